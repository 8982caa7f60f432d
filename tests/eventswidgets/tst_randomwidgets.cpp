// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The model next to a naive second one, through many random changes of files and settings. After
// each step both have the same rows, have emitted the same signals and agree on what is stored.

#include "dconftool.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "files.h"
#include "messagelog.h"
#include "mgconfitem.h"
#include "naivecatalogs.h"
#include "randomsteps.h"

#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QtTest>

#include <functional>
namespace {

const QString directory = QStringLiteral("/usr/share/glimmera/eventswidgets");
const QString key = QStringLiteral("/desktop/glimmera-marlo-home/events_screen_widgets");

constexpr int patience = 60000; // ms, of a machine that is very busy

struct Widget {
    QString title;
    QString translationId;
    QString descriptionId;
    QString icon;
    QString path;
    QString availablePath;
    int order = -1;
    bool enabled = false;
    bool defaultEnabled = false;
    bool available = false;

    bool isAvailable() const { return availablePath.isEmpty() || QFile::exists(availablePath); }
    bool operator!=(const Widget &other) const
    {
        return title != other.title || translationId != other.translationId
            || descriptionId != other.descriptionId || icon != other.icon || path != other.path
            || availablePath != other.availablePath || order != other.order
            || enabled != other.enabled || defaultEnabled != other.defaultEnabled
            || available != other.available;
    }
};

} // namespace

// Does everything one by one and looks for everything from the top.
class NaiveWidgets : public QObject
{
public:
    NaiveWidgets() { connect(&m_item, &MGConfItem::valueChanged, this, &NaiveWidgets::readKey); }

    void readKey()
    {
        const QVariant value = m_item.value();
        m_defaults = !value.isValid();
        enabledList = value.toStringList();
        for (int row = 0; row < rows.size(); ++row) {
            if (m_defaults) {
                enabledList.append(rows.at(row).path);
            }
            const bool enabled =
                m_defaults ? rows.at(row).defaultEnabled : enabledList.contains(rows.at(row).path);
            if (rows.at(row).enabled != enabled) {
                rows[row].enabled = enabled;
                events.append(QStringLiteral("changed %1").arg(row));
            }
        }
    }

    void scan()
    {
        if (m_defaults) {
            enabledList.clear();
        }
        QList<Widget> widgets;
        const QStringList names =
            QDir(directory).entryList({QStringLiteral("*.json")}, QDir::Files, QDir::Unsorted);
        for (const QString &name : names) {
            readFile(name, &widgets);
        }
        QStringList paths;
        for (const Widget &widget : qAsConst(widgets)) {
            paths.append(widget.path);
            const int row = find(widget.path);
            if (row < 0) {
                const int place = insertionIndex(widget);
                rows.insert(place, widget);
                events.append(QStringLiteral("inserted %1").arg(place));
            } else if (rows.at(row) != widget) {
                rows[row] = widget;
                events.append(QStringLiteral("changed %1").arg(row));
            }
        }
        int row = 0;
        while (row < rows.size()) {
            if (paths.contains(rows.at(row).path)) {
                ++row;
            } else {
                rows.removeAt(row);
                events.append(QStringLiteral("removed %1").arg(row));
            }
        }
    }

    void updateAvailable()
    {
        for (int row = 0; row < rows.size(); ++row) {
            const bool available = rows.at(row).isAvailable();
            if (rows.at(row).available != available) {
                rows[row].available = available;
                events.append(QStringLiteral("changed %1 (261)").arg(row));
            }
        }
    }

    QVariantList shown(int row) const
    {
        const Widget &widget = rows.at(row);
        return {
            text(widget.translationId, widget.title), widget.icon,     widget.path, widget.enabled,
            text(widget.descriptionId, QString()),    widget.available};
    }

