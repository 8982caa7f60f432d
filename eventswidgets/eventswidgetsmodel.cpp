// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgetsmodel.h"

#include "eventswidget.h"
#include "eventswidgetsfile.h"
#include "models/rownumbers.h"

#include <QDirIterator>
#include <QFileInfo>
#include <QHash>

#include <algorithm>

namespace {

const QLatin1String definitionDirectory("/usr/share/glimmera/eventswidgets");
const QLatin1String definitionFilter("*.json");

const QLatin1String enabledKey("/desktop/glimmera-marlo-home/events_screen_widgets");

} // namespace

/*!
    \qmltype EventsWidgetsModel
    \inqmlmodule com.marlo.settings.system
    \brief Lists the widgets of the events screen.

    Packages offer widgets by installing a definition file, \c{*.json}, into
    \c /usr/share/glimmera/eventswidgets; \l{marlo-eventswidgets(5)} describes the format. The model
    lists all of them. It follows the directory and the user's choice,
    \c /desktop/glimmera-marlo-home/events_screen_widgets (dconf, list of strings): the paths of the
    enabled widgets. Until the user makes a choice, each widget is enabled by its own default.

    The roles of a row:

    \table
    \header \li Role \li Type \li Value
    \row \li \c title \li string \li The title in the user's language, or the untranslated one.
    \row \li \c description \li string \li The description in the user's language; empty without a
         translation.
    \row \li \c icon \li string \li The value in the definition file: a URL such as
         \c{image://theme/lamp}, an absolute path, or the name of an icon of the theme. To show a
         path in an Image, prepend \c{file://}.
    \row \li \c path \li string \li The value in the definition file: the widget's identity, which
         enableWidget() and disableWidget() take.
    \row \li \c enabled \li bool \li Whether the widget is enabled.
    \row \li \c available \li bool \li Whether the file that the widget needs exists, see
         updateAvailable().
    \endtable

    A definition file that cannot be read is skipped with a warning, as is each entry that is not a
    widget.

    \qml
    Repeater {
        model: EventsWidgetsModel { id: widgets }
        delegate: Switch {
            text: title
            enabled: available
            checked: model.enabled
            onToggled: checked ? widgets.enableWidget(path) : widgets.disableWidget(path)
        }
    }
    \endqml

    \note Handlers may call any method of the model. While rows are being changed, requests wait
    until control returns to the event loop. The model then runs each kind of update at most once
    and applies the choices (enableWidget(), disableWidget()) in the order of the calls.

    \image gallery-events-widgets.png The gallery's page for this type

    \section1 What may surprise
    \section2 The first choice enables everything else
    The first enableWidget() or disableWidget() stores a list of all known widgets, even of those
    whose default is off, plus or minus this one. From then on only the list counts, so all
    other widgets are enabled.

    \section2 A widget keeps its place
    The \c order of a widget places it when it is first listed: before the first row of a higher
    order, or at the end. Rows without an order do not count as higher. A changed order moves
    nothing until the model is created again, because rows must not move while the user taps them.

    \section2 Availability is checked only on request
    The model checks whether a widget's file exists when it reads the definition files, and when a
    page calls updateAvailable(). The files may be anywhere, and watching them all would cost more
    than it is worth. A widget that is not available stays listed, so that a page can say so.

    \section2 Catalogs stay
    When a file is removed or names another catalog, its old catalogs remain in use until the model
    is destroyed: a text that is still on the screen keeps its translation. A loaded catalog does
    not follow a change of the language. A page that must follow it has to create its models again.

    \section2 A change of file or catalog does not change the row
    A widget that moves to another file, or whose file names another catalog, is not reported as
    changed, because everything that a row shows is the same.
*/

EventsWidgetsModel::EventsWidgetsModel(QObject *parent)
    : QAbstractListModel(parent), m_catalogs(this),
      m_watcher(definitionDirectory, definitionFilter), m_enabledItem(enabledKey)
{
    connect(&m_watcher, &DirectoryWatcher::changed, this, &EventsWidgetsModel::directoryChanged);
    connect(&m_enabledItem, &MGConfItem::valueChanged, this,
            &EventsWidgetsModel::enabledWidgetsChanged);
}

