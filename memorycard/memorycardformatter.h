// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MEMORYCARDFORMATTER_H
#define MEMORYCARDFORMATTER_H

#include "helperprocess.h"

#include <QObject>
#include <QProcess>
#include <QQueue>
#include <QString>
#include <QStringList>

#include <initializer_list>
#include <optional>

class QDBusPendingCallWatcher;

/*
    Formats a memory card, removes all files from it, mounts and unmounts it, and identifies its
    file system.

    Requests are queued as commands, which run one at a time: in the helper program, in the disk
    service or in a FileRemover. The formatter never blocks while one of them runs.
*/
class MemoryCardFormatter : public QObject
{
    Q_OBJECT
    Q_PROPERTY(Status status READ status NOTIFY statusChanged)
    Q_PROPERTY(QString deviceName READ deviceName WRITE setDeviceName NOTIFY deviceNameChanged)
    Q_PROPERTY(QString devicePath READ devicePath WRITE setDevicePath NOTIFY devicePathChanged)
    Q_PROPERTY(QString filesystemType READ filesystemType NOTIFY filesystemTypeChanged)
    Q_PROPERTY(QStringList supportedFormatTypes READ supportedFormatTypes CONSTANT)
    Q_PROPERTY(bool busy READ busy NOTIFY busyChanged)

public:
    enum Status {
        Idle,
        Unmounting,
        Formatting,
        RemovingFiles,
        Mounting,
        Probing,
        Error,
    };
    Q_ENUM(Status)

    // The names of the disk service's errors, with the prefix "Error".
    enum MountError {
        ErrorFailed,
        ErrorCancelled,
        ErrorAlreadyCancelled,
        ErrorNotAuthorized,
        ErrorNotAuthorizedCanObtain,
        ErrorNotAuthorizedDismissed,
        ErrorAlreadyMounted,
        ErrorNotMounted,
        ErrorOptionNotPermitted,
        ErrorMountedByOtherUser,
        ErrorAlreadyUnmounting,
        ErrorNotSupported,
        ErrorTimedout,
        ErrorWouldWakeup,
        ErrorDeviceBusy,
    };
    Q_ENUM(MountError)

    explicit MemoryCardFormatter(QObject *parent = nullptr);

    Status status() const { return m_status; }
    QString deviceName() const { return m_deviceName; }
    void setDeviceName(const QString &name);
    QString devicePath() const { return m_devicePath; }
    void setDevicePath(const QString &path);
    QString filesystemType() const { return m_filesystemType; }
    QStringList supportedFormatTypes() const;
    bool busy() const { return m_status != Idle && m_status != Error; }

    Q_INVOKABLE void format(const QString &type);
    Q_INVOKABLE void removeAllFiles();
    Q_INVOKABLE void mount();
    Q_INVOKABLE void unmount();

Q_SIGNALS:
    void statusChanged();
    void deviceNameChanged();
    void devicePathChanged();
    void filesystemTypeChanged();
    void busyChanged();
    // Users connect to exactly these signatures.
    void mountError(MountError error); // clazy:exclude=fully-qualified-moc-types
    void unmountError(MountError error); // clazy:exclude=fully-qualified-moc-types

private Q_SLOTS:
    void commandError(QProcess::ProcessError /*error*/) { fail(); }
    void commandFinished(int code, QProcess::ExitStatus status);
    void fileRemoverFinished() { finishCommand(); }
    void fileRemoverError() { fail(); }

private:
    // Each has the number of the status that it leads to.
    enum class Command {
        Unmount = Unmounting,
        Format = Formatting,
        RemoveFiles = RemovingFiles,
        Mount = Mounting,
        Probe = Probing,
    };

    // The path and the type of the request: devicePath may change before the step starts, and the
    // formatter must never format or empty a card other than the requested one.
    struct Step {
        Command command;
        QString devicePath;
        QString formatType;
    };

    void warnThatBusy(const char *request) const;
    void failWithout(const char *value);
    void setStatus(Status status);
    void startSequence(const char *request, std::initializer_list<Command> commands,
                       const QString &formatType = QString());
    // Does nothing while a command runs.
    void doNextCommand();
    void startHelper(const Step &step);
    void startMountOperation(Command command);
    void mountOperationFinished(QDBusPendingCallWatcher *reply);
    void startRemovingFiles(const Step &step);
    void finishCommand();
    void fail();
    // Drops every step that waits, except probes: each new path is probed.
    void dropSequence();
    void endInError();

    HelperProcess m_helper;
    QQueue<Step> m_steps;
    Status m_status = Idle;
    // The command that is under way. The status of a mount command changes only afterwards.
    std::optional<Command> m_running;
    // Whether the queue continues when the handlers of Error have returned. Requests that they make
    // start by themselves, and one that was refused must not leave its queue to be run.
    bool m_startsAfterError = false;
    QString m_deviceName;
    QString m_devicePath;
    QString m_filesystemType;
};

#endif
