// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The command as its users run it.

#include "files.h"
#include "loggedtest.h"
#include "mgconfitem.h"
#include "patience.h"
#include "simulator/recordingservice.h"
#include "texts.h"

#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>
#include <QTemporaryDir>
#include <QtTest>

#include <functional>

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
    void showInALanguage();
    void showNothing();

private:
    std::unique_ptr<QTemporaryDir> m_directory;
};

namespace {

const QString glimmera = "/usr/share/glimmera"_s;
const QString quickActions = "/usr/share/glimmera/quickactions/"_s;
const QString eventsWidgets = "/usr/share/glimmera/eventswidgets/"_s;

// Makes a file of the given name.
using Make = std::function<void(const QString &)>;

const QByteArray call = "remote-service=org.example.lamp\nremote-path=/lamp\n"
                        "remote-interface=org.example.Lamp\nremote-method=toggle\n";
const QByteArray goodAction = "title=maps-title\ntranslation-catalog=maps\npriority=1\n" + call;
const QByteArray goodWidget =
    R"({ "translation_catalog": "maps", "widgets": [ { "path": "/a.qml", )"
    R"("title": "A", "order": 1 } ] })";

const QByteArray goodWidgetWithTexts =
    R"({ "translation_catalog": "maps", "widgets": [ { "path": "/a.qml", "title": "A", "order": 1, )"
    R"("translation_id": "maps-title", "description_id": "maps-english" } ] })";

void write(const char *name, const QByteArray &content)
{
    Files::write(QString::fromLatin1(name), content);
}

struct Result {
    int status;
    QByteArray output = {};
    QByteArray errors = {};

    bool operator==(const Result &other) const
    {
        return status == other.status && output == other.output && errors == other.errors;
    }
};

char *toString(const Result &result)
{
    return qstrdup(QByteArray::number(result.status) + '\n' + result.output + result.errors);
}

// Runs a command line whose words are separated by spaces. The program must not crash.
Result run(const QByteArray &line, const char *locale = "C.UTF-8")
{
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert("LC_ALL"_s, QLatin1String(locale));
    process.setProcessEnvironment(environment);
    process.start(QLatin1String(PROGRAM),
                  QString::fromUtf8(line).split(QLatin1Char(' '), Qt::SkipEmptyParts));
    if (!process.waitForFinished(patience) || process.exitStatus() != QProcess::NormalExit) {
        process.kill();
        process.waitForFinished();
        QTest::qFail("the program crashed or did not end", __FILE__, __LINE__);
        return {-1};
    }
    return {process.exitCode(), process.readAllStandardOutput(), process.readAllStandardError()};
}

} // namespace

Q_DECLARE_METATYPE(Make)

void TestMarloDefinitions::init()
{
    LoggedTest::init();
    m_directory = std::make_unique<QTemporaryDir>();
    QVERIFY(QDir::setCurrent(m_directory->path()));
    Files::installCatalog("maps_eng_en"_s);
}

void TestMarloDefinitions::cleanup()
{
    LoggedTest::cleanup();
    QVERIFY(QDir::setCurrent("/"_s));
    m_directory.reset();
    Files::remove(glimmera);
    Files::remove("/usr/share/translations"_s);
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
    write("lamp.conf", content);
    QTEST(run("check lamp.conf").status, "status");
    QTEST(run("check lamp.conf --strict").status, "strictStatus");
    // A missing file is a failure, whatever else is checked.
    const QByteArray output = run("check lamp.conf").output;
    QCOMPARE(run("check lamp.conf missing.conf"),
             (Result{2, output, "marlo-definitions: there is no \"missing.conf\"\n"}));
}