    QList<Widget> rows;
    QStringList events;
    QStringList enabledList;
    QStringList warnings;

private:
    void readFile(const QString &name, QList<Widget> *widgets)
    {
        const QString path = directory + QLatin1Char('/') + name;
        QFile file(path);
        if (!file.open(QIODevice::ReadOnly)) {
            warnings.append(QStringLiteral("Failed to open \"%1\"").arg(path));
            return;
        }
        const QJsonDocument document = QJsonDocument::fromJson(file.readAll());
        if (!document.isObject()) {
            warnings.append(QStringLiteral("Invalid Events Widget \"%1\"").arg(path));
            return;
        }
        const QJsonObject definition = document.object();
        m_catalogs.add(name, definition.value(QStringLiteral("translation_catalog")).toString());
        const QJsonArray array = definition.value(QStringLiteral("widgets")).toArray();
        for (const QJsonValue &value : array) {
            const QJsonObject object = value.toObject();
            const auto text = [&object](const char *name) {
                return object.value(QLatin1String(name)).toString();
            };
            Widget widget;
            widget.path = text("path");
            if (!value.isObject() || widget.path.isEmpty()) {
                warnings.append(QStringLiteral("Invalid widget defined in \"%1\"").arg(path));
                continue;
            }
            widget.availablePath = text("available_path");
            widget.title = text("title");
            widget.translationId = text("translation_id");
            widget.descriptionId = text("description_id");
            widget.icon = text("icon");
            widget.order = object.value(QStringLiteral("order")).toInt(-1);
            widget.defaultEnabled = object.value(QStringLiteral("default_enabled")).toBool();
            if (m_defaults) {
                enabledList.append(widget.path);
                widget.enabled = widget.defaultEnabled;
            } else {
                widget.enabled = enabledList.contains(widget.path);
            }
            widget.available = widget.isAvailable();
            widgets->append(widget);
        }
    }

    int find(const QString &path) const
    {
        for (int row = 0; row < rows.size(); ++row) {
            if (rows.at(row).path == path) {
                return row;
            }
        }
        return -1;
    }

    int insertionIndex(const Widget &widget) const
    {
        if (widget.order < 0) {
            return rows.size();
        }
        if (rows.isEmpty() || widget.order < rows.first().order) {
            return 0;
        }
        for (int row = 1; row < rows.size(); ++row) {
            if (widget.order < rows.at(row).order) {
                return row;
            }
        }
        return rows.size();
    }

    QString text(const QString &id, const QString &fallback) const
    {
        const QString text = id.isEmpty() ? fallback : m_catalogs.text(id);
        return text == id ? fallback : text;
    }

    MGConfItem m_item{key};
    bool m_defaults = false;
    // Catalogs are added but never removed.
    NaiveCatalogs m_catalogs;
};

// Each scan of the model warns of this file. The naive model then scans as well, so that it follows
// every scan that the watcher of the directory starts.
const QString marker = directory + QStringLiteral("/marker.json");
std::function<void()> onScan;
QtMessageHandler nextHandler = nullptr;

void noteScan(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    nextHandler(type, context, text);
    if (text.contains(marker)) {
        onScan();
    }
}

class TestRandomWidgets : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void steps_data();
    void steps();

private:
    void makeModels();
    QString step();
    void changeFile(const QString &path);
    void waitForScan(int scansBefore);
    QByteArray randomWidget();
    QString difference();

    std::unique_ptr<MessageLog> m_log;
    QRandomGenerator m_random;
    QStringList m_files;
    QStringList m_paths;
    QStringList m_needed; // files that widgets need
    std::unique_ptr<NaiveWidgets> m_naive;
    std::unique_ptr<EventsWidgetsModel> m_model;
    QStringList m_events;
    QVariant m_stored; // what the key should hold
    int m_scans = 0;
};

