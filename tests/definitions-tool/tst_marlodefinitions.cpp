// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The command as its users run it.

#include "files.h"
#include "loggedtest.h"
#include "mgconfitem.h"
#include "simulator/recordingservice.h"

#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>
#include <QTemporaryDir>
#include <QtTest>

#include <sys/stat.h>
#include <unistd.h>

class TestMarloDefinitions : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void exitStatus_data();
    void exitStatus();
    void wrongUsage_data();
    void wrongUsage();
    void helpAndVersion();
    void jsonFormat();
    void directory();
    void installedDefinitions();
    void root();
    void catalogsOfSources();
    void pathsAcrossFiles();
    void sameFileTwice();
    void hostileNames();
    void hostileFiles_data();
    void hostileFiles();
    void unreadableFile();
    void boundedFindings();
    void outputThatCannotBeWritten();
    void list();
    void listWithoutAnything();
    void listCatalogs();
    void showQuickAction();
    void showSendsTheSameCall_data();
    void showSendsTheSameCall();
    void showEventsWidgets();
    void showNothing();

private:
    struct Result {
        int status;
        QString output;
        QString errors;
    };
    // Runs a command line whose words are separated by spaces. Anything but an orderly end is a
    // failure.
    static Result run(const QByteArray &line, const char *locale = "C.UTF-8");

    std::unique_ptr<QTemporaryDir> m_directory;
};

namespace {

const QString glimmera = QStringLiteral("/usr/share/glimmera");
const QString quickActions = QStringLiteral("/usr/share/glimmera/quickactions/");
const QString eventsWidgets = QStringLiteral("/usr/share/glimmera/eventswidgets/");
constexpr int timeout = 60000; // ms

const QByteArray call = "remote-service=org.example.lamp\nremote-path=/lamp\n"
                        "remote-interface=org.example.Lamp\nremote-method=toggle\n";
const QByteArray goodAction = "title=maps-title\ntranslation-catalog=maps\npriority=1\n" + call;
const QByteArray goodWidget =
    R"({ "translation_catalog": "maps", "widgets": [ { "path": "/a.qml", )"
    R"("title": "A", "order": 1 } ] })";

QString lines(const QStringList &lines)
{
    return lines.join(QLatin1Char('\n')) + QLatin1Char('\n');
}

} // namespace

void TestMarloDefinitions::init()
{
    LoggedTest::init();
    m_directory = std::make_unique<QTemporaryDir>();
    QVERIFY(QDir::setCurrent(m_directory->path()));
    Files::installCatalog(QStringLiteral("maps_eng_en"));
}

void TestMarloDefinitions::cleanup()
{
    LoggedTest::cleanup();
    QVERIFY(QDir::setCurrent(QStringLiteral("/")));
    m_directory.reset();
    Files::remove(glimmera);
    Files::remove(QStringLiteral("/usr/share/translations"));
}

TestMarloDefinitions::Result TestMarloDefinitions::run(const QByteArray &line, const char *locale)
{
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QStringLiteral("LC_ALL"), QLatin1String(locale));
    process.setProcessEnvironment(environment);
    process.start(QStringLiteral(PROGRAM),
                  QString::fromUtf8(line).split(QLatin1Char(' '), Qt::SkipEmptyParts));
    if (!process.waitForFinished(timeout) || process.exitStatus() != QProcess::NormalExit) {
        process.kill();
        process.waitForFinished();
        QTest::qFail("the program crashed or did not end", __FILE__, __LINE__);
        return {-1, {}, {}};
    }
    return {process.exitCode(), QString::fromUtf8(process.readAllStandardOutput()),
            QString::fromUtf8(process.readAllStandardError())};
}

void TestMarloDefinitions::exitStatus_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<int>("status");
    QTest::addColumn<int>("strictStatus");
    QTest::newRow("good") << goodAction << 0 << 0;
    QTest::newRow("note") << goodAction + "[remote-arguments]\nsize=1\n1\\argument=1\n" << 0 << 0;
    QTest::newRow("warning") << "x=1\n" + goodAction << 0 << 1;
    QTest::newRow("error") << "x\n" + goodAction << 1 << 1;
}