void TestMarloDefinitions::wrongUsage_data()
{
    QTest::addColumn<QByteArray>("line");
    for (const char *line :
         {"", "verify", "check --verbose a.conf", "check --format xml .", "check --catalogs .",
          "list --strict", "list --format json", "list a.conf", "show", "show a.conf b.conf",
          "show --root / a.conf", "show --locale xx a.conf", "list --locale fi", "check --root",
          "check --root /nowhere", "--strict"}) {
        QTest::newRow(line) << QByteArray(line);
    }
}

void TestMarloDefinitions::wrongUsage()
{
    QFETCH(QByteArray, line);
    const Result result = run(line);
    QCOMPARE(result.status, 2);
    QCOMPARE(result.output, QByteArray());
    QVERIFY(result.errors.startsWith("marlo-definitions: "));
    QCOMPARE(result.errors.count('\n'), 1);
}

void TestMarloDefinitions::helpAndVersion()
{
    const Result help = run("--help");
    QCOMPARE(help.status, 0);
    QVERIFY(help.output.contains("check [--strict]"));
    const Result version = run("--version");
    QCOMPARE(version.status, 0);
    QVERIFY(version.output.startsWith("marlo-definitions "));
}

void TestMarloDefinitions::jsonFormat()
{
    write("lamp.conf", "x=1\n" + goodAction + "title=\"Lämp\"\n");
    const Result result = run("check --format json lamp.conf");
    QCOMPARE(result.status, 1);
    const QJsonArray findings = QJsonDocument::fromJson(result.output).array();
    QCOMPARE(findings.size(), 4);
    QCOMPARE(findings.at(0).toObject(),
             (QJsonObject{{"file"_s, "lamp.conf"_s},
                          {"line"_s, 1},
                          {"severity"_s, "warning"_s},
                          {"rule"_s, "unknown-key"_s},
                          {"text"_s, "unknown key \"x\""_s}}));
    QCOMPARE(findings.at(2).toObject().value("rule"_s).toString(), "encoding"_s);

    write("lamp.conf", goodAction);
    const Result clean = run("check --format json lamp.conf");
    QCOMPARE(clean.status, 0);
    QVERIFY(QJsonDocument::fromJson(clean.output).isArray());
}

void TestMarloDefinitions::directory()
{
    write("f/b.conf", "b\n" + goodAction);
    write("f/A.CONF", "a\n" + goodAction);
    write("f/.hidden.conf", "h\n");
    write("f/readme.txt", "x");
    write("f/w.json", "[]");
    write("f/deeper/c.conf", "c\n");
    Files::makeDirectory("f/directory.conf"_s);
    Files::makeDirectory("f/directory.json"_s);
    Files::makeLink("nowhere.conf"_s, "f/link.conf"_s);
    const Result expected{
        1,
        "f/A.CONF:1: error: this line is not a key and is ignored [no-key]\n"
        "f/b.conf:1: error: this line is not a key and is ignored [no-key]\n"
        "f/directory.conf:1: error: this is not a regular file [unreadable]\n"
        "f/w.json:1: error: this is not an object: nothing of the file is read [json]\n"};
    QCOMPARE(run("check f"), expected);
    QCOMPARE(run("check f/"), expected);

    const Result other = run("check f/readme.txt");
    QCOMPARE(other.status, 1);
    QVERIFY(other.output.contains("[file-name]"));
}

void TestMarloDefinitions::installedDefinitions()
{
    QCOMPARE(
        run("check"),
        (Result{2, {}, "marlo-definitions: there are no directories of definitions in \"/\"\n"}));
    // One of the two directories is enough.
    Files::write(eventsWidgets + "lamp.json"_s, "{");
    const Result result = run("check");
    QCOMPARE(result.status, 1);
    QVERIFY(result.output.startsWith(eventsWidgets.toUtf8() + "lamp.json:1: error:"));
}

