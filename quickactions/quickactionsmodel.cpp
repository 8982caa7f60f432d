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
#include <QSet>

#include <algorithm>
#include <limits>

namespace {

const QLatin1String definitionDirectory("/usr/share/glimmera/quickactions");
const QLatin1String definitionSuffix(".conf");
constexpr int reloadDelay = 1000; // ms

const QLatin1String enabledKey("/desktop/glimmera-marlo-home/events_screen_actions");
const QLatin1String blockedKey("/desktop/glimmera-marlo-home/blocked_actions");
const QLatin1String userKey("/desktop/glimmera-marlo-home/events_screen_actions_user");

const QLatin1String noReplyError("org.freedesktop.DBus.Error.NoReply");
const QLatin1String serviceUnknownError("org.freedesktop.DBus.Error.ServiceUnknown");

const QLatin1String storeService("com.marlo.marlostore");
const QLatin1String storePath("/StoreClient");
const QLatin1String storeInterface("com.marlo.marlostore");
const QLatin1String storeMethod("showApp");

// By suffix and name, whatever their case, as QDir would filter and sort them. It would make a
// regular expression and two texts of every entry, though, and what is read here are hundreds of
// small files.
QStringList definitionFiles()
{
    QStringList names = QDir(definitionDirectory).entryList(QDir::AllEntries, QDir::Unsorted);
    const auto isOther = [](const QString &name) {
        return !name.endsWith(definitionSuffix, Qt::CaseInsensitive);
    };
    names.erase(std::remove_if(names.begin(), names.end(), isOther), names.end());
    names.sort(Qt::CaseInsensitive);
    return names;
}

QSet<QString> toSet(const QStringList &list)
{
    return {list.cbegin(), list.cend()};
}

// A row without a priority stops every action that has one, wherever that row stands; one of a
// negative priority stops none.
uint priorityOfRow(const QuickAction &action)
{
    const std::optional<int> priority = action.priority();
    return priority ? uint(qMax(*priority, 0)) : std::numeric_limits<uint>::max();
}

} // namespace

/*!
    \qmltype QuickActionsModel
    \inqmlmodule com.marlo.settings.system
    \brief Lists the quick actions of the events screen.

    Packages offer a quick action by installing a definition file, \c{*.conf}, into
    \c /usr/share/glimmera/quickactions; \l{marlo-quickactions(5)} tells what it holds.
    The model lists those that the user has enabled, in the user's order; with \l showPotential it
    lists all of them. It follows the directory, about a second after a change, and the user's lists.
    (Rows that stay keep their places, though: with \l showPotential an action that is enabled or
    disabled, one whose file gives another priority, and what another model or process orders anew
    take their new places when the model is created the next time.)

    \list
    \li \c /desktop/glimmera-marlo-home/events_screen_actions (dconf, list of strings): the paths of
        the enabled actions' files, in the order in which they are shown.
    \li \c /desktop/glimmera-marlo-home/blocked_actions (dconf, list of strings): the paths of
    actions that are never listed.
    \endlist

    The roles of a row:

    \table
    \header \li Role \li Type \li Value
    \row \li \c title \li string \li The title in the user's language, or its identifier without a
         translation; undefined if the file gives no title.
    \row \li \c icon \li string \li As in the definition file; undefined if it gives none.
    \row \li \c path \li string \li The path of the definition file: the action's identity, which
         enableAction() and disableAction() take.
    \row \li \c enabled \li bool \li Whether the user has enabled the action.
    \endtable

    A definition file that cannot be read is listed without title and icon, with a warning.

    \qml
    ListView {
        model: QuickActionsModel { id: actions }
        delegate: ItemDelegate {
            text: model.title || ""
            onClicked: actions.triggerAction(index)
        }
    }
    \endqml

    \note What a handler of one of the model's signals asks of the model while rows are being
    changed is done as soon as control returns to the event loop.
*/

