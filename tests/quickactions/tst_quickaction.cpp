// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The reader of definition files and the calls that they describe.

#include "files.h"
#include "loggedtest.h"
#include "quickactions/quickaction.h"
#include "simulator/recordingservice.h"
#include "usedupdescriptors.h"

#include <QtTest>

#include <unistd.h>

using Action = QuickAction;
using Answer = RecordingService::Answer;

class TestQuickAction : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void keepsPathAndState();
    void readsKeys_data();
    void readsKeys();
    void readsArguments_data();
    void readsArguments();
    void readsOfLatin1();
    void hugeArraysEnd();
    void ignoresOtherGroups();
    void questions();
    void missingKeysAreEmpty();
    void listsAreNoText();
    void priority_data();
    void priority();
    void unreadable_data();
    void unreadable();
    void cannotBeOpened();
    void withoutAStandardInput();
    void leavesNothingOpen();
    void shorterThanItSays();
    void brokenFilesStayBroken_data();
    void brokenFilesStayBroken();
    void packedValues_data();
    void packedValues();
    void atSigns_data();
    void atSigns();
    void endsInABackslash();
    void hugeFile();
    void vanished();
    void linesThatAreNoKeys();
    void comparison();
    void copies();

    void sendsTheCall();
    void argumentsStayAsRead();
    void noArguments_data();
    void noArguments();
    void refusesBeforeSending_data();
    void refusesBeforeSending();
    void valuesMayLookLikePlaceholders();
    void mostArgumentsThatCanBeSent();
    void deliversTheError();

private:
    QString write(const QByteArray &content) const;
    QDBusMessage send(const QByteArray &content) const;

    QString m_path;
};

namespace {

constexpr char unreadableWarning[] = "warning [default] Unable to open action file";

const QByteArray lampCall = "remote-service=org.example.lamp\n"
                            "remote-path=/lamp\n"
                            "remote-interface=org.example.Lamp\n"
                            "remote-method=toggle\n";

QByteArray arguments(int count)
{
    QByteArray section = "[remote-arguments]\nsize=" + QByteArray::number(count) + '\n';
    for (int i = 1; i <= count; ++i) {
        section += QByteArray::number(i) + "\\argument=value " + QByteArray::number(i) + '\n';
    }
    return section;
}

class Receiver : public QObject
{
    Q_OBJECT

public:
    int replies = 0;
    QList<QDBusError> errors;
    QList<QDBusMessage> sent;

public Q_SLOTS:
    void reply() { ++replies; }
    void error(const QDBusError &error, const QDBusMessage &message)
    {
        errors.append(error);
        sent.append(message);
    }
};

} // namespace

QString TestQuickAction::write(const QByteArray &content) const
{
    Files::write(m_path, content);
    return m_path;
}

// The one call that a definition sends. Sending does not wait for the reply.
QDBusMessage TestQuickAction::send(const QByteArray &content) const
{
    const RecordingService lamp(QDBusConnection::SessionBus, QStringLiteral("org.example.lamp"));
    write(content);
    Receiver receiver;
    const bool isSent =
        Action(m_path, true)
            .trigger(&receiver, SLOT(reply()), SLOT(error(QDBusError, QDBusMessage)));
    const auto compare = [&] {
        QVERIFY(isSent);
        QCOMPARE(lamp.calls().size(), 0);
        QTRY_COMPARE(receiver.replies, 1);
        QCOMPARE(lamp.calls().size(), 1);
        QCOMPARE(receiver.errors.size(), 0);
    };
    compare();
    return lamp.calls().value(0);
}

void TestQuickAction::init()
{
    // A name for each row of test data: QSettings remembers a file by its name, size and time, and
    // the next row may write as many bytes in the same millisecond.
    static int count = 0;
    m_path = QStringLiteral("/usr/share/glimmera/quickactions/%1.conf").arg(++count);
    Files::makeDirectory(QFileInfo(m_path).path());
    Files::remove(m_path);
    LoggedTest::init();
}