void TestMarloDefinitions::exitStatus()
{
    QFETCH(QByteArray, content);
    Files::write(QStringLiteral("lamp.conf"), content);
    QTEST(run("check lamp.conf").status, "status");
    QTEST(run("check lamp.conf --strict").status, "strictStatus");
    // A missing file is a failure, whatever else is checked.
    const Result result = run("check lamp.conf missing.conf");
    QCOMPARE(result.status, 2);
    QCOMPARE(result.errors, QStringLiteral("marlo-definitions: there is no \"missing.conf\"\n"));
    QCOMPARE(result.output, run("check lamp.conf").output);
}

void TestMarloDefinitions::wrongUsage_data()
{
    QTest::addColumn<QByteArray>("line");
    for (const char *line :
         {"", "verify", "check --verbose a.conf", "check --format xml .", "check --catalogs .",
          "list --strict", "list --format json", "list a.conf", "show", "show a.conf b.conf",
          "show --root / a.conf", "check --root", "check --root /nowhere", "--strict"}) {
        QTest::newRow(line) << QByteArray(line);
    }
}

void TestMarloDefinitions::wrongUsage()
{
    QFETCH(QByteArray, line);
    const Result result = run(line);
    QCOMPARE(result.status, 2);
    QCOMPARE(result.output, QString());
    QVERIFY(result.errors.startsWith(QStringLiteral("marlo-definitions: ")));
    QCOMPARE(result.errors.count(QLatin1Char('\n')), 1);
}

void TestMarloDefinitions::helpAndVersion()
{
    const Result help = run("--help");
    QCOMPARE(help.status, 0);
    QVERIFY(help.output.contains(QStringLiteral("check [--strict]")));
    const Result version = run("--version");
    QCOMPARE(version.status, 0);
    QVERIFY(version.output.startsWith(QStringLiteral("marlo-definitions ")));
}

void TestMarloDefinitions::jsonFormat()
{
    Files::write(QStringLiteral("lamp.conf"), "x=1\n" + goodAction + "title=\"Lämp\"\n");
    const Result result = run("check --format json lamp.conf");
    QCOMPARE(result.status, 1);
    const QJsonArray findings = QJsonDocument::fromJson(result.output.toUtf8()).array();
    QCOMPARE(findings.size(), 4);
    QCOMPARE(findings.at(0).toObject(),
             (QJsonObject{{QStringLiteral("file"), QStringLiteral("lamp.conf")},
                          {QStringLiteral("line"), 1},
                          {QStringLiteral("severity"), QStringLiteral("warning")},
                          {QStringLiteral("rule"), QStringLiteral("unknown-key")},
                          {QStringLiteral("text"), QStringLiteral("unknown key \"x\"")}}));
    QCOMPARE(findings.at(2).toObject().value(QStringLiteral("rule")).toString(),
             QStringLiteral("encoding"));

    Files::write(QStringLiteral("lamp.conf"), goodAction);
    const Result clean = run("check --format json lamp.conf");
    QCOMPARE(clean.status, 0);
    QVERIFY(QJsonDocument::fromJson(clean.output.toUtf8()).isArray());
}