QuickActionsModel::QuickActionsModel(QObject *parent)
    : QAbstractListModel(parent), m_catalogs(this), m_watcher(definitionDirectory, this),
      m_reloadTimer(this), m_enabledItem(enabledKey), m_blockedItem(blockedKey)
{
    m_reloadTimer.setSingleShot(true);
    m_reloadTimer.setInterval(reloadDelay);
    connect(&m_watcher, &DirectoryWatcher::directoryChanged, this,
            &QuickActionsModel::directoryChanged);

    connect(&m_enabledItem, &MGConfItem::valueChanged, this,
            &QuickActionsModel::updateEnabledActions);
    m_enabledList = m_enabledItem.value().toStringList();
    connect(&m_blockedItem, &MGConfItem::valueChanged, this, [this] {
        m_blockedList = m_blockedItem.value().toStringList();
        loadActions();
    });
    m_blockedList = m_blockedItem.value().toStringList();
}

QuickActionsModel::~QuickActionsModel()
{
    // Announces language changes, which may lead back here: while there is a model to ask, but one
    // that loads nothing any more.
    m_complete = false;
    m_catalogs.clear();
}

/*!
    \qmlproperty bool QuickActionsModel::showPotential

    Whether every action that is offered is listed, enabled or not, for a page on which the user
    enables, disables and orders them. As the model loads, the enabled ones are placed first, in the
    user's order, then the others by the priority that their files give, each before the first row of
    a greater priority or of none, whether that is enabled or not. The default is false.
*/
bool QuickActionsModel::showPotential() const
{
    return m_showPotential;
}

void QuickActionsModel::setShowPotential(bool showPotential)
{
    if (m_showPotential != showPotential) {
        m_showPotential = showPotential;
        loadActions();
        Q_EMIT showPotentialChanged();
    }
}

/*!
    \qmlproperty int QuickActionsModel::count
    \readonly

    The number of rows.
*/
int QuickActionsModel::count() const
{
    return rowCount();
}

int QuickActionsModel::rowCount(const QModelIndex &parent) const
{
    // The same for every parent, on purpose: a list has but one, and pages need not name it.
    Q_UNUSED(parent)
    return int(m_rows.size());
}