void TestQuickAction::cleanup()
{
    LoggedTest::cleanup();
    Files::remove(m_path);
}

void TestQuickAction::keepsPathAndState()
{
    write("title=x\n");
    QCOMPARE(Action(m_path, true).path(), m_path);
    QVERIFY(Action(m_path, true).enabled());
    QVERIFY(!Action(m_path, false).enabled());
}

void TestQuickAction::readsKeys_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QVariantMap>("config");

    const auto map = [](const char *key, const QVariant &value) {
        return QVariantMap{{QString::fromLatin1(key), value}};
    };
    QTest::newRow("before any section")
        << QByteArray("title=x\n") << map("title", QStringLiteral("x"));
    QTest::newRow("in the general section")
        << QByteArray("[General]\ntitle=x\n") << map("title", QStringLiteral("x"));
    QTest::newRow("unknown key") << QByteArray("colour=red\n")
                                 << map("colour", QStringLiteral("red"));
    QTest::newRow("empty value") << QByteArray("title=\n") << map("title", QString());
    QTest::newRow("list") << QByteArray("title=a, b\n")
                          << map("title", QStringList{QStringLiteral("a"), QStringLiteral("b")});
    QTest::newRow("list with an at sign")
        << QByteArray("title=@a, b\n")
        << map("title", QStringList{QStringLiteral("@a"), QStringLiteral("b")});
    QTest::newRow("quoted comma") << QByteArray("title=\"a, b\"\n")
                                  << map("title", QStringLiteral("a, b"));
    QTest::newRow("comment") << QByteArray("; title=x\n") << QVariantMap();
    QTest::newRow("empty file") << QByteArray() << QVariantMap();
}

void TestQuickAction::readsKeys()
{
    QFETCH(QByteArray, content);
    QFETCH(QVariantMap, config);
    write(content);
    const Action action(m_path, false);
    QCOMPARE(action.config(), config);
    // To QVariant, a list of strings and a list of variants that are strings are equal.
    for (auto it = config.cbegin(); it != config.cend(); ++it) {
        QCOMPARE(action.config().value(it.key()).userType(), it->userType());
    }
    QCOMPARE(action.readActionConfig(m_path), config);
}

void TestQuickAction::readsArguments_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QVariant>("expected");

    const QVariant none; // no such entry at all
    const QVariantList empty;
    const auto list = [](const QVariantList &values) { return QVariant(values); };
    QTest::newRow("no section") << QByteArray("title=x\n") << none;
    QTest::newRow("in their order")
        << QByteArray("[remote-arguments]\nsize=2\n2\\argument=b\n1\\argument=a\n")
        << list({QStringLiteral("a"), QStringLiteral("b")});
    QTest::newRow("always texts") << QByteArray(
        "[remote-arguments]\nsize=2\n1\\argument=1\n2\\argument=true\n")
                                  << list({QStringLiteral("1"), QStringLiteral("true")});
    QTest::newRow("list among them")
        << QByteArray("[remote-arguments]\nsize=1\n1\\argument=a, b\n")
        << list({QStringList{QStringLiteral("a"), QStringLiteral("b")}});
    const QString me = QStringLiteral("me");
    const QString atMe = QStringLiteral("@me");
    const QString atHome = QStringLiteral("@home");
    QTest::newRow("lists with an at sign")
        << QByteArray("[remote-arguments]\nsize=5\n1\\argument=me, @home\n"
                      "2\\argument=@me, home\n3\\argument=\"me\", \"@home\"\n"
                      "4\\argument=@@me, @home\n5\\argument=\"me, @home\"\n")
        << list({QStringList{me, atHome}, QStringList{atMe, QStringLiteral("home")},
                 QStringList{me, atHome}, QStringList{atMe, atHome}, QStringLiteral("me, @home")});
    QTest::newRow("list with another type")
        << QByteArray("[remote-arguments]\nsize=1\n1\\argument=me, @Point(1 2)\n")
        << list({QVariant(QVariantList{me, QPoint(1, 2)})});
    QTest::newRow("size 0") << QByteArray("[remote-arguments]\nsize=0\n1\\argument=a\n")
                            << list(empty);
    QTest::newRow("no size") << QByteArray("[remote-arguments]\n1\\argument=a\n") << list(empty);
    QTest::newRow("negative size")
        << QByteArray("[remote-arguments]\nsize=-3\n1\\argument=a\n") << list(empty);
    QTest::newRow("smaller size") << QByteArray(
        "[remote-arguments]\nsize=1\n1\\argument=a\n2\\argument=b\n")
                                  << list({QStringLiteral("a")});
    QTest::newRow("missing element") << QByteArray("[remote-arguments]\nsize=2\n2\\argument=b\n")
                                     << list({QVariant(), QStringLiteral("b")});
    QTest::newRow("section wins over key of that name")
        << QByteArray("remote-arguments=x\n[remote-arguments]\nsize=1\n1\\argument=a\n")
        << list({QStringLiteral("a")});
}

