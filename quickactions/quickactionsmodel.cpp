// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "quickactionsmodel.h"

#include "quickaction.h"

#include <QDBusConnection>
#include <QDBusError>
#include <QDBusMessage>
#include <QDir>
#include <QQmlInfo>
#include <QScopedValueRollback>

#include <algorithm>
#include <chrono>
#include <utility>

using namespace std::chrono_literals;

namespace {

constexpr std::chrono::milliseconds reloadDelay = 1s;

constexpr auto enabledKey = "/desktop/glimmera-marlo-home/events_screen_actions"_L1;
constexpr auto blockedKey = "/desktop/glimmera-marlo-home/blocked_actions"_L1;
constexpr auto userKey = "/desktop/glimmera-marlo-home/events_screen_actions_user"_L1;

constexpr auto noReplyError = "org.freedesktop.DBus.Error.NoReply"_L1;
constexpr auto serviceUnknownError = "org.freedesktop.DBus.Error.ServiceUnknown"_L1;

constexpr auto storeService = "com.marlo.marlostore"_L1;
constexpr auto storePath = "/StoreClient"_L1;
constexpr auto storeInterface = "com.marlo.marlostore"_L1;
constexpr auto storeMethod = "showApp"_L1;

QSet<QString> setOf(const QStringList &texts)
{
    return {texts.cbegin(), texts.cend()};
}

} // namespace

/*!
    \qmltype QuickActionsModel
    \inqmlmodule com.marlo.settings.system
    \brief Lists the quick actions of the events screen.

    Packages offer a quick action by installing a definition file, \c{*.conf}, into
    \c /usr/share/glimmera/quickactions; \l{marlo-quickactions(5)} describes the format.
    The model lists the actions that the user has enabled, in the user's order; with
    \l showPotential it lists all of them. It reloads about a second after the directory changes,
    and follows two lists in dconf:

    \list
    \li \c /desktop/glimmera-marlo-home/events_screen_actions (list of strings): the paths of the
        enabled actions' files, in the order in which they are shown.
    \li \c /desktop/glimmera-marlo-home/blocked_actions (list of strings): the paths of actions that
        are never listed, not even if the user has enabled them. Vendors use this list.
    \endlist

    The roles of a row:

    \table
    \header \li Role \li Type \li Value
    \row \li \c title \li string \li The title in the user's language, or its identifier if there is
         no translation; undefined if the file has no title.
    \row \li \c icon \li string \li The value in the definition file: a URL such as
         \c{image://theme/lamp}, an absolute path, or the name of an icon of the theme. To show a
         path in an Image, prepend \c{file://}. Undefined if the file has no icon.
    \row \li \c path \li string \li The path of the definition file: the action's identity, which
         enableAction() and disableAction() take.
    \row \li \c enabled \li bool \li Whether the user has enabled the action.
    \endtable

    \qml
    ListView {
        model: QuickActionsModel { id: actions }
        delegate: ItemDelegate {
            text: model.title || ""
            onClicked: actions.triggerAction(index)
        }
    }
    \endqml

    \note Handlers may call any method of the model. enableAction() and disableAction() store the
    list at once. While rows are being changed, updates and moves wait until control returns to the
    event loop. The model then runs each kind of update at most once, and all moves in the order of
    the calls.

    \image gallery-quick-actions.png The gallery's page for this type

    \section1 What may surprise
    \section2 A file that cannot be read is still a row
    The model logs a warning and lists the file without title and icon. Triggering it sends nothing.
    The user's list may contain the file, and move() relies on rows and entries having the same
    indexes.

    \section2 The roles have the numbers 0 to 3
    These are also the numbers of Qt's roles for display, decoration, editing and tool tips. The
    numbers are fixed, because existing code may use them. TitlesView treats role 0 as unknown: if
    \c title is its \c matchRole, every row matches.

    \section2 An action can be enabled twice
    enableAction() does not check whether the list already contains the path, because the list that
    the model knows may be older than the stored one. disableAction() removes every entry. A path
    has one row, however many entries it has.

    \section2 Rows change only after dconf reports the change
    This keeps the models of all pages equal after enableAction() and disableAction(). dconf may
    report the change during the call or later.

    \section2 move() takes indexes in the user's list
    It uses the same indexes for the row and for the entry in the list, so call it on a model
    without \l showPotential. Enabled actions that are not installed or are blocked have an entry
    but no row. The entry remains so that the action returns to its place when its package is
    installed again. \l{QuickActionsModel::move()}{move()} has an example for such a list.

    \section2 Existing rows do not move
    Rows keep their places when an action is enabled or disabled with \l showPotential, when the
    priority in a file changes, and when another model or process changes the order. Otherwise a row
    could move while the user taps it. Models that are created later use the new order.

    \section2 Other actions may be placed above the enabled ones
    With \l showPotential, an action that is not enabled is inserted before the first row that has a
    greater priority or no priority. If the first enabled action has no priority, every new action
    with a priority is placed above it. Give all actions a priority, or show the enabled ones in a
    separate model.

    \section2 Reloads are repeated
    The first change of the directory causes one reload, the second causes two, the third causes
    three, and so on. The extra reloads only repeat the warnings about files that cannot be read:
    a file that has not changed is not read again.

    \section2 A file of the same size and time keeps its old values
    QSettings keeps what it has read from a file until the size or the modification time of the file
    changes. A definition that is replaced by one of the same size and time keeps its old values
    until the process ends.

    \section2 Arguments are strings
    Arguments of a call are sent as strings, even \c 1 and \c true, because an INI file has no
    types. A value with an unquoted comma is sent as an array of strings. Only a value that QSettings
    itself reads as another type is sent as that type: \c{@ByteArray(abc)} as an array of bytes.

    \section2 A timeout is not a failure
    A service that does not answer in time causes no message: it may be busy opening its window. The
    message about a call that could not be sent ends in \c{%6}, because programs that read logs
    expect exactly this text.

    \section2 The store may show the package of another action
    It shows the package of the first row that sends the same call and names a package: actions with
    the same call need the same service.

    \section2 Titles do not follow a change of the language
    A model does not load its catalogs again when the language changes. A page that must follow the
    change has to create its models again.
*/