void TestMarloDefinitions::directory()
{
    Files::write(QStringLiteral("f/b.conf"), "b\n" + goodAction);
    Files::write(QStringLiteral("f/A.CONF"), "a\n" + goodAction);
    Files::write(QStringLiteral("f/.hidden.conf"), "h\n");
    Files::write(QStringLiteral("f/readme.txt"), "x");
    Files::write(QStringLiteral("f/w.json"), "[]");
    Files::write(QStringLiteral("f/deeper/c.conf"), "c\n");
    Files::makeDirectory(QStringLiteral("f/directory.conf"));
    Files::makeDirectory(QStringLiteral("f/directory.json"));
    Files::makeLink(QStringLiteral("nowhere.conf"), QStringLiteral("f/link.conf"));
    const Result result = run("check f");
    QCOMPARE(result.status, 1);
    QCOMPARE(
        result.output,
        lines({QStringLiteral("f/A.CONF:1: error: this line is not a key and is ignored "
                              "[no-key]"),
               QStringLiteral("f/b.conf:1: error: this line is not a key and is ignored "
                              "[no-key]"),
               QStringLiteral("f/directory.conf:1: error: this is not a regular file [unreadable]"),
               QStringLiteral("f/w.json:1: error: this is not an object: nothing of the file is "
                              "read [json]")}));
    QCOMPARE(run("check f/").output, result.output);

    const Result other = run("check f/readme.txt");
    QCOMPARE(other.status, 1);
    QVERIFY(other.output.contains(QStringLiteral("[file-name]")));
}

void TestMarloDefinitions::installedDefinitions()
{
    const Result nothing = run("check");
    QCOMPARE(nothing.status, 2);
    QCOMPARE(
        nothing.errors,
        QStringLiteral("marlo-definitions: there are no directories of definitions in \"/\"\n"));

    Files::write(quickActions + QStringLiteral("lamp.conf"), "x\n" + goodAction);
    Files::write(eventsWidgets + QStringLiteral("lamp.json"), "{");
    const Result result = run("check");
    QCOMPARE(result.status, 1);
    QCOMPARE(result.output.count(QLatin1Char('\n')), 2);
    QVERIFY(result.output.startsWith(quickActions + QStringLiteral("lamp.conf:1: error:")));
    QVERIFY(result.output.contains(eventsWidgets + QStringLiteral("lamp.json:1: error:")));
}

void TestMarloDefinitions::root()
{
    // What is installed on this machine is ignored.
    Files::installCatalog(QStringLiteral("atlas_eng_en"));
    Files::write(quickActions + QStringLiteral("bad.conf"), "x\n");
    Files::write(QStringLiteral("root/usr/share/glimmera/quickactions/lamp.conf"),
                 "translation-catalog=atlas\ntitle=Lamp\npriority=1\n" + call);
    const QByteArray line = "check --strict --root root";
    const Result missing = run(line);
    QCOMPARE(missing.status, 1);
    QCOMPARE(
        missing.output,
        QStringLiteral("root/usr/share/glimmera/quickactions/lamp.conf:1: warning: the catalog "
                       "\"atlas\" is not installed in root/usr/share/translations "
                       "[catalog]\n"));

    Files::makeDirectory(QStringLiteral("root/usr/share/translations"));
    QVERIFY(QFile::copy(QStringLiteral("/usr/share/translations/atlas_eng_en.qm"),
                        QStringLiteral("root/usr/share/translations/atlas_eng_en.qm")));
    const Result lacking = run(line);
    QCOMPARE(lacking.status, 1);
    QCOMPARE(
        lacking.output,
        QStringLiteral("root/usr/share/glimmera/quickactions/lamp.conf:2: warning: the catalog "
                       "\"atlas\" does not hold the text \"Lamp\" [text-id]\n"));

    // The root does not apply to named files.
    QVERIFY(QFile::copy(QStringLiteral("/usr/share/translations/maps_eng_en.qm"),
                        QStringLiteral("root/usr/share/translations/maps_eng_en.qm")));
    Files::write(QStringLiteral("other.conf"), goodAction);
    const Result named = run(line + " other.conf");
    QCOMPARE(named.status, 0);
    QCOMPARE(named.output, QString());
}