void TestQuickAction::readsArguments()
{
    QFETCH(QByteArray, content);
    QFETCH(QVariant, expected);
    write(content);
    const QVariantMap config = Action(m_path, false).config();
    QCOMPARE(config.contains(QStringLiteral("remote-arguments")), expected.isValid());
    QCOMPARE(config.value(QStringLiteral("remote-arguments")), expected);
}

void TestQuickAction::readsOfLatin1()
{
    write("title=\xe4\n");
    QCOMPARE(Action(m_path, false).title(), QStringLiteral("\u00e4"));
    write("title=\xc3\xa4!\n");
    QCOMPARE(Action(m_path, false).title(), QStringLiteral("\u00c3\u00a4!"));
}

void TestQuickAction::hugeArraysEnd()
{
    write("[remote-arguments]\nsize=2000000000\n1\\argument=a\n");
    QCOMPARE(Action(m_path, false).arguments().size(), 256);
}

void TestQuickAction::ignoresOtherGroups()
{
    write("icon=i\n\\of-no-group=x\n[extra]\ntitle=x\n[Remote-Arguments]\nsize=1\n1\\argument=a\n");
    QCOMPARE(Action(m_path, false).config(),
             (QVariantMap{{QStringLiteral("icon"), QStringLiteral("i")}}));
}

void TestQuickAction::questions()
{
    write("title=t\nicon=i\ntranslation-catalog=c\nrequires-package=p\npriority=7\n" + lampCall
          + arguments(1));
    const Action action(m_path, false);
    QCOMPARE(action.title(), QStringLiteral("t"));
    QCOMPARE(action.icon(), QVariant(QStringLiteral("i")));
    QCOMPARE(action.translationCatalog(), QStringLiteral("c"));
    QCOMPARE(action.requiredPackage(), QStringLiteral("p"));
    QCOMPARE(action.priority(), std::optional<int>(7));
    QCOMPARE(action.service(), QStringLiteral("org.example.lamp"));
    QCOMPARE(action.objectPath(), QStringLiteral("/lamp"));
    QCOMPARE(action.interface(), QStringLiteral("org.example.Lamp"));
    QCOMPARE(action.method(), QStringLiteral("toggle"));
    QCOMPARE(action.arguments(), QVariantList{QStringLiteral("value 1")});
}

void TestQuickAction::missingKeysAreEmpty()
{
    write("colour=red\n");
    const Action action(m_path, false);
    QCOMPARE(action.title(), QString());
    QCOMPARE(action.icon(), QVariant());
    QCOMPARE(action.translationCatalog(), QString());
    QCOMPARE(action.requiredPackage(), QString());
    QVERIFY(!action.priority());
    QCOMPARE(action.service(), QString());
    QCOMPARE(action.arguments(), QVariantList());
}

void TestQuickAction::listsAreNoText()
{
    write("title=a, b\nicon=a, b\n");
    const Action action(m_path, false);
    QCOMPARE(action.title(), QString());
    QCOMPARE(action.icon(), QVariant(QStringList{QStringLiteral("a"), QStringLiteral("b")}));
}