QuickActionsModel::QuickActionsModel(QObject *parent)
    : QAbstractListModel(parent), m_catalogs(this),
      m_watcher(Action::directory, Action::nameFilter), m_reloadTimer(this),
      m_enabledItem(enabledKey), m_blockedItem(blockedKey)
{
    m_reloadTimer.setSingleShot(true);
    m_reloadTimer.setInterval(reloadDelay);
    connect(&m_watcher, &DirectoryWatcher::changed, this, &QuickActionsModel::directoryChanged);

    connect(&m_enabledItem, &MGConfItem::valueChanged, this,
            &QuickActionsModel::updateEnabledActions);
    m_enabledList = storedList();
    connect(&m_blockedItem, &MGConfItem::valueChanged, this, [this] {
        m_blockedList = m_blockedItem.value().toStringList();
        loadActions();
    });
    m_blockedList = m_blockedItem.value().toStringList();
}

QuickActionsModel::~QuickActionsModel()
{
    // Removing the catalogs sends language change events, whose handlers may call the model. It
    // still exists here, and loads nothing any more.
    m_complete = false;
    m_catalogs.clear();
}

/*!
    \qmlproperty bool QuickActionsModel::showPotential

    Whether every offered action is listed, enabled or not, for a page on which the user enables and
    disables actions. The default is false. When a model loads, it places the enabled actions first,
    in the user's order.

    \qml
    Repeater {
        model: QuickActionsModel { id: offered; showPotential: true }
        delegate: Switch {
            text: model.title || ""
            checked: model.enabled
            onToggled: checked ? offered.enableAction(path) : offered.disableAction(path)
        }
    }
    \endqml

    If a handler sets the property while rows are being changed, the model waits until control
    returns to the event loop. It then changes the rows and emits showPotentialChanged().
*/
void QuickActionsModel::setShowPotential(bool showPotential)
{
    if (m_showPotential != showPotential) {
        m_showPotential = showPotential;
        applyShowPotential();
    }
}

/*!
    \qmlproperty int QuickActionsModel::count
    \readonly

    The number of rows.
*/

int QuickActionsModel::rowCount(const QModelIndex & /*parent*/) const
{
    // Every parent has the same rows, on purpose, so that pages need not pass one.
    return m_rows.size();
}

