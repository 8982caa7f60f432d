// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Good and bad definition files: the checker finds the expected problems in the expected lines. It
// finds an error if, and only if, the model reads something other than the file says.

#include "definitions-tool/definitionschecker.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "files.h"
#include "loggedtest.h"
#include "patience.h"
#include "places.h"
#include "quickactions/quickaction.h"
#include "quickactions/quickactionsmodel.h"
#include "texts.h"
#include "words.h"

#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>
#include <QRegularExpression>
#include <QTemporaryDir>
#include <QtTest>

#include <algorithm>

class TestCorpus : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();

    void findings_data();
    void findings();
    void findingsOfATree();
    void rulesAreExplained();
    void agreesOnQuickActions_data();
    void agreesOnQuickActions();
    void agreesOnEventsWidgets_data();
    void agreesOnEventsWidgets();
    void examplesAreClean();
};

namespace {

const QString quickActionsCorpus = CORPUS_DIR "/quickaction"_s;
const QString eventsWidgetsCorpus = CORPUS_DIR "/eventswidgetsfile"_s;

QByteArray read(const QString &path)
{
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        qFatal("cannot read %s", qPrintable(path));
    }
    return file.readAll();
}

void addRows(const QStringList &directories)
{
    QTest::addColumn<QString>("path");
    for (const QString &directory : directories) {
        const QFileInfoList files = QDir(directory).entryInfoList(QDir::Files);
        if (files.isEmpty()) {
            qFatal("there is no corpus in %s", qPrintable(directory));
        }
        for (const QFileInfo &file : files) {
            QTest::newRow(qPrintable(file.fileName())) << file.filePath();
        }
    }
}

std::vector<Finding> check(const QString &path)
{
    DefinitionsChecker checker("/"_s);
    if (!checker.check(path)) {
        qFatal("nothing at %s", qPrintable(path));
    }
    return checker.findings();
}

// Returns the lines that the checker must print for a file of the corpus.
QString expectedFindings(const QFileInfo &file)
{
    const QString start = file.fileName() + QLatin1Char(':');
    QString expected;
    const auto lines =
        QString::fromUtf8(read(file.path() + ".findings"_s)).split(QLatin1Char('\n'));
    for (const QString &line : lines) {
        if (line.startsWith(start)) {
            expected += line + QLatin1Char('\n');
        }
    }
    return expected;
}

// Returns the errors in a copy of the file, because QSettings caches files by name.
std::vector<Finding> errors(const QString &path)
{
    const QTemporaryDir directory;
    const QString copy = directory.filePath(QFileInfo(path).fileName());
    Files::write(copy, read(path));
    std::vector<Finding> errors;
    for (const Finding &finding : check(copy)) {
        if (finding.severity == Finding::Severity::Error) {
            errors.push_back(finding);
        }
    }
    return errors;
}

// Reads a plain INI file, without the special rules of QSettings. Values with a backslash, which only
// QSettings understands, are left out.
struct Reading {
    QVector<QPair<QString, QString>> values; // of the keys outside sections, or in remote-arguments
    bool hasOtherLines = false;
};

Reading readPlainly(const QByteArray &content)
{
    Reading reading;
    QString section;
    bool isContinued = false;
    bool isQuoted = false;
    const auto lines = QString::fromUtf8(content).split(QLatin1Char('\n'));
    for (const QString &written : lines) {
        const QString line = written.trimmed();
        const bool goesOn = isContinued || isQuoted;
        isContinued = line.endsWith(QLatin1Char('\\'));
        isQuoted = isQuoted != (line.count(QLatin1Char('"')) % 2 == 1);
        if (goesOn || line.isEmpty() || line.startsWith(QLatin1Char(';'))) {
            continue;
        }
        if (line.startsWith(QLatin1Char('['))) {
            section = line.mid(1, line.indexOf(QLatin1Char(']')) - 1);
            continue;
        }
        const int equals = line.indexOf(QLatin1Char('='));
        if (equals < 0) {
            reading.hasOtherLines = true;
            continue;
        }
        const QString key = line.left(equals).trimmed();
        QString value = line.mid(equals + 1).section(" ;"_s, 0, 0).trimmed();
        if (value.contains(QLatin1Char('\\')) || isQuoted) {
            continue;
        }
        if (value.startsWith(QLatin1Char('"')) && value.endsWith(QLatin1Char('"'))) {
            value = value.mid(1, value.size() - 2);
        }
        if (section.isEmpty() || section.toLower() == "general"_s) {
            reading.values.append({key, value});
        } else if (section == "remote-arguments"_s) {
            reading.values.append({section + QLatin1Char('/') + key, value});
        }
    }
    return reading;
}