void TestQuickAction::priority_data()
{
    QTest::addColumn<QByteArray>("value");
    QTest::addColumn<int>("expected");
    constexpr int none = INT_MIN;
    QTest::newRow("0") << QByteArray("0") << 0;
    QTest::newRow("positive") << QByteArray("20") << 20;
    QTest::newRow("negative") << QByteArray("-1") << -1;
    QTest::newRow("quoted") << QByteArray("\"5\"") << 5;
    QTest::newRow("empty") << QByteArray() << none;
    QTest::newRow("word") << QByteArray("first") << none;
    QTest::newRow("fraction") << QByteArray("1.5") << none;
    QTest::newRow("list") << QByteArray("1, 2") << none;
    QTest::newRow("beyond 32 bits") << QByteArray("99999999999") << none;
}

void TestQuickAction::priority()
{
    QFETCH(QByteArray, value);
    QFETCH(int, expected);
    write("priority=" + value + '\n');
    QCOMPARE(Action(m_path, false).priority().value_or(INT_MIN), expected);
}

void TestQuickAction::unreadable_data()
{
    QTest::addColumn<QByteArray>("kind");
    for (const char *kind :
         {"unclosed section", "directory", "pipe", "link to a pipe", "link to a device"}) {
        QTest::newRow(kind) << QByteArray(kind);
    }
}

void TestQuickAction::unreadable()
{
    QFETCH(QByteArray, kind);
    const QString target = m_path + QStringLiteral(".target");
    Files::remove(target);
    if (kind == "unclosed section") {
        write("title=x\n[remote-arguments\n");
    } else if (kind == "directory") {
        Files::makeDirectory(m_path);
    } else if (kind == "pipe") {
        Files::makePipe(m_path);
    } else if (kind == "link to a pipe") {
        Files::makePipe(target);
        Files::makeLink(target, m_path);
    } else if (kind == "link to a device") {
        Files::makeLink(QStringLiteral("/dev/zero"), m_path);
    }
    QCOMPARE(Action(m_path, true).config(), QVariantMap());
    QCOMPARE(m_log->takeReport(), QString::fromLatin1(unreadableWarning));
    Files::remove(target);
}

void TestQuickAction::cannotBeOpened()
{
    write("title=x\n");
    {
        const UsedUpDescriptors none;
        QCOMPARE(Action(m_path, true).config(), QVariantMap());
    }
    QCOMPARE(m_log->takeReport(), QString::fromLatin1(unreadableWarning));
    QCOMPARE(Action(m_path, true).title(), QStringLiteral("x"));
}

void TestQuickAction::withoutAStandardInput()
{
    // The lowest descriptor is as good as any other to look for what is packed.
    write("title=@DateTime(\\0\\0\\0\\x10)\n");
    const int input = dup(STDIN_FILENO);
    close(STDIN_FILENO);
    const Action action(m_path, true);
    dup2(input, STDIN_FILENO);
    close(input);
    QCOMPARE(action.config(), QVariantMap());
    QCOMPARE(m_log->takeReport(), QString::fromLatin1(unreadableWarning));
}

void TestQuickAction::leavesNothingOpen()
{
    const auto openFiles = [] { return QDir(QStringLiteral("/proc/self/fd")).count(); };
    write("title=x\n");
    const uint before = openFiles();
    QCOMPARE(Action(m_path, true).title(), QStringLiteral("x"));
    QCOMPARE(openFiles(), before);
}

void TestQuickAction::shorterThanItSays()
{
    QFile number(QStringLiteral("/sys/kernel/uevent_seqnum"));
    QVERIFY(number.open(QIODevice::ReadOnly));
    const QByteArray content = number.readAll();
    if (number.size() <= content.size()) {
        QSKIP("the kernel reports the true size of its files");
    }
    Files::makeLink(number.fileName(), m_path);
    const QVariantMap config = Action(m_path, true).config();
    const QString report = m_log->takeReport();
    Files::remove(m_path);
    write(content);
    QCOMPARE(config, Action(m_path, true).config());
    QCOMPARE(report, m_log->takeReport());
}

