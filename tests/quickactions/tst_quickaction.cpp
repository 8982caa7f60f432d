// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The reader of definition files and the calls that they describe.

#include "files.h"
#include "loggedtest.h"
#include "openings.h"
#include "patience.h"
#include "places.h"
#include "quickactions/quickaction.h"
#include "simulator/recordingservice.h"
#include "texts.h"
#include "words.h"

#include <QtTest>

#include <algorithm>
#include <iterator>

using Action = QuickAction;

class TestQuickAction : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void getters();
    void readsKeys_data();
    void readsKeys();
    void unreadable_data();
    void unreadable();
    void priority();
    void rereadsChangedFilesOnly();
    void vanished();

    void comparison();
    void sendsTheCall_data();
    void sendsTheCall();
    void refusesBeforeSending_data();
    void refusesBeforeSending();

private:
    QString write(const QByteArray &content) const;

    QString m_path;
};

namespace {

const QString unreadableWarning = "warning [default] Unable to open action file"_s;

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
    int errors = 0;

public Q_SLOTS:
    void reply() { ++replies; }
    void error(const QDBusError &, const QDBusMessage &) { ++errors; }
};

} // namespace

QString TestQuickAction::write(const QByteArray &content) const
{
    Files::write(m_path, content);
    return m_path;
}

void TestQuickAction::init()
{
    // A name for each row of test data: QSettings remembers a file by its name, size and time, and
    // the next row may write as many bytes in the same millisecond.
    static int count = 0;
    m_path = "%1/%2.conf"_s.arg(Places::quickActions).arg(++count);
    Files::makeDirectory(QFileInfo(m_path).path());
    Files::remove(m_path);
    LoggedTest::init();
}

void TestQuickAction::cleanup()
{
    LoggedTest::cleanup();
    Files::remove(m_path);
}

void TestQuickAction::getters()
{
    write("title=t\nicon=i\ntranslation-catalog=c\nrequires-package=p\npriority=7\n" + lampCall
          + arguments(1));
    const Action action(m_path, true);
    QCOMPARE(action.path(), m_path);
    QVERIFY(action.enabled());
    QCOMPARE(action.title(), "t"_s);
    QCOMPARE(action.icon(), QVariant("i"_s));
    QCOMPARE(action.translationCatalog(), "c"_s);
    QCOMPARE(action.requiredPackage(), "p"_s);
    QCOMPARE(action.priority(), std::optional<int>(7));
    QCOMPARE(action.service(), "org.example.lamp"_s);
    QCOMPARE(action.objectPath(), "/lamp"_s);
    QCOMPARE(action.interface(), "org.example.Lamp"_s);
    QCOMPARE(action.method(), "toggle"_s);
    QCOMPARE(action.arguments(), QVariantList{"value 1"_s});

    // Missing keys are empty, and so is the text of a list.
    write("title=a, b\nicon=a, b\n");
    const Action other(m_path, false);
    QVERIFY(!other.enabled());
    QCOMPARE(other.icon(), QVariant(words("a b")));
    QVERIFY(!other.priority());
    for (const QString &text :
         {other.title(), other.translationCatalog(), other.requiredPackage(), other.service(),
          other.objectPath(), other.interface(), other.method()}) {
        QCOMPARE(text, QString());
    }
    QCOMPARE(other.arguments(), QVariantList());
}

void TestQuickAction::readsKeys_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QVariantMap>("config");
    const auto row = [](const char *name, const QByteArray &content, const QVariantMap &config) {
        QTest::newRow(name) << content << config;
    };
    const auto title = [](const QVariant &value) { return QVariantMap{{"title"_s, value}}; };
    row("before any section", "title=x\n", title("x"_s));
    row("in the general section", "[General]\ntitle=x\n", title("x"_s));
    row("in other sections",
        "title=x\n\\of-no-group=x\n[extra]\ntitle=y\n[Remote-Arguments]\nsize=1\n1\\argument=a\n",
        title("x"_s));
    row("unknown key", "colour=red\n", {{"colour"_s, "red"_s}});
    row("empty value", "title=\n", title(QString()));
    row("list", "title=a, b\n", title(words("a b")));
    row("list with an at sign", "title=@a, b\n", title(words("@a b")));
    row("quoted comma", "title=\"a, b\"\n", title("a, b"_s));
    row("Latin 1", "title=\xe4\n", title("ä"_s));
    row("UTF-8", "title=\xc3\xa4!\n", title("Ã¤!"_s));
    row("at sign", "title=@marlo\n", title("@marlo"_s));
    row("doubled at sign", "title=@@marlo\n", title("@marlo"_s));
    row("at sign and backslash at the end", "title=@\\", title("@"_s));
    row("line that is no key", "some words\ntitle=x\n", title("x"_s));
    row("comment", "; title=x\n", {});
    row("empty file", "", {});

    const auto list = [row](const char *name, const QByteArray &content,
                            const QVariantList &arguments) {
        row(name, "[remote-arguments]\n" + content, {{"remote-arguments"_s, arguments}});
    };
    list("in their order", "size=2\n2\\argument=b\n1\\argument=a\n", {"a"_s, "b"_s});
    list("always texts", "size=2\n1\\argument=1\n2\\argument=true\n", {"1"_s, "true"_s});
    list("list among them", "size=1\n1\\argument=a, b\n", {words("a b")});
    list("lists with an at sign",
         "size=5\n1\\argument=me, @home\n2\\argument=@me, home\n3\\argument=\"me\", \"@home\"\n"
         "4\\argument=@@me, @home\n5\\argument=\"me, @home\"\n",
         {words("me @home"), words("@me home"), words("me @home"), words("@me @home"),
          "me, @home"_s});
    list("list with another type", "size=1\n1\\argument=me, @Point(1 2)\n",
         {QVariant(QVariantList{"me"_s, QPoint(1, 2)})});
    list("size 0", "size=0\n1\\argument=a\n", {});
    list("no size", "1\\argument=a\n", {});
    list("negative size", "size=-3\n1\\argument=a\n", {});
    list("smaller size", "size=1\n1\\argument=a\n2\\argument=b\n", {"a"_s});
    list("missing element", "size=2\n2\\argument=b\n", {QVariant(), "b"_s});
    QVariantList most{"a"_s};
    std::fill_n(std::back_inserter(most), 255, QVariant());
    list("huge size", "size=2000000000\n1\\argument=a\n", most);
    row("section wins over key of that name",
        "remote-arguments=x\n[remote-arguments]\nsize=1\n1\\argument=a\n",
        {{"remote-arguments"_s, QVariantList{"a"_s}}});
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

