// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "titlesview.h"

#include <QJSValue>
#include <QLocale>
#include <QtDebug>

namespace {

// A role of a model, and the chain of properties to read from each of its values.
class RolePath
{
public:
    RolePath(const QString &path, const QHash<int, QByteArray> &roleNames)
    {
        const QStringList parts = path.split(QLatin1Char('.'), Qt::SkipEmptyParts);
        if (parts.isEmpty()) {
            return;
        }
        m_role = roleNames.key(parts.first().toLatin1(), noRole);
        for (int i = 1; i < parts.size(); ++i) {
            m_properties.append(parts.at(i).toUtf8());
        }
    }

    // Role 0 counts as unknown, on purpose.
    bool isKnown() const { return m_role != noRole; }

    QVariant value(const QModelIndex &index) const
    {
        QVariant value = index.data(m_role);
        for (const QByteArray &property : m_properties) {
            // A value that is not an object has no properties: the step is skipped.
            if (const auto *object = value.value<QObject *>()) {
                value = object->property(property.constData());
            }
        }
        return value;
    }

private:
    static constexpr int noRole = 0;

    int m_role = noRole;
    QVector<QByteArray> m_properties;
};

} // namespace

/*!
    \qmltype TitlesView
    \inqmlmodule com.marlo.settings.system
    \brief Joins one role of the rows of a list model into a sentence.

    \l values contains the texts of \l role: those of all rows, or only of the rows whose
    \l matchRole has the value \l match. \l value joins these texts by the rules of the user's
    language, for example "Clock, Weather, and Calendar" in English. Both properties are updated
    when rows are inserted, removed or changed, and when the model is reset.

    \l role and \l matchRole are role paths. A role path is the name of a role. If the role holds
    objects, names of properties may follow, separated by dots, as in \c "contact.name.first". A
    property that does not exist has no value. If a value is not an object, the rest of the path is
    ignored, so one path can be used for rows that hold an object and for rows that hold its text.

    \qml
    Label {
        text: titles.value
        TitlesView {
            id: titles
            model: EventsWidgetsModel { }
            role: "title"
            matchRole: "enabled"
            match: true
        }
    }
    \endqml

    A view matches one role. To select rows by two roles, put a model with the matching rows in
    between. This example joins the titles of the widgets that are both enabled and available:

    \qml
    Label {
        text: usableTitles.value
        TitlesView {
            id: usableTitles
            model: ListModel { id: usable }
            role: "title"
        }
        Instantiator {
            id: rows
            function select() {
                usable.clear();
                for (let i = 0; i < count; ++i) {
                    if (objectAt(i).isUsable)
                        usable.append({ title: objectAt(i).text });
                }
            }
            model: EventsWidgetsModel { }
            delegate: QtObject {
                readonly property string text: model.title
                readonly property bool isUsable: model.enabled && model.available
                onTextChanged: Qt.callLater(rows.select)
                onIsUsableChanged: Qt.callLater(rows.select)
            }
            onObjectAdded: Qt.callLater(select)
            onObjectRemoved: Qt.callLater(select)
        }
    }
    \endqml

    \image gallery-titles.png The gallery's page for this type

    \section1 What may surprise
    \section2 A model cannot be cleared
    Setting \l model to null logs a warning and keeps the old model, so that a page that is being
    closed keeps its sentence. If the model is destroyed, the property becomes null.

    \section2 An unknown matchRole selects every row
    An unknown \l role reads the display role, because a view may be set up before the model has its
    roles. The role with the number 0 counts as unknown. Many list models give this number to their
    first role, for example QuickActionsModel to \c title, and a QML \c ListModel.

    \section2 Moved rows are not noticed
    Call update() after rows have been moved or the layout of the model has changed.

    \section2 A new language is not noticed
    \l value uses the list format of the default locale at the time of reading, and \l values
    contains the texts of the last update. \c{QQmlEngine::retranslate()} evaluates the bindings of
    pages again, including those that read \l value.

    \section2 Empty texts are included
    A row without text adds an empty text. Exclude such rows with \l matchRole.
*/

/*!
    \qmlproperty object TitlesView::model

    The model that is read, a \c QAbstractListModel. It is null until a model is set, and after the
    model has been destroyed. Any other value is refused with a warning, and the model is kept.
*/
void TitlesView::setModel(QObject *model)
{
    if (model == m_model) {
        return;
    }
    auto *listModel = qobject_cast<QAbstractListModel *>(model);
    if (listModel == nullptr) {
        // Null too, on purpose: a page keeps its sentence while it is being destroyed.
        qWarning() << "Unsupported model type" << model;
        return;
    }

    for (const QMetaObject::Connection &connection : m_connections) {
        disconnect(connection);
    }
    m_model = listModel;
    m_connections = {
        connect(listModel, &QAbstractItemModel::rowsInserted, this, &TitlesView::update),
        connect(listModel, &QAbstractItemModel::rowsRemoved, this, &TitlesView::update),
        connect(listModel, &QAbstractItemModel::dataChanged, this, &TitlesView::update),
        connect(listModel, &QAbstractItemModel::modelReset, this, &TitlesView::update),
        connect(listModel, &QObject::destroyed, this, &TitlesView::modelDestroyed),
    };
    Q_EMIT modelChanged();
    update();
}

