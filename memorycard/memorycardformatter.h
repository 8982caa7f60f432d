// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MEMORYCARDFORMATTER_H
#define MEMORYCARDFORMATTER_H

#include <QObject>
#include <QProcess>
#include <QQueue>
#include <QString>
#include <QStringList>

#include <initializer_list>

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
    // The states of the formatter. Those between Idle and Error are also the commands of its queue.
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

    using QObject::QObject;
    ~MemoryCardFormatter() override;

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
    void commandError(QProcess::ProcessError error);
    void commandFinished(int code, QProcess::ExitStatus status);
    void fileRemoverFinished();
    void fileRemoverError();

private:
    // The path and the type of the request: devicePath may change before the command starts, and
    // the formatter must never format or empty a card other than the requested one.
    struct Command {
        Status command;
        QString devicePath;
        QString formatType;
    };

    // Both warn. A missing value also leads to the status Error.
    bool isRefused(const char *request) const;
    bool requireValue(const char *name, const QString &value);
    void setStatus(Status status);
    void enqueue(std::initializer_list<Status> commands, const QString &formatType = QString());
    void startSequence(std::initializer_list<Status> commands,
                       const QString &formatType = QString());
    void startIfNothingRuns();
    void doNextCommand();
    void startFormatting(const Command &command);
    void startProbing(const Command &command);
    void runHelper(Status command, const QStringList &arguments);
    void startMountOperation(Status command);
    void mountOperationFinished(const QString &method, QDBusPendingCallWatcher *reply);
    void startRemovingFiles(const Command &command);
    void finishCommand();
    void fail();
    void endInError();

    QProcess *m_process = nullptr;
    QQueue<Command> m_commands;
    Status m_status = Idle;
    // The command that is under way, or Idle. The status of a mount command changes only
    // afterwards.
    Status m_running = Idle;
    QString m_deviceName;
    QString m_devicePath;
    QString m_filesystemType;
};

#endif
