// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "loggedtest.h"
#include "texts.h"
#include "translations/checkedtranslator.h"

#include <QCoreApplication>
#include <QDataStream>
#include <QFile>
#include <QtTest>

#include <atomic>
#include <thread>

class TestCheckedTranslator : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void readsWhatQtReads_data();
    void readsWhatQtReads();
    void refusesDamagedCatalogs_data();
    void refusesDamagedCatalogs();
    void survivesEveryChangedByte();
    void survivesEveryLength();
    void readsOnlyRegularFilesOfLimitedSize();
    void keepsACatalogWhoseFileIsCut();
    void replacesACatalog();
    void mayBeDeletedWhileAnotherThreadTranslates();
    void warnsOnceOfACatalogThatItDoesNotUse();
};

namespace {

const QString path = "/usr/share/translations/damaged.qm"_s;

const QByteArray magic = QByteArray::fromHex("3cb86418caef9c95cd211cbf60a1bddd");
constexpr quint8 contexts = 0x2f;
constexpr quint8 hashes = 0x42;
constexpr quint8 messages = 0x69;
constexpr quint8 pluralRules = 0x88;
constexpr quint8 dependencies = 0x96;

// Writes big-endian numbers and, as QDataStream does, blocks with their lengths.
template<typename... Parts> QByteArray bytes(const Parts &...parts)
{
    QByteArray data;
    QDataStream stream(&data, QIODevice::WriteOnly);
    (stream << ... << parts);
    return data;
}

QByteArray section(quint8 tag, const QByteArray &content)
{
    return bytes(tag, content);
}

// "a", for any text with the hash 1.
const QByteArray message = bytes(quint8(3), QByteArray("\0a", 2), quint8(1));
const QByteArray hashTable = section(hashes, bytes(1, 0));
// Any text with a hash of 1.
constexpr const char *text = "\1";

QByteArray compiled(const QString &name)
{
    Files::installCatalog(name);
    QFile file("/usr/share/translations/"_s + name + ".qm"_s);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

QString refusal(const QByteArray &content)
{
    Files::write(path, content);
    CheckedTranslator translator;
    const QString reason = translator.loadFile(path);
    // Reads from an hashTable, if there is one.
    translator.translate("", text, "", 1);
    translator.translate("", "maps-title");
    translator.translate("context", "maps-english", "comment", 2);
    return reason;
}

} // namespace

void TestCheckedTranslator::readsWhatQtReads_data()
{
    QTest::addColumn<QByteArray>("content");
    const auto add = [](const char *name, const QByteArray &content) {
        QTest::newRow(name) << magic + content;
    };
    add("nothing", {});
    add("one message", hashTable + section(messages, message));
    add("unknown section", section(0xee, "x") + hashTable + section(messages, message));
    add("plural forms, one of them empty",
        hashTable
            + section(messages,
                      bytes(quint8(3), QByteArray("\0a", 2), quint8(3), ~0U, quint8(3),
                            QByteArray("\0c", 2), quint8(1)))
            + section(pluralRules, QByteArray::fromHex("0101ff040204")));
    add("other parts of a message",
        hashTable
            + section(messages,
                      bytes(quint8(5), 7, quint8(3), QByteArray("\0a", 2), quint8(8),
                            QByteArray(""), quint8(6), QByteArray(text), quint8(7), QByteArray(""),
                            quint8(1))));
    // Two buckets: an empty one, and one with the context "".
    add("contexts",
        hashTable + section(messages, message)
            + section(contexts, bytes(quint16(1), quint16(1), quint16(0), quint16(0x0100))));
    // The name of the last context ends at the end of the section, without the zero that ends the
    // list: QTranslator reads on in the next section.
    add("contexts without an end",
        hashTable + section(messages, message)
            + section(contexts, bytes(quint16(1), quint16(1), quint16(0), quint16(0x0178)))
            + section(pluralRules, QByteArray::fromHex("0101")));
    const QByteArray noBuckets = section(contexts, bytes(quint16(0), quint16(0)));
    const QByteArray oneBucket = section(contexts, bytes(quint16(1), quint16(0), quint16(0)));
    add("only the last section of a kind is read",
        noBuckets + oneBucket + hashTable + section(messages, "x") + section(messages, message));
    add("nothing is read from a section with the tag 0 on",
        oneBucket + hashTable + section(messages, message) + section(0, "x") + noBuckets
            + section(messages, "x") + section(dependencies, bytes("other"_s)));
}

void TestCheckedTranslator::readsWhatQtReads()
{
    QFETCH(QByteArray, content);
    Files::write(path, content);
    QTranslator expected;
    QVERIFY(expected.load(path));
    CheckedTranslator translator;
    QCOMPARE(translator.loadFile(path), QString());
    for (const int number : {-1, 0, 1, 2, 5}) {
        for (const char *context : {"", "x", "y"}) {
            QCOMPARE(translator.translate(context, text, "", number),
                     expected.translate(context, text, "", number));
        }
    }
}

void TestCheckedTranslator::refusesDamagedCatalogs_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("reason");
    const auto add = [](const char *name, const QByteArray &content, const QString &reason) {
        QTest::newRow(name) << content << reason;
    };
    const QString foreign = "it does not begin like a catalog"_s;
    add("empty file", {}, foreign);
    add("part of the magic number", magic.left(15), foreign);
    add("another magic number", "<" + magic.mid(1).toUpper() + message, foreign);

