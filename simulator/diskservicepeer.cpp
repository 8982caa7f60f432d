// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "diskservicepeer.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>

DiskServicePeer::DiskServicePeer(const QStringList &scenarios)
{
    m_process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
    m_process.start(QStringLiteral(DISK_SERVICE_PEER), scenarios);
    while (!m_process.canReadLine()) {
        if (!m_process.waitForReadyRead()) {
            qFatal("no disk service: %s", qPrintable(scenarios.join(QLatin1Char(' '))));
        }
    }
    m_process.readLine();
}

DiskServicePeer::~DiskServicePeer()
{
    m_process.closeWriteChannel();
    m_process.waitForFinished();
}

QList<DiskServicePeer::Call> DiskServicePeer::calls()
{
    while (m_process.canReadLine()) {
        const QJsonObject line = QJsonDocument::fromJson(m_process.readLine()).object();
        const auto text = [&line](const char *key) {
            return line.value(QLatin1String(key)).toString();
        };
        m_calls.append({text("path"), text("interface"), text("member"), text("signature"),
                        line.value(QLatin1String("arguments")).toArray().toVariantList()});
    }
    return m_calls;
}

QStringList DiskServicePeer::members()
{
    QStringList members;
    const auto all = calls();
    for (const Call &call : all) {
        members.append(call.member);
    }
    return members;
}

void DiskServicePeer::replyToKept()
{
    m_process.write("\n");
}