// When sources are checked, their catalogs are not compiled yet.
void TestMarloDefinitions::catalogsOfSources()
{
    Files::removeCatalog(QStringLiteral("maps_eng_en"));
    Files::write(QStringLiteral("lamp.conf"), goodAction);
    QByteArray line = "check --strict lamp.conf";
    QCOMPARE(run(line).status, 1);
    line += " --no-catalogs";
    QCOMPARE(run(line).output, QString());
    QCOMPARE(run(line).status, 0);

    // Installed catalogs, which may be older, are ignored, too.
    Files::installCatalog(QStringLiteral("maps_eng_en"));
    Files::write(QStringLiteral("lamp.conf"), goodAction + "[General]\ntitle=maps-new\n");
    QVERIFY(!run(line).output.contains(QStringLiteral("[text-id]")));

    Files::write(QStringLiteral("lamp.conf"),
                 "title=maps-title\ntranslation-catalog=maps_eng_en\npriority=1\n" + call);
    QCOMPARE(run(line).status, 1);
}

void TestMarloDefinitions::pathsAcrossFiles()
{
    Files::write(QStringLiteral("a.json"), goodWidget);
    Files::write(QStringLiteral("b.json"), "\n\n" + goodWidget);
    const Result result = run("check a.json b.json");
    QCOMPARE(result.status, 0);
    QCOMPARE(
        result.output,
        QStringLiteral("b.json:3: warning: the path \"/a.qml\" is also in a.json:1; only one of "
                       "the two widgets is listed [duplicate-path]\n"));
}

void TestMarloDefinitions::sameFileTwice()
{
    Files::write(QStringLiteral("f/a.json"), goodWidget);
    Files::write(QStringLiteral("f/a.conf"), "[x\n");
    Files::makeLink(QStringLiteral("f"), QStringLiteral("g"));
    const Result result = run("check f f/a.json g/a.conf ./f/../f/a.conf");
    QCOMPARE(result.status, 1);
    QCOMPARE(result.output.count(QLatin1Char('\n')), 1);
}

void TestMarloDefinitions::hostileNames()
{
    // A name must neither forge a line of the report nor control a terminal.
    const QString name = QStringLiteral("a\nb.conf:1: note\u001b[2J ä.json");
    Files::write(name, "{");
    for (const char *locale : {"C.UTF-8", "C", "POSIX"}) {
        const Result result = run("check .", locale);
        QCOMPARE(result.status, 1);
        QCOMPARE(result.output.count(QLatin1Char('\n')), 1);
        QVERIFY2(result.output.startsWith(
                     QStringLiteral("./a\\u000ab.conf:1: note\\u001b[2J ä.json:1: error: ")),
                 qPrintable(result.output));
    }
    // A file whose name is not UTF-8 is not found, and causes no crash.
    QFile file(QStringLiteral("plain.conf"));
    QVERIFY(file.open(QIODevice::WriteOnly));
    QCOMPARE(::rename("plain.conf", "bad\xff.conf"), 0);
    QVERIFY(run("check .").status > 0);
    QCOMPARE(::unlink("bad\xff.conf"), 0);
}

void TestMarloDefinitions::hostileFiles_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QString>("suffix");
    for (const char *kind :
         {"pipe", "link to a pipe", "endless device", "directory", "huge", "one long line",
          "many entries", "many objects", "no text", "zeroes", "deep"}) {
        for (const char *suffix : {"conf", "json"}) {
            QTest::addRow("%s.%s", kind, suffix)
                << QString::fromLatin1(kind) << QString::fromLatin1(suffix);
        }
    }
}