EventsWidgetsModel::~EventsWidgetsModel()
{
    // Removing the catalogs sends language change events, whose handlers may call data(). The model
    // still exists here.
    m_catalogs.clear();
}

int EventsWidgetsModel::rowCount(const QModelIndex &parent) const
{
    return parent.isValid() ? 0 : m_rows.size();
}

QVariant EventsWidgetsModel::data(const QModelIndex &index, int role) const
{
    if (!hasIndex(index.row(), index.column(), index.parent())) {
        return {};
    }
    const Widget &widget = m_rows.at(index.row());
    switch (role) {
    case TitleRole:
        return widget.translatedTitle();
    case IconRole:
        return widget.icon;
    case PathRole:
        return widget.path;
    case EnabledRole:
        return widget.enabled;
    case DescriptionRole:
        return widget.translatedDescription();
    case AvailableRole:
        return widget.available;
    default:
        return {};
    }
}

QHash<int, QByteArray> EventsWidgetsModel::roleNames() const
{
    return {
        {TitleRole, "title"},
        {IconRole, "icon"},
        {PathRole, "path"},
        {EnabledRole, "enabled"},
        {DescriptionRole, "description"},
        {AvailableRole, "available"},
    };
}

void EventsWidgetsModel::componentComplete()
{
    m_complete = true;
    enabledWidgetsChanged();
    directoryChanged();
}

/*!
    \qmlmethod void EventsWidgetsModel::enableWidget(string path)
    \qmlmethod void EventsWidgetsModel::disableWidget(string path)

    enableWidget() adds the widget \a path at the end of the user's list, even if the list already
    contains it. disableWidget() removes every entry of it. The rows change once dconf reports the
    change.
*/
void EventsWidgetsModel::enableWidget(const QString &path)
{
    // A path may be listed twice, on purpose: disableWidget() removes every occurrence.
    m_requests.choose([this, path] { m_enabledItem.set(enabledList() + QStringList(path)); });
}

void EventsWidgetsModel::disableWidget(const QString &path)
{
    m_requests.choose([this, path] {
        QStringList list = enabledList();
        list.removeAll(path);
        m_enabledItem.set(list);
    });
}

/*!
    \qmlmethod void EventsWidgetsModel::directoryChanged()
    \qmlmethod void EventsWidgetsModel::enabledWidgetsChanged()

    Read the definition files and the user's list again. These are not signals: the model calls them
    when the directory or the list has changed, and a page may do so at any time.
*/
void EventsWidgetsModel::directoryChanged()
{
    if (!m_complete || m_requests.defer(&EventsWidgetsModel::directoryChanged)) {
        return;
    }
    const Change change(&m_requests);

    QSet<QString> stale;
    stale.reserve(m_rows.size());
    for (const Widget &widget : qAsConst(m_rows)) {
        stale.insert(widget.path);
    }
    const std::vector<Widget> widgets = readWidgets();
    for (const Widget &widget : widgets) {
        stale.remove(widget.path);
    }
    mergeWidgets(widgets);
    removeStaleRows(stale);
}

void EventsWidgetsModel::enabledWidgetsChanged()
{
    if (!m_complete || m_requests.defer(&EventsWidgetsModel::enabledWidgetsChanged)) {
        return;
    }
    const Change change(&m_requests);

    const QVariant stored = m_enabledItem.value();
    m_defaults = !stored.isValid();
    m_enabledList = stored.toStringList();
    const QSet<QString> enabledPaths(m_enabledList.cbegin(), m_enabledList.cend());
    for (int row = 0; row < m_rows.size(); ++row) {
        Widget &widget = m_rows[row];
        if (m_defaults) {
            m_enabledList.append(widget.path);
        }
        const bool enabled =
            m_defaults ? widget.defaultEnabled : enabledPaths.contains(widget.path);
        if (widget.enabled != enabled) {
            widget.enabled = enabled;
            Q_EMIT dataChanged(index(row), index(row));
        }
    }
}

