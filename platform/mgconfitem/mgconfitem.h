// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MGCONFITEM_H
#define MGCONFITEM_H

#include <QByteArray>
#include <QObject>
#include <QString>
#include <QVariant>

/*
    Reads, writes and follows one key of the user's settings in dconf. For the main thread only.

    Before set() returns, every item of the process on that key has the new value and emits
    valueChanged(). The value is stored in the background, even if the item is deleted. If it cannot
    be stored, the key gets its old value back, with another valueChanged().
*/
class MGConfItem : public QObject
{
    Q_OBJECT

public:
    // Takes an absolute path such as "/settings/location/enabled". For any other key, the item logs
    // a warning, has no value and stores nothing.
    explicit MGConfItem(const QString &key, QObject *parent = nullptr);
    ~MGConfItem() override;

    QString key() const { return m_key; }

    // Invalid if the key is not set.
    QVariant value() const;
    QVariant value(const QVariant &defaultValue) const;

    // Stores booleans, integers, strings, string lists and maps of these, and refuses other types
    // with a warning. An invalid value unsets the key.
    void set(const QVariant &value);
    void unset();

Q_SIGNALS:
    // Not emitted for an equal value. A slot may set the key again or delete the item.
    void valueChanged();

private:
    // A change names a key, or a whole directory if it ends with a slash.
    bool isOneOf(const char *prefix, const char *const *changes) const;
    void update();

    const QString m_key;
    QByteArray m_path; // of the key in dconf; empty if the key is not valid
    QByteArray m_lastValue;
    unsigned long m_handler = 0;
};

#endif