void TestMarloDefinitions::hostileFiles()
{
    QFETCH(QString, kind);
    QFETCH(QString, suffix);
    const QString name = QStringLiteral("hostile.") + suffix;
    constexpr int large = 2 * 1024 * 1024;
    if (kind == QStringLiteral("pipe")) {
        Files::makePipe(name);
    } else if (kind == QStringLiteral("link to a pipe")) {
        Files::makePipe(QStringLiteral("pipe"));
        Files::makeLink(QStringLiteral("pipe"), name);
    } else if (kind == QStringLiteral("endless device")) {
        Files::makeLink(QStringLiteral("/dev/zero"), name);
    } else if (kind == QStringLiteral("directory")) {
        Files::makeDirectory(name + QStringLiteral("/x"));
    } else if (kind == QStringLiteral("huge")) {
        Files::write(name, "{}");
        QVERIFY(QFile::resize(name, 1LL << 40));
    } else if (kind == QStringLiteral("one long line")) {
        Files::write(name, QByteArray(large, 'x'));
    } else if (kind == QStringLiteral("many entries")) {
        Files::write(name, R"({"widgets":[)" + QByteArray("0,").repeated(large / 2) + "0]}");
    } else if (kind == QStringLiteral("many objects")) {
        Files::write(name, R"({"widgets":[)" + QByteArray("{},").repeated(large) + "0]}");
    } else if (kind == QStringLiteral("no text")) {
        QByteArray content;
        for (int i = 0; i < 100000; ++i) {
            content += char(uint(i) * 2654435761U >> 13);
        }
        Files::write(name, content);
    } else if (kind == QStringLiteral("zeroes")) {
        Files::write(name, QByteArray(100000, '\0'));
    } else {
        Files::write(name, QByteArray(100000, '['));
    }
    const Result result = run("check " + name.toUtf8());
    // A directory with the name of a widgets file is checked as a directory.
    const bool isClean = kind == QStringLiteral("directory") && suffix == QStringLiteral("json");
    QCOMPARE(result.status, isClean ? 0 : 1);
    QCOMPARE(result.errors, QString());
    QVERIFY(result.output.count(QLatin1Char('\n')) <= 3 * 1001);
    QVERIFY(run("show " + name.toUtf8()).status >= 0);
    if (kind == QStringLiteral("directory")) {
        Files::remove(name);
    }
}

void TestMarloDefinitions::unreadableFile()
{
    Files::write(QStringLiteral("a.conf"), goodAction);
    Files::write(QStringLiteral("a.json"), goodWidget);
    QCOMPARE(::chmod("a.conf", 0), 0);
    QCOMPARE(::chmod("a.json", 0), 0);
    if (::access("a.conf", R_OK) == 0) {
        QSKIP("who runs this may read everything");
    }
    const Result result = run("check .");
    QCOMPARE(result.status, 1);
    QCOMPARE(result.output,
             lines({QStringLiteral("./a.conf:1: error: the file cannot be opened [unreadable]"),
                    QStringLiteral("./a.json:1: error: the file cannot be opened [unreadable]")}));
}

void TestMarloDefinitions::boundedFindings()
{
    // A thousand warnings do not hide an error.
    Files::write(
        QStringLiteral("a.conf"),
        QByteArray("x=1\n").repeated(1) +
            [] {
                QByteArray content;
                for (int i = 0; i < 3000; ++i) {
                    content += "key-" + QByteArray::number(i) + "=1\n";
                }
                return content;
            }()
            + "no key\n" + goodAction);
    const Result result = run("check a.conf");
    QCOMPARE(result.status, 1);
    QCOMPARE(result.output.count(QStringLiteral(": warning: ")), 1001);
    QCOMPARE(result.output.count(QStringLiteral("[too-many]")), 1);
    QCOMPARE(result.output.count(QStringLiteral(": error: ")), 1);
}

void TestMarloDefinitions::outputThatCannotBeWritten()
{
    Files::write(QStringLiteral("a.conf"), "x\n");
    QProcess process;
    process.setStandardOutputFile(QStringLiteral("/dev/full"));
    process.start(QStringLiteral(PROGRAM), {QStringLiteral("check"), QStringLiteral("a.conf")});
    QVERIFY(process.waitForFinished(timeout));
    QCOMPARE(process.exitStatus(), QProcess::NormalExit);
    QCOMPARE(process.exitCode(), 2);
}