void TestQuickAction::brokenFilesStayBroken_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<bool>("isBroken");
    QTest::newRow("section at the end") << QByteArray("title=x\n[a") << true;
    QTest::newRow("section in front") << QByteArray("[a\ntitle=x\n") << true;
    QTest::newRow("section closed on the next line") << QByteArray("title=x\n[a\n]\n") << true;
    QTest::newRow("section closed behind a comment") << QByteArray("title=x\n[a;]\n") << true;
    QTest::newRow("section behind a mark") << QByteArray("\xef\xbb\xbf[a\ntitle=x\n") << true;
    QTest::newRow("section behind a comment") << QByteArray("title=x\n;b\n \t[a\n") << true;
    QTest::newRow("section behind a semicolon") << QByteArray("title=x;[a\n[b\n") << true;
    QTest::newRow("closed section") << QByteArray("title=x\n[a]b\n") << false;
    QTest::newRow("in a comment") << QByteArray("title=x\n;[a\n") << false;
    QTest::newRow("in quotes") << QByteArray("b=\"\n[a\n\"\ntitle=x\n") << false;
    QTest::newRow("behind a backslash") << QByteArray("b=\\\n[a\ntitle=x\n") << false;
    QTest::newRow("behind a backslash and two") << QByteArray("b=\\\r\n[a\ntitle=x\n") << false;
    QTest::newRow("section closed over two lines") << QByteArray("title=x\n[\"a\n\"]\n") << false;
    QTest::newRow("backslash at the end") << QByteArray("title=x\nb=\\") << false;
}

// QSettings remembers what it has read of an unchanged file, but not that it was an error.
void TestQuickAction::brokenFilesStayBroken()
{
    QFETCH(QByteArray, content);
    QFETCH(bool, isBroken);
    write(content);
    for (int reading = 0; reading < 3; ++reading) {
        QCOMPARE(Action(m_path, true).title(), isBroken ? QString() : QStringLiteral("x"));
        QCOMPARE(m_log->takeReport(),
                 isBroken ? QString::fromLatin1(unreadableWarning) : QString());
    }
}

void TestQuickAction::packedValues_data()
{
    QTest::addColumn<QByteArray>("content");
    // Two billion elements, which would be all memory, and a list in a list in a list.
    const QByteArray huge = "@Variant(\\0\\0\\0\\x9\\x7f\\xff\\xff\\xf0)";
    QByteArray deep = "@Variant(";
    for (int i = 0; i < 200000; ++i) {
        deep += "\\0\\0\\0\\x9\\0\\0\\0\\x1";
    }
    QTest::newRow("huge") << "title=" + huge + '\n';
    QTest::newRow("deep") << "title=" + deep.left(900000) + ")\n";
    QTest::newRow("unused key") << "colour=" + huge + '\n';
    QTest::newRow("argument") << "[remote-arguments]\nsize=1\n1\\argument=" + huge + '\n';
    QTest::newRow("in a list") << "title=a, " + huge + '\n';
    QTest::newRow("behind blanks") << "title= \t" + huge + '\n';
    QTest::newRow("quoted") << "title=\"" + huge + "\"\n";
    QTest::newRow("quotes within") << "title=@Va\"\"ri\"ant(\"" + huge.mid(9) + '\n';
    QTest::newRow("escaped at sign") << "title=\\x40" + huge.mid(1) + '\n';
    QTest::newRow("octal") << "title=\\100" + huge.mid(1) + '\n';
    QTest::newRow("escaped letter") << "title=@V\\x61" + huge.mid(3) + '\n';
    QTest::newRow("continued line") << "title=\\\n" + huge + '\n';
    QTest::newRow("backslashes for nothing") << "title=\\q@\\zVa\\wriant(" + huge.mid(9) + '\n';
    QTest::newRow("without a key, as the first byte") << '=' + huge + '\n';
    QTest::newRow("date and time") << QByteArray("title=@DateTime(\\0\\0\\0\\x10)\n");
    QTest::newRow("at sign with upper bits") << "title=\\x10040" + huge.mid(1) + '\n';
    QTest::newRow("behind a byte-order mark") << "\xef\xbb\xbf\ntitle=\xef\xbb\xbf" + huge + '\n';
    QTest::newRow("quoted, in a list") << "title=\"a\", \"" + huge + "\"\n";
    QTest::newRow("in a section without an end") << "[a\ntitle=" + huge + '\n';
    QTest::newRow("behind two comments") << "; a\n; b\ntitle=" + huge + '\n';
    QTest::newRow("key with a quoted equals sign") << "\"a=b\"=" + huge + '\n';
    QTest::newRow("repeated key") << "title=" + huge + "\ntitle=x\n";
}