QVariant QuickActionsModel::data(const QModelIndex &index, int role) const
{
    if (!hasRow(index.row())) {
        return {};
    }
    const Action &action = m_rows.at(index.row());
    switch (role) {
    case TitleRole: {
        const QString title = action.title();
        return title.isEmpty() ? QVariant() : CatalogTable::text(title);
    }
    case IconRole:
        return action.icon();
    case PathRole:
        return action.path();
    case EnabledRole:
        return action.enabled();
    default:
        return {};
    }
}

QHash<int, QByteArray> QuickActionsModel::roleNames() const
{
    return {
        {TitleRole, "title"},
        {IconRole, "icon"},
        {PathRole, "path"},
        {EnabledRole, "enabled"},
    };
}

/*!
    \qmlmethod object QuickActionsModel::get(int index)

    Returns the row at \a index as an object with a property for each role. For an index
    without a row, it returns an empty object and logs a message.
*/
QVariantMap QuickActionsModel::get(int index) const
{
    if (!hasRow(index)) {
        qmlInfo(this) << "get() called with invalid index: " << index;
        return {};
    }
    QVariantMap row;
    const QHash<int, QByteArray> names = roleNames();
    for (auto it = names.cbegin(); it != names.cend(); ++it) {
        row.insert(QString::fromLatin1(it.value()), data(this->index(index), it.key()));
    }
    return row;
}

/*!
    \qmlmethod void QuickActionsModel::triggerAction(int index)

    Sends the D-Bus call of the action at \a index on the session bus, without waiting for a reply.
    Every failure except a timeout is logged. An index without a row is logged, too.

    If the service does not exist and the action names a package that it needs, the model asks the
    application store client to show that package. It calls the method \c showApp of the interface
    \c com.marlo.marlostore, at the path \c /StoreClient of the service \c com.marlo.marlostore on
    the session bus.
*/
void QuickActionsModel::triggerAction(int index)
{
    if (!hasRow(index)) {
        qmlInfo(this) << "triggerAction() called with invalid index: " << index;
        return;
    }
    m_rows.at(index).trigger(this, nullptr, SLOT(triggerActionError(QDBusError, QDBusMessage)));
}

void QuickActionsModel::componentComplete()
{
    m_complete = true;
    loadActions();
}

/*!
    \qmlmethod void QuickActionsModel::enableAction(string path)
    \qmlmethod void QuickActionsModel::disableAction(string path)

    enableAction() adds the definition file \a path at the end of the user's list. disableAction()
    removes all of its entries. Both methods start from the stored list, which another process may
    just have changed, and store the new list at once. They also set
    \c /desktop/glimmera-marlo-home/events_screen_actions_user (dconf, bool) to \c true, which
    records that the user has changed the list.
*/
void QuickActionsModel::enableAction(const QString &path)
{
    storeList(storedList() + QStringList(path));
}

void QuickActionsModel::disableAction(const QString &path)
{
    QStringList list = storedList();
    list.removeAll(path);
    storeList(list);
}

/*!
    \qmlmethod void QuickActionsModel::move(int index, int newIndex)

    Moves the row and the entry of the user's list at \a index to \a newIndex. Like enableAction(),
    it records that the user has changed the list. An index outside the user's list is silently
    ignored. If a dconf profile locks the list, or a handler of \c rowsAboutToBeMoved stores another
    one, the row returns to its old place. If dconf fails to store the list later, it restores the
    list from before, but the row stays at its new place.

    The rows must begin with the enabled actions in the user's order. Without \l showPotential this
    is true unless an enabled action is missing or blocked, or another model or process has changed
    the order. While an enabled action is not installed, the indexes after its entry mean other
    entries than the rows that the user sees. The rows of a new model always have the stored order.
    A page on which the user orders the actions therefore creates its model again when it is opened,
    and after a move if the rows then differ from the list:

    \qml
    ListView {
        id: list

        function paths(actions) {
            return Array.from({ length: actions.count }, (none, i) => actions.get(i).path).join();
        }
        function showStoredOrder() {
            const shown = model;
            const stored = newActions.createObject(list);
            if (shown && paths(shown) === paths(stored)) {
                stored.destroy();
                return;
            }
            model = stored;
            if (shown)
                shown.destroy();
        }
        function moveAction(from, to) {
            model.move(from, to);
            showStoredOrder();
        }

        delegate: ItemDelegate {
            text: model.title || ""
            onClicked: list.moveAction(index, 0)
        }
        Component.onCompleted: showStoredOrder()

        Component {
            id: newActions
            QuickActionsModel { }
        }
    }
    \endqml
*/
void QuickActionsModel::move(int index, int newIndex)
{
    m_moves.append({index, newIndex});
    applyMoves();
}