// Returns the value of a key in the model as text, or nothing if the model does not know the key.
std::optional<QString> modelText(const QuickActionsModel &model, const QuickAction &action,
                                 const QString &key)
{
    static const QHash<QString, QString (QuickAction::*)() const> texts = {
        {"translation-catalog"_s, &QuickAction::translationCatalog},
        {"requires-package"_s, &QuickAction::requiredPackage},
        {"remote-service"_s, &QuickAction::service},
        {"remote-path"_s, &QuickAction::objectPath},
        {"remote-interface"_s, &QuickAction::interface},
        {"remote-method"_s, &QuickAction::method},
    };
    if (texts.contains(key)) {
        return (action.*texts.value(key))();
    }
    if (key == "title"_s) {
        return model.data(model.index(0), QuickActionsModel::TitleRole).toString();
    }
    if (key == "icon"_s) {
        return model.data(model.index(0), QuickActionsModel::IconRole).toString();
    }
    if (key == "priority"_s) {
        return action.priority() ? QString::number(*action.priority()) : "none"_s;
    }
    static const QRegularExpression argument("^remote-arguments/([1-9][0-9]*)\\\\argument$"_s);
    const QRegularExpressionMatch match = argument.match(key);
    if (match.hasMatch()) {
        const QVariant value = action.arguments().value(match.captured(1).toInt() - 1);
        // A value with commas is sent as a list.
        return value.userType() == QMetaType::QByteArray
            ? "@ByteArray(%1)"_s.arg(QString::fromLatin1(value.toByteArray()))
            : value.toStringList().join(", "_s);
    }
    return {};
}

// Returns the number of members with these names in a text.
int countMembers(const QString &text, const QStringList &names)
{
    const QRegularExpression member("\"(%1)\"\\s*:"_s.arg(names.join(QLatin1Char('|'))));
    int count = 0;
    for (auto it = member.globalMatch(text); it.hasNext(); it.next()) {
        ++count;
    }
    return count;
}

} // namespace

void TestCorpus::initTestCase()
{
    Files::installCatalogs(words("maps_eng_en maps-fi"));
    // A catalog without engineering English.
    QVERIFY(QFile::copy("/usr/share/translations/maps-fi.qm"_s,
                        "/usr/share/translations/islands-fi.qm"_s));
}

void TestCorpus::init()
{
    LoggedTest::init();
    Files::makeDirectory(Places::quickActions);
    Files::makeDirectory(Places::eventsWidgets);
}

void TestCorpus::cleanup()
{
    LoggedTest::cleanup();
    Files::remove(Places::quickActions);
    Files::remove(Places::eventsWidgets);
}

void TestCorpus::findings_data()
{
    addRows({quickActionsCorpus, eventsWidgetsCorpus});
}

void TestCorpus::findings()
{
    QFETCH(QString, path);
    const QFileInfo file(path);
    const QString name = file.fileName();
    QVERIFY(QDir::setCurrent(file.path()));
    QString found;
    for (const Finding &finding : check(name)) {
        found += toText(finding) + QLatin1Char('\n');
    }
    m_log->takeAll(); // of the readers
    QCOMPARE(found, expectedFindings(file));
    QCOMPARE(name.startsWith("bad"_s), found.contains(": error: "_s));
    QCOMPARE(name.startsWith("warn"_s),
             !found.contains(": error: "_s) && found.contains(": warning: "_s));
}