/*!
    \qmlmethod void EventsWidgetsModel::updateAvailable()

    Rechecks whether each widget's \c available_path exists. Call this when the widgets are about to
    be shown, or when such a file may have been installed or removed.
*/
void EventsWidgetsModel::updateAvailable()
{
    if (m_requests.defer(&EventsWidgetsModel::updateAvailable)) {
        return;
    }
    const Change change(&m_requests);

    for (int row = 0; row < m_rows.size(); ++row) {
        Widget &widget = m_rows[row];
        const bool available = widget.isAvailable();
        if (widget.available != available) {
            widget.available = available;
            Q_EMIT dataChanged(index(row), index(row), {AvailableRole});
        }
    }
}

QStringList EventsWidgetsModel::enabledList() const
{
    // A choice before componentComplete() must not discard the user's other choices.
    return m_complete ? m_enabledList : m_enabledItem.value().toStringList();
}

std::vector<EventsWidget> EventsWidgetsModel::readWidgets()
{
    std::vector<Widget> widgets;
    QDirIterator entries(definitionDirectory, {definitionFilter}, QDir::Files);
    while (entries.hasNext()) {
        const QString path = entries.next();
        // The filter of the iterator accepts links to pipes and devices.
        if (!entries.fileInfo().isFile()) {
            continue;
        }
        std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(path);
        if (file) {
            m_catalogs.addDefinition(entries.fileName(), file->translationCatalog);
            widgets.insert(widgets.end(), std::make_move_iterator(file->widgets.begin()),
                           std::make_move_iterator(file->widgets.end()));
        }
    }

    if (m_defaults) {
        m_enabledList.clear();
        for (Widget &widget : widgets) {
            m_enabledList.append(widget.path);
            widget.enabled = widget.defaultEnabled;
        }
    } else {
        const QSet<QString> enabledPaths(m_enabledList.cbegin(), m_enabledList.cend());
        for (Widget &widget : widgets) {
            widget.enabled = enabledPaths.contains(widget.path);
        }
    }
    return widgets;
}

void EventsWidgetsModel::mergeWidgets(const std::vector<Widget> &widgets)
{
    // Where to start searching for the row of a path: insertions only push rows down.
    QHash<QString, int> firstRows;
    firstRows.reserve(m_rows.size() + int(widgets.size()));
    for (int row = 0; row < m_rows.size(); ++row) {
        firstRows.insert(m_rows.at(row).path, row);
    }
    RowNumbers<int> orders; // Filled when they are needed: most scans insert nothing.
    for (const Widget &widget : widgets) {
        int row = firstRows.value(widget.path, -1);
        if (row < 0) {
            while (orders.count() < m_rows.size()) {
                orders.append(m_rows.at(orders.count()).order);
            }
            row = orders.insert(widget.order);
            firstRows.insert(widget.path, row);
            insertWidget(row, widget);
            continue;
        }
        while (m_rows.at(row).path != widget.path) {
            ++row;
        }
        if (m_rows.at(row).order != widget.order) {
            orders.clear();
        }
        if (m_rows.at(row) != widget) {
            updateWidget(row, widget);
        }
    }
}

void EventsWidgetsModel::insertWidget(int row, const Widget &widget)
{
    beginInsertRows({}, row, row);
    m_rows.insert(row, widget);
    endInsertRows();
}

void EventsWidgetsModel::updateWidget(int row, const Widget &widget)
{
    // The row keeps its place, on purpose, even if its order changes.
    m_rows[row] = widget;
    Q_EMIT dataChanged(index(row), index(row));
}

void EventsWidgetsModel::removeStaleRows(const QSet<QString> &paths)
{
    if (paths.isEmpty()) {
        return;
    }
    int row = 0;
    while (row < m_rows.size()) {
        if (!paths.contains(m_rows.at(row).path)) {
            ++row;
            continue;
        }
        beginRemoveRows({}, row, row);
        // Deliberately without effect, because the users of the catalogs are file names and this is
        // a path: texts that are still on the screen keep their translation.
        m_catalogs.removeDefinition(m_rows.at(row).file, m_rows.at(row).translationCatalog);
        m_rows.removeAt(row);
        endRemoveRows();
    }
}