void TestMarloDefinitions::list()
{
    Files::installCatalog(QStringLiteral("maps_eng_en"));
    Files::write(quickActions + QStringLiteral("a.conf"), "title=A\npriority=20\n" + call);
    Files::write(quickActions + QStringLiteral("b.conf"), "title=B\npriority=10\n" + call);
    Files::write(quickActions + QStringLiteral("c.conf"),
                 "title=maps-title\ntranslation-catalog=maps\npriority=1\n" + call);
    Files::write(quickActions + QStringLiteral("d.conf"), "title=D\n" + call);
    Files::write(eventsWidgets + QStringLiteral("w.json"),
                 R"({ "widgets": [
        { "path": "/x.qml", "title": "X", "order": 2, "default_enabled": true },
        { "path": "/y.qml", "title": "Y", "order": 1, "available_path": "/nowhere" } ] })");
    MGConfItem enabled(QStringLiteral("/desktop/glimmera-marlo-home/events_screen_actions"));
    MGConfItem blocked(QStringLiteral("/desktop/glimmera-marlo-home/blocked_actions"));
    enabled.set(QStringList(quickActions + QStringLiteral("c.conf")));
    blocked.set(QStringList(quickActions + QStringLiteral("d.conf")));

    const QString expected = lines(
        {QStringLiteral("quick actions: 3"),
         QStringLiteral("  enabled   ") + quickActions + QStringLiteral("c.conf  Maps"),
         QStringLiteral("  disabled  ") + quickActions + QStringLiteral("b.conf  B"),
         QStringLiteral("  disabled  ") + quickActions + QStringLiteral("a.conf  A"),
         QStringLiteral("events widgets: 2"), QStringLiteral("  disabled  unavailable  /y.qml  Y"),
         QStringLiteral("  enabled   available    /x.qml  X")});
    // dconf stores in the background.
    QTRY_COMPARE(run("list").output, expected);
    QCOMPARE(run("list").status, 0);
    enabled.unset();
    blocked.unset();
}

void TestMarloDefinitions::listWithoutAnything()
{
    const Result result = run("list");
    QCOMPARE(result.status, 0);
    QCOMPARE(result.output,
             lines({QStringLiteral("quick actions: 0"), QStringLiteral("events widgets: 0")}));
    QCOMPARE(run("list --catalogs").output, QString());
}

void TestMarloDefinitions::listCatalogs()
{
    Files::installCatalog(QStringLiteral("maps_eng_en"));
    Files::installCatalog(QStringLiteral("maps-de"));
    Files::installCatalog(QStringLiteral("maps-fi"));
    Files::write(quickActions + QStringLiteral("a.conf"), "translation-catalog=maps\n");
    Files::write(eventsWidgets + QStringLiteral("w.json"),
                 R"({ "translation_catalog": "nowhere" })");
    const Result result = run("list --catalogs", "fi_FI.UTF-8");
    QCOMPARE(result.status, 0);
    QCOMPARE(result.output,
             lines({QStringLiteral("maps"),
                    QStringLiteral("  engineering English: /usr/share/translations/maps_eng_en.qm"),
                    QStringLiteral("  current locale, fi_FI: /usr/share/translations/maps-fi.qm"),
                    QStringLiteral("  de: /usr/share/translations/maps-de.qm"),
                    QStringLiteral("  fi: /usr/share/translations/maps-fi.qm"),
                    QStringLiteral("nowhere"), QStringLiteral("  engineering English: none"),
                    QStringLiteral("  current locale, fi_FI: none")}));
}

void TestMarloDefinitions::showQuickAction()
{
    Files::write(QStringLiteral("a.conf"), "title=Lamp\nicon=a,b\nrequires-package=lamp\n" + call);
    const Result result = run("show a.conf");
    QCOMPARE(result.status, 0);
    QCOMPARE(result.output,
             lines({QStringLiteral("title: Lamp"), QStringLiteral("translation catalog: "),
                    QStringLiteral("icon: a list, which is not a text: a, b"),
                    QStringLiteral("priority: none"), QStringLiteral("required package: lamp"),
                    QStringLiteral("busctl --user -- call org.example.lamp /lamp org.example.Lamp "
                                   "toggle")}));

    Files::write(QStringLiteral("b.conf"), "title=Lamp\n");
    const Result none = run("show b.conf");
    QCOMPARE(none.status, 0);
    QVERIFY(
        none.output.endsWith(QStringLiteral("\n# cannot be sent: The call names no service\n")));
}

