// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "serviceprocess.h"

#include <csignal>

#include <sys/types.h>

ServiceProcess::ServiceProcess(const char *bus, const QString &service, const char *scenario)
{
    m_process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
    m_process.start(QStringLiteral(BUS_SERVICE_PEER),
                    {QLatin1String(bus), service, QLatin1String(scenario)});
    while (!m_process.canReadLine()) {
        if (!m_process.waitForReadyRead()) {
            qFatal("no service %s that does %s", qPrintable(service), scenario);
        }
    }
    m_process.readLine();
}

ServiceProcess::~ServiceProcess()
{
    goOn();
    m_process.closeWriteChannel();
    m_process.waitForFinished();
}

void ServiceProcess::stop()
{
    signal(SIGSTOP);
}

void ServiceProcess::goOn()
{
    signal(SIGCONT);
}

void ServiceProcess::sendSignals(int count)
{
    m_process.write(QByteArray::number(count) + '\n');
}

QStringList ServiceProcess::calls()
{
    while (m_process.canReadLine()) {
        m_calls.append(QString::fromUtf8(m_process.readLine().trimmed()));
    }
    return m_calls;
}

void ServiceProcess::signal(int number)
{
    // Never to process 0: that would signal the whole process group.
    if (m_process.processId() > 0) {
        kill(static_cast<pid_t>(m_process.processId()), number);
    }
}
