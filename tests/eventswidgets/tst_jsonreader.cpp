// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The reader beside QJsonDocument: both have to see the same in every text.

#include "eventswidgets/jsonreader.h"
#include "messagelog.h"

#include <QJsonDocument>
#include <QJsonObject>
#include <QRandomGenerator>
#include <QtTest>

#include <functional>
#include <optional>

class TestJsonReader : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void agreesWithQJsonDocument_data();
    void agreesWithQJsonDocument();
    void refusesToEscapeBytesOutsideAscii();
    void agreesOnMutilatedTexts();
    void agreesOnDepth_data();
    void agreesOnDepth();
    void nestedValues();
    void passesWhatItIsNotAskedFor();
    void positionOfAValue();
    void memberWithoutAKey();
    void positionOfAnError_data();
    void positionOfAnError();

private:
    std::unique_ptr<MessageLog> m_log;
};

namespace {

template<typename Value> using Members = QMap<QString, Value>;

// The members of an object, all of them read by one function; nothing if the text is no object.
template<typename Value>
std::optional<Members<Value>> members(const QByteArray &text,
                                      const std::function<Value(JsonReader *)> &read)
{
    Members<Value> members;
    JsonReader reader(text);
    if (!reader.beginObject()) {
        return {};
    }
    std::string_view key;
    while (reader.nextMember(&key)) {
        const QString name = QString::fromUtf8(key.data(), int(key.size()));
        members[name] = read(&reader);
    }
    if (!reader.atEnd()) {
        return {};
    }
    return members;
}

template<typename Value>
std::optional<Members<Value>>
expectedMembers(const QByteArray &text, const std::function<Value(const QJsonValue &)> &convert)
{
    const QJsonDocument document = QJsonDocument::fromJson(text);
    if (!document.isObject()) {
        return {};
    }
    Members<Value> members;
    const QJsonObject object = document.object();
    for (auto it = object.constBegin(); it != object.constEnd(); ++it) {
        // A half of a surrogate pair is no character in UTF-8.
        const QByteArray key = it.key().toUtf8();
        members[QString::fromUtf8(key.constData(), key.size())] = convert(it.value());
    }
    return members;
}

bool agrees(const QByteArray &text)
{
    const auto strings =
        members<QString>(text, [](JsonReader *reader) { return reader->readString(); });
    const auto numbers = members<int>(text, [](JsonReader *reader) { return reader->readInt(-7); });
    const auto bools = members<bool>(text, [](JsonReader *reader) { return reader->readBool(); });
    const auto skipped = members<int>(text, [](JsonReader *reader) {
        reader->skip();
        return 0;
    });
    return strings
        == expectedMembers<QString>(text, [](const QJsonValue &value) { return value.toString(); })
        && numbers
        == expectedMembers<int>(text, [](const QJsonValue &value) { return value.toInt(-7); })
        && bools
        == expectedMembers<bool>(text, [](const QJsonValue &value) { return value.toBool(); })
        && skipped.has_value() == strings.has_value();
}

QVector<QByteArray> texts()
{
    QVector<QByteArray> texts = {
        "",
        " ",
        "{}",
        " \t\r\n{ \n} \t",
        "\xef\xbb\xbf{}",
        "\xef\xbb\xbf\xef\xbb\xbf{}",
        " \xef\xbb\xbf{}",
        "[]",
        "null",
        R"("a")",
        "{",
        "}",
        "{]",
        "{} {}",
        "{},",
        R"({"a"})",
        R"({"a":})",
        R"({"a" 1})",
        R"({"a":1,})",
        R"({,"a":1})",
        R"({"a":1 "b":2})",
        "{a:1}",
        "{'a':1}",
        R"({"a":1,"a":"x","a":true})",
        R"({"a":"x","\u0061":"y"})",
        R"({"":"empty"})",
        R"({"a":[1,[2,{"b":[]}],{}],"c":"d"})",
        R"({"a":[1,]})",
        R"({"a":[,1]})",
        R"({"a":[1 2]})",
        R"({"a":[})",
        R"({"a":{]})",
        QByteArray("{\"a\":\"\0\"}", 9),
        QByteArray("{\"a\":\0}", 7),
        QByteArray("{}\0", 3),
        "{\"a\":\"line\nbreak\"}",
        "{\"a\":\"\x7f\"}",
    };
    for (const QByteArray string : {"plain",
                                    "\xc3\xa4\xe2\x82\xac\xf0\x9f\x98\x80",
                                    R"(\\\"\/\b\f\n\r\t)",
                                    R"(\u00e4x)",
                                    R"(\u00E4\u20aC)",
                                    R"(\ud83d\ude00)",
                                    R"(\ud83d)",
                                    R"(\ude00x)",
                                    R"(\u0000)",
                                    R"(\u12)",
                                    R"(\u123g)",
                                    R"(\u 123)",
                                    R"(\u+123)",
                                    R"(\u0x1)",
                                    R"(\U0041)",
                                    R"(\x)",
                                    R"(\')",
                                    R"(\)",
                                    R"(\\\)",
                                    "\xff",
                                    "\xc3",
                                    "\xc3(",
                                    "\xc0\x80",
                                    "\xe0\x80\x80",
                                    "\xed\xa0\x80",
                                    "\xf4\x90\x80\x80",
                                    "\xf8\x88\x80",
                                    "x\xef\xbb\xbfy",
                                    "\xef\xbf\xbe",
                                    "\xc3\\u00e4",
                                    "\xc3\xa4\\n\xc3\xa4"}) {
        const QByteArray quoted = '"' + string + '"';
        texts.append(R"({"a":)" + quoted + R"(,"b":"c"})");
        texts.append("{" + quoted + R"(:"a","b":"c"})");
    }
    for (const QByteArray value : {"0",
                                   "-0",
                                   "1",
                                   "-1",
                                   "00",
                                   "01",
                                   "-01",
                                   "+1",
                                   "5.0",
                                   "5.00",
                                   "5.5",
                                   ".5",
                                   "5.",
                                   "-",
                                   "-.",
                                   "1e2",
                                   "1E+2",
                                   "1e-2",
                                   "50e-1",
                                   "1e",
                                   "1e+",
                                   "e1",
                                   "1.5e1",
                                   "2147483647",
                                   "2147483648",
                                   "-2147483648",
                                   "-2147483649",
                                   "4294967296",
                                   "9223372036854775807",
                                   "9223372036854775808",
                                   "1e300",
                                   "1e308",
                                   "1e309",
                                   "1e999",
                                   "1e-400",
                                   "-1e999",
                                   "0x10",
                                   "1_0",
                                   "Infinity",
                                   "NaN",
                                   "-Infinity",
                                   "true",
                                   "false",
                                   "null",
                                   "True",
                                   "tru",
                                   "truex",
                                   "true1",
                                   "nul",
                                   "nulll",
                                   "fals",
                                   "undefined",
                                   "1 2",
                                   "1,",
                                   R"("1")",
                                   "[1]",
                                   R"({"x":1})",
                                   "0.1000000000000000055511151231257827"}) {
        texts.append(R"({"a":)" + value + R"(,"b":"c"})");
        texts.append(R"({"a":)" + value + "}");
        texts.append(R"({"b":[)" + value + R"(, "c"]})");
    }
    return texts;
}

} // namespace