void TestRandomWidgets::initTestCase()
{
    for (const auto *name : {"maps_eng_en", "maps-fi", "atlas_eng_en"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    QLocale::setDefault(QLocale(QStringLiteral("fi_FI")));
    for (const char *name : {"one", "two", "Three", "four"}) {
        m_files.append(directory + QLatin1Char('/') + QLatin1String(name)
                       + QStringLiteral(".json"));
    }
    for (const char *path : {"/a", "/b", "/c", "/D", "/e", "/f", "/g", "/h"}) {
        m_paths.append(QLatin1String(path));
    }
    m_needed = QStringList{QStringLiteral("/usr/share/glimmera/first"),
                           QStringLiteral("/usr/share/glimmera/second")};
}

void TestRandomWidgets::makeModels()
{
    m_model.reset();
    m_model = std::make_unique<EventsWidgetsModel>();
    m_naive = std::make_unique<NaiveWidgets>();

    m_events.clear();
    RandomSteps::record(m_model.get(), &m_events);
    m_naive->readKey();
    m_model->componentComplete();
}

QByteArray TestRandomWidgets::randomWidget()
{
    const auto oneOf = [this](const QByteArrayList &texts) {
        return RandomSteps::anyOf(&m_random, texts);
    };
    if (RandomSteps::chance(&m_random, 4)) {
        return oneOf({"7", "{ \"title\": \"no path\" }", "null"});
    }
    return R"({ "path": ")" + RandomSteps::anyOf(&m_random, m_paths).toUtf8() + '"'
        + oneOf({"", R"(, "title": "plain")", R"(, "title": "other")"})
        + oneOf({"", R"(, "translation_id": "maps-title")", R"(, "translation_id": "maps-english")",
                 R"(, "translation_id": "unknown")"})
        + oneOf({"", R"(, "description_id": "maps-title")", R"(, "description_id": "unknown")"})
        + oneOf({"", R"(, "icon": "one")", R"(, "icon": 2)"})
        + oneOf({"", "", R"(, "order": 1)", R"(, "order": 3)", R"(, "order": 7)",
                 R"(, "order": -2)", R"(, "order": 0)", R"(, "order": "5")", R"(, "order": 2.5)"})
        + oneOf({"", R"(, "default_enabled": true)", R"(, "default_enabled": false)"})
        + oneOf({"", "", R"(, "available_path": ")" + m_needed.first().toUtf8() + '"',
                 R"(, "available_path": ")" + m_needed.last().toUtf8() + '"'})
        + " }";
}

void TestRandomWidgets::changeFile(const QString &path)
{
    if (RandomSteps::chance(&m_random, 5)) {
        Files::write(path, RandomSteps::chance(&m_random, 50) ? "[]" : "{ broken");
        return;
    }
    QByteArray content = "{ ";
    if (RandomSteps::chance(&m_random, 50)) {
        content += R"("translation_catalog": ")"
            + RandomSteps::anyOf(&m_random, QByteArrayList{"maps", "atlas", "none", ""}) + "\", ";
    }
    content += "\"widgets\": [";
    for (int count = m_random.bounded(5), i = 0; i < count; ++i) {
        content += (i == 0 ? " " : ", ") + randomWidget();
    }
    Files::write(path, content + " ] }");
}

// Does one of the things that can happen, and returns what.
QString TestRandomWidgets::step()
{
    const QString path = RandomSteps::anyOf(&m_random, m_paths);
    const QString file = RandomSteps::anyOf(&m_random, m_files);
    const int kind = m_random.bounded(1000);
    if (kind < 150) {
        m_stored = m_naive->enabledList + QStringList(path);
        m_model->enableWidget(path);
        return QStringLiteral("enable ") + path;
    }
    if (kind < 300) {
        QStringList list = m_naive->enabledList;
        list.removeAll(path);
        m_stored = list;
        m_model->disableWidget(path);
        return QStringLiteral("disable ") + path;
    }
    if (kind < 400) {
        QStringList list;
        for (int size = m_random.bounded(6); size > 0; --size) {
            list.append(RandomSteps::anyOf(&m_random, m_paths));
        }
        m_stored = list;
        MGConfItem(key).set(list);
        return QStringLiteral("list ") + list.join(QLatin1Char(' '));
    }
    if (kind < 500) {
        m_stored = QVariant();
        MGConfItem(key).unset();
        return QStringLiteral("no list");
    }
    if (kind < 520) {
        m_model->enabledWidgetsChanged();
        m_naive->readKey();
        return QStringLiteral("read the list");
    }
    if (kind < 600) {
        const QString needed = RandomSteps::anyOf(&m_random, m_needed);
        if (QFile::exists(needed)) {
            Files::remove(needed);
        } else {
            Files::write(needed, "");
        }
        return QStringLiteral("switch ") + needed;
    }
    if (kind < 680) {
        m_model->updateAvailable();
        m_naive->updateAvailable();
        return QStringLiteral("update available");
    }
    if (kind < 965) {
        const int before = m_scans;
        const bool removes = kind >= 880;
        if (!removes) {
            changeFile(file);
            waitForScan(before);
        } else if (QFile::remove(file)) {
            waitForScan(before);
        }
        return (removes ? QStringLiteral("remove ") : QStringLiteral("write ")) + file;
    }
    if (kind < 968) {
        const QStringList list{path};
        const bool changes = m_stored != QVariant(list);
        m_stored = list;
        DconfTool::waitUntilStored();
        DconfTool::write(key, "['" + path.toUtf8() + "']");
        const auto isKnown = [&] { return m_naive->enabledList == list; };
        if (changes && !QTest::qWaitFor(isKnown, patience)) {
            QTest::qFail("the change of another process is not seen", __FILE__, __LINE__);
        }
        return QStringLiteral("another process: list ") + path;
    }
    if (kind < 980) {
        makeModels();
        return QStringLiteral("new models");
    }
    m_model->directoryChanged();
    return QStringLiteral("scan");
}