// Each of these would end the process, or might.
void TestQuickAction::packedValues()
{
    QFETCH(QByteArray, content);
    write(content);
    QCOMPARE(Action(m_path, true).config(), QVariantMap());
    QCOMPARE(m_log->takeReport(), QString::fromLatin1(unreadableWarning));
}

void TestQuickAction::atSigns_data()
{
    QTest::addColumn<QByteArray>("value");
    QTest::addColumn<QString>("title");
    QTest::newRow("within") << QByteArray("a@Variant(b)") << QStringLiteral("a@Variant(b)");
    QTest::newRow("name") << QByteArray("@marlo") << QStringLiteral("@marlo");
    QTest::newRow("doubled") << QByteArray("@@Variant(") << QStringLiteral("@Variant(");
    QTest::newRow("short") << QByteArray("@Var") << QStringLiteral("@Var");
    QTest::newRow("alone") << QByteArray("@") << QStringLiteral("@");
    QTest::newRow("quote") << QByteArray("@\\\"Variant(\\\"") << QStringLiteral("@\"Variant(\"");
    QTest::newRow("escaped letter") << QByteArray("\\xe4iti") << QStringLiteral("\u00e4iti");
    // QSettings unpacks none of these.
    const QString name = QStringLiteral("x");
    QTest::newRow("in a comment") << QByteArray("x\n; an example: x=@Variant(y)") << name;
    QTest::newRow("behind a comma in quotes")
        << QByteArray("\"Hello, @DateTime(now)\"") << QStringLiteral("Hello, @DateTime(now)");
    QTest::newRow("behind an equals sign")
        << QByteArray("see x=@Variant(y)") << QStringLiteral("see x=@Variant(y)");
    QTest::newRow("behind a semicolon") << QByteArray("x;=@Variant(y)") << name;
    QTest::newRow("in a line that is no key") << QByteArray("x\n@Variant(y)") << name;
    QTest::newRow("in the name of a section") << QByteArray("x\n[@Variant(y)]") << name;
    QTest::newRow("without an end") << QByteArray("@Variant(y") << QStringLiteral("@Variant(y");
    QTest::newRow("with a blank behind the end")
        << QByteArray("\"@Variant(y) \"") << QStringLiteral("@Variant(y) ");
}

void TestQuickAction::atSigns()
{
    QFETCH(QByteArray, value);
    QFETCH(QString, title);
    write("title=" + value + '\n');
    QCOMPARE(Action(m_path, true).title(), title);
}

void TestQuickAction::endsInABackslash()
{
    write("title=@\\");
    QCOMPARE(Action(m_path, true).title(), QStringLiteral("@"));
}

void TestQuickAction::hugeFile()
{
    Files::makeSparse(m_path, qint64(1) << 40);
    QCOMPARE(Action(m_path, true).config(), QVariantMap());
    QCOMPARE(m_log->takeReport(), QString::fromLatin1(unreadableWarning));
}

void TestQuickAction::vanished()
{
    QCOMPARE(Action(m_path, true).config(), QVariantMap());
    QCOMPARE(Action(m_path, true).path(), m_path);
    Files::makeLink(QStringLiteral("/nowhere"), m_path);
    QCOMPARE(Action(m_path, true).config(), QVariantMap());
}