void TestJsonReader::init()
{
    m_log = std::make_unique<MessageLog>();
}

void TestJsonReader::cleanup()
{
    QCOMPARE(m_log->takeReport(), QString());
    m_log.reset();
}

void TestJsonReader::agreesWithQJsonDocument_data()
{
    QTest::addColumn<QByteArray>("text");
    const QVector<QByteArray> all = texts();
    for (const QByteArray &text : all) {
        const QByteArray name = QJsonDocument::fromJson(text).isObject() ? "good " : "bad ";
        QTest::newRow((name + text.toPercentEncoding("{}[]:, ")).constData()) << text;
    }
}

void TestJsonReader::agreesWithQJsonDocument()
{
    QFETCH(QByteArray, text);
    QVERIFY(agrees(text));
}

void TestJsonReader::refusesToEscapeBytesOutsideAscii()
{
    // Of these alone QJsonDocument makes characters that nobody wrote.
    const QByteArray text("\"\\\xc3\xa4\"");
    JsonReader reader(text);
    QCOMPARE(reader.readString(), QString());
    QVERIFY(!reader.atEnd());
}

void TestJsonReader::agreesOnMutilatedTexts()
{
    const QVector<QByteArray> all = texts();
    const QByteArray pieces("{}[]\",:\\u0a1-.eE+ntf \n\xc3\xa4\xff", 26);
    QRandomGenerator random(20260712);
    int good = 0;
    for (int i = 0; i < 50000; ++i) {
        QByteArray text = all.at(random.bounded(all.size()));
        for (int change = random.bounded(1, 4); change > 0; --change) {
            const int at = random.bounded(text.size() + 1);
            const QByteArray piece(1, pieces.at(random.bounded(pieces.size())));
            text.replace(at, random.bounded(2), random.bounded(4) > 0 ? piece : QByteArray());
        }
        // The two differences: QJsonDocument makes characters that are none of an escaped byte
        // outside ASCII, and drops a byte-order mark at the start of a string.
        static const QRegularExpression different(
            QStringLiteral("\\\\[\\x80-\\xff]|\"\\xef\\xbb\\xbf"));
        if (QString::fromLatin1(text.constData(), text.size()).contains(different)) {
            continue;
        }
        good += QJsonDocument::fromJson(text).isObject() ? 1 : 0;
        QVERIFY2(agrees(text), text.toPercentEncoding("{}[]:, ").constData());
    }
    // Not all of them for nothing.
    QVERIFY(good > 1000);
}