/*!
    \qmlsignal QuickActionsModel::showPotentialChanged()
    \qmlsignal QuickActionsModel::countChanged()

    Emitted after the property has changed and the rows have been updated.
*/

void QuickActionsModel::loadActions()
{
    if (!m_complete || m_requests.defer(&QuickActionsModel::loadActions)) {
        return;
    }
    const ChangeScope change(&m_requests);
    const int countBefore = count();
    const Selection selected = select();
    removeRowsExcept(setOf(selected.enabled + selected.others));
    updateRows(setOf(selected.enabled));
    insertMissing(selected);
    if (count() != countBefore) {
        Q_EMIT countChanged();
    }
}

void QuickActionsModel::updateEnabledActions()
{
    if (m_moving || m_requests.defer(&QuickActionsModel::updateEnabledActions)) {
        return;
    }
    m_enabledList = storedList();
    loadActions();
}

void QuickActionsModel::directoryChanged()
{
    if (!m_reloadTimer.isActive()) {
        m_reloadTimer.start();
        // Deliberately a new connection each time, and none is ever removed: each timeout loads
        // once more for every earlier period of changes.
        connect(&m_reloadTimer, &QTimer::timeout, this, &QuickActionsModel::loadActions);
    }
}

void QuickActionsModel::triggerActionError(const QDBusError &error, const QDBusMessage &msg)
{
    if (error.name() == noReplyError) {
        return;
    }
    const QString text = QStringLiteral("Failed to send dbus call to: service=%1 path=%2 "
                                        "interface=%3 method=%4. Error was: %5 %6")
                             .arg(msg.service(), msg.path(), msg.interface(), msg.member(),
                                  error.name(), error.message());
    qmlInfo(this).noquote() << text;
    if (error.name() != serviceUnknownError) {
        return;
    }

    // Several actions can send the same call, and some of them may not name the package.
    for (const Action &action : qAsConst(m_rows)) {
        const bool sent = action.service() == msg.service() && action.objectPath() == msg.path()
            && action.interface() == msg.interface() && action.method() == msg.member();
        if (sent && !action.requiredPackage().isEmpty()) {
            showStorePackage(action.requiredPackage());
            return;
        }
    }
}

void QuickActionsModel::showStorePackage(const QString &packageName)
{
    QDBusMessage call =
        QDBusMessage::createMethodCall(storeService, storePath, storeInterface, storeMethod);
    call.setArguments({packageName});
    const QDBusConnection bus = QDBusConnection::sessionBus();
    // Only a call that cannot be sent fails here: the model does not wait for a reply.
    if (bus.call(call, QDBus::NoBlock).type() == QDBusMessage::ErrorMessage) {
        qmlInfo(this) << "call to com.marlo.marlostore failed: " << bus.lastError();
    }
}

bool QuickActionsModel::hasRow(int index) const
{
    return index >= 0 && index < rowCount();
}

void QuickActionsModel::applyShowPotential()
{
    if (!m_requests.defer(&QuickActionsModel::applyShowPotential)) {
        loadActions();
        Q_EMIT showPotentialChanged();
    }
}

void QuickActionsModel::applyMoves()
{
    if (!m_requests.defer(&QuickActionsModel::applyMoves)) {
        const auto moves = std::exchange(m_moves, {});
        for (const auto &[index, newIndex] : moves) {
            applyMove(index, newIndex);
        }
    }
}

// The model must list the actions of the stored list, also if a handler or another process has just
// stored another one.
void QuickActionsModel::applyMove(int index, int newIndex)
{
    // At most twice: a handler of the first update may store yet another list, but not forever.
    for (int i = 0; i < 2 && storedList() != m_enabledList; ++i) {
        updateEnabledActions();
    }
    const int size = m_enabledList.size();
    if (index >= 0 && newIndex >= 0 && index < size && newIndex < size) {
        storeMove(index, newIndex);
        if (storedList() != m_enabledList) {
            updateEnabledActions();
        }
    }
}

