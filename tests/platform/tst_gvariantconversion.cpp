// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "gvariantconversion.h"
#include "loggedtest.h"
#include "texts.h"

#include <QDate>
#include <QDebug>
#include <QTest>
#include <QUrl>
#include <glib.h>
#include <limits>

namespace {

// QVariants of different types may compare equal; their descriptions do not.
QString describe(const QVariant &value)
{
    QString description;
    QDebug(&description).nospace() << value;
    return description;
}

QString print(GVariant *value)
{
    gchar *const text = g_variant_print(value, TRUE);
    const QString copy = QString::fromUtf8(text);
    g_free(text);
    return copy;
}

GVariantPtr parse(const QByteArray &text)
{
    return GVariantPtr(g_variant_parse(nullptr, text.constData(), nullptr, nullptr, nullptr));
}

// Data that was not checked, as in a damaged database.
GVariantPtr untrusted(const char *type, const QByteArray &data)
{
    GBytes *const bytes = g_bytes_new(data.constData(), static_cast<gsize>(data.size()));
    GVariant *const value = g_variant_new_from_bytes(G_VARIANT_TYPE(type), bytes, FALSE);
    g_bytes_unref(bytes);
    return GVariantPtr(g_variant_ref_sink(value));
}

} // namespace

class TestGVariantConversion : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void bothWays_data();
    void bothWays();
    void refusesOtherTypes_data();
    void refusesOtherTypes();
    void refusesInvalidText_data();
    void refusesInvalidText();
    void readsForeignTypes_data();
    void readsForeignTypes();
    void damagedDataIsInvalid_data();
    void damagedDataIsInvalid();
    void deepDataIsInvalid();
    void longListsAreReadOnce();
};

void TestGVariantConversion::bothWays_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QString>("printed");

    const auto row = [](const char *name, const QVariant &value, const char *printed) {
        QTest::newRow(name) << value << printed;
    };
    const QString text = "text"_s;
    const QString marks = QString(2, QChar(QChar::ByteOrderMark));
    row("true", true, "true");
    row("false", false, "false");
    row("int", std::numeric_limits<int>::min(), "-2147483648");
    row("string", text, "'text'");
    row("empty string", QString(), "''");
    row("beyond Latin", "Ünïcödé 日本 😀"_s, "'Ünïcödé 日本 😀'");
    row("byte order mark", marks + text, "'\\ufeff\\ufefftext'");
    row("string list", QStringList{"b"_s, QString(), text}, "['b', '', 'text']");
    row("empty string list", QStringList(), "@as []");
    row("map", QVariantMap{{"b"_s, 15}, {"a"_s, QStringList{text}}, {QString(), true}},
        "{'': <true>, 'a': <['text']>, 'b': <15>}");
    row("empty map", QVariantMap(), "@a{sv} {}");
}

void TestGVariantConversion::bothWays()
{
    QFETCH(const QVariant, value);
    QFETCH(const QString, printed);

    QString reason;
    const GVariantPtr converted = toGVariant(value, &reason);
    QVERIFY2(converted, qPrintable(reason));
    QCOMPARE(reason, QString());
    QVERIFY(!g_variant_is_floating(converted.get()));
    QCOMPARE(print(converted.get()), printed);

    const QVariant back = toQVariant(converted.get());
    QCOMPARE(describe(back), describe(value));
    QCOMPARE(back, value);
}

