// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "documents/textfilereader.h"
#include "files.h"
#include "files/regularfile.h"
#include "interfaceof.h"
#include "loggedtest.h"

#include <QTemporaryDir>
#include <QtTest>

#include <sys/socket.h>
#include <sys/un.h>

#include <unistd.h>

class TestTextFileReader : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void hasTwoMethods();

    void readContent_data();
    void readContent();
    void readContentOfNothing_data();
    void readContentOfNothing();
    void readContentOfLargeFiles();
    void readContentFollowsLinks();
    void readContentReadsOnEveryCall();

    void collateJoinsInOrder();
    void collateSortsByCase();
    void collateTakesFilesOnly();
    void collateLeavesOutEmptyFiles();
    void collateLeavesOutWhatIsTooLarge();
    void collateOfNothing();
    void collateOfNoLocalDirectory_data();
    void collateOfNoLocalDirectory();
    void collateDecodesUrls();
    void collateKeepsSeparatorAndPrefix();

private:
    QString path(const char *name) const;
    QUrl directory() const { return QUrl::fromLocalFile(m_directory->path()); }

    std::unique_ptr<QTemporaryDir> m_directory;
};

namespace {

const QString comma = QStringLiteral(",");
const QString colon = QStringLiteral(":");

void makeSocket(const QString &path)
{
    const int descriptor = socket(AF_UNIX, SOCK_STREAM, 0);
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    const QByteArray name = QFile::encodeName(path);
    QVERIFY(name.size() < int(sizeof(address.sun_path)));
    qstrcpy(address.sun_path, name.constData());
    QCOMPARE(bind(descriptor, reinterpret_cast<sockaddr *>(&address), sizeof(address)), 0);
    close(descriptor);
}

} // namespace

QString TestTextFileReader::path(const char *name) const
{
    return m_directory->filePath(QString::fromUtf8(name));
}

void TestTextFileReader::init()
{
    m_directory = std::make_unique<QTemporaryDir>();
    QVERIFY(m_directory->isValid());
    LoggedTest::init();
}

void TestTextFileReader::cleanup()
{
    LoggedTest::cleanup();
    m_directory.reset();
}

void TestTextFileReader::hasTwoMethods()
{
    const QStringList expected = {
        QStringLiteral("QString readContent(QString)"),
        QStringLiteral("QString collate(QUrl,QString,QString)"),
    };
    QCOMPARE(interfaceOf(TextFileReader::staticMetaObject), expected);
}

void TestTextFileReader::readContent_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("text");

    QTest::newRow("line") << QByteArray("a") << QStringLiteral("a");
    QTest::newRow("lines run together") << QByteArray("a\nb") << QStringLiteral("ab");
    QTest::newRow("last line end") << QByteArray("a\nb\n") << QStringLiteral("ab");
    QTest::newRow("empty lines") << QByteArray("\n\na\n\n\nb\n\n") << QStringLiteral("ab");
    QTest::newRow("carriage returns") << QByteArray("a\r\nb\r\n") << QStringLiteral("ab");
    QTest::newRow("a carriage return alone") << QByteArray("a\rb") << QStringLiteral("a\rb");
    QTest::newRow("blanks") << QByteArray(" a \n b ") << QStringLiteral(" a  b ");
    QTest::newRow("empty") << QByteArray() << QStringLiteral("");
    QTest::newRow("line ends alone") << QByteArray("\n\n") << QStringLiteral("");
    QTest::newRow("UTF-8") << QByteArray("\xC3\xA4\n\xE2\x9C\x93") << QStringLiteral("ä✓");
    QTest::newRow("byte-order mark") << QByteArray("\xEF\xBB\xBF"
                                                   "a")
                                     << QStringLiteral("a");
    QTest::newRow("UTF-16") << QByteArray("\xFF\xFE"
                                          "a\0\n\0b\0",
                                          8)
                            << QStringLiteral("ab");
    QTest::newRow("NUL") << QByteArray("a\0b", 3)
                         << QString::fromUtf8(QByteArray("a")) + QChar(0) + QLatin1Char('b');
    QTest::newRow("a long line") << QByteArray(300000, 'x') << QString(300000, QLatin1Char('x'));
    QTest::newRow("many lines") << QByteArray("x\n").repeated(100000)
                                << QString(100000, QLatin1Char('x'));
}