void TestQuickAction::linesThatAreNoKeys()
{
    write("some words\ntitle=x\n");
    QCOMPARE(Action(m_path, true).title(), QStringLiteral("x"));
}

void TestQuickAction::comparison()
{
    write("title=x\n");
    const Action action(m_path, true);
    QVERIFY(action == Action(m_path, true));
    QVERIFY(!(action != Action(m_path, true)));
    QVERIFY(action != Action(m_path, false));

    const QString other = m_path + QStringLiteral(".other");
    Files::write(other, "title=x\n");
    QVERIFY(action != Action(other, true));
    Files::remove(other);

    write("title=another\n");
    QVERIFY(action != Action(m_path, true));
    QVERIFY(!(action == Action(m_path, true)));
}

void TestQuickAction::copies()
{
    write("title=x\npriority=3\n");
    const Action action(m_path, true);
    const Action copy(action);
    QVERIFY(copy == action);
    Action assigned(QStringLiteral("/nowhere"), false);
    QVERIFY(assigned != action);
    assigned = action;
    QVERIFY(assigned == action);
    QCOMPARE(assigned.priority(), std::optional<int>(3));
}

void TestQuickAction::sendsTheCall()
{
    const QDBusMessage call = send(lampCall + arguments(2));
    QCOMPARE(call.type(), QDBusMessage::MethodCallMessage);
    QCOMPARE(call.path(), QStringLiteral("/lamp"));
    QCOMPARE(call.interface(), QStringLiteral("org.example.Lamp"));
    QCOMPARE(call.member(), QStringLiteral("toggle"));
    QCOMPARE(call.signature(), QStringLiteral("ss"));
    QCOMPARE(call.arguments(),
             (QVariantList{QStringLiteral("value 1"), QStringLiteral("value 2")}));
}

void TestQuickAction::argumentsStayAsRead()
{
    const QDBusMessage call =
        send(lampCall
             + "[remote-arguments]\nsize=4\n1\\argument=1\n2\\argument=true\n3\\argument=a, b\n"
               "4\\argument=me, @home\n");
    QCOMPARE(call.signature(), QStringLiteral("ssasas"));
    QCOMPARE(call.arguments(),
             (QVariantList{QStringLiteral("1"), QStringLiteral("true"),
                           QStringList{QStringLiteral("a"), QStringLiteral("b")},
                           QStringList{QStringLiteral("me"), QStringLiteral("@home")}}));
}

void TestQuickAction::noArguments_data()
{
    QTest::addColumn<QByteArray>("section");
    QTest::newRow("no section") << QByteArray();
    QTest::newRow("size 0") << QByteArray("[remote-arguments]\nsize=0\n");
    QTest::newRow("no size") << QByteArray("[remote-arguments]\n1\\argument=a\n");
}

void TestQuickAction::noArguments()
{
    QFETCH(QByteArray, section);
    const QDBusMessage call = send(lampCall + section);
    QCOMPARE(call.type(), QDBusMessage::MethodCallMessage);
    QCOMPARE(call.signature(), QString());
}

