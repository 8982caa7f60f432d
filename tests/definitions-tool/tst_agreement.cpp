// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compares the checker with the readers on random files.

#include "definitions-tool/definitionschecker.h"
#include "definitions-tool/inilines.h"
#include "definitions-tool/jsonwalker.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "files.h"
#include "loggedtest.h"
#include "patience.h"
#include "quickactions/quickaction.h"
#include "texts.h"

#include <QDBusError>
#include <QDBusMessage>
#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QRegularExpression>
#include <QTemporaryDir>
#include <QtTest>

#include <algorithm>
#include <random>

// Stores the error of a call.
class Receiver : public QObject
{
    Q_OBJECT

public:
    QDBusError error;

public Q_SLOTS:
    void fail(const QDBusError &answer, const QDBusMessage &) { error = answer; }
};

class TestAgreement : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void linesHaveTheKeysOfQSettings();
    void mutilatedQuickActions();
    void walkerReadsWhatQJsonDocumentReads();
    void namesThatCanBeSent();

private:
    QString write(const QByteArray &content, const char *suffix);

    std::unique_ptr<QTemporaryDir> m_directory;
    int m_files = 0;
};

namespace {

using Random = std::mt19937;

int below(int end, Random *random)
{
    return int((*random)() % uint(end));
}

QVector<QByteArray> corpus(const char *kind)
{
    QVector<QByteArray> contents;
    const QDir directory(CORPUS_DIR "/"_s + QLatin1String(kind));
    const QStringList names = directory.entryList(QDir::Files);
    for (const QString &name : names) {
        QFile file(directory.filePath(name));
        if (!file.open(QIODevice::ReadOnly)) {
            qFatal("cannot read %s", qPrintable(name));
        }
        contents.append(file.readAll());
    }
    if (contents.isEmpty()) {
        qFatal("there is no corpus in %s", qPrintable(directory.path()));
    }
    return contents;
}

// Removes, inserts or replaces some bytes. Most new bytes have a meaning in the format.
QByteArray mutilated(QByteArray content, const QByteArray &meaningful, Random *random)
{
    for (int changes = 1 + below(4, random); changes > 0; --changes) {
        const int position = below(content.size() + 1, random);
        const char character = below(4, random) > 0
            ? meaningful.at(below(meaningful.size(), random))
            : char(below(256, random));
        switch (below(4, random)) {
        case 0:
            content.remove(position, 1 + below(8, random));
            break;
        case 1:
            content.insert(position, character);
            break;
        case 2:
            content.insert(position,
                           content.mid(below(content.size() + 1, random), below(30, random)));
            break;
        default:
            if (position < content.size()) {
                content[position] = character;
            }
        }
    }
    return content;
}

std::vector<Finding> check(const QString &path)
{
    DefinitionsChecker checker("/"_s);
    checker.check(path);
    return checker.findings();
}

// Reads the object or array at a position with the walker.
QJsonValue walk(const QByteArray &text, int position)
{
    JsonWalker walker(text, position);
    QJsonObject object;
    QJsonArray array;
    const bool isObject = text.at(position) == '{';
    while (walker.next()) {
        const bool isNested = walker.value().isObject() || walker.value().isArray();
        const QJsonValue value = isNested ? walk(text, walker.position()) : walker.value();
        if (isObject) {
            object.insert(walker.key(), value);
        } else {
            array.append(value);
        }
    }
    return isObject ? QJsonValue(object) : QJsonValue(array);
}

int count(const std::vector<Finding> &findings, std::initializer_list<const char *> rules)
{
    return int(std::count_if(findings.cbegin(), findings.cend(), [rules](const Finding &finding) {
        return std::any_of(rules.begin(), rules.end(), [&finding](const char *rule) {
            return finding.rule == QLatin1String(rule);
        });
    }));
}

} // namespace

void TestAgreement::init()
{
    LoggedTest::init();
    // In memory, because there are many files.
    m_directory =
        std::make_unique<QTemporaryDir>(qEnvironmentVariable("XDG_RUNTIME_DIR") + "/XXXXXX"_s);
}

void TestAgreement::cleanup()
{
    LoggedTest::cleanup();
    m_directory.reset();
}

// Uses a new name each time, because QSettings caches what it has read.
QString TestAgreement::write(const QByteArray &content, const char *suffix)
{
    const QString path = m_directory->filePath("%1.%2"_s.arg(++m_files).arg(QLatin1String(suffix)));
    Files::write(path, content);
    return path;
}