void TestTextFileReader::readContent()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, text);
    Files::write(path("file"), content);
    const TextFileReader reader;
    const QString read = reader.readContent(path("file"));
    QCOMPARE(read, text);
    QVERIFY(!read.isNull());
}

void TestTextFileReader::readContentOfNothing_data()
{
    QTest::addColumn<QString>("name");
    QTest::newRow("no path") << QString();
    QTest::newRow("nothing") << QStringLiteral("%1/nothing");
    QTest::newRow("nothing in a file") << QStringLiteral("%1/file/nothing");
    QTest::newRow("directory") << QStringLiteral("%1");
    QTest::newRow("pipe") << QStringLiteral("%1/pipe");
    QTest::newRow("socket") << QStringLiteral("%1/socket");
    QTest::newRow("link to a pipe") << QStringLiteral("%1/link");
    QTest::newRow("link to itself") << QStringLiteral("%1/loop");
    QTest::newRow("endless device") << QStringLiteral("/dev/zero");
    QTest::newRow("device") << QStringLiteral("/dev/null");
    QTest::newRow("memory, which cannot be read") << QStringLiteral("/proc/self/mem");
    QTest::newRow("URL") << QStringLiteral("file://%1/file");
    QTest::newRow("NUL") << QStringLiteral("%1/file") + QChar(0) + QLatin1Char('x');
    QTest::newRow("NUL first") << QString(QChar(0)) + QStringLiteral("%1/file");
    QTest::newRow("long") << QStringLiteral("%1/") + QString(100000, QLatin1Char('x'));
}

void TestTextFileReader::readContentOfNothing()
{
    QFETCH(QString, name);
    Files::write(path("file"), "text");
    Files::makePipe(path("pipe"));
    Files::makeLink(path("pipe"), path("link"));
    Files::makeLink(path("loop"), path("loop"));
    makeSocket(path("socket"));
    const TextFileReader reader;
    name.replace(QStringLiteral("%1"), m_directory->path());
    QVERIFY(reader.readContent(name).isNull());
}

void TestTextFileReader::readContentOfLargeFiles()
{
    const TextFileReader reader;
    Files::makeSparse(path("file"), maximumTextSize);
    QCOMPARE(reader.readContent(path("file")).size(), int(maximumTextSize));
    Files::makeSparse(path("file"), maximumTextSize + 1);
    QVERIFY(reader.readContent(path("file")).isNull());
    // A file that is larger than the memory.
    Files::makeSparse(path("file"), qint64(1) << 40);
    QVERIFY(reader.readContent(path("file")).isNull());
}

void TestTextFileReader::readContentFollowsLinks()
{
    Files::write(path("file"), "text");
    Files::makeLink(path("file"), path("link"));
    const TextFileReader reader;
    QCOMPARE(reader.readContent(path("link")), QStringLiteral("text"));
}

void TestTextFileReader::readContentReadsOnEveryCall()
{
    const TextFileReader reader;
    Files::write(path("file"), "one");
    QCOMPARE(reader.readContent(path("file")), QStringLiteral("one"));
    Files::write(path("file"), "two");
    QCOMPARE(reader.readContent(path("file")), QStringLiteral("two"));
}

void TestTextFileReader::collateJoinsInOrder()
{
    Files::write(path("2"), "B");
    Files::write(path("1"), "A");
    const TextFileReader reader;
    QCOMPARE(reader.collate(directory(), comma, colon), QStringLiteral(":A,B"));
    Files::write(path("10"), "C\nD\n");
    QCOMPARE(reader.collate(directory(), comma, colon), QStringLiteral(":A,CD,B"));
}

void TestTextFileReader::collateSortsByCase()
{
    for (const char *name : {"a", "B", "c", "D", "ä", "_", "1"}) {
        Files::write(path(name), name);
    }
    const TextFileReader reader;
    QCOMPARE(reader.collate(directory(), comma, QString()), QStringLiteral("1,B,D,_,a,c,ä"));
}