void TestMarloDefinitions::root()
{
    // These are on this machine, and not below the root: they must be ignored.
    Files::installCatalog("atlas_eng_en"_s);
    Files::write(quickActions + "bad.conf"_s, "x\n");
    write("root/usr/share/glimmera/quickactions/lamp.conf",
          "translation-catalog=atlas\ntitle=Lamp\npriority=1\n" + call);
    QCOMPARE(run("check --strict --root root"),
             (Result{1,
                     "root/usr/share/glimmera/quickactions/lamp.conf:1: warning: the catalog "
                     "\"atlas\" is not installed in root/usr/share/translations [catalog]\n"}));

    // If files are named, only the catalogs of the root are used.
    write("lamp.conf", goodAction);
    QCOMPARE(run("check --strict --root root lamp.conf").status, 1);
    Files::makeDirectory("root/usr/share/translations"_s);
    QVERIFY(QFile::copy("/usr/share/translations/maps_eng_en.qm"_s,
                        "root/usr/share/translations/maps_eng_en.qm"_s));
    QCOMPARE(run("check --strict --root root lamp.conf"), Result{0});
}

// When sources are checked, their catalogs are not compiled yet.
void TestMarloDefinitions::catalogsOfSources()
{
    Files::removeCatalog("maps_eng_en"_s);
    write("lamp.conf", goodAction);
    // Nor have they the permissions of installed files.
    QVERIFY(QFile::setPermissions("lamp.conf"_s, QFile::ReadOwner | QFile::WriteOwner));
    QCOMPARE(run("check --strict lamp.conf").status, 1);
    const QByteArray line = "check --strict lamp.conf --no-catalogs";
    QCOMPARE(run(line), Result{0});

    // Installed catalogs, which may be older, are ignored, too.
    Files::installCatalog("maps_eng_en"_s);
    write("lamp.conf", goodAction + "[General]\ntitle=maps-new\n");
    QVERIFY(!run(line).output.contains("[text-id]"));

    write("lamp.conf", "title=maps-title\ntranslation-catalog=maps_eng_en\npriority=1\n" + call);
    QCOMPARE(run(line).status, 1);
}

void TestMarloDefinitions::pathsAcrossFiles()
{
    write("a.json", goodWidget);
    write("b.json", "\n\n" + goodWidget);
    QCOMPARE(run("check a.json b.json"),
             (Result{0,
                     "b.json:3: warning: the path \"/a.qml\" is also in a.json:1; only one of the "
                     "two widgets is listed [duplicate-path]\n"}));
}

void TestMarloDefinitions::sameFileTwice()
{
    write("f/a.json", goodWidget);
    write("f/a.conf", "[x\n");
    Files::makeLink("f"_s, "g"_s);
    const Result result = run("check f f/a.json g/a.conf ./f/../f/a.conf");
    QCOMPARE(result.status, 1);
    QCOMPARE(result.output.count('\n'), 1);
}

void TestMarloDefinitions::hostileNames()
{
    // A name must neither forge a line of the report nor control a terminal.
    Files::write("a\nb.conf:1: note\u001b[2J ä.json"_s, "{");
    for (const char *locale : {"C.UTF-8", "C", "POSIX"}) {
        const Result result = run("check .", locale);
        QCOMPARE(result.status, 1);
        QCOMPARE(result.output.count('\n'), 1);
        QVERIFY2(result.output.startsWith("./a\\u000ab.conf:1: note\\u001b[2J ä.json:1: error: "),
                 result.output.constData());
    }
    // A file whose name is not UTF-8 is not found, and causes no crash.
    write("plain.conf", {});
    QCOMPARE(::rename("plain.conf", "bad\xff.conf"), 0);
    QVERIFY(run("check .").status > 0);
    QCOMPARE(::unlink("bad\xff.conf"), 0);
}

