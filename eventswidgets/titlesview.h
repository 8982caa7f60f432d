// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef TITLESVIEW_H
#define TITLESVIEW_H

#include <QAbstractListModel>
#include <QObject>
#include <QPointer>
#include <QStringList>
#include <QVariant>

#include <array>

// Reads one role of another list model, from all rows or from those that match. Provides the texts
// as a list and as a sentence in the user's language.
class TitlesView : public QObject
{
    Q_OBJECT
    Q_PROPERTY(QObject *model READ model WRITE setModel NOTIFY modelChanged)
    Q_PROPERTY(QString matchRole READ matchRole WRITE setMatchRole NOTIFY matchRoleChanged)
    Q_PROPERTY(QVariant match READ match WRITE setMatch NOTIFY matchChanged)
    Q_PROPERTY(QString role READ role WRITE setRole NOTIFY roleChanged)
    Q_PROPERTY(QString value READ value NOTIFY valueChanged)
    Q_PROPERTY(QStringList values READ values NOTIFY valueChanged)

public:
    using QObject::QObject;

    QObject *model() const { return m_model; }
    void setModel(QObject *model);
    QString matchRole() const { return m_matchRole; }
    void setMatchRole(const QString &matchRole);
    QVariant match() const { return m_match; }
    void setMatch(const QVariant &match);
    QString role() const { return m_role; }
    void setRole(const QString &role);
    QString value() const { return joined(m_values); }
    QStringList values() const { return m_values; }

    Q_INVOKABLE QString joined(const QStringList &list) const;

public Q_SLOTS:
    void update();

Q_SIGNALS:
    void modelChanged();
    void matchRoleChanged();
    void matchChanged();
    void roleChanged();
    void valueChanged();

private:
    QStringList collect() const;
    bool matches(const QVariant &value) const;
    void modelDestroyed();
    void matchDestroyed(QObject *object);
    QVariant watched(const QVariant &value, const QObject *destroyed);

    QPointer<QAbstractListModel> m_model;
    std::array<QMetaObject::Connection, 5> m_connections;
    QString m_matchRole;
    QVariant m_match;
    QString m_role;
    QStringList m_values;
    uint m_updates = 0; // begun so far
};

#endif