// What else cannot be read is tested with the check of settings files.
void TestQuickAction::unreadable_data()
{
    QTest::addColumn<QByteArray>("content");
    const auto row = [](const char *name, const char *content) {
        QTest::newRow(name) << QByteArray(content);
    };
    row("unclosed section", "title=x\n[remote-arguments\n");
    // QSettings would unpack these values, which may take all memory or crash the process.
    row("packed value", "title=@DateTime(\\0\\0\\0\\x10)\n");
    row("packed argument", "[remote-arguments]\nsize=1\n1\\argument=@Variant(\\0\\0\\0\\x10)\n");
}

void TestQuickAction::unreadable()
{
    QFETCH(QByteArray, content);
    write(content);
    const Action action(m_path, true);
    QVERIFY(!action.isRead());
    QCOMPARE(action.config(), QVariantMap());
    QCOMPARE(m_log->takeReport(), unreadableWarning);
    // It is tried again each time. QSettings remembers an unchanged file, but not that it was an
    // error.
    QVERIFY(!action.reread(true).isRead());
    QCOMPARE(m_log->takeReport(), unreadableWarning);
    QVERIFY(!Action(m_path, true).isRead());
    QCOMPARE(m_log->takeReport(), unreadableWarning);
    Files::remove(m_path);
    write("title=x\n");
    QCOMPARE(action.reread(true).title(), "x"_s);
}

void TestQuickAction::priority()
{
    const auto priority = [this](const QByteArray &value) {
        // QSettings rereads a file of another size.
        static QByteArray comment = "\n";
        comment.prepend(';');
        write("priority=" + value + '\n' + comment);
        return Action(m_path, false).priority();
    };
    QCOMPARE(priority("0"), std::optional(0));
    QCOMPARE(priority("20"), std::optional(20));
    QCOMPARE(priority("-1"), std::optional(-1));
    QCOMPARE(priority("\"5\""), std::optional(5));
    for (const char *value : {"", "first", "1.5", "1, 2", "99999999999"}) {
        QVERIFY2(!priority(value), value);
    }
}

void TestQuickAction::rereadsChangedFilesOnly()
{
    write("title=old\n");
    QFile file(m_path);
    QVERIFY(file.open(QIODevice::ReadWrite));
    const QDateTime time = QDateTime::currentDateTime();
    QVERIFY(file.setFileTime(time, QFileDevice::FileModificationTime));
    const Openings openings(m_path);
    const Action action(m_path, true);
    QVERIFY(openings.take());
    QCOMPARE(action.reread(true), action);
    QVERIFY(!action.reread(false).enabled());
    QVERIFY(!openings.take());

    // The same size and modification time: only the time of the change differs.
    const QDateTime change = QFileInfo(m_path).metadataChangeTime();
    TRY(file.setFileTime(time, QFileDevice::FileModificationTime)
        && QFileInfo(m_path).metadataChangeTime() != change);
    file.close();
    const Action touched = action.reread(true);
    QCOMPARE(touched, action);
    QVERIFY(openings.take());
    QCOMPARE(touched.reread(true), action);
    QVERIFY(!openings.take());

    write("title=changed\n");
    QCOMPARE(action.reread(true).title(), "changed"_s);
    Files::remove(m_path);
    QCOMPARE(action.reread(true).config(), QVariantMap());
}

