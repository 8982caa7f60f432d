// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "files/regularfile.h"
#include "texts.h"
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
    const QString path = directory.filePath("file"_s);
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
    const QString path = directory.filePath("file"_s);
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
    QCOMPARE(readFirstLine("/proc/self/mem"_s, 4).state, State::Failed);
}

// Files of the kernel report a size of 0, but may have content of any size.
void TestRegularFile::readsFilesOfTheKernel()
{
    const QString path = "/proc/version"_s;
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
    const QString nothing = "No such file or directory"_s;
    const QString irregular = "file to open is not a regular file"_s;
    QTest::newRow("no path") << QString() << State::NotOpened << nothing;
    QTest::newRow("nothing") << "%1/nothing"_s << State::NotOpened << nothing;
    QTest::newRow("NUL in the path")
        << "%1/file"_s + QChar(0) << State::NotOpened << "Invalid argument"_s;
    QTest::newRow("directory") << "%1"_s << State::NotRegular << "file to open is a directory"_s;
    QTest::newRow("pipe") << "%1/pipe"_s << State::NotRegular << irregular;
    QTest::newRow("device") << "/dev/zero"_s << State::NotRegular << irregular;
    QTest::newRow("too large") << "%1/sparse"_s << State::TooLarge
                               << "file to open is larger than 1000 bytes"_s;
    QTest::newRow("cannot be read")
        << "/proc/self/mem"_s << State::Failed << "Input/output error"_s;
}

void TestRegularFile::refuses()
{
    QFETCH(QString, path);
    QFETCH(State, state);
    const QTemporaryDir directory;
    Files::write(directory.filePath("file"_s), "text");
    Files::makePipe(directory.filePath("pipe"_s));
    Files::makeSparse(directory.filePath("sparse"_s), qint64(1) << 40);
    const QDir openFiles("/proc/self/fd"_s);
    const uint before = openFiles.count();
    const RegularFile file = readRegularFile(path.replace("%1"_s, directory.path()), 1000);
    QCOMPARE(file.state, state);
    QTEST(file.error, "error");
    QCOMPARE(file.content, QByteArray());
    QCOMPARE(QDir(openFiles.path()).count(), before);
}

void TestRegularFile::withoutDescriptors()
{
    const UsedUpDescriptors none;
    const RegularFile file = readRegularFile("/proc/version"_s, 1000);
    QCOMPARE(file.state, State::NotOpened);
    QCOMPARE(file.error, "Too many open files"_s);
}

QTEST_GUILESS_MAIN(TestRegularFile)

#include "tst_regularfile.moc"