void TestJsonReader::agreesOnDepth_data()
{
    QTest::addColumn<QByteArray>("text");
    for (const int depth : {1022, 1023, 1024, 100000, 5000000}) {
        QTest::newRow(qPrintable(QStringLiteral("%1 arrays").arg(depth)))
            << R"({"a":)" + QByteArray(depth, '[') + QByteArray(depth, ']') + "}";
        QTest::newRow(qPrintable(QStringLiteral("%1 open arrays").arg(depth)))
            << R"({"a":)" + QByteArray(depth, '[');
    }
    QByteArray text = "1";
    for (int depth = 1; depth <= 1025; ++depth) {
        text = R"({"a":)" + text + "}";
        if (depth >= 1023) {
            QTest::newRow(qPrintable(QStringLiteral("%1 objects").arg(depth))) << text;
        }
    }
}

void TestJsonReader::agreesOnDepth()
{
    QFETCH(QByteArray, text);
    QVERIFY(agrees(text));
}

void TestJsonReader::nestedValues()
{
    const QByteArray text = R"({ "a": [ { "b": "x" }, { "b": "y" }, [ 3 ], 4 ], "c": 5 })";
    JsonReader reader(text);
    QStringList strings;
    QVector<int> numbers;
    std::string_view key;
    QVERIFY(reader.beginObject());
    QVERIFY(reader.nextMember(&key));
    QVERIFY(key == "a");
    QVERIFY(reader.beginArray());
    for (int i = 0; i < 2; ++i) {
        QVERIFY(reader.nextElement());
        QVERIFY(reader.beginObject());
        while (reader.nextMember(&key)) {
            strings.append(reader.readString());
        }
    }
    QVERIFY(reader.nextElement());
    QVERIFY(reader.beginArray());
    while (reader.nextElement()) {
        numbers.append(reader.readInt(-1));
    }
    QVERIFY(reader.nextElement());
    numbers.append(reader.readInt(-1));
    QVERIFY(!reader.nextElement());
    QVERIFY(reader.nextMember(&key));
    QVERIFY(key == "c");
    numbers.append(reader.readInt(-1));
    QVERIFY(!reader.atEnd());
    QVERIFY(!reader.nextMember(&key));
    QVERIFY(reader.atEnd());
    QCOMPARE(strings, (QStringList{QStringLiteral("x"), QStringLiteral("y")}));
    QCOMPARE(numbers, (QVector<int>{3, 4, 5}));
}

void TestJsonReader::passesWhatItIsNotAskedFor()
{
    const QByteArray text = R"([ { "a": [ 1 ] }, [ 1, 2 ], "x", 7 ])";
    JsonReader reader(text);
    QVERIFY(reader.beginArray());
    QVERIFY(reader.nextElement());
    QVERIFY(!reader.beginArray());
    QVERIFY(reader.nextElement());
    QVERIFY(!reader.beginObject());
    QVERIFY(reader.nextElement());
    QCOMPARE(reader.readInt(-1), -1);
    QVERIFY(reader.nextElement());
    QCOMPARE(reader.readString(), QString());
    QVERIFY(!reader.nextElement());
    QVERIFY(reader.atEnd());
}

void TestJsonReader::memberWithoutAKey()
{
    const QByteArray text = R"({ "a": 1, 2 })";
    JsonReader reader(text);
    QVERIFY(reader.beginObject());
    std::string_view key;
    QVERIFY(reader.nextMember(&key));
    QCOMPARE(reader.readInt(-1), 1);
    // Nobody takes the key of the member before for this one's.
    QVERIFY(!reader.nextMember(&key));
    QVERIFY(!reader.atEnd());
}

void TestJsonReader::positionOfAValue()
{
    const QByteArray text = "\xef\xbb\xbf {\n \"a\" :\n [ 1 ]} ";
    JsonReader reader(text);
    QCOMPARE(reader.position(), text.indexOf('{'));
    QVERIFY(reader.beginObject());
    std::string_view key;
    QVERIFY(reader.nextMember(&key));
    QCOMPARE(reader.position(), text.indexOf('['));
    reader.skip();
    QVERIFY(!reader.nextMember(&key));
    QVERIFY(reader.atEnd());
    QCOMPARE(reader.position(), text.size());
}

void TestJsonReader::positionOfAnError_data()
{
    QTest::addColumn<QByteArray>("text");
    QTest::addColumn<int>("position");
    QTest::newRow("no comma") << QByteArray(R"({"a":1 "b":2})") << 7;
    QTest::newRow("no key") << QByteArray(R"({"a":1, b:2})") << 8;
    QTest::newRow("no value") << QByteArray(R"({"a": })") << 6;
    QTest::newRow("unknown word") << QByteArray("{\"a\":\n yes}") << 7;
    QTest::newRow("no end of a string") << QByteArray("{\"a\": \"b\n}\n") << 7;
    QTest::newRow("no end") << QByteArray(R"({"a":[1)") << 7;
    QTest::newRow("more behind it") << QByteArray("{}\n{}") << 3;
    QTest::newRow("too deep") << QByteArray(2000, '[') << 1025;
}

void TestJsonReader::positionOfAnError()
{
    QFETCH(QByteArray, text);
    JsonReader reader(text);
    reader.skip();
    QVERIFY(!reader.atEnd());
    QTEST(reader.position(), "position");
}

QTEST_GUILESS_MAIN(TestJsonReader)

#include "tst_jsonreader.moc"