void TestMarloDefinitions::showSendsTheSameCall_data()
{
    QTest::addColumn<QByteArray>("arguments");
    QTest::addColumn<QVariantList>("expected");
    QTest::newRow("none") << QByteArray() << QVariantList();
    QTest::newRow("texts and a list")
        << QByteArray("[remote-arguments]\nsize=5\n1\\argument=a b\n2\\argument=\n"
                      "3\\argument=\"it's $HOME `x` \\\\ \\\"q\\\"\"\n4\\argument=x, y z\n"
                      "5\\argument=-1\n")
        << QVariantList{QStringLiteral("a b"), QString(), QStringLiteral("it's $HOME `x` \\ \"q\""),
                        QStringList{QStringLiteral("x"), QStringLiteral("y z")},
                        QStringLiteral("-1")};
}

void TestMarloDefinitions::showSendsTheSameCall()
{
    QFETCH(QByteArray, arguments);
    QFETCH(QVariantList, expected);
    RecordingService lamp(QDBusConnection::SessionBus, QStringLiteral("org.example.lamp"));
    Files::write(QStringLiteral("a.conf"), goodAction + arguments);
    const QString output = run("show a.conf").output;
    const QString line = output.trimmed().section(QLatin1Char('\n'), -1);

    QProcess shell;
    shell.start(QStringLiteral("/bin/sh"), {QStringLiteral("-c"), line});
    QTRY_COMPARE_WITH_TIMEOUT(shell.state(), QProcess::NotRunning, timeout);
    QCOMPARE(shell.exitCode(), 0);
    QCOMPARE(lamp.calls().size(), 1);
    const QDBusMessage message = lamp.calls().constFirst();
    QCOMPARE(message.path(), QStringLiteral("/lamp"));
    QCOMPARE(message.interface(), QStringLiteral("org.example.Lamp"));
    QCOMPARE(message.member(), QStringLiteral("toggle"));
    QCOMPARE(message.arguments(), expected);
}

void TestMarloDefinitions::showEventsWidgets()
{
    Files::write(QStringLiteral("w.json"), R"({ "translation_catalog": "maps", "widgets": [ {
        "path": "/x.qml", "title": "X", "translation_id": "t", "description_id": "d",
        "icon": "i", "order": "2", "default_enabled": true, "available_path": "/nowhere" }, 5 ] })");
    const Result result = run("show w.json");
    QCOMPARE(result.status, 0);
    QCOMPARE(
        result.output,
        lines({QStringLiteral("translation catalog: maps"), QString(),
               QStringLiteral("path: /x.qml"), QStringLiteral("title: X"),
               QStringLiteral("title's identifier: t"),
               QStringLiteral("description's identifier: d"), QStringLiteral("icon: i"),
               QStringLiteral("order: -1"), QStringLiteral("enabled by default: true"),
               QStringLiteral("available path: /nowhere"), QStringLiteral("available: false")}));
}

void TestMarloDefinitions::showNothing()
{
    Files::write(QStringLiteral("a.txt"), "title=Lamp\n");
    Files::write(QStringLiteral("a.conf"), "[x\n");
    Files::write(QStringLiteral("a.json"), "[]");
    for (const char *name : {"a.txt", "a.conf", "a.json", "missing.json", "missing.conf"}) {
        const Result result = run(QByteArray("show ") + name);
        QCOMPARE(result.status, 2);
        QCOMPARE(result.output, QString());
        QCOMPARE(
            result.errors,
            QStringLiteral("marlo-definitions: no model reads \"%1\"\n").arg(QLatin1String(name)));
    }
}

QTEST_GUILESS_MAIN(TestMarloDefinitions)

#include "tst_marlodefinitions.moc"
