// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "documents/textfilereader.h"
#include "files.h"
#include "files/regularfile.h"
#include "loggedtest.h"
#include "texts.h"

#include <QTemporaryDir>
#include <QTextCodec>
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

    void readContent_data();
    void readContent();
    void readContentInTheEncodingOfTheLocale();
    void readContentOfNothing_data();
    void readContentOfNothing();
    void readContentOfLargeFiles();
    void readContentFollowsLinksOnEveryCall();

    void collateJoinsInOrder();
    void collateSortsByCase();
    void collateTakesFilesOnly();
    void collateLeavesOutEmptyFiles();
    void collateLeavesOutFilesAboveTheLimit();
    void collateOfNothing_data();
    void collateOfNothing();
    void collateDecodesUrls();
    void collateKeepsSeparatorAndPrefix();

private:
    QString path(const char *name) const { return m_directory->filePath(QString::fromUtf8(name)); }
    QString read(const char *name) const { return TextFileReader().readContent(path(name)); }
    QString collate(const QString &separator = ","_s, const QString &prefix = ":"_s) const
    {
        const QUrl directory = QUrl::fromLocalFile(m_directory->path());
        return TextFileReader().collate(directory, separator, prefix);
    }

    std::unique_ptr<QTemporaryDir> m_directory;
};

namespace {

void makeSocket(const QString &path)
{
    const int descriptor = socket(AF_UNIX, SOCK_STREAM, 0);
    sockaddr_un address = {};
    address.sun_family = AF_UNIX;
    qstrncpy(address.sun_path, QFile::encodeName(path).constData(), sizeof(address.sun_path));
    if (bind(descriptor, reinterpret_cast<sockaddr *>(&address), sizeof(address)) != 0) {
        qFatal("cannot make a socket");
    }
    close(descriptor);
}

} // namespace

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

void TestTextFileReader::readContent_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("text");

    const auto row = [](const char *name, const QByteArray &content, const QString &text) {
        QTest::newRow(name) << content << text;
    };
    const QString ab = "ab"_s;
    row("line", "ab", ab);
    row("lines run together", "a\nb", ab);
    row("last line end", "a\nb\n", ab);
    row("empty lines", "\n\na\n\n\nb\n\n", ab);
    row("carriage returns", "a\r\nb\r\n", ab);
    row("a carriage return alone", "a\rb", "a\rb"_s);
    row("blanks", " a \n b ", " a  b "_s);
    row("empty", "", ""_s);
    row("line ends alone", "\n\n", ""_s);
    row("UTF-8", "ä\n✓", "ä✓"_s);
    row("byte-order mark", "\uFEFFab", ab);
    row("UTF-16", QByteArray("\xFF\xFE\x61\0\n\0b\0", 8), ab);
    row("NUL", QByteArray("a\0b", 3), "a\0b"_s);
    row("a long line", QByteArray(300000, 'x'), QString(300000, QLatin1Char('x')));
    row("many lines", QByteArray("x\n").repeated(100000), QString(100000, QLatin1Char('x')));
}

void TestTextFileReader::readContent()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, text);
    Files::write(path("file"), content);
    QCOMPARE(read("file"), text);
    QVERIFY(!read("file").isNull());
}

void TestTextFileReader::readContentInTheEncodingOfTheLocale()
{
    Files::write(path("file"), "\xE4");
    QTextCodec *const before = QTextCodec::codecForLocale();
    QTextCodec::setCodecForLocale(QTextCodec::codecForName("ISO-8859-1"));
    const QString text = read("file");
    QTextCodec::setCodecForLocale(before);
    QCOMPARE(text, "ä"_s);
}

void TestTextFileReader::readContentOfNothing_data()
{
    QTest::addColumn<QString>("name");
    const auto row = [](const char *name, const QString &path) { QTest::newRow(name) << path; };
    row("no path", {});
    row("nothing", "%1/nothing"_s);
    row("nothing in a file", "%1/file/nothing"_s);
    row("directory", "%1"_s);
    row("pipe", "%1/pipe"_s);
    row("socket", "%1/socket"_s);
    row("link to a pipe", "%1/link"_s);
    row("link to itself", "%1/loop"_s);
    row("endless device", "/dev/zero"_s);
    row("device", "/dev/null"_s);
    row("memory, which cannot be read", "/proc/self/mem"_s);
    row("URL", "file://%1/file"_s);
    row("NUL", "%1/file\0x"_s);
    row("NUL first", "\0%1/file"_s);
    row("long", "%1/"_s + QString(100000, QLatin1Char('x')));
}

void TestTextFileReader::readContentOfNothing()
{
    QFETCH(QString, name);
    Files::write(path("file"), "text");
    Files::makePipe(path("pipe"));
    Files::makeLink(path("pipe"), path("link"));
    Files::makeLink(path("loop"), path("loop"));
    makeSocket(path("socket"));
    name.replace("%1"_s, m_directory->path());
    QVERIFY(TextFileReader().readContent(name).isNull());
}

