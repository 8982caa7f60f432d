// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef HELPERPROCESS_H
#define HELPERPROCESS_H

#include "files/filedescriptor.h"

#include <QObject>
#include <QProcess>
#include <QStringList>

/*
    Runs the helper program, /usr/libexec/sdcardhelper, one command at a time. Each start() ends with
    one of the two signals, which is emitted later. A warning in the category of faultlog.h says why
    a helper failed.
*/
class HelperProcess : public QObject
{
    Q_OBJECT

public:
    enum class Kind {
        Prober, // ends with this object
        Formatter, // has no output, and continues after the end of this object and of the process
    };

    // The QProcess is a child of the owner.
    explicit HelperProcess(QObject *owner) : m_owner(owner) { }
    ~HelperProcess() override;

    // Returns whether the helper is starting.
    [[nodiscard]] bool start(Kind kind, const QStringList &arguments);

    // The standard output of a prober that has finished, once.
    [[nodiscard]] QByteArray takeOutput() { return m_process->readAllStandardOutput(); }

Q_SIGNALS:
    void finished(int code, QProcess::ExitStatus status);
    void failedToStart(QProcess::ProcessError error);

private:
    void makeProcess();
    void abandonProcess();
    QString redirectErrors();
    void reportFailedStartLater(const char *reason);
    void reportFailedStart(const QString &reason);
    void reportEnd(int code, QProcess::ExitStatus status);
    QString firstLineOfErrors() const;

    QObject *const m_owner;
    QProcess *m_process = nullptr;
    FileDescriptor m_errors; // a file in memory with the standard error
    Kind m_kind = Kind::Prober;
    bool m_isAwaited = false;
};

#endif
