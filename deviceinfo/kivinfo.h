// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef KIVINFO_H
#define KIVINFO_H

#include <QObject>

class QDBusMessage;
class QDBusPendingCallWatcher;

// The smart back cover that is attached to the device, as the cover daemon reports it.
class KivInfo : public QObject
{
    Q_OBJECT
    Q_PROPERTY(QString kivId READ kivId NOTIFY kivIdChanged)
    Q_PROPERTY(bool kivReady READ kivReady NOTIFY kivReadyChanged)

public:
    explicit KivInfo(QObject *parent = nullptr);

    QString kivId() const { return m_kivId; }
    bool kivReady() const { return m_kivReady; }

Q_SIGNALS:
    void kivIdChanged();
    void kivReadyChanged();

private Q_SLOTS:
    void slotIdFinished(QDBusPendingCallWatcher *watcher);
    void slotReadyFinished(QDBusPendingCallWatcher *watcher);
    void propertiesChanged(const QDBusMessage &message);

private:
    QDBusPendingCallWatcher *get(const QString &property);
    void setKivId(const QString &kivId);
    void setKivReady(bool kivReady);

    QString m_kivId;
    bool m_kivReady = false;
    bool m_latestReady = false; // kivReady as the daemon sent it last
};

#endif