void TestCorpus::findingsOfATree()
{
    const QTemporaryDir directory;
    QVERIFY(QDir::setCurrent(directory.path()));
    QCOMPARE(QProcess::execute("cp"_s, {"-r"_s, CORPUS_DIR "/tree"_s, "."_s}), 0);
    const QDir catalogs(QLatin1String(CATALOGS_OF_TREE));
    const QString share = "tree/usr/share/"_s;
    for (const QString &name : catalogs.entryList({"*.qm"_s})) {
        QVERIFY(QFile::copy(catalogs.filePath(name), share + "translations/"_s + name));
    }
    QFile damaged(share + "translations/kettle-da.qm"_s);
    QVERIFY(damaged.open(QIODevice::ReadWrite) && damaged.seek(20) && damaged.putChar('\xff'));
    damaged.close();
    // Git does not store these permissions.
    for (const QString &name :
         words("glimmera/quickactions/private.conf glimmera/eventswidgets/private.json "
               "kettle/Private.qml translations/kettle-nl.qm")) {
        QVERIFY(QFile::setPermissions(share + name, QFile::ReadOwner | QFile::WriteOwner));
    }

    DefinitionsChecker checker("tree"_s);
    QVERIFY(checker.checkInstalled());
    QString found;
    for (const Finding &finding : checker.findings()) {
        found += toText(finding) + QLatin1Char('\n');
    }
    QCOMPARE(found, QString::fromUtf8(read(CORPUS_DIR "/tree.findings"_s)));
}

// The corpus has an example of each rule, and the manual page explains it.
void TestCorpus::rulesAreExplained()
{
    static const QRegularExpression rule("\\[([a-z-]+)\\]\n"_s);
    // tst_marlodefinitions tests these.
    QSet<QString> found = {"file-name"_s, "too-many"_s};
    for (const QString &name : words("quickaction eventswidgetsfile tree")) {
        const QString findings = QString::fromUtf8(read(CORPUS_DIR "/%1.findings"_s.arg(name)));
        for (auto it = rule.globalMatch(findings); it.hasNext();) {
            found.insert(it.next().captured(1));
        }
    }
    static const QRegularExpression item("\\bSy ([a-z-]+)"_s);
    const QString page = QString::fromUtf8(read(SOURCE_DIR "/docs/man/marlo-definitions.1"_s));
    QSet<QString> explained;
    for (auto it = item.globalMatch(page); it.hasNext();) {
        explained.insert(it.next().captured(1));
    }
    QCOMPARE(explained, found);
}

void TestCorpus::agreesOnQuickActions_data()
{
    addRows({quickActionsCorpus});
}

void TestCorpus::agreesOnQuickActions()
{
    QFETCH(QString, path);
    const QByteArray content = read(path);
    const QString installed = Places::quickActions + QLatin1Char('/') + QFileInfo(path).fileName();
    Files::write(installed, content);

    QuickActionsModel model;
    model.setShowPotential(true);
    model.componentComplete();
    QCOMPARE(model.count(), 1);
    QStringList differences = m_log->takeTexts();

    const QuickAction action(installed, false);
    m_log->takeAll();
    const Reading reading = readPlainly(content);
    if (reading.hasOtherLines) {
        differences.append("a line is passed over"_s);
    }
    for (const auto &[key, value] : reading.values) {
        const std::optional<QString> text = modelText(model, action, key);
        const QString expected =
            key == "title"_s && !value.isEmpty() ? qtTrId(value.toUtf8().constData()) : value;
        if (text && *text != expected) {
            differences.append("%1: %2, not %3"_s.arg(key, *text, expected));
        }
    }

    // No service has the name: every call that can be sent fails with this error.
    model.triggerAction(0);
    QString outcome;
    const auto isAnswered = [this, &outcome] {
        outcome += m_log->takeTexts().join(QLatin1Char('\n'));
        return outcome.contains("Failed to "_s);
    };
    TRY(isAnswered());
    if (!outcome.contains("org.freedesktop.DBus.Error.ServiceUnknown"_s)) {
        differences.append(outcome);
    }

    const std::vector<Finding> found = errors(installed);
    m_log->takeAll(); // of the reader
    QVERIFY2(found.empty() == differences.isEmpty(),
             qPrintable(differences.join(QLatin1Char('\n'))));
}

void TestCorpus::agreesOnEventsWidgets_data()
{
    addRows({eventsWidgetsCorpus});
}