void TestQuickAction::vanished()
{
    QCOMPARE(Action(m_path, true).config(), QVariantMap());
    QCOMPARE(Action(m_path, true).path(), m_path);
    QVERIFY(Action(m_path, true).isRead());
    Files::makeLink("/nowhere"_s, m_path);
    QCOMPARE(Action(m_path, true).config(), QVariantMap());
}

void TestQuickAction::comparison()
{
    write("title=x\n");
    const Action action(m_path, true);
    const QString other = m_path + ".other"_s;
    Files::write(other, "title=x\n");
    const auto compare = [&](const Action &compared, bool isEqual) {
        QCOMPARE(action == compared, isEqual);
        QCOMPARE(action != compared, !isEqual);
    };
    compare(Action(m_path, true), true);
    compare(Action(m_path, false), false);
    compare(Action(other, true), false);
    Files::remove(other);
    write("title=another\n");
    compare(Action(m_path, true), false);
}

void TestQuickAction::sendsTheCall_data()
{
    QTest::addColumn<QByteArray>("section");
    QTest::addColumn<QString>("signature");
    QTest::addColumn<QVariantList>("arguments");
    const auto row = [](const char *name, const QByteArray &section, const QString &signature,
                        const QVariantList &arguments) {
        QTest::newRow(name) << section << signature << arguments;
    };
    row("no section", "", {}, {});
    row("bytes", "[remote-arguments]\nsize=1\n1\\argument=@ByteArray(abc)\n", "ay"_s,
        {QByteArray("abc")});
    row("texts and lists",
        "[remote-arguments]\nsize=4\n1\\argument=1\n2\\argument=true\n3\\argument=a, b\n"
        "4\\argument=me, @home\n",
        "ssasas"_s, {"1"_s, "true"_s, words("a b"), words("me @home")});
    row("a list of other types", "[remote-arguments]\nsize=1\n1\\argument=me, @ByteArray(abc)\n",
        "av"_s, {});
    row("the most arguments", arguments(255), "s"_s.repeated(255), {});
}

void TestQuickAction::sendsTheCall()
{
    QFETCH(QByteArray, section);
    QFETCH(QVariantList, arguments);
    const RecordingService lamp(QDBusConnection::SessionBus, "org.example.lamp"_s);
    write(lampCall + section);
    Receiver receiver;
    QVERIFY(Action(m_path, true)
                .trigger(&receiver, SLOT(reply()), SLOT(error(QDBusError, QDBusMessage))));
    // Sending does not wait for the reply.
    QCOMPARE(lamp.calls().size(), 0);
    TRY_COMPARE(receiver.replies, 1);
    QCOMPARE(lamp.calls().size(), 1);
    QCOMPARE(receiver.errors, 0);
    const QDBusMessage call = lamp.calls().constFirst();
    QCOMPARE(call.type(), QDBusMessage::MethodCallMessage);
    QCOMPARE(call.path(), "/lamp"_s);
    QCOMPARE(call.interface(), "org.example.Lamp"_s);
    QCOMPARE(call.member(), "toggle"_s);
    QTEST(call.signature(), "signature");
    if (!arguments.isEmpty()) {
        QCOMPARE(call.arguments(), arguments);
    }
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
    row("names like placeholders", "remote-service=%2\nremote-path=%3\nremote-interface=%4 %1\n",
        "service=%2 path=%3 interface=%4 %1 method=",
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
    const char *noType = "org.freedesktop.DBus.Error.InvalidArgs An argument has no D-Bus type";
    row("too many arguments", lampCall + arguments(256), lamp, tooMany);
    row("too long a signature", lampCall + arguments(254) + "255\\argument=a, b\nsize=255\n", lamp,
        tooMany);
    row("empty value", lampCall + "[remote-arguments]\nsize=1\n1\\argument=@Invalid()\n", lamp,
        noType);
    row("list with an empty value",
        lampCall + "[remote-arguments]\nsize=1\n1\\argument=me, @Invalid()\n", lamp, noType);
    row("missing argument", lampCall + "[remote-arguments]\nsize=1\n", lamp, noType);
}

void TestQuickAction::refusesBeforeSending()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, call);
    QFETCH(QString, error);
    const RecordingService lamp(QDBusConnection::SessionBus, "org.example.lamp"_s);
    write(content);
    Receiver receiver;
    QVERIFY(
        !Action(m_path, true).trigger(&receiver, nullptr, SLOT(error(QDBusError, QDBusMessage))));
    // Reported once, on the channel of the receiver; nothing is sent and nothing comes later.
    QCOMPARE(m_log->takeReport(),
             "info [default] <Unknown File>: QML Receiver: Failed to initialize dbus "
             "call to: "_s
                 + call + ". Error was: "_s + error + " %6"_s);
    QTest::qWait(50);
    QCOMPARE(lamp.calls().size(), 0);
    QCOMPARE(receiver.errors, 0);
}

QTEST_GUILESS_MAIN(TestQuickAction)

#include "tst_quickaction.moc"