void TestAgreement::linesHaveTheKeysOfQSettings()
{
    Random random(1);
    const QVector<QByteArray> contents = corpus("quickaction");
    int compared = 0;
    for (int i = 0; i < 4000; ++i) {
        // QSettings decodes names with percent signs in its own way.
        const QByteArray content =
            mutilated(contents.at(below(contents.size(), &random)), "\n\r\\\"=;[] ,/#", &random)
                .replace('%', 'x')
                .replace('@', 'x');
        if (content.size() > 100000) {
            continue;
        }
        const QString path = write(content, "conf");
        const QSettings settings(path, QSettings::IniFormat);
        if (settings.status() != QSettings::NoError) {
            continue; // The model then reads no keys.
        }
        const QStringList keys = settings.allKeys();
        QStringList found;
        for (const NamedIniLine &line : readIniLines(content)) {
            if (line.kind == IniLine::Kind::Key && !found.contains(line.name)) {
                found.append(line.name);
            }
        }
        found.sort();
        if (found != keys) {
            qInfo() << content;
        }
        QCOMPARE(found, keys);
        compared += keys.size();
        Files::remove(path);
    }
    QVERIFY(compared > 10000);
}

void TestAgreement::mutilatedQuickActions()
{
    Random random(2);
    const QVector<QByteArray> contents = corpus("quickaction");
    int refused = 0;
    for (int i = 0; i < 4000; ++i) {
        const QByteArray content = mutilated(contents.at(below(contents.size(), &random)),
                                             "\n\r\\\"=;[] ,/#@%x1", &random);
        const QString path = write(content, "conf");
        const std::vector<Finding> findings = check(path);
        // The model reads a copy under another name.
        const QString another = write(content, "conf");
        const QuickAction action(another, false);
        const bool isRefused = !action.isRead();
        m_log->takeAll();
        refused += isRefused ? 1 : 0;
        QCOMPARE(count(findings, {"unreadable"}), isRefused ? 1 : 0);
        if (!isRefused && action.whyUnsendable().isValid()) {
            QVERIFY2(count(findings, {"call", "arguments", "comma", "type"}) > 0,
                     content.constData());
        }
        const int lines = content.count('\n') + 1;
        for (const Finding &finding : findings) {
            QVERIFY(finding.line >= 1 && finding.line <= lines);
        }
        Files::remove(path);
        Files::remove(another);
    }
    QVERIFY(refused > 10 && refused < 3000);
}

void TestAgreement::walkerReadsWhatQJsonDocumentReads()
{
    QVector<QByteArray> contents = corpus("eventswidgetsfile");
    contents.append(
        R"( { "a\"]" : [ -1.5e3 ,true, null,{ } , [ ] ,"\\" ] ,"\u0061": {"b\\":"}" }, "a":[{"":0}] } )");
    // QJsonDocument reads these as unpaired surrogates, which compare unequal.
    static const QRegularExpression escapedBytes("\\\\[\\x80-\\xff]"_s);
    Random random(5);
    int accepted = 0;
    for (int i = 0; i < 8000; ++i) {
        const QByteArray &content = contents.at(i % contents.size());
        const QByteArray text = i < contents.size()
            ? content
            : mutilated(content, "\n\\\"{}[]:, 019.eE-tfnu\xc3\xa4", &random);
        const QJsonDocument document = QJsonDocument::fromJson(text);
        if (document.isObject() && !QString::fromLatin1(text).contains(escapedBytes)) {
            ++accepted;
            QCOMPARE(walk(text, text.indexOf('{')).toObject(), document.object());
        }
    }
    QVERIFY2(accepted > 500, qPrintable(QString::number(accepted)));
}

void TestAgreement::namesThatCanBeSent()
{
    const QStringList keys = {"remote-service"_s, "remote-path"_s, "remote-interface"_s,
                              "remote-method"_s};
    const QStringList good = {"org.example.lamp"_s, "/lamp"_s, "org.example.Lamp"_s, "toggle"_s};
    const QByteArray characters = "aZ_-./:1 ";
    Random random(4);
    int sent = 0;
    int refused = 0;
    for (int i = 0; i < 1500; ++i) {
        QStringList values = good;
        QByteArray name = below(2, &random) == 0 ? QByteArray() : values.at(i % 4).toLatin1();
        for (int length = below(6, &random); length > 0; --length) {
            name.insert(below(name.size() + 1, &random),
                        characters.at(below(characters.size(), &random)));
        }
        values[i % 4] = QString::fromLatin1(name);
        QByteArray content;
        for (int key = 0; key < keys.size(); ++key) {
            content += keys.at(key).toLatin1() + "=\"" + values.at(key).toLatin1() + "\"\n";
        }
        const QString path = write(content, "conf");
        Receiver receiver;
        const bool isSent = QuickAction(path, false)
                                .trigger(&receiver, nullptr, SLOT(fail(QDBusError, QDBusMessage)));
        if (isSent) {
            TRY(receiver.error.isValid());
        }
        // No service has this name, so a call that is sent fails with ServiceUnknown.
        const bool arrived = receiver.error.type() == QDBusError::ServiceUnknown;
        (arrived ? sent : refused) += 1;
        m_log->takeAll();
        QVERIFY2((count(check(path), {"call"}) == 0) == arrived,
                 qPrintable(QString::fromUtf8(content) + receiver.error.message()));
        Files::remove(path);
    }
    QVERIFY(sent > 200 && refused > 200);
}

QTEST_GUILESS_MAIN(TestAgreement)

#include "tst_agreement.moc"
