// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef DISKSERVICEPEER_H
#define DISKSERVICEPEER_H

#include <QProcess>
#include <QString>
#include <QStringList>
#include <QVariantMap>

/*
    A disk service in a process of its own, which owns the real name on the private system bus. It
    does what its scenarios say (see diskservice.cpp) for as long as this object exists.
*/
class DiskServicePeer
{
public:
    struct Call {
        QString path;
        QString interface;
        QString member;
        QString signature;
        QVariantList arguments;
    };

    // Ends the test program if there is no such scenario.
    explicit DiskServicePeer(const QStringList &scenarios);
    ~DiskServicePeer();
    Q_DISABLE_COPY_MOVE(DiskServicePeer)

    // The calls that it has received so far.
    QList<Call> calls();
    // The methods of calls().
    QStringList members();
    // Replies to the calls that the service kept while it hung.
    void replyToKept();

private:
    QProcess m_process;
    QList<Call> m_calls;
};

#endif