void TestCorpus::agreesOnEventsWidgets()
{
    QFETCH(QString, path);
    const QByteArray content = read(path);
    const QString installed = Places::eventsWidgets + QLatin1Char('/') + QFileInfo(path).fileName();
    Files::write(installed, content);

    EventsWidgetsModel model;
    model.componentComplete();
    QStringList differences = m_log->takeTexts();
    const int warnings = differences.filter("Invalid widget defined in"_s).size();

    const std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(installed);
    m_log->takeAll();
    const auto compare = [&differences](const QJsonObject &written, const QString &key,
                                        const QJsonValue &value) {
        const QJsonValue expected = written.value(key);
        if (!expected.isUndefined() && expected != value) {
            differences.append(key + " is another"_s);
        }
    };
    const QStringList fileKeys = words("translation_catalog widgets");
    const auto read = [](const EventsWidget &widget) {
        return QJsonObject{{"path"_s, widget.path},
                           {"title"_s, widget.title},
                           {"translation_id"_s, widget.translationId},
                           {"description_id"_s, widget.descriptionId},
                           {"icon"_s, widget.icon},
                           {"order"_s, widget.order},
                           {"default_enabled"_s, widget.defaultEnabled},
                           {"available_path"_s, widget.availablePath}};
    };
    const QStringList widgetKeys = read({}).keys();
    int members = 0;
    if (file) {
        const QJsonObject object = QJsonDocument::fromJson(content).object();
        compare(object, fileKeys.first(), file->translationCatalog);
        const QJsonValue widgets = object.value("widgets"_s);
        if (!widgets.isArray()) {
            differences.append("widgets is missing or another"_s);
        }
        for (const QString &key : fileKeys) {
            members += object.contains(key) ? 1 : 0;
        }
        size_t next = 0;
        for (const QJsonValue &entry : widgets.toArray()) {
            const QJsonObject written = entry.toObject();
            for (const QString &key : widgetKeys) {
                members += written.contains(key) ? 1 : 0;
            }
            if (written.value("path"_s).toString().isEmpty()) {
                continue; // the model has logged a message
            }
            QVERIFY(next < file->widgets.size());
            const EventsWidget &widget = file->widgets.at(next++);
            for (const QString &key : widgetKeys) {
                compare(written, key, read(widget).value(key));
            }

            // The model lists the last widget of each path.
            const auto exactly = Qt::MatchExactly | Qt::MatchCaseSensitive;
            const QModelIndex row =
                model.match(model.index(0), EventsWidgetsModel::PathRole, widget.path, 1, exactly)
                    .value(0);
            QVERIFY(row.isValid());
            if (widget.translationId.isEmpty()) {
                QCOMPARE(row.data(EventsWidgetsModel::TitleRole).toString(), widget.title);
            }
            QCOMPARE(row.data(EventsWidgetsModel::IconRole).toString(), widget.icon);
            QCOMPARE(row.data(EventsWidgetsModel::EnabledRole).toBool(), widget.defaultEnabled);
        }
        QCOMPARE(next, file->widgets.size());
        if (countMembers(QString::fromUtf8(content), fileKeys + widgetKeys) != members) {
            differences.append("a member is lost"_s);
        }
    } else {
        QCOMPARE(model.rowCount(), 0);
    }
    const std::vector<Finding> found = errors(installed);
    m_log->takeAll(); // of the reader
    QVERIFY2(found.empty() == differences.isEmpty(),
             qPrintable(differences.join(QLatin1Char('\n'))));
    // The model logs a warning for each widget that it ignores.
    const auto ignored = std::count_if(found.cbegin(), found.cend(), [](const Finding &finding) {
        return finding.rule == QLatin1String("path") || finding.rule == QLatin1String("widget");
    });
    QCOMPARE(int(ignored), file ? warnings : 0);
}

void TestCorpus::examplesAreClean()
{
    const QDir examples(SOURCE_DIR "/docs/examples"_s);
    const QStringList names = examples.entryList(words("*.conf *.json"), QDir::Files);
    QCOMPARE(names.size(), 2);
    for (const QString &name : names) {
        for (const Finding &finding : check(examples.filePath(name))) {
            // Their catalogs are not installed.
            QVERIFY2(finding.rule == "catalog"_s || finding.severity == Finding::Severity::Note,
                     qPrintable(toText(finding)));
        }
    }
}

QTEST_GUILESS_MAIN(TestCorpus)

#include "tst_corpus.moc"