void TestTextFileReader::collateTakesFilesOnly()
{
    QTemporaryDir elsewhere;
    const QString target = elsewhere.filePath(QStringLiteral("target"));
    Files::write(target, "link");
    Files::write(path("a"), "a");
    Files::makeLink(target, path("b"));
    Files::write(path(".hidden"), "hidden");
    Files::write(path("directory/c"), "in a directory");
    Files::makeLink(path("directory"), path("link to a directory"));
    Files::makeLink(path("nothing"), path("link to nothing"));
    Files::makePipe(path("pipe"));
    Files::makeLink(path("pipe"), path("link to a pipe"));
    Files::makeLink(QStringLiteral("/dev/zero"), path("link to a device"));
    makeSocket(path("socket"));
    const TextFileReader reader;
    QCOMPARE(reader.collate(directory(), comma, colon), QStringLiteral(":a,link"));
}

void TestTextFileReader::collateLeavesOutEmptyFiles()
{
    Files::write(path("1"), "");
    Files::write(path("2"), "A");
    Files::write(path("3"), "\n\n");
    Files::write(path("4"), " ");
    Files::write(path("5"), "");
    const TextFileReader reader;
    QCOMPARE(reader.collate(directory(), comma, colon), QStringLiteral(":A, "));
}

void TestTextFileReader::collateLeavesOutWhatIsTooLarge()
{
    Files::write(path("1"), "A");
    Files::makeSparse(path("2"), maximumTextSize);
    Files::makeSparse(path("3"), maximumTextSize - 2);
    Files::write(path("4"), "B");
    Files::write(path("5"), "C");
    const TextFileReader reader;
    // The limit is one of all files together.
    const QString text = reader.collate(directory(), comma, QString());
    QCOMPARE(text.size(), int(maximumTextSize) + 2);
    QVERIFY(text.startsWith(QStringLiteral("A,")));
    QVERIFY(text.endsWith(QStringLiteral(",B")));
}

void TestTextFileReader::collateOfNothing()
{
    const TextFileReader reader;
    QVERIFY(reader.collate(directory(), comma, colon).isNull());
    Files::write(path("1"), "");
    Files::write(path("2"), "\n");
    QVERIFY(reader.collate(directory(), comma, colon).isNull());
    QVERIFY(reader.collate(QUrl::fromLocalFile(path("nothing")), comma, colon).isNull());
    Files::write(path("3"), "text");
    QVERIFY(reader.collate(QUrl::fromLocalFile(path("3")), comma, colon).isNull());
    QVERIFY(!reader.collate(directory(), comma, colon).isNull());
}

void TestTextFileReader::collateOfNoLocalDirectory_data()
{
    QTest::addColumn<QString>("url");
    QTest::newRow("none") << QString();
    QTest::newRow("http") << QStringLiteral("http://localhost%1");
    QTest::newRow("resource") << QStringLiteral("qrc:%1");
    QTest::newRow("path") << QStringLiteral("%1");
    QTest::newRow("no path") << QStringLiteral("file:");
    QTest::newRow("no path, no host") << QStringLiteral("file://");
    QTest::newRow("query alone") << QStringLiteral("file:?a");
    QTest::newRow("NUL") << QStringLiteral("file://%1%00x");
}

void TestTextFileReader::collateOfNoLocalDirectory()
{
    QFETCH(QString, url);
    Files::write(path("1"), "text");
    // The current directory has a text, which must not be found.
    const QString before = QDir::currentPath();
    QVERIFY(QDir::setCurrent(m_directory->path()));
    const TextFileReader reader;
    url.replace(QStringLiteral("%1"), m_directory->path());
    const QString text = reader.collate(QUrl(url), comma, colon);
    QVERIFY(QDir::setCurrent(before));
    QVERIFY(text.isNull());
}

void TestTextFileReader::collateDecodesUrls()
{
    Files::write(path("a directory #1/file"), "text");
    const TextFileReader reader;
    const QUrl url(QStringLiteral("file://%1/a%20directory%20%231")
                       .replace(QStringLiteral("%1"), m_directory->path()));
    QCOMPARE(reader.collate(url, comma, QString()), QStringLiteral("text"));
}

void TestTextFileReader::collateKeepsSeparatorAndPrefix()
{
    Files::write(path("1"), "%1");
    Files::write(path("2"), "%2");
    const TextFileReader reader;
    QCOMPARE(reader.collate(directory(), QStringLiteral("%1\n"), QStringLiteral("%2")),
             QStringLiteral("%2%1%1\n%2"));
    QCOMPARE(reader.collate(directory(), QString(), QString()), QStringLiteral("%1%2"));
}

QTEST_GUILESS_MAIN(TestTextFileReader)

#include "tst_textfilereader.moc"