void TestRandomWidgets::waitForScan(int scansBefore)
{
    QTRY_VERIFY_WITH_TIMEOUT(m_scans > scansBefore, patience);
}

// Empty if the models agree.
QString TestRandomWidgets::difference()
{
    const auto lines = [](const QStringList &list) { return list.join(QStringLiteral(", ")); };
    if (m_events != m_naive->events) {
        return QStringLiteral("signals: %1\nexpected: %2")
            .arg(lines(m_events), lines(m_naive->events));
    }
    if (m_model->rowCount() != m_naive->rows.size()) {
        return QStringLiteral("%1 rows instead of %2")
            .arg(m_model->rowCount())
            .arg(m_naive->rows.size());
    }
    for (int row = 0; row < m_model->rowCount(); ++row) {
        QVariantList shown;
        for (int role = 256; role <= 261; ++role) {
            shown.append(m_model->data(m_model->index(row), role));
        }
        if (shown != m_naive->shown(row)) {
            QString text;
            QDebug(&text) << row << shown << "expected:" << m_naive->shown(row);
            return text;
        }
    }
    const QVariant stored = MGConfItem(key).value();
    if (stored != m_stored) {
        QString text;
        QDebug(&text) << "stored:" << stored << "expected:" << m_stored;
        return text;
    }
    const QStringList messages = m_log->takeTexts();
    if (messages != m_naive->warnings) {
        return QStringLiteral("messages: %1\nexpected: %2")
            .arg(lines(messages), lines(m_naive->warnings));
    }
    m_events.clear();
    m_naive->events.clear();
    m_naive->warnings.clear();
    return {};
}

void TestRandomWidgets::steps_data()
{
    RandomSteps::addRows();
}

void TestRandomWidgets::steps()
{
    QFETCH(quint32, seed);
    QFETCH(bool, busy);
    const auto load = busy ? std::make_unique<RandomSteps::BusyMachine>() : nullptr;
    Files::remove(directory);
    Files::write(marker, "");
    for (const QString &needed : qAsConst(m_needed)) {
        Files::remove(needed);
    }
    MGConfItem(key).unset();
    m_stored = QVariant();
    m_random.seed(seed);
    m_log = std::make_unique<MessageLog>();
    onScan = [this] {
        ++m_scans;
        m_naive->scan();
    };
    nextHandler = qInstallMessageHandler(noteScan);
    makeModels();

    QStringList done;
    for (int i = 0; i < RandomSteps::count() && !QTest::currentTestFailed(); ++i) {
        done.append(step());
        QCoreApplication::processEvents();
        const QString different = difference();
        if (!different.isEmpty()) {
            QFAIL(qPrintable(RandomSteps::report(different, done)));
        }
    }
    m_model.reset();
    m_naive.reset();
    qInstallMessageHandler(nextHandler);
    m_log.reset();
}

QTEST_GUILESS_MAIN(TestRandomWidgets)

#include "tst_randomwidgets.moc"
