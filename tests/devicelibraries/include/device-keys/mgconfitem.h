// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DEVICE_MGCONFITEM_H
#define DEVICE_MGCONFITEM_H

#include <QByteArray>
#include <QList>
#include <QObject>
#include <QString>
#include <QVariant>

// A device's MGConfItem, in the style of code that is built with Qt's defaults: keywords, implicit
// conversions and deprecated functions. The class is larger than the stand-in.
class MGConfItem : public QObject
{
    Q_OBJECT

public:
    explicit MGConfItem(const QString &key, QObject *parent = nullptr);
    ~MGConfItem();

    QString key() const { return m_key; }
    QVariant value() const;
    QVariant value(const QVariant &defaultValue) const;
    void set(const QVariant &value);
    void unset();

    QString group() const
    {
        QString path = "";
        foreach(const QString &part, m_key.split("/", QString::SkipEmptyParts))
        {
            path += "/" + part;
        }
        return path;
    }
    QByteArray name() const
    {
        QByteArray name = "key ";
        name += m_key;
        return name;
    }

public slots:
    void refresh() { emit valueChanged(); }

signals:
    void valueChanged();

private:
    QString m_key;
    char m_cache[4096];
};

#endif
