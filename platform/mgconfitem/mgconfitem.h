// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MGCONFITEM_H
#define MGCONFITEM_H

#include "gvariantconversion.h"

#include <QByteArray>
#include <QObject>
#include <QString>
#include <QVariant>

/*
    One key of the user's settings in dconf: reads it, writes it and follows its changes, whoever
    makes them. For the main thread only.

    A value that is set is seen by every item of the process on that key, and valueChanged() is
    emitted, before set() returns; it is stored in the background, whether or not the item lives on.
    If it could not be stored the key falls back to its old value, with another valueChanged().
*/
class MGConfItem : public QObject
{
    Q_OBJECT

public:
    // The key is an absolute path, as "/settings/location/enabled". An item on anything else warns
    // once, has no value and stores nothing.
    explicit MGConfItem(const QString &key, QObject *parent = nullptr);
    ~MGConfItem() override;

    QString key() const;

    // Invalid if the key is not set.
    QVariant value() const;
    QVariant value(const QVariant &defaultValue) const;

    // Stores booleans, integers, strings, string lists and maps of these. Any other value is refused
    // with a warning and the key stays as it is; an invalid one unsets the key.
    void set(const QVariant &value);
    void unset();

Q_SIGNALS:
    // The key holds another value than before; storing an equal one does not emit it. A slot may
    // set the key again or delete the item.
    void valueChanged();

private:
    bool isAmong(const char *prefix, const char *const *changes) const;
    void update();
    void write(GVariant *value);

    const QString m_key;
    QByteArray m_path; // of the key in dconf; empty if the key is not valid
    GVariantPtr m_lastValue;
    unsigned long m_handler = 0;
};

#endif