void QuickActionsModel::storeMove(int index, int newIndex)
{
    const ChangeScope change(&m_requests);
    // An entry of the list may have no row.
    const bool movesRow = index != newIndex && hasRow(index) && hasRow(newIndex);
    if (movesRow) {
        beginMoveAction(index, newIndex);
    }
    const QStringList before = m_enabledList;
    m_enabledList.move(index, newIndex);
    // A handler of the announcement may have stored another list, which must not be overwritten.
    const bool isCurrent = storedList() == before;
    if (isCurrent) {
        const QScopedValueRollback<bool> moving(m_moving, true);
        storeList(m_enabledList);
    }
    if (movesRow) {
        endMoveRows();
    }
    const QStringList stored = storedList();
    const bool isStored = isCurrent && stored != before;
    // The list was not stored, or the key is locked.
    if (movesRow && !isStored && stored != m_enabledList) {
        beginMoveAction(newIndex, index);
        endMoveRows();
    }
}

// The caller calls endMoveRows().
void QuickActionsModel::beginMoveAction(int index, int newIndex)
{
    beginMoveRows({}, index, index, {}, newIndex > index ? newIndex + 1 : newIndex);
    m_rows.move(index, newIndex);
}

QuickActionsModel::Selection QuickActionsModel::select() const
{
    const QSet<QString> blocked = setOf(m_blockedList);
    Selection selected;
    const QStringList names = QDir(Action::directory).entryList({Action::nameFilter});
    for (const QString &name : names) {
        const QString path = Action::directory + QLatin1Char('/') + name;
        if (!blocked.contains(path)) {
            selected.others.append(path);
        }
    }
    QSet<QString> others = setOf(selected.others);
    for (const QString &path : m_enabledList) {
        if (others.remove(path)) {
            selected.enabled.append(path);
        }
    }
    const auto isDropped = [this, &others](const QString &path) {
        return !m_showPotential || !others.contains(path);
    };
    selected.others.erase(std::remove_if(selected.others.begin(), selected.others.end(), isDropped),
                          selected.others.end());
    return selected;
}

void QuickActionsModel::removeRowsExcept(const QSet<QString> &paths)
{
    int row = 0;
    while (row < m_rows.size()) {
        const Action &action = m_rows.at(row);
        if (paths.contains(action.path())) {
            ++row;
            continue;
        }
        beginRemoveRows({}, row, row);
        m_catalogs.removeDefinition(action.path(), action.translationCatalog());
        m_rows.removeAt(row);
        endRemoveRows();
    }
}

void QuickActionsModel::updateRows(const QSet<QString> &enabled)
{
    for (int row = 0; row < m_rows.size(); ++row) {
        const Action old = m_rows.at(row);
        const Action action = old.reread(enabled.contains(old.path()));
        m_rows[row] = action;
        if (action == old) {
            continue;
        }
        // The old catalog is not released, on purpose: its texts remain until the model is destroyed.
        if (action.translationCatalog() != old.translationCatalog()) {
            m_catalogs.addDefinition(action.path(), action.translationCatalog());
        }
        Q_EMIT dataChanged(index(row), index(row));
    }
}

void QuickActionsModel::insertMissing(const Selection &selected)
{
    QSet<QString> listed;
    for (const Action &action : qAsConst(m_rows)) {
        listed.insert(action.path());
    }
    // All enabled actions before this one in the list have a row.
    for (int i = 0; i < selected.enabled.size(); ++i) {
        const QString path = selected.enabled.at(i);
        if (!listed.contains(path)) {
            insertAction(i, Action(path, true));
        }
    }
    for (const QString &path : selected.others) {
        if (!listed.contains(path)) {
            const Action action(path, false);
            insertAction(rowForPriority(action.priority()), action);
        }
    }
}

// Before the first row of a greater priority or of none.
int QuickActionsModel::rowForPriority(std::optional<int> priority) const
{
    if (!priority || *priority < 0) {
        return m_rows.size();
    }
    const auto place = std::find_if(m_rows.cbegin(), m_rows.cend(), [priority](const Action &row) {
        return !row.priority() || *row.priority() > *priority;
    });
    return int(place - m_rows.cbegin());
}

void QuickActionsModel::insertAction(int row, const Action &action)
{
    beginInsertRows({}, row, row);
    m_catalogs.addDefinition(action.path(), action.translationCatalog());
    m_rows.insert(row, action);
    endInsertRows();
}

QStringList QuickActionsModel::storedList() const
{
    return m_enabledItem.value().toStringList();
}

void QuickActionsModel::storeList(const QStringList &list)
{
    m_enabledItem.set(list);
    MGConfItem(userKey).set(true);
}