void TestMarloDefinitions::hostileFiles_data()
{
    QTest::addColumn<QString>("name");
    QTest::addColumn<Make>("make");

    const auto row = [](const char *kind, const Make &make) {
        for (const char *name : {"hostile.conf", "hostile.json"}) {
            QTest::addRow("%s %s", name, kind) << name << make;
        }
    };
    const auto content = [](const QByteArray &text) -> Make {
        return [=](const QString &name) { Files::write(name, text); };
    };
    row("pipe", Files::makePipe);
    row("link to a pipe", [](const QString &name) {
        Files::makePipe("pipe"_s);
        Files::makeLink("pipe"_s, name);
    });
    row("endless device", [](const QString &name) { Files::makeLink("/dev/zero"_s, name); });
    row("directory", [](const QString &name) { Files::makeDirectory(name + "/x"_s); });
    row("huge", [](const QString &name) { Files::makeSparse(name, 1LL << 40); });
    constexpr int large = 2 * 1024 * 1024;
    row("one long line", content(QByteArray(large, 'x')));
    row("many entries", content("{\"widgets\":[" + QByteArray("0,").repeated(large / 2) + "0]}"));
    row("many objects", content("{\"widgets\":[" + QByteArray("{},").repeated(large) + "0]}"));
    row("zeroes", content(QByteArray(100000, '\0')));
    row("deep", content(QByteArray(100000, '[')));
}

void TestMarloDefinitions::hostileFiles()
{
    QFETCH(QString, name);
    QFETCH(Make, make);
    make(name);
    const Result result = run("check " + name.toUtf8());
    // A directory with the name of a widgets file is checked as a directory.
    QCOMPARE(result.status, QFileInfo(name).isDir() && name.endsWith("json"_s) ? 0 : 1);
    QCOMPARE(result.errors, QByteArray());
    QVERIFY(result.output.count('\n') <= 3 * 1001);
    QVERIFY(run("show " + name.toUtf8()).status >= 0);
}

void TestMarloDefinitions::unreadableFile()
{
    write("a.conf", goodAction);
    write("a.json", goodWidget);
    QCOMPARE(::chmod("a.conf", 0), 0);
    QCOMPARE(::chmod("a.json", 0), 0);
    if (::access("a.conf", R_OK) == 0) {
        QSKIP("the user who runs this may read everything");
    }
    QCOMPARE(run("check ."),
             (Result{1,
                     "./a.conf:1: error: the file cannot be opened [unreadable]\n"
                     "./a.json:1: error: the file cannot be opened [unreadable]\n"}));
}

void TestMarloDefinitions::boundedFindings()
{
    // A thousand warnings do not hide an error.
    QByteArray content = "x=1\n";
    for (int i = 0; i < 3000; ++i) {
        content += "key-" + QByteArray::number(i) + "=1\n";
    }
    write("a.conf", content + "no key\n" + goodAction);
    const Result result = run("check a.conf");
    QCOMPARE(result.status, 1);
    QCOMPARE(result.output.count(": warning: "), 1001);
    QCOMPARE(result.output.count("[too-many]"), 1);
    QCOMPARE(result.output.count(": error: "), 1);
}

void TestMarloDefinitions::outputThatCannotBeWritten()
{
    write("a.conf", "x\n");
    QProcess process;
    process.setStandardOutputFile("/dev/full"_s);
    process.start(QLatin1String(PROGRAM), {"check"_s, "a.conf"_s});
    QVERIFY(process.waitForFinished(patience));
    QCOMPARE(process.exitStatus(), QProcess::NormalExit);
    QCOMPARE(process.exitCode(), 2);
}