    const QString cut = "it is cut short or damaged"_s;
    const QByteArray whole = section(messages, message);
    add("only a tag", magic + whole + char(messages), cut);
    add("part of a length", magic + whole + bytes(messages, quint16(0)), cut);
    add("section without content", magic + section(messages, "") + whole, cut);
    add("section without its last byte", magic + whole.chopped(1), cut);
    add("zeros at the end", magic + whole + QByteArray(5, '\0'), cut);

    add("dependency", magic + section(dependencies, bytes("other"_s)),
        "it depends on other catalogs"_s);

    const QString damaged = "a message is damaged"_s;
    const auto addMessage = [&](const char *name, const QByteArray &content) {
        add(name, magic + hashTable + section(messages, content), damaged);
    };
    addMessage("message without an end", message.chopped(1));
    addMessage("unknown tag", bytes(quint8(2), QByteArray("ab"), quint8(1)));
    addMessage("half a character", bytes(quint8(3), QByteArray("abc"), quint8(1)));
    addMessage("translation beyond the end", bytes(quint8(3), 4, quint16('a'), quint8(1)));
    addMessage("negative length", bytes(quint8(3), -6, quint8(1)));
    addMessage("source text without a length", bytes(quint8(6), ~0U, quint8(1)));
    addMessage("context beyond the end", bytes(quint8(7), 0x40000000, quint8(1)));
    addMessage("comment beyond the end", bytes(quint8(8), 2, quint8(1)));
    addMessage("part of a length in a message", bytes(quint8(8), quint16(0)));
    addMessage("obsolete part beyond the end", bytes(quint8(5), quint16(0x0101)));
    addMessage("damaged second message", message + bytes(quint8(0)));

    const QString badIndex = "its index is damaged"_s;
    const auto addIndex = [&](const char *name, const QByteArray &content) {
        add(name, magic + section(hashes, content) + section(messages, message), badIndex);
    };
    addIndex("position behind the messages", bytes(1, message.size()));
    addIndex("negative position", bytes(1, -1));
    addIndex("position inside a message", bytes(1, 1));
    addIndex("hash without a position", bytes(1, 0, 2));
    addIndex("part of a hash", bytes(1, 0, quint8(0)));
    addIndex("two hashes of a message", bytes(1, 0, 1, 0));
    add("index without messages", magic + hashTable, badIndex);

    const QString badContexts = "its list of contexts is damaged"_s;
    const auto addContexts = [&](const char *name, const QByteArray &content) {
        add(name, magic + hashTable + section(messages, message) + section(contexts, content),
            badContexts);
    };
    addContexts("no buckets", bytes(quint16(0), quint16(0)));
    addContexts("part of a number", bytes(quint8(1)));
    addContexts("fewer buckets than announced", bytes(quint16(2), quint16(0)));
    addContexts("bucket behind the names", bytes(quint16(1), quint16(1), quint16(0)));
    addContexts("bucket without names", bytes(quint16(1), quint16(0)));
    // QTranslator reads the first list.
    add("no buckets before a section with the tag 0",
        magic + hashTable + section(messages, message)
            + section(contexts, bytes(quint16(0), quint16(0))) + section(0, "x")
            + section(contexts, bytes(quint16(1), quint16(0), quint16(0))),
        badContexts);

    for (const auto *rules : {"01", "0500", "8101", "040102ff", "010102", "0401"}) {
        add(rules, magic + section(pluralRules, QByteArray::fromHex(rules)),
            "its plural rules are damaged"_s);
    }
}

void TestCheckedTranslator::refusesDamagedCatalogs()
{
    QFETCH(QByteArray, content);
    QTEST(refusal(content), "reason");
}