void TestGVariantConversion::refusesOtherTypes_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QString>("reason");

    const auto row = [](const char *name, const QVariant &value, const char *reason) {
        QTest::newRow(name) << value << reason;
    };
    const QString key = "k"_s;
    row("bytes", QByteArray("bytes"), "a value of type QByteArray");
    row("date", QDate(2026, 1, 2), "a value of type QDate");
    row("URL", QUrl("file:///x"_s), "a value of type QUrl");
    row("character", QChar(u'x'), "a value of type QChar");
    row("null pointer", QVariant::fromValue(nullptr), "a value of type std::nullptr_t");
    row("object", QVariant::fromValue<QObject *>(this), "a value of type QObject*");
    row("double", 0.5, "a value of type double");
    row("uint", 1U, "a value of type uint");
    row("qlonglong", qlonglong(1), "a value of type qlonglong");
    row("list", QVariantList{1}, "a value of type QVariantList");
    row("hash", QVariantHash(), "a value of type QVariantHash");
    row("map in a map", QVariantMap{{key, QVariantMap()}}, "a value of type QVariantMap");
    row("URL in a map", QVariantMap{{key, QUrl()}}, "a value of type QUrl");
    row("invalid", QVariant(), "an invalid QVariant");
    row("invalid in a map", QVariantMap{{key, QVariant()}}, "an invalid QVariant");
}

void TestGVariantConversion::refusesOtherTypes()
{
    QFETCH(const QVariant, value);
    QFETCH(const QString, reason);

    QString given;
    QVERIFY(!toGVariant(value, &given));
    QCOMPARE(given, reason);
}

void TestGVariantConversion::refusesInvalidText_data()
{
    QTest::addColumn<QString>("text");

    const QString around = "x"_s;
    QTest::newRow("NUL") << around + QChar(QChar::Null) + around;
    QTest::newRow("NUL at the end") << around + QChar(QChar::Null);
    QTest::newRow("high surrogate") << around + QChar(0xD83D) + around;
    QTest::newRow("high surrogate at the end") << around + QChar(0xD83D);
    QTest::newRow("low surrogate") << QString(QChar(0xDE00)) + around;
    QTest::newRow("swapped surrogates") << QString(QChar(0xDE00)) + QChar(0xD83D);
}

void TestGVariantConversion::refusesInvalidText()
{
    QFETCH(const QString, text);

    const QString fine = "fine"_s;
    const QVariantList carriers = {
        text,
        QStringList{fine, text},
        QVariantMap{{fine, text}},
        QVariantMap{{text, fine}},
        QVariantMap{{fine, QStringList{text}}},
    };
    for (const QVariant &carrier : carriers) {
        QString reason;
        QVERIFY2(!toGVariant(carrier, &reason), qPrintable(describe(carrier)));
        QCOMPARE(reason, "text of type QString with a NUL or half a surrogate pair"_s);
    }
}

void TestGVariantConversion::readsForeignTypes_data()
{
    QTest::addColumn<QVariant>("value");

    const auto row = [](const char *text, const QVariant &value) { QTest::newRow(text) << value; };
    const QString a = "a"_s;
    const QString b = "b"_s;
    const QVariantList nothing;
    row("<<<'a'>>>", a);
    row("[<'a'>, <1>]", QVariantList{a, 1});
    row("[1, 2]", QVariantList{1, 2});
    row("@ai []", nothing);
    row("[['a'], []]", QVariantList{QStringList{a}, QStringList()});
    row("{'a': 1}", QVariantMap{{a, 1}});
    row("{'a': 'b'}", QVariantMap{{a, b}});
    row("{'a': <{'b': <1>}>}", QVariantMap{{a, QVariantMap{{b, 1}}}});
    row("@a{ss} {}", QVariantMap());
    // If a key occurs twice, the first value is used.
    row("{'a': 1, 'b': 2, 'a': 3}", QVariantMap{{a, 1}, {b, 2}});
    // Types that the module never stores.
    row("byte 0xff", nothing);
    row("uint32 1", nothing);
    row("int64 1", nothing);
    row("1.5", nothing);
    row("handle 3", nothing);
    row("objectpath '/a/b'", nothing);
    row("signature 'a{sv}'", nothing);
    row("b'a'", QVariantList{nothing, nothing});
    row("{1: 'a'}", QVariantList{QVariantList{1, a}});
    row("@ms nothing", nothing);
    row("@ms 'a'", QVariantList{a});
    row("()", nothing);
    row("('a', 1, [true])", QVariantList{a, 1, QVariantList{true}});
}