void TestQuickAction::refusesBeforeSending_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("call"); // as in the warning
    QTest::addColumn<QString>("error");

    const auto row = [](const char *name, const QByteArray &content, const char *call,
                        const char *error) {
        QTest::newRow(name) << content << QString::fromLatin1(call) << QString::fromLatin1(error);
    };
    row("no service", lampCall + "remote-service=\n",
        "service= path=/lamp interface=org.example.Lamp method=toggle",
        "org.qtproject.QtDBus.Error.InvalidService The call names no service");
    row("empty file", "", "service= path= interface= method=",
        "org.qtproject.QtDBus.Error.InvalidService The call names no service");
    // These would end the process, or the connection to the bus.
    row("service of one word", lampCall + "remote-service=lamp\n",
        "service=lamp path=/lamp interface=org.example.Lamp method=toggle",
        "org.qtproject.QtDBus.Error.InvalidService The service is not a bus name");
    row("reserved path", lampCall + "remote-path=/org/freedesktop/DBus/Local\n",
        "service=org.example.lamp path=/org/freedesktop/DBus/Local interface=org.example.Lamp "
        "method=toggle",
        "org.qtproject.QtDBus.Error.InvalidObjectPath The path is reserved");
    row("reserved interface", lampCall + "remote-interface=org.freedesktop.DBus.Local\n",
        "service=org.example.lamp path=/lamp interface=org.freedesktop.DBus.Local method=toggle",
        "org.qtproject.QtDBus.Error.InvalidInterface The interface is reserved");
    row("no method", lampCall + "remote-method=\n",
        "service=org.example.lamp path=/lamp interface=org.example.Lamp method=",
        "org.qtproject.QtDBus.Error.InvalidMember The call names no method");

    const char *lamp =
        "service=org.example.lamp path=/lamp interface=org.example.Lamp method=toggle";
    const char *tooMany = "org.freedesktop.DBus.Error.InvalidArgs The call has too many arguments";
    const char *noText = "org.freedesktop.DBus.Error.InvalidArgs An argument is not text";
    row("too many arguments", lampCall + arguments(256), lamp, tooMany);
    row("too long a signature", lampCall + arguments(254) + "255\\argument=a, b\nsize=255\n", lamp,
        tooMany);
    row("argument of another type",
        lampCall + "[remote-arguments]\nsize=1\n1\\argument=@Rect(1 2 3 4)\n", lamp, noText);
    row("list with another type",
        lampCall + "[remote-arguments]\nsize=1\n1\\argument=me, @Rect(1 2 3 4)\n", lamp, noText);
    row("missing argument", lampCall + "[remote-arguments]\nsize=1\n", lamp, noText);
}

void TestQuickAction::refusesBeforeSending()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, call);
    QFETCH(QString, error);
    const RecordingService lamp(QDBusConnection::SessionBus, QStringLiteral("org.example.lamp"));
    write(content);
    Receiver receiver;
    QVERIFY(
        !Action(m_path, true).trigger(&receiver, nullptr, SLOT(error(QDBusError, QDBusMessage))));
    // Reported once, on the channel of the receiver; nothing is sent and nothing comes later.
    QCOMPARE(
        m_log->takeReport(),
        QStringLiteral("info [default] <Unknown File>: QML Receiver: Failed to initialize dbus "
                       "call to: ")
            + call + QStringLiteral(". Error was: ") + error + QStringLiteral(" %6"));
    QTest::qWait(50);
    QCOMPARE(lamp.calls().size(), 0);
    QCOMPARE(receiver.errors.size(), 0);
}

void TestQuickAction::valuesMayLookLikePlaceholders()
{
    write("remote-service=%2\nremote-path=%3\nremote-interface=%4 %1\n");
    Receiver receiver;
    QVERIFY(!Action(m_path, true).trigger(&receiver, nullptr, nullptr));
    const QString text = m_log->takeReport();
    QVERIFY2(text.contains(QStringLiteral("service=%2 path=%3 interface=%4 %1 method=. ")),
             qPrintable(text));
}

void TestQuickAction::mostArgumentsThatCanBeSent()
{
    QCOMPARE(send(lampCall + arguments(255)).arguments().size(), 255);
}

void TestQuickAction::deliversTheError()
{
    RecordingService lamp(QDBusConnection::SessionBus, QStringLiteral("org.example.lamp"));
    lamp.setAnswer(Answer::Error, QStringLiteral("org.example.Error.Broken"));
    write(lampCall);
    Receiver receiver;
    QVERIFY(Action(m_path, true)
                .trigger(&receiver, SLOT(reply()), SLOT(error(QDBusError, QDBusMessage))));
    QTRY_COMPARE(receiver.errors.size(), 1);
    QCOMPARE(receiver.errors.constFirst().name(), QStringLiteral("org.example.Error.Broken"));
    QCOMPARE(receiver.sent.constFirst().member(), QStringLiteral("toggle"));
    QCOMPARE(receiver.replies, 0);
}

QTEST_GUILESS_MAIN(TestQuickAction)

#include "tst_quickaction.moc"