QVariant QuickActionsModel::data(const QModelIndex &index, int role) const
{
    if (!hasRow(index.row())) {
        return {};
    }
    const Action &action = *m_rows[size_t(index.row())];
    switch (role) {
    case TitleRole: {
        const QString title = action.title();
        return title.isEmpty() ? QVariant() : qtTrId(title.toLocal8Bit().constData());
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

    Returns the row at \a index as an object with a property for each role. An index without a row
    gives an empty object and a warning.
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

    Sends the D-Bus call of the action at \a index on the session bus, without waiting for an
    answer.

    If the call fails because its service does not exist, and the action names a package that it
    needs, the application store client is asked to show that package: by the method \c showApp of
    \c com.marlo.marlostore at the path \c /StoreClient of the service of that name on the session
    bus. Every failure but that of a service which does not answer in time gives a
    warning, and so does an index without a row.
*/
void QuickActionsModel::triggerAction(int index)
{
    if (!hasRow(index)) {
        qmlInfo(this) << "triggerAction() called with invalid index: " << index;
        return;
    }
    m_rows[size_t(index)]->trigger(this, nullptr,
                                   SLOT(triggerActionError(QDBusError, QDBusMessage)));
}

void QuickActionsModel::classBegin()
{
}

void QuickActionsModel::componentComplete()
{
    m_complete = true;
    loadActions();
}

/*!
    \qmlmethod void QuickActionsModel::enableAction(string path)

    Adds the action of the definition file \a path at the end of the user's list, even if it is in
    there. The model follows once dconf reports the change. Notes in
    \c /desktop/glimmera-marlo-home/events_screen_actions_user (dconf, bool) that the user has
    chosen.
*/
void QuickActionsModel::enableAction(const QString &path)
{
    if (putOff([this, path] { enableAction(path); })) {
        return;
    }
    writeEnabledList(m_enabledList + QStringList(path));
}

/*!
    \qmlmethod void QuickActionsModel::disableAction(string path)

    Takes the action of the definition file \a path out of the user's list, however often it is in
    there. The model follows once dconf reports the change. Notes that the user has chosen, as
    enableAction() does.
*/
void QuickActionsModel::disableAction(const QString &path)
{
    if (putOff([this, path] { disableAction(path); })) {
        return;
    }
    QStringList list = m_enabledList;
    list.removeAll(path);
    writeEnabledList(list);
}

/*!
    \qmlmethod void QuickActionsModel::move(int index, int newIndex)

    Moves the row and the entry of the user's list at \a index to \a newIndex, and notes that the
    user has chosen, as enableAction() does. An index outside the user's list does nothing.

    The rows have to begin with the enabled actions in the user's order. Without \l showPotential they
    do, unless an enabled action is missing or blocked, or has been given another place by somebody
    else; with it, actions that are not enabled may stand among them.
*/
void QuickActionsModel::move(int index, int newIndex)
{
    if (putOff([this, index, newIndex] { move(index, newIndex); })) {
        return;
    }
    if (index < 0 || newIndex < 0 || index >= m_enabledList.size()
        || newIndex >= m_enabledList.size()) {
        return;
    }

    {
        const QScopedValueRollback<bool> changing(m_changing, true);
        // An entry of the list need not have a row.
        const bool movesRow = index != newIndex && hasRow(index) && hasRow(newIndex);
        if (movesRow) {
            const int destination = newIndex > index ? newIndex + 1 : newIndex;
            beginMoveRows({}, index, index, {}, destination);
            const auto from = m_rows.begin() + index;
            const auto to = m_rows.begin() + newIndex;
            if (index < newIndex) {
                std::rotate(from, from + 1, to + 1);
            } else {
                std::rotate(to, from, from + 1);
            }
        }
        m_enabledList.move(index, newIndex);
        {
            const QScopedValueRollback<bool> moving(m_moving, true);
            writeEnabledList(m_enabledList);
        }
        if (movesRow) {
            endMoveRows();
        }
    }
    // Whoever was told of the write may have enabled or disabled an action in answer.
    if (m_enabledItem.value().toStringList() != m_enabledList) {
        updateEnabledActions();
    }
}

/*!
    \qmlsignal QuickActionsModel::showPotentialChanged()

    Emitted after \l showPotential and with it the rows have changed.
*/

/*!
    \qmlsignal QuickActionsModel::countChanged()

    Emitted after \l count has changed.
*/

void QuickActionsModel::loadActions()
{
    if (!m_complete || putOff([this] { loadActions(); })) {
        return;
    }

    const int countBefore = count();
    {
        const QScopedValueRollback<bool> changing(m_changing, true);
        const QSet<QString> enabled = toSet(m_enabledList);

        QStringList offered;
        QSet<QString> selected;
        const QSet<QString> blocked = toSet(m_blockedList);
        const QStringList names = definitionFiles();
        for (const QString &name : names) {
            const QString path = definitionDirectory + QLatin1Char('/') + name;
            if ((m_showPotential || enabled.contains(path)) && !blocked.contains(path)) {
                offered.append(path);
                selected.insert(path);
            }
        }

        removeRowsExcept(selected);

        QHash<QString, const Action *> rows;
        m_priorities.clear();
        for (int row = 0; row < rowCount(); ++row) {
            const Action &action = *m_rows[size_t(row)];
            rows.insert(action.path(), &action);
            m_priorities.insert(row, priorityOfRow(action));
        }
        const auto addOrUpdate = [this, &rows](const Action &action, auto insertionIndex) {
            const Action *known = rows.value(action.path());
            if (known == nullptr) {
                addAction(insertionIndex(), action);
            } else if (*known != action) {
                const auto isKnown = [known](const auto &row) { return row.get() == known; };
                const auto row = std::find_if(m_rows.cbegin(), m_rows.cend(), isKnown);
                updateAction(int(row - m_rows.cbegin()), action);
            }
        };

        // The enabled ones first, in the order of the list: each goes behind those before it that
        // have a row, which are just those that have been met. A repeated entry is met once.
        QSet<QString> met;
        for (const QString &path : qAsConst(m_enabledList)) {
            if (selected.contains(path) && !met.contains(path)) {
                addOrUpdate(Action(path, true), [&met] { return met.size(); });
                met.insert(path);
            }
        }
        for (const QString &path : qAsConst(offered)) {
            if (!enabled.contains(path)) {
                const Action action(path, false);
                addOrUpdate(action, [this, &action] { return insertionIndexByPriority(action); });
            }
        }
    }
    if (count() != countBefore) {
        Q_EMIT countChanged();
    }
}

void QuickActionsModel::updateEnabledActions()
{
    if (m_moving || putOff([this] { updateEnabledActions(); })) {
        return;
    }
    m_enabledList = m_enabledItem.value().toStringList();
    loadActions();
}

void QuickActionsModel::directoryChanged()
{
    if (!m_reloadTimer.isActive()) {
        m_reloadTimer.start();
        // Not to be tidied into one connection: on purpose none is ever undone, so that a timeout
        // loads once more for every period of changes that went before.
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

    // Several actions may make the same call, and not every one need name the package.
    for (const auto &row : m_rows) {
        const bool sent = row->service() == msg.service() && row->objectPath() == msg.path()
            && row->interface() == msg.interface() && row->method() == msg.member();
        if (sent && !row->requiredPackage().isEmpty()) {
            showStorePackage(row->requiredPackage());
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
    // Fails only if it cannot be sent; nobody waits for an answer.
    if (bus.call(call, QDBus::NoBlock).type() == QDBusMessage::ErrorMessage) {
        qmlInfo(this) << "call to com.marlo.marlostore failed: " << bus.lastError();
    }
}

bool QuickActionsModel::putOff(const std::function<void()> &request)
{
    return m_changing && QMetaObject::invokeMethod(this, request, Qt::QueuedConnection);
}

bool QuickActionsModel::hasRow(int index) const
{
    return index >= 0 && index < rowCount();
}

void QuickActionsModel::removeRowsExcept(const QSet<QString> &paths)
{
    int row = 0;
    while (row < rowCount()) {
        const Action &action = *m_rows[size_t(row)];
        if (paths.contains(action.path())) {
            ++row;
        } else {
            beginRemoveRows({}, row, row);
            removeTranslatorForAction(action);
            m_rows.erase(m_rows.begin() + row);
            endRemoveRows();
        }
    }
}

void QuickActionsModel::addAction(int row, const Action &action)
{
    beginInsertRows({}, row, row);
    addTranslatorForAction(action);
    m_rows.insert(m_rows.begin() + row, std::make_unique<Action>(action));
    m_priorities.insert(row, priorityOfRow(action));
    endInsertRows();
}

void QuickActionsModel::updateAction(int row, const Action &action)
{
    Action &current = *m_rows[size_t(row)];
    const bool catalogChanged = current.translationCatalog() != action.translationCatalog();
    current = action;
    m_priorities.replace(row, priorityOfRow(action));
    // The old catalog is not released, on purpose: its texts stay at hand until the model goes.
    if (catalogChanged) {
        addTranslatorForAction(action);
    }
    Q_EMIT dataChanged(index(row), index(row));
}

int QuickActionsModel::insertionIndexByPriority(const Action &action) const
{
    const std::optional<int> priority = action.priority();
    if (!priority || *priority < 0) {
        return rowCount();
    }
    return m_priorities.firstAbove(uint(*priority));
}

void QuickActionsModel::addTranslatorForAction(const Action &action)
{
    m_catalogs.addDefinition(action.path(), action.translationCatalog());
}

void QuickActionsModel::removeTranslatorForAction(const Action &action)
{
    m_catalogs.removeDefinition(action.path(), action.translationCatalog());
}

void QuickActionsModel::writeEnabledList(const QStringList &list)
{
    m_enabledItem.set(list);
    MGConfItem(userKey).set(true);
}