void TestMarloDefinitions::list()
{
    Files::write(quickActions + "a.conf"_s, "title=A\npriority=20\n" + call);
    Files::write(quickActions + "b.conf"_s, "title=B\npriority=10\n" + call);
    Files::write(quickActions + "c.conf"_s,
                 "title=maps-title\ntranslation-catalog=maps\npriority=1\n" + call);
    Files::write(quickActions + "d.conf"_s, "title=D\n" + call);
    Files::write(eventsWidgets + "w.json"_s,
                 R"({ "widgets": [
        { "path": "/x.qml", "title": "X", "order": 2, "default_enabled": true },
        { "path": "/y.qml", "title": "Y", "order": 1, "available_path": "/nowhere" } ] })");
    MGConfItem enabled("/desktop/glimmera-marlo-home/events_screen_actions"_s);
    MGConfItem blocked("/desktop/glimmera-marlo-home/blocked_actions"_s);
    enabled.set(QStringList(quickActions + "c.conf"_s));
    blocked.set(QStringList(quickActions + "d.conf"_s));

    const Result expected{0,
                          "quick actions: 3\n"
                          "  enabled   /usr/share/glimmera/quickactions/c.conf  Maps\n"
                          "  disabled  /usr/share/glimmera/quickactions/b.conf  B\n"
                          "  disabled  /usr/share/glimmera/quickactions/a.conf  A\n"
                          "events widgets: 2\n"
                          "  disabled  unavailable  /y.qml  Y\n"
                          "  enabled   available    /x.qml  X\n"};
    // dconf stores values in the background.
    TRY_COMPARE(run("list"), expected);
    enabled.unset();
    blocked.unset();
}

void TestMarloDefinitions::listWithoutAnything()
{
    QCOMPARE(run("list"), (Result{0, "quick actions: 0\nevents widgets: 0\n"}));
    QCOMPARE(run("list --catalogs"), Result{0});
}

void TestMarloDefinitions::listCatalogs()
{
    Files::installCatalog("maps-de"_s);
    Files::installCatalog("maps-fi"_s);
    Files::write(quickActions + "a.conf"_s, "translation-catalog=maps\n");
    Files::write(eventsWidgets + "w.json"_s, R"({ "translation_catalog": "nowhere" })");
    // The models load neither of these.
    Files::write("/usr/share/translations/maps-sv.qm"_s, "damaged");
    Files::write(quickActions + "b.conf"_s, "translation-catalog=../translations/maps\n");
    QCOMPARE(run("list --catalogs", "fi_FI.UTF-8"),
             (Result{0,
                     "maps\n"
                     "  engineering English: /usr/share/translations/maps_eng_en.qm\n"
                     "  current locale, fi_FI: /usr/share/translations/maps-fi.qm\n"
                     "  de: /usr/share/translations/maps-de.qm\n"
                     "  fi: /usr/share/translations/maps-fi.qm\n"
                     "nowhere\n"
                     "  engineering English: none\n"
                     "  current locale, fi_FI: none\n"}));
    QVERIFY(run("list --catalogs", "sv_SE.UTF-8")
                .output.contains("  current locale, sv_SE: none\n"
                                 "  de: "));
}

void TestMarloDefinitions::showQuickAction()
{
    write("a.conf", "title=Lamp\nicon=a,b\nrequires-package=lamp\n" + call);
    QCOMPARE(run("show a.conf"),
             (Result{0,
                     "title: Lamp\n"
                     "title's identifier: Lamp\n"
                     "translation catalog: \n"
                     "icon: a list, which is not a text: a, b\n"
                     "priority: none\n"
                     "required package: lamp\n"
                     "busctl --user -- call org.example.lamp /lamp org.example.Lamp toggle\n"}));

    write("b.conf", "title=Lamp\n");
    const Result none = run("show b.conf");
    QCOMPARE(none.status, 0);
    QVERIFY(none.output.endsWith("\n# cannot be sent: The call names no service\n"));
}

void TestMarloDefinitions::showSendsTheSameCall_data()
{
    QTest::addColumn<QByteArray>("arguments");
    QTest::addColumn<QVariantList>("expected");
    QTest::newRow("none") << QByteArray() << QVariantList();
    QTest::newRow("texts and a list")
        << QByteArray("[remote-arguments]\nsize=6\n1\\argument=a b\n2\\argument=\n"
                      "3\\argument=\"it's $HOME `x` \\\\ \\\"q\\\"\"\n4\\argument=x, y z\n"
                      "5\\argument=-1\n6\\argument=@ByteArray(\\xe9)\n")
        << QVariantList{
               "a b"_s, QString(),         "it's $HOME `x` \\ \"q\""_s, QStringList{"x"_s, "y z"_s},
               "-1"_s,  QByteArray("\xe9")};
}

