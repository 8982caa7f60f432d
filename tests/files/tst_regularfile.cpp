// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "files/regularfile.h"
#include "usedupdescriptors.h"

#include <QTemporaryDir>
#include <QtTest>

using State = RegularFile::State;
Q_DECLARE_METATYPE(State)

class TestRegularFile : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void readsUpToTheLimit();
    void readsTheFirstLine();
    void readsFilesOfTheKernel();
    void refuses_data();
    void refuses();
    void withoutDescriptors();
};

void TestRegularFile::readsUpToTheLimit()
{
    const QTemporaryDir directory;
    const QString path = directory.filePath(QStringLiteral("file"));
    Files::write(path, "text");
    const RegularFile file = readRegularFile(path, 4);
    QCOMPARE(file.state, State::Read);
    QCOMPARE(file.content, QByteArray("text"));
    QCOMPARE(file.error, QString());
    QCOMPARE(readRegularFile(path, 3).state, State::TooLarge);
    QCOMPARE(readRegularFile(path, 3).content, QByteArray());

    Files::write(path, {});
    QCOMPARE(readRegularFile(path, 0).state, State::Read);
    QCOMPARE(readRegularFile(path, 4).content, QByteArray());
}

void TestRegularFile::readsTheFirstLine()
{
    const QTemporaryDir directory;
    const QString path = directory.filePath(QStringLiteral("file"));
    Files::write(path, "text\nmore");
    QCOMPARE(readFirstLine(path, 4).state, State::Read);
    QCOMPARE(readFirstLine(path, 4).content, QByteArray("text"));
    QCOMPARE(readFirstLine(path, 3).state, State::TooLarge);
    QCOMPARE(readFirstLine(path, 3).content, QByteArray());
    // A line that ends in the second block, and one that ends with the file.
    Files::write(path, QByteArray(5000, 'x') + '\0' + "more");
    QCOMPARE(readFirstLine(path, 5000).content, QByteArray(5000, 'x'));
    Files::write(path, QByteArray(8192, 'x'));
    QCOMPARE(readFirstLine(path, 8192).content, QByteArray(8192, 'x'));
    QCOMPARE(readFirstLine(path, 8191).state, State::TooLarge);
    QCOMPARE(readFirstLine(directory.path(), 4).state, State::NotRegular);
    QCOMPARE(readFirstLine(QStringLiteral("/proc/self/mem"), 4).state, State::Failed);
}

// Files of the kernel report a size of 0, but may have content of any size.
void TestRegularFile::readsFilesOfTheKernel()
{
    const QString path = QStringLiteral("/proc/version");
    const RegularFile file = readRegularFile(path, 10000);
    QCOMPARE(file.state, State::Read);
    QVERIFY(file.content.startsWith("Linux"));
    QVERIFY(file.content.endsWith('\n'));
    QCOMPARE(readRegularFile(path, file.content.size()).content, file.content);
    QCOMPARE(readRegularFile(path, file.content.size() - 1).state, State::TooLarge);
}

void TestRegularFile::refuses_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<State>("state");
    QTest::addColumn<QString>("error");
    const QString nothing = QStringLiteral("No such file or directory");
    const QString irregular = QStringLiteral("file to open is not a regular file");
    QTest::newRow("no path") << QString() << State::NotOpened << nothing;
    QTest::newRow("nothing") << QStringLiteral("%1/nothing") << State::NotOpened << nothing;
    QTest::newRow("NUL in the path") << QStringLiteral("%1/file") + QChar(0) << State::NotOpened
                                     << QStringLiteral("Invalid argument");
    QTest::newRow("directory") << QStringLiteral("%1") << State::NotRegular
                               << QStringLiteral("file to open is a directory");
    QTest::newRow("pipe") << QStringLiteral("%1/pipe") << State::NotRegular << irregular;
    QTest::newRow("device") << QStringLiteral("/dev/zero") << State::NotRegular << irregular;
    QTest::newRow("too large") << QStringLiteral("%1/sparse") << State::TooLarge
                               << QStringLiteral("file to open is larger than 1000 bytes");
    QTest::newRow("cannot be read") << QStringLiteral("/proc/self/mem") << State::Failed
                                    << QStringLiteral("Input/output error");
}

void TestRegularFile::refuses()
{
    QFETCH(QString, path);
    QFETCH(State, state);
    const QTemporaryDir directory;
    Files::write(directory.filePath(QStringLiteral("file")), "text");
    Files::makePipe(directory.filePath(QStringLiteral("pipe")));
    Files::makeSparse(directory.filePath(QStringLiteral("sparse")), qint64(1) << 40);
    const QDir openFiles(QStringLiteral("/proc/self/fd"));
    const uint before = openFiles.count();
    const RegularFile file =
        readRegularFile(path.replace(QStringLiteral("%1"), directory.path()), 1000);
    QCOMPARE(file.state, state);
    QTEST(file.error, "error");
    QCOMPARE(file.content, QByteArray());
    QCOMPARE(QDir(openFiles.path()).count(), before);
}

void TestRegularFile::withoutDescriptors()
{
    const UsedUpDescriptors none;
    const RegularFile file = readRegularFile(QStringLiteral("/proc/version"), 1000);
    QCOMPARE(file.state, State::NotOpened);
    QCOMPARE(file.error, QStringLiteral("Too many open files"));
}

QTEST_GUILESS_MAIN(TestRegularFile)

#include "tst_regularfile.moc"