void TestCheckedTranslator::survivesEveryChangedByte()
{
    const QByteArray content = compiled("maps-fi"_s);
    int accepted = 0;
    for (int at = 0; at < content.size(); ++at) {
        for (const char mask : {'\x01', '\x80', '\xff'}) {
            QByteArray changed = content;
            changed[at] = char(changed.at(at) ^ mask);
            accepted += refusal(changed).isEmpty() ? 1 : 0;
        }
    }
    // A changed text or hash is not a danger.
    QVERIFY(accepted > 0);
}

void TestCheckedTranslator::survivesEveryLength()
{
    const QByteArray content = compiled("maps-fi"_s);
    QList<int> accepted;
    for (int size = 0; size < content.size(); ++size) {
        if (refusal(content.left(size)).isEmpty()) {
            accepted.append(size);
        }
    }
    // Behind the magic number, the language and the messages, before the plural rules.
    const int end = content.size();
    QCOMPARE(accepted, (QList<int>{magic.size(), magic.size() + 7, end - 7}));
    QCOMPARE(refusal(content), QString());
}

void TestCheckedTranslator::readsOnlyRegularFilesOfLimitedSize()
{
    CheckedTranslator translator;
    QVERIFY(translator.loadFile("/usr/share"_s).contains("directory"_s));
    QVERIFY(!translator.loadFile("/nowhere"_s).isEmpty());
    Files::makePipe("/usr/share/pipe.qm"_s);
    QVERIFY(translator.loadFile("/usr/share/pipe.qm"_s).contains("not a regular file"_s));

    // One section fills the file to the limit.
    const auto limit = int(maximumCatalogSize);
    const QByteArray largest = magic + section(0xee, QByteArray(limit - magic.size() - 5, 'x'));
    QCOMPARE(largest.size(), limit);
    QCOMPARE(refusal(largest), QString());
    QCOMPARE(refusal(largest + 'x'), "file to open is larger than 16777216 bytes"_s);
}

void TestCheckedTranslator::keepsACatalogWhoseFileIsCut()
{
    Files::installCatalog("maps-fi"_s);
    const QString file = "/usr/share/translations/maps-fi.qm"_s;
    CheckedTranslator translator;
    QCOMPARE(translator.loadFile(file), QString());
    // A program that maps the file would get SIGBUS now.
    QVERIFY(QFile::resize(file, 0));
    QCOMPARE(translator.translate("", "maps-title"), "Kartat"_s);
}

void TestCheckedTranslator::replacesACatalog()
{
    CheckedTranslator translator;
    QCoreApplication::installTranslator(&translator);
    Files::installCatalogs({"maps-fi"_s, "maps-de"_s});
    QCOMPARE(translator.loadFile("/usr/share/translations/maps-fi.qm"_s), QString());
    QCOMPARE(qtTrId("maps-title"), "Kartat"_s);
    QCOMPARE(translator.loadFile("/usr/share/translations/maps-de.qm"_s), QString());
    QCOMPARE(qtTrId("maps-title"), "Karten"_s);
    Files::write(path, "damaged");
    QVERIFY(!translator.loadFile(path).isEmpty());
    QCOMPARE(qtTrId("maps-title"), "maps-title"_s);
    QVERIFY(translator.isEmpty());
}

void TestCheckedTranslator::mayBeDeletedWhileAnotherThreadTranslates()
{
    // The address sanitizer notices if the thread reads freed content. Each look-up reads all these
    // messages, so the thread spends nearly all its time there.
    const QByteArray another = bytes(quint8(6), QByteArray("x"), quint8(1));
    const int count = 100000;
    QByteArray index;
    for (int i = 0; i < count; ++i) {
        index += bytes(1, i * another.size());
    }
    Files::write(path, magic + section(hashes, index) + section(messages, another.repeated(count)));
    auto translator = std::make_unique<CheckedTranslator>();
    QCOMPARE(translator->loadFile(path), QString());
    QCoreApplication::installTranslator(translator.get());

    std::atomic<bool> isReading = false;
    std::atomic<bool> isDone = false;
    std::thread reader([&] {
        while (!isDone) {
            qtTrId(text);
            isReading = true;
        }
    });
    while (!isReading) {
        std::this_thread::yield();
    }
    translator.reset();
    isDone = true;
    reader.join();
}

void TestCheckedTranslator::warnsOnceOfACatalogThatItDoesNotUse()
{
    Files::write(path, magic + section(dependencies, bytes("other"_s)));
    CheckedTranslator translator;
    translator.loadFileIfFound(path);
    QCOMPARE(m_log->takeTexts(),
             QStringList{"The translation catalog \"/usr/share/translations/damaged.qm\" is not "
                         "used: it depends on other catalogs"_s});
    translator.loadFileIfFound(QString());
}

QTEST_GUILESS_MAIN(TestCheckedTranslator)

#include "tst_checkedtranslator.moc"