void TestTextFileReader::readContentOfLargeFiles()
{
    Files::makeSparse(path("file"), maximumTextSize);
    QCOMPARE(read("file").size(), int(maximumTextSize));
    Files::makeSparse(path("file"), maximumTextSize + 1);
    QVERIFY(read("file").isNull());
    // A file that is larger than the memory.
    Files::makeSparse(path("file"), qint64(1) << 40);
    QVERIFY(read("file").isNull());
}

void TestTextFileReader::readContentFollowsLinksOnEveryCall()
{
    Files::makeLink(path("file"), path("link"));
    for (const char *text : {"one", "two"}) {
        Files::write(path("file"), text);
        QCOMPARE(read("link"), QString::fromLatin1(text));
    }
}

void TestTextFileReader::collateJoinsInOrder()
{
    Files::write(path("2"), "B");
    Files::write(path("1"), "A");
    QCOMPARE(collate(), ":A,B"_s);
    Files::write(path("10"), "C\nD\n");
    QCOMPARE(collate(), ":A,CD,B"_s);
}

void TestTextFileReader::collateSortsByCase()
{
    for (const char *name : {"a", "B", "c", "D", "ä", "_", "1"}) {
        Files::write(path(name), name);
    }
    QCOMPARE(collate(), ":1,B,D,_,a,c,ä"_s);
}

void TestTextFileReader::collateTakesFilesOnly()
{
    const QTemporaryDir elsewhere;
    const QString target = elsewhere.filePath("target"_s);
    Files::write(target, "link");
    Files::write(path("a"), "a");
    Files::makeLink(target, path("b"));
    Files::write(path(".hidden"), "hidden");
    Files::write(path("directory/c"), "in a directory");
    Files::makeLink(path("directory"), path("link to a directory"));
    Files::makeLink(path("nothing"), path("link to nothing"));
    Files::makePipe(path("pipe"));
    Files::makeLink(path("pipe"), path("link to a pipe"));
    Files::makeLink("/dev/zero"_s, path("link to a device"));
    makeSocket(path("socket"));
    QCOMPARE(collate(), ":a,link"_s);
}

void TestTextFileReader::collateLeavesOutEmptyFiles()
{
    Files::write(path("1"), "");
    Files::write(path("2"), "\n\n");
    QVERIFY(collate().isNull());
    Files::write(path("3"), "A");
    Files::write(path("4"), " ");
    Files::write(path("5"), "");
    QCOMPARE(collate(), ":A, "_s);
}

void TestTextFileReader::collateLeavesOutFilesAboveTheLimit()
{
    Files::write(path("1"), "A");
    Files::makeSparse(path("2"), maximumTextSize);
    Files::makeSparse(path("3"), maximumTextSize - 2);
    Files::write(path("4"), "B");
    Files::write(path("5"), "C");
    // The limit applies to all files together.
    const QString text = collate();
    QCOMPARE(text.size(), int(maximumTextSize) + 3);
    QVERIFY(text.startsWith(":A,"_s));
    QVERIFY(text.endsWith(",B"_s));
}

void TestTextFileReader::collateOfNothing_data()
{
    QTest::addColumn<QString>("url");
    const auto row = [](const char *name, const char *url) {
        QTest::newRow(name) << QString::fromLatin1(url);
    };
    row("empty directory", "file://%1/empty");
    row("nothing", "file://%1/nothing");
    row("file", "file://%1/1");
    row("none", "");
    row("http", "http://localhost%1");
    row("resource", "qrc:%1");
    row("path", "%1");
    row("no path", "file:");
    row("no path, no host", "file://");
    row("query alone", "file:?a");
    row("NUL", "file://%1%00x");
}

void TestTextFileReader::collateOfNothing()
{
    QFETCH(QString, url);
    Files::write(path("1"), "text");
    Files::makeDirectory(path("empty"));
    // The current directory has a text, which must not be found.
    const QString before = QDir::currentPath();
    QVERIFY(QDir::setCurrent(m_directory->path()));
    url.replace("%1"_s, m_directory->path());
    const QString text = TextFileReader().collate(QUrl(url), ","_s, ":"_s);
    QVERIFY(QDir::setCurrent(before));
    QVERIFY(text.isNull());
}

void TestTextFileReader::collateDecodesUrls()
{
    Files::write(path("a directory #1/file"), "text");
    const QUrl url("file://%1/a%20directory%20%231"_s.replace("%1"_s, m_directory->path()));
    QCOMPARE(TextFileReader().collate(url, ","_s, ":"_s), ":text"_s);
}

void TestTextFileReader::collateKeepsSeparatorAndPrefix()
{
    Files::write(path("1"), "%1");
    Files::write(path("2"), "%2");
    QCOMPARE(collate("%1\n"_s, "%2"_s), "%2%1%1\n%2"_s);
    QCOMPARE(collate(QString(), QString()), "%1%2"_s);
}

QTEST_GUILESS_MAIN(TestTextFileReader)

#include "tst_textfilereader.moc"