void TestGVariantConversion::readsForeignTypes()
{
    QFETCH(const QVariant, value);

    const GVariantPtr foreign = parse(QTest::currentDataTag());
    QVERIFY(foreign);
    QCOMPARE(describe(toQVariant(foreign.get())), describe(value));
}

void TestGVariantConversion::damagedDataIsInvalid_data()
{
    QTest::addColumn<QByteArray>("type");
    QTest::addColumn<QByteArray>("data");

    const auto row = [](const char *name, const char *type, const QByteArray &data) {
        QTest::newRow(name) << QByteArray(type) << data;
    };
    row("boolean of 2", "b", "\2");
    row("integer of three bytes", "i", "123");
    row("string without its end", "s", "abc");
    row("string of Latin-1", "s", QByteArray("\xe4\0", 2));
    row("string of half a surrogate pair", "s", QByteArray("\xed\xa0\xbd\0", 4));
    row("string with a NUL", "s", QByteArray("a\0b\0", 4));
    row("empty string data", "s", "");
    row("invalid object path", "o", QByteArray("no path\0", 8));
    row("invalid signature", "g", QByteArray("!\0", 2));
    row("list whose offsets lie outside", "as", QByteArray("a\0\xff", 3));
    row("list whose elements overlap", "as", QByteArray("a\0\2\0\2\0\2", 7));
    row("variant of no type", "v", QByteArray("1234\0!", 6));
    row("variant without its end", "v", "1234");
    row("map with a damaged key", "a{sv}", QByteArray("\xff\0\0\0\0\0\0\0\1\0i\2\x0c", 13));
    row("maybe of two sizes", "mi", "12345");
}

void TestGVariantConversion::damagedDataIsInvalid()
{
    QFETCH(const QByteArray, type);
    QFETCH(const QByteArray, data);

    const GVariantPtr value = untrusted(type, data);
    QCOMPARE(describe(toQVariant(value.get())), describe(QVariant()));
}

void TestGVariantConversion::deepDataIsInvalid()
{
    // Each "v" holds the one before it: its data, a zero and its type.
    QByteArray data("\1\0b", 3);
    for (int level = 0; level < 10000; ++level) {
        data += QByteArray("\0v", 2);
    }
    const GVariantPtr value = untrusted("v", data);
    QCOMPARE(describe(toQVariant(value.get())), describe(QVariant()));
}

// If each element were searched from the start, this would take an hour.
void TestGVariantConversion::longListsAreReadOnce()
{
    constexpr int count = 1000000;
    GVariantBuilder texts;
    GVariantBuilder numbers;
    g_variant_builder_init(&texts, G_VARIANT_TYPE("as"));
    g_variant_builder_init(&numbers, G_VARIANT_TYPE("av"));
    for (int i = 0; i < count; ++i) {
        g_variant_builder_add(&texts, "s", QByteArray::number(i).constData());
        g_variant_builder_add(&numbers, "v", g_variant_new_int32(i));
    }
    const auto stored = [](const char *type, GVariant *value) {
        const GVariantPtr owned(g_variant_ref_sink(value));
        return untrusted(type,
                         QByteArray(static_cast<const char *>(g_variant_get_data(value)),
                                    int(g_variant_get_size(value))));
    };
    const GVariantPtr text = stored("as", g_variant_builder_end(&texts));
    const GVariantPtr number = stored("av", g_variant_builder_end(&numbers));
    const QStringList readTexts = toQVariant(text.get()).toStringList();
    QCOMPARE(readTexts.size(), count);
    QCOMPARE(readTexts.last(), QString::number(count - 1));
    const QVariantList readNumbers = toQVariant(number.get()).toList();
    QCOMPARE(readNumbers.size(), count);
    QCOMPARE(readNumbers.last(), QVariant(count - 1));
}

int main(int argc, char *argv[])
{
    g_log_set_always_fatal(
        GLogLevelFlags(G_LOG_LEVEL_ERROR | G_LOG_LEVEL_CRITICAL | G_LOG_LEVEL_WARNING));
    TestGVariantConversion test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_gvariantconversion.moc"