/*!
    \qmlproperty string TitlesView::matchRole

    The role path whose value selects the rows. An empty path, the default, selects every row.
*/
void TitlesView::setMatchRole(const QString &matchRole)
{
    if (m_matchRole != matchRole) {
        m_matchRole = matchRole;
        Q_EMIT matchRoleChanged();
        update();
    }
}

/*!
    \qmlproperty var TitlesView::match

    The value that \l matchRole must have, or a list of the values that it may have. An object that
    is destroyed becomes null.
*/
void TitlesView::setMatch(const QVariant &match)
{
    // A QML array arrives as a QJSValue, which never compares equal.
    const QVariant plain =
        match.userType() == qMetaTypeId<QJSValue>() ? match.value<QJSValue>().toVariant() : match;
    if (m_match == plain) {
        return;
    }
    m_match = watched(plain, nullptr);
    Q_EMIT matchChanged();
    update();
}

/*!
    \qmlproperty string TitlesView::role

    The role path whose values are collected. With an empty path, the default, nothing is
    collected.
*/
void TitlesView::setRole(const QString &role)
{
    if (m_role != role) {
        m_role = role;
        Q_EMIT roleChanged();
        update();
    }
}

/*!
    \qmlproperty list<string> TitlesView::values
    \readonly
    \qmlproperty string TitlesView::value
    \readonly

    The texts of the rows that match, in the order of the model, as a list and joined by joined().
*/

/*!
    \qmlmethod string TitlesView::joined(list<string> list)

    Returns the texts of \a list, joined by the list format of the default locale.
*/
QString TitlesView::joined(const QStringList &list) const
{
    return QLocale().createSeparatedList(list);
}

/*!
    \qmlmethod void TitlesView::update()

    Reads the model again.
*/
void TitlesView::update()
{
    const uint updates = ++m_updates;
    const QStringList values = collect();
    // Reading a property may have called update() again, which has then collected newer values.
    if (updates == m_updates && m_values != values) {
        m_values = values;
        Q_EMIT valueChanged();
    }
}

/*!
    \qmlsignal TitlesView::modelChanged()
    \qmlsignal TitlesView::matchRoleChanged()
    \qmlsignal TitlesView::matchChanged()
    \qmlsignal TitlesView::roleChanged()

    Emitted after the property has changed, before the model is read again.
*/

/*!
    \qmlsignal TitlesView::valueChanged()

    Emitted after \l values, and therefore \l value, has changed.
*/

QStringList TitlesView::collect() const
{
    if (m_model == nullptr || m_role.isEmpty()) {
        return {};
    }
    const QHash<int, QByteArray> roleNames = m_model->roleNames();
    const RolePath matchRole(m_matchRole, roleNames);
    const RolePath role(m_role, roleNames);

    QStringList values;
    const int count = m_model->rowCount();
    // Reading a property may destroy the model.
    for (int row = 0; row < count && m_model != nullptr; ++row) {
        const QModelIndex index = m_model->index(row, 0);
        if (matchRole.isKnown() && (!matches(matchRole.value(index)) || m_model == nullptr)) {
            continue;
        }
        values.append(role.value(index).toString());
    }
    return values;
}

bool TitlesView::matches(const QVariant &value) const
{
    if (m_match.userType() == QMetaType::QStringList && value.canConvert<QString>()
        && m_match.toStringList().contains(value.toString())) {
        return true;
    }
    if (m_match.userType() == QMetaType::QVariantList && m_match.toList().contains(value)) {
        return true;
    }
    // The order matters: the right variant is converted to the type of the left one, and some
    // conversions work in one direction only.
    return m_match == value;
}

void TitlesView::modelDestroyed()
{
    Q_EMIT modelChanged();
    update();
}

void TitlesView::matchDestroyed(QObject *object)
{
    setMatch(watched(m_match, object));
}

// Returns the value with null in place of the destroyed object, also in its lists and maps, and
// connects to all other objects.
QVariant TitlesView::watched(const QVariant &value, const QObject *destroyed)
{
    if (value.userType() == QMetaType::QVariantList) {
        QVariantList list = value.toList();
        for (QVariant &element : list) {
            element = watched(element, destroyed);
        }
        return list;
    }
    if (value.userType() == QMetaType::QVariantMap) {
        QVariantMap map = value.toMap();
        for (QVariant &element : map) {
            element = watched(element, destroyed);
        }
        return map;
    }
    auto *const object = value.value<QObject *>();
    if (object == nullptr) {
        return value;
    }
    if (object == destroyed) {
        return QVariant::fromValue<QObject *>(nullptr);
    }
    connect(object, &QObject::destroyed, this, &TitlesView::matchDestroyed, Qt::UniqueConnection);
    return value;
}
