// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgets/eventswidget.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "files.h"
#include "mgconfitem.h"
#include "naivecatalogs.h"
#include "places.h"
#include "randommodeltest.h"
#include "texts.h"
#include "words.h"

#include <QDir>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QtTest>

#include <functional>

namespace {

using Widget = EventsWidget;

class NaiveWidgets : public NaiveRows<Widget>
{
public:
    NaiveWidgets() { connect(&m_item, &MGConfItem::valueChanged, this, &NaiveWidgets::readKey); }

    void readKey()
    {
        const QVariant value = m_item.value();
        m_defaults = !value.isValid();
        enabledList = value.toStringList();
        for (int row = 0; row < rows.size(); ++row) {
            Widget widget = rows.at(row);
            if (m_defaults) {
                enabledList.append(widget.path);
            }
            widget.enabled = m_defaults ? widget.defaultEnabled : enabledList.contains(widget.path);
            if (rows.at(row) != widget) {
                change(row, widget);
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
            QDir(Places::eventsWidgets).entryList({"*.json"_s}, QDir::Files, QDir::Unsorted);
        for (const QString &name : names) {
            readFile(name, &widgets);
        }
        QStringList paths;
        for (const Widget &widget : qAsConst(widgets)) {
            paths.append(widget.path);
            const int row = find(widget.path);
            if (row < 0) {
                insert(insertionIndex(widget), widget);
            } else if (rows.at(row) != widget) {
                change(row, widget);
            }
        }
        removeAllBut(paths);
    }

    void updateAvailable()
    {
        for (int row = 0; row < rows.size(); ++row) {
            Widget widget = rows.at(row);
            widget.available = widget.isAvailable();
            if (rows.at(row) != widget) {
                change(row, widget);
                events.last() += " (261)"_s;
            }
        }
    }

    QVariantList shown(int row) const override
    {
        const Widget &widget = rows.at(row);
        return {
            text(widget.translationId, widget.title), widget.icon,     widget.path, widget.enabled,
            text(widget.descriptionId, QString()),    widget.available};
    }

private:
    void readFile(const QString &name, QList<Widget> *widgets)
    {
        const QString path = Places::eventsWidgets + QLatin1Char('/') + name;
        QFile file(path);
        if (!file.open(QIODevice::ReadOnly)) {
            warnings.append("Failed to open \"%1\""_s.arg(path));
            return;
        }
        const QJsonDocument document = QJsonDocument::fromJson(file.readAll());
        if (!document.isObject()) {
            warnings.append("Invalid Events Widget \"%1\""_s.arg(path));
            return;
        }
        const QJsonObject definition = document.object();
        m_catalogs.add(name, definition.value("translation_catalog"_s).toString());
        const QJsonArray array = definition.value("widgets"_s).toArray();
        for (const QJsonValue &value : array) {
            const QJsonObject object = value.toObject();
            Widget widget;
            widget.path = object.value("path"_s).toString();
            if (widget.path.isEmpty()) {
                warnings.append("Invalid widget defined in \"%1\""_s.arg(path));
                continue;
            }
            widget.availablePath = object.value("available_path"_s).toString();
            widget.title = object.value("title"_s).toString();
            widget.translationId = object.value("translation_id"_s).toString();
            widget.descriptionId = object.value("description_id"_s).toString();
            widget.icon = object.value("icon"_s).toString();
            widget.order = object.value("order"_s).toInt(-1);
            widget.defaultEnabled = object.value("default_enabled"_s).toBool();
            if (m_defaults) {
                enabledList.append(widget.path);
            }
            widget.enabled = m_defaults ? widget.defaultEnabled : enabledList.contains(widget.path);
            widget.available = widget.isAvailable();
            widgets->append(widget);
        }
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

    MGConfItem m_item{Places::enabledWidgets};
    bool m_defaults = false;
    // Catalogs are added but never removed.
    NaiveCatalogs m_catalogs;
};

// Each scan of the model warns about this file. The naive model then scans as well, so that it
// follows every scan that the watcher of the directory starts.
const QString marker = Places::eventsWidgets + "/marker.json"_s;
std::function<void()> onScan;
QtMessageHandler nextHandler = nullptr;

void noteScan(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    nextHandler(type, context, text);
    if (text.contains(marker)) {
        onScan();
    }
}

} // namespace

class TestRandomWidgets : public RandomModelTest
{
    Q_OBJECT

public:
    TestRandomWidgets();

private:
    void reset() override;
    void makeModels() override;
    void removeModels() override;
    QAbstractListModel *model() const override { return m_model.get(); }
    NaiveModel *naive() const override { return m_naive.get(); }
    QString step() override;
    void changeFile(const QString &path);
    QByteArray randomWidget();

    QStringList m_files;
    const QStringList m_paths = words("/a /b /c /D /e /f /g /h");
    const QStringList m_needed = words("/usr/share/glimmera/first /usr/share/glimmera/second");
    std::unique_ptr<NaiveWidgets> m_naive;
    std::unique_ptr<EventsWidgetsModel> m_model;
};

TestRandomWidgets::TestRandomWidgets()
    : RandomModelTest(Places::eventsWidgets, Places::enabledWidgets, "Widget")
{
    for (const QString &name : words("one two Three four")) {
        m_files.append("%1/%2.json"_s.arg(Places::eventsWidgets, name));
    }
    onScan = [this] {
        ++m_reloads;
        m_naive->scan();
    };
}

void TestRandomWidgets::reset()
{
    Files::write(marker, "");
    for (const QString &needed : m_needed) {
        Files::remove(needed);
    }
}

void TestRandomWidgets::makeModels()
{
    removeModels();
    nextHandler = qInstallMessageHandler(noteScan);
    m_model = std::make_unique<EventsWidgetsModel>();
    m_naive = std::make_unique<NaiveWidgets>();
    m_events = std::make_unique<RowEvents>(m_model.get());
    m_naive->readKey();
    m_model->componentComplete();
}

void TestRandomWidgets::removeModels()
{
    if (m_model != nullptr) {
        m_model.reset();
        m_naive.reset();
        qInstallMessageHandler(nextHandler);
    }
}

QByteArray TestRandomWidgets::randomWidget()
{
    if (chance(4)) {
        return oneOf({"7", "{ \"title\": \"no path\" }", "null"});
    }
    return R"({ "path": ")" + anyOf(m_paths).toUtf8() + '"'
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
    if (chance(5)) {
        Files::write(path, oneOf({"[]", "{ broken"}));
        return;
    }
    QByteArrayList widgets;
    for (int count = m_random.bounded(5); count > 0; --count) {
        widgets.append(randomWidget());
    }
    const QByteArray catalog = oneOf({"maps", "atlas", "none", ""});
    Files::write(path,
                 (chance(50) ? R"({ "translation_catalog": ")" + catalog + "\", " : "{ ")
                     + "\"widgets\": [ " + widgets.join(", ") + " ] }");
}

QString TestRandomWidgets::step()
{
    const QString path = anyOf(m_paths);
    const QString file = anyOf(m_files);
    const int kind = m_random.bounded(1000);
    if (kind < 300) {
        return choose(kind < 150 ? "enable" : "disable", path);
    }
    if (kind < 400) {
        return store(listOf(m_paths, 6));
    }
    if (kind < 500) {
        return storeNothing();
    }
    if (kind < 520) {
        m_model->enabledWidgetsChanged();
        m_naive->readKey();
        return "read the list"_s;
    }
    if (kind < 600) {
        const QString needed = anyOf(m_needed);
        if (QFile::exists(needed)) {
            Files::remove(needed);
        } else {
            Files::write(needed, "");
        }
        return "switch "_s + needed;
    }
    if (kind < 680) {
        m_model->updateAvailable();
        m_naive->updateAvailable();
        return "update available"_s;
    }
    if (kind < 880) {
        changeFile(file);
        waitForReload();
        return "write "_s + file;
    }
    if (kind < 965) {
        if (QFile::remove(file)) {
            waitForReload();
        }
        return "remove "_s + file;
    }
    if (kind < 968) {
        return storeInAnotherProcess({path});
    }
    if (kind < 980) {
        makeModels();
        return "new models"_s;
    }
    m_model->directoryChanged();
    return "scan"_s;
}

QTEST_GUILESS_MAIN(TestRandomWidgets)

#include "tst_randomwidgets.moc"
