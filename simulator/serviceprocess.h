// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SERVICEPROCESS_H
#define SERVICEPROCESS_H

#include <QProcess>
#include <QString>
#include <QStringList>

/*
    A D-Bus service in a process of its own, which a test may stop at any moment. It does what its
    scenario says (see busservice.cpp) for as long as this object exists.
*/
class ServiceProcess
{
public:
    // Ends the test program if there is no such scenario, or if the service cannot own the name.
    ServiceProcess(const char *bus, const QString &service, const char *scenario);
    ~ServiceProcess();
    Q_DISABLE_COPY_MOVE(ServiceProcess)

    // Stops the process. It keeps its name, but does not reply until goOn() is called.
    void stop();
    void goOn();
    void sendSignals(int count);

    // The members that have been called so far.
    QStringList calls();

private:
    void signal(int number);

    QProcess m_process;
    QStringList m_calls;
};

#endif
