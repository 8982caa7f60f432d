// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "eventswidgetsmodel.h"

#include "eventswidget.h"
#include "eventswidgetsfile.h"

#include <QDirIterator>
#include <QFileInfo>
#include <QHash>

#include <algorithm>

namespace {

constexpr auto enabledKey = "/desktop/glimmera-marlo-home/events_screen_widgets"_L1;

std::vector<EventsWidgetsFile> readFiles()
{
    std::vector<EventsWidgetsFile> files;
    QDirIterator entries(EventsWidgetsFile::directory, {EventsWidgetsFile::nameFilter},
                         QDir::Files);
    while (entries.hasNext()) {
        const QString path = entries.next();
        // The filter of the iterator accepts links to pipes and devices.
        if (entries.fileInfo().isFile()) {
            if (std::optional<EventsWidgetsFile> file = readEventsWidgetsFile(path)) {
                files.push_back(std::move(*file));
            }
        }
    }
    return files;
}

QStringList pathsOf(const std::vector<EventsWidgetsFile> &files)
{
    QStringList paths;
    for (const EventsWidgetsFile &file : files) {
        for (const EventsWidget &widget : file.widgets) {
            paths.append(widget.path);
        }
    }
    return paths;
}

// Which widgets are enabled by the user's list, or by default without a list. An empty list counts.
class Choice
{
public:
    explicit Choice(const QVariant &stored) : m_isStored(stored.isValid())
    {
        const QStringList list = stored.toStringList();
        m_paths = {list.cbegin(), list.cend()};
    }
    bool enables(const EventsWidget &widget) const
    {
        return m_isStored ? m_paths.contains(widget.path) : widget.defaultEnabled;
    }

private:
    bool m_isStored;
    QSet<QString> m_paths;
};

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

    \note Handlers may call any method of the model. enableWidget() and disableWidget() store the
    list at once. While rows are being changed, updates wait until control returns to the event
    loop. The model then runs each kind of update at most once.

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
      m_watcher(EventsWidgetsFile::directory, EventsWidgetsFile::nameFilter),
      m_enabledItem(enabledKey)
{
    connect(&m_watcher, &DirectoryWatcher::changed, this, &EventsWidgetsModel::directoryChanged);
    connect(&m_enabledItem, &MGConfItem::valueChanged, this,
            &EventsWidgetsModel::enabledWidgetsChanged);
}

EventsWidgetsModel::~EventsWidgetsModel()
{
    // Removing the catalogs sends language change events, whose handlers may call the model. It
    // still exists here, and reads nothing any more.
    m_complete = false;
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
    contains it. disableWidget() removes every entry of it. Both methods start from the stored list,
    which another process may just have changed, and store the new list at once. The rows change
    once dconf reports the change.
*/
void EventsWidgetsModel::enableWidget(const QString &path)
{
    // A path may be listed twice, on purpose: disableWidget() removes every occurrence.
    m_enabledItem.set(enabledList() + QStringList(path));
}

void EventsWidgetsModel::disableWidget(const QString &path)
{
    QStringList list = enabledList();
    list.removeAll(path);
    m_enabledItem.set(list);
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
    const ChangeScope change(&m_requests);
    const std::vector<EventsWidgetsFile> files = readFiles();
    // First, because a handler of the rest may make the user's first choice.
    m_knownPaths = pathsOf(files);
    for (const EventsWidgetsFile &file : files) {
        // Never removed, on purpose: texts that are still on the screen keep their translation.
        m_catalogs.addDefinition(file.path, file.translationCatalog);
    }
    mergeWidgets(files);
    removeRowsExcept({m_knownPaths.cbegin(), m_knownPaths.cend()});
}

void EventsWidgetsModel::enabledWidgetsChanged()
{
    if (!m_complete || m_requests.defer(&EventsWidgetsModel::enabledWidgetsChanged)) {
        return;
    }
    const ChangeScope change(&m_requests);

    const Choice choice(m_enabledItem.value());
    m_knownPaths.clear();
    // First, because a handler of the rest may make the user's first choice.
    for (const Widget &widget : qAsConst(m_rows)) {
        m_knownPaths.append(widget.path);
    }
    for (int row = 0; row < m_rows.size(); ++row) {
        Widget &widget = m_rows[row];
        const bool enabled = choice.enables(widget);
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
    const ChangeScope change(&m_requests);

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
    const QVariant stored = m_enabledItem.value();
    return stored.isValid() ? stored.toStringList() : m_knownPaths;
}

void EventsWidgetsModel::mergeWidgets(const std::vector<EventsWidgetsFile> &files)
{
    const Choice choice(m_enabledItem.value());
    // Where the search for the row of a path starts: insertions only push rows down.
    QHash<QString, int> firstRows;
    for (int row = 0; row < m_rows.size(); ++row) {
        firstRows.insert(m_rows.at(row).path, row);
    }
    for (const EventsWidgetsFile &file : files) {
        for (Widget widget : file.widgets) {
            widget.enabled = choice.enables(widget);
            const auto first = firstRows.constFind(widget.path);
            if (first == firstRows.cend()) {
                firstRows.insert(widget.path, insertWidget(widget));
            } else {
                updateWidget(findWidget(widget.path, *first), widget);
            }
        }
    }
}

int EventsWidgetsModel::findWidget(const QString &path, int firstRow) const
{
    const auto found = std::find_if(m_rows.cbegin() + firstRow, m_rows.cend(),
                                    [&path](const Widget &row) { return row.path == path; });
    return int(found - m_rows.cbegin());
}

// Returns the row: before the first one of a higher order, or the last.
int EventsWidgetsModel::insertWidget(const Widget &widget)
{
    const auto place = std::find_if(m_rows.cbegin(), m_rows.cend(), [&widget](const Widget &row) {
        return widget.order >= 0 && row.order > widget.order;
    });
    const int row = int(place - m_rows.cbegin());
    beginInsertRows({}, row, row);
    m_rows.insert(row, widget);
    endInsertRows();
    return row;
}

void EventsWidgetsModel::updateWidget(int row, const Widget &widget)
{
    // The row keeps its place, on purpose, even if its order changes.
    if (m_rows.at(row) != widget) {
        m_rows[row] = widget;
        Q_EMIT dataChanged(index(row), index(row));
    }
}

void EventsWidgetsModel::removeRowsExcept(const QSet<QString> &paths)
{
    int row = 0;
    while (row < m_rows.size()) {
        if (paths.contains(m_rows.at(row).path)) {
            ++row;
            continue;
        }
        beginRemoveRows({}, row, row);
        m_rows.removeAt(row);
        endRemoveRows();
    }
}