void TestMarloDefinitions::showSendsTheSameCall()
{
    QFETCH(QByteArray, arguments);
    QFETCH(QVariantList, expected);
    RecordingService lamp(QDBusConnection::SessionBus, "org.example.lamp"_s);
    write("a.conf", goodAction + arguments);
    const QByteArray output = run("show a.conf").output.trimmed();
    const QString line = QString::fromUtf8(output.mid(output.lastIndexOf('\n') + 1));

    QProcess shell;
    shell.start("/bin/sh"_s, {"-c"_s, line});
    TRY_COMPARE(shell.state(), QProcess::NotRunning);
    QCOMPARE(shell.exitCode(), 0);
    QCOMPARE(lamp.calls().size(), 1);
    const QDBusMessage message = lamp.calls().constFirst();
    QCOMPARE(message.path(), "/lamp"_s);
    QCOMPARE(message.interface(), "org.example.Lamp"_s);
    QCOMPARE(message.member(), "toggle"_s);
    QCOMPARE(message.arguments(), expected);
}

void TestMarloDefinitions::showEventsWidgets()
{
    write("w.json", R"({ "translation_catalog": "maps", "widgets": [ {
        "path": "/x.qml", "title": "X", "translation_id": "t", "description_id": "maps-title",
        "icon": "i", "order": "2", "default_enabled": true, "available_path": "/nowhere" }, 5 ] })");
    QCOMPARE(run("show w.json"),
             (Result{0,
                     "translation catalog: maps\n"
                     "\n"
                     "path: /x.qml\n"
                     "title: X\n"
                     "title's identifier: t\n"
                     "untranslated title: X\n"
                     "description: Maps\n"
                     "description's identifier: maps-title\n"
                     "icon: i\n"
                     "order: -1\n"
                     "enabled by default: true\n"
                     "available path: /nowhere\n"
                     "available: false\n"}));
}

void TestMarloDefinitions::showInALanguage()
{
    Files::installCatalogs({"maps-fi"_s, "settings-system_eng_en"_s, "settings-system-fi"_s});
    write("w.json", goodWidgetWithTexts);
    const QByteArray widget = run("show --locale fi w.json").output;
    QVERIFY2(widget.contains("\ntitle: Kartat\n"), widget.constData());
    QVERIFY(widget.contains("\ndescription: Maps, English only\n"));

    write("a.conf", goodAction);
    QVERIFY(run("show --locale fi_FI a.conf").output.startsWith("title: Kartat\n"));
    QVERIFY(run("show a.conf").output.startsWith("title: Maps\n"));
    QVERIFY(run("show a.conf", "fi_FI.UTF-8").output.startsWith("title: Kartat\n"));
    // The catalog of the settings pages is installed, too.
    write("b.conf", "title=settings-test-both\n" + call);
    QVERIFY(run("show --locale fi b.conf").output.startsWith("title: Molemmat\n"));
    QVERIFY(run("show b.conf").output.startsWith("title: Both, engineering English\n"));
}

void TestMarloDefinitions::showNothing()
{
    write("a.txt", "title=Lamp\n");
    write("a.conf", "[x\n");
    write("a.json", "[]");
    for (const QByteArray name : {"a.txt", "a.conf", "a.json", "missing.json", "missing.conf"}) {
        QCOMPARE(run("show " + name),
                 (Result{2, {}, "marlo-definitions: no model reads \"" + name + "\"\n"}));
    }
}

QTEST_GUILESS_MAIN(TestMarloDefinitions)

#include "tst_marlodefinitions.moc"
