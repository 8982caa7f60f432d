// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "titlesview.h"

#include <QJSValue>
#include <QLocale>
#include <QtDebug>

#include <functional>

namespace {

// A role of a model, and the properties that lead on from its values.
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

// Calls the function for every object in a value, also within its lists and maps.
void forEachObject(QVariant *value, const std::function<void(QObject *, QVariant *)> &function)
{
    if (value->userType() == QMetaType::QVariantList) {
        QVariantList list = value->toList();
        for (QVariant &element : list) {
            forEachObject(&element, function);
        }
        *value = list;
    } else if (value->userType() == QMetaType::QVariantMap) {
        QVariantMap map = value->toMap();
        for (QVariant &element : map) {
            forEachObject(&element, function);
        }
        *value = map;
    } else if (auto *object = value->value<QObject *>()) {
        function(object, value);
    }
}

} // namespace

/*!
    \qmltype TitlesView
    \inqmlmodule com.marlo.settings.system
    \brief Joins one role of the rows of a list model into a sentence.

    \l values has the texts of \l role, of all rows or of those whose \l matchRole has the value
    \l match. \l value joins them as the user's language does, in English "Clock, Weather, and
    Calendar". They follow rows that are inserted, removed or changed and a reset of the model.

    \l role and \l matchRole are role paths: the name of a role, or that followed by names of
    properties, joined by dots, such as \c "contact.name.first" for a role that holds objects. A
    property that an object lacks has no value. A step from a value that is not an object is
    skipped, so one path serves rows that hold an object and rows that hold its text.

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

    \image gallery-titles.png The gallery's page of this type

    \section1 What may surprise
    \section2 A model cannot be cleared
    Setting \l model to null logs a warning and keeps the old model, so that a page that is being
    closed keeps its sentence. A model that is destroyed is removed.

    \section2 An unknown matchRole takes every row
    An unknown \l role reads the display role, because a view may be set up before the model has its
    roles. The role with the number 0 counts as unknown. It is the first role of many list models,
    such as \c title of QuickActionsModel and the roles of a QML \c ListModel.

    \section2 Moved rows are not noticed
    After a move or a new layout call update().

    \section2 A new language is not noticed
    \l value uses the list format of the default locale at the time of reading, and \l values has
    the texts of the last update. The engine evaluates the texts of its pages again after a change.

    \section2 Empty texts count
    A row without text gives an empty text. Exclude such rows with \l matchRole.
*/

/*!
    \qmlproperty object TitlesView::model

    The model that is read, a \c QAbstractListModel; null before the first one is set and after a
    model was destroyed. Anything else is refused with a warning and the model stays.
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

    The role path whose value selects the rows. Empty, the default, takes every row.
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
    QVariant plain =
        match.userType() == qMetaTypeId<QJSValue>() ? match.value<QJSValue>().toVariant() : match;
    if (m_match == plain) {
        return;
    }
    forEachObject(&m_match, [this](QObject *object, QVariant *) {
        disconnect(object, &QObject::destroyed, this, &TitlesView::matchDestroyed);
    });
    forEachObject(&plain, [this](QObject *object, QVariant *) {
        connect(object, &QObject::destroyed, this, &TitlesView::matchDestroyed,
                Qt::UniqueConnection);
    });
    m_match = plain;
    Q_EMIT matchChanged();
    update();
}

/*!
    \qmlproperty string TitlesView::role

    The role path whose values are collected. Empty, the default, collects nothing.
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
    // Reading a property may have called update() again; then the values from there are newer.
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

    Emitted after \l values and with it \l value have changed.
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
    forEachObject(&m_match, [object](QObject *held, QVariant *value) {
        if (held == object) {
            *value = QVariant::fromValue<QObject *>(nullptr);
        }
    });
    Q_EMIT matchChanged();
    update();
}
