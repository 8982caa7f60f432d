// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "memorycardformatter.h"

#include "diskservice.h"
#include "fileremover.h"
#include "files/literals.h"

#include <QDBusError>
#include <QDBusPendingCallWatcher>
#include <QFileInfo>
#include <QLoggingCategory>
#include <QPointer>

#include <algorithm>
#include <array>
#include <memory>
#include <utility>

namespace {

Q_LOGGING_CATEGORY(lcMemoryCardLog, "org.tarnwickos.settings.memorycard", QtWarningMsg)

struct FormatType {
    QLatin1String name;
    QLatin1String mkfs;
    QLatin1String helperCommand;
};
constexpr std::array formatTypes = {
    FormatType{"vfat"_L1, "/sbin/mkfs.vfat"_L1, "format_vfat"_L1},
    FormatType{"ext4"_L1, "/sbin/mkfs.ext4"_L1, "format_ext4"_L1},
};
constexpr QLatin1String probeCommand = "probe"_L1;

} // namespace

/*!
    \qmltype MemoryCardFormatter
    \inqmlmodule com.marlo.settings.system
    \brief Formats, empties, mounts, unmounts and probes a memory card.

    The disk service knows a card by its \l deviceName; \l devicePath is the device node of its
    partition. This shows the type of the file system on a card:

    \qml
    Label {
        text: card.filesystemType

        MemoryCardFormatter {
            id: card

            devicePath: "/dev/mmcblk1p1"
        }
    }
    \endqml

    \image gallery-memory-card.png The gallery's page for this type

    Every operation is a sequence of commands that run one after the other, without blocking.
    \l status shows the progress:

    \table
    \header \li Operation \li Status on success
    \row \li a new \l devicePath \li \c Probing, \c Idle
    \row \li format() \li \c Unmounting, \c Formatting, \c Mounting, \c Idle
    \row \li removeAllFiles() \li \c Mounting, \c RemovingFiles, \c Idle
    \row \li mount() \li \c Mounting, \c Idle
    \row \li unmount() \li \c Unmounting, \c Idle
    \endtable

    The disk service mounts and unmounts: the methods \c Mount and \c Unmount of
    \c org.freedesktop.UDisks2.Filesystem at \c{/org/freedesktop/UDisks2/block_devices/<deviceName>}
    of the service \c org.freedesktop.UDisks2 on the system bus. The program
    \c /usr/libexec/sdcardhelper formats and probes. Its arguments are \c format_vfat,
    \c format_ext4 or \c probe, and the name of the partition, such as \c mmcblk1p1. It exits with
    0 on success, and writes the type of the file system to its standard output for \c probe.
    removeAllFiles() finds the card by its \l devicePath in \c{/etc/mtab}.

    A failed command ends the sequence with the status \c Error, in which every operation is
    accepted. Everything that waits in the queue is dropped, except the probe of a new \l devicePath.
    Formatting, removing files and probing use the \l devicePath and the type of their
    request; mounting and unmounting use the \l deviceName that is set when the step starts.
    The formatter logs messages in the category \c{org.tarnwickos.settings.memorycard}. One warning
    in the category \c{com.marlo.settings.system.memorycard} says why files could not be removed, or
    how the helper failed: its exit code or signal, and the first line of its standard error.

    \section1 When an operation has ended

    The signals of a formatter that is used twice do not always show the end of an operation: a
    second failure does not change the status \c Error, and mount() on a mounted card does not
    change \c Idle. A page therefore creates a formatter for each operation, in a Loader, and starts
    the operation in the handler of devicePathChanged(). The probe of the path then runs after the
    operation. When the status becomes \c Idle or \c Error, the operation has ended, and after
    \c Idle \l filesystemType is up to date. The following page is complete. To empty the card, it
    would call \c{run(card => card.removeAllFiles())}:

    \quotefile memory-card.qml

    \section1 What may surprise
    \section2 Mounting and unmounting change the status afterwards
    \c Formatting, \c RemovingFiles and \c Probing are set when the work begins. \c Unmounting and
    \c Mounting are set after the disk service has reported success. Until then the status is the
    previous one, and for the first step of a sequence \l busy is \c false. Operations that are
    requested meanwhile are queued and run afterwards. A page must remember that it has requested an
    operation.

    \section2 Formatting needs a mounted card
    On a card that is not mounted, format() ends with \c ErrorNotMounted, so only a card that is
    known to work is formatted. Call mount() first; its \c ErrorAlreadyMounted is harmless.

    \section2 Two errors do not end the sequence
    After \c ErrorAlreadyMounted and \c ErrorAlreadyUnmounting the sequence continues: the card is
    already in the requested state, or about to be. The status of that step is not shown.

    \section2 Some errors have no signal
    Errors that are not the disk service's own, such as a missing service, and failures of the
    helper program only lead to the status \c Error. The status before it shows which step failed.

    \section2 Without a device name a sequence waits
    If \l deviceName is empty when a mounting or unmounting step starts, the step only logs a
    critical message. The rest of the sequence stays in the queue and runs before the next
    operation: after format() without a name, unmount() formats the card. In the middle of a
    sequence, the formatter stays busy and refuses every operation; only a new object helps. The
    message says "unmount" for mounting and "mount" for unmounting, because programs that read logs
    expect exactly these lines.

    \section2 Some mount directories are refused, and some count as empty
    The formatter does not empty a mount directory that is a symbolic link, or that is not on the
    card: the card has been unmounted, another file system is mounted over it, or the mount table is
    wrong. The device number of the directory must be that of the device node \l devicePath. Only
    the file systems btrfs, FUSE, overlay and tmpfs have numbers of their own: there, the type of
    the file system must be the one in the mount table, and no other device may come later in the
    table with the same directory or one above it. A device that has the root directory is not
    a card: none of its mount directories is emptied. A mount directory that cannot be opened counts
    as empty, unless the process has too few file descriptors or too little memory. If the card is
    mounted more than once, the operation succeeds if one mount directory can be emptied.

    A directory on the card with another device number stays, and the status becomes \c Error: another
    file system is mounted there, or it is a subvolume of btrfs. So does the card if \l devicePath
    does not begin with a slash.

    \section2 Work outlives its formatter
    Destroying a formatter stops neither the removal of files nor a helper that is formatting,
    because a half-formatted card cannot be used. Before the process exits, it waits for the removal
    to finish.
*/

MemoryCardFormatter::MemoryCardFormatter(QObject *parent) : QObject(parent), m_helper(this)
{
    connect(&m_helper, &HelperProcess::failedToStart, this, &MemoryCardFormatter::commandError);
    connect(&m_helper, &HelperProcess::finished, this, &MemoryCardFormatter::commandFinished);
}

/*!
    \qmlproperty enumeration MemoryCardFormatter::status
    \readonly

    \value MemoryCardFormatter.Idle Nothing runs; the last sequence, if any, succeeded.
    \value MemoryCardFormatter.Unmounting The card has been unmounted.
    \value MemoryCardFormatter.Formatting The card is being formatted.
    \value MemoryCardFormatter.RemovingFiles The files on the card are being removed.
    \value MemoryCardFormatter.Mounting The card has been mounted.
    \value MemoryCardFormatter.Probing The helper identifies the file system on the card.
    \value MemoryCardFormatter.Error Nothing runs; the last sequence failed.
*/

/*!
    \qmlproperty string MemoryCardFormatter::deviceName

    The name of the block device in the disk service's object path, such as \c mmcblk1p1, which the
    disk service mounts and unmounts. In this name, each byte of the kernel name that is not an
    ASCII letter, a digit or an underscore is an underscore and two lower-case hexadecimal digits:
    for \c dm-0, set \c dm_2d0. With \c dm-0 itself, every request to the disk service fails. The
    name can be set at any time, but must not be empty during an operation.
*/
void MemoryCardFormatter::setDeviceName(const QString &name)
{
    if (m_deviceName != name) {
        qCDebug(lcMemoryCardLog) << "New device name" << name;
        m_deviceName = name;
        Q_EMIT deviceNameChanged();
    }
}

/*!
    \qmlproperty string MemoryCardFormatter::devicePath

    The device node of the card's partition, such as \c /dev/mmcblk1p1. A new path, even an empty
    one, is probed immediately, or after a request to the disk service that is under way. While the
    formatter is \l busy, the path cannot be changed: trying to do so gives a warning.
*/
void MemoryCardFormatter::setDevicePath(const QString &path)
{
    if (m_devicePath == path) {
        return;
    }
    if (busy()) {
        warnThatBusy("Cannot change device path");
        return;
    }
    m_devicePath = path;
    const QPointer<MemoryCardFormatter> self(this);
    Q_EMIT devicePathChanged();
    if (self) {
        m_steps.enqueue({Command::Probe, m_devicePath, {}}); // a handler may have changed it
        doNextCommand();
    }
}

/*!
    \qmlproperty string MemoryCardFormatter::filesystemType
    \readonly

    The type of the file system on the card, such as \c vfat: the trimmed standard output of the
    last probe. It is usually empty after a probe that exited with an error. A helper that crashes
    or cannot be started leaves it unchanged: it may then be the type of another card.
*/

/*!
    \qmlproperty list<string> MemoryCardFormatter::supportedFormatTypes
    \readonly

    The types that format() supports, in this order: \c vfat if \c /sbin/mkfs.vfat is executable,
    and \c ext4 if \c /sbin/mkfs.ext4 is executable. They are checked whenever the property is read.
*/
QStringList MemoryCardFormatter::supportedFormatTypes() const
{
    QStringList types;
    for (const FormatType &type : formatTypes) {
        if (QFileInfo(type.mkfs).isExecutable()) {
            types.append(type.name);
        }
    }
    return types;
}

/*!
    \qmlproperty bool MemoryCardFormatter::busy
    \readonly

    Whether \l status is neither \c Idle nor \c Error. While \c true, operations are refused with a
    warning.
*/

/*!
    \qmlmethod void MemoryCardFormatter::format(string type)

    Unmounts the card, creates a \c vfat or \c ext4 file system on it, depending on \a type, and
    mounts it.
    \b {Everything on the card is lost.} For any other type (names are case-sensitive), the helper
    program gets only the name of the partition, and its exit code determines whether the step
    succeeds. An empty type or \l devicePath leads to \c Error with a warning. \b {Set \l deviceName
    first.}
*/
void MemoryCardFormatter::format(const QString &type)
{
    if (!busy() && m_devicePath.isEmpty()) {
        failWithout("devicePath");
    } else if (!busy() && type.isEmpty()) {
        failWithout("type");
    } else {
        startSequence("format() called", {Command::Unmount, Command::Format, Command::Mount}, type);
    }
}

/*!
    \qmlmethod void MemoryCardFormatter::removeAllFiles()

    Mounts the card, unless it is already mounted, and removes all files and directories on it, on a
    thread of the application's global thread pool. If some cannot be removed, the others are
    removed first, and the status then becomes \c Error. It also becomes \c Error if no thread can
    be started, if the process may open fewer than 16 more files, or if the application clears the
    thread pool before the removal starts. An empty \l devicePath leads to \c Error with a warning.
*/
void MemoryCardFormatter::removeAllFiles()
{
    if (!busy() && m_devicePath.isEmpty()) {
        failWithout("devicePath");
    } else {
        startSequence("removeAllFiles() called", {Command::Mount, Command::RemoveFiles});
    }
}

/*!
    \qmlmethod void MemoryCardFormatter::mount()
    \qmlmethod void MemoryCardFormatter::unmount()

    Mounts or unmounts the card.
*/
void MemoryCardFormatter::mount()
{
    startSequence("mount() called", {Command::Mount});
}

void MemoryCardFormatter::unmount()
{
    startSequence("unmount() called", {Command::Unmount});
}

/*!
    \qmlsignal MemoryCardFormatter::statusChanged()
    \qmlsignal MemoryCardFormatter::deviceNameChanged()
    \qmlsignal MemoryCardFormatter::devicePathChanged()
    \qmlsignal MemoryCardFormatter::filesystemTypeChanged()
    \qmlsignal MemoryCardFormatter::busyChanged()

    Emitted after the property has changed. devicePathChanged() is emitted before the probe is
    queued. busyChanged() is also emitted whenever an operation has been accepted, although \l busy
    changes only with the status.
*/

/*!
    \qmlsignal MemoryCardFormatter::mountError(enumeration error)

    Emitted before \l status changes, when the disk service could not mount the card. Each \a error
    is an error of the disk service, \c {org.freedesktop.UDisks2.Error.*}.

    \value MemoryCardFormatter.ErrorFailed The operation failed.
    \value MemoryCardFormatter.ErrorCancelled The operation was cancelled.
    \value MemoryCardFormatter.ErrorAlreadyCancelled The operation had been cancelled before.
    \value MemoryCardFormatter.ErrorNotAuthorized The user is not authorized.
    \value MemoryCardFormatter.ErrorNotAuthorizedCanObtain The user can obtain authorization.
    \value MemoryCardFormatter.ErrorNotAuthorizedDismissed The user dismissed the dialog.
    \value MemoryCardFormatter.ErrorAlreadyMounted The card is mounted; the sequence continues.
    \value MemoryCardFormatter.ErrorNotMounted The card is not mounted.
    \value MemoryCardFormatter.ErrorOptionNotPermitted An option is not permitted.
    \value MemoryCardFormatter.ErrorMountedByOtherUser Another user has mounted the card.
    \value MemoryCardFormatter.ErrorAlreadyUnmounting It is being unmounted; the sequence continues.
    \value MemoryCardFormatter.ErrorNotSupported The operation is not supported.
    \value MemoryCardFormatter.ErrorTimedout The operation took too long.
    \value MemoryCardFormatter.ErrorWouldWakeup The operation would wake up a sleeping disk.
    \value MemoryCardFormatter.ErrorDeviceBusy The card is in use.
*/

/*!
    \qmlsignal MemoryCardFormatter::unmountError(enumeration error)

    Emitted before \l status changes, when the disk service could not unmount the card. The values
    of \a error are those of mountError().
*/

void MemoryCardFormatter::commandFinished(int code, QProcess::ExitStatus status)
{
    const QPointer<MemoryCardFormatter> self(this);
    if (m_running == Command::Probe && status == QProcess::NormalExit) {
        // As a C string: a NUL ends the type.
        const QString type = QString::fromLatin1(m_helper.takeOutput().trimmed().constData());
        if (std::exchange(m_filesystemType, type) != type) {
            Q_EMIT filesystemTypeChanged();
        }
    }
    if (self && status == QProcess::NormalExit && code == 0) {
        finishCommand();
    } else if (self) {
        fail();
    }
}

void MemoryCardFormatter::warnThatBusy(const char *request) const
{
    qCWarning(lcMemoryCardLog) << request << "when not idle. Status is" << m_status;
}

void MemoryCardFormatter::failWithout(const char *value)
{
    qCWarning(lcMemoryCardLog) << value << "is empty.";
    setStatus(Error);
}

void MemoryCardFormatter::setStatus(Status status)
{
    if (m_status == status) {
        return;
    }
    const bool wasBusy = busy();
    m_status = status;
    qCDebug(lcMemoryCardLog) << "New status" << status;
    const QPointer<MemoryCardFormatter> self(this);
    Q_EMIT statusChanged();
    if (self && busy() != wasBusy) {
        Q_EMIT busyChanged();
    }
}

void MemoryCardFormatter::startSequence(const char *request,
                                        std::initializer_list<Command> commands,
                                        const QString &formatType)
{
    if (busy()) {
        warnThatBusy(request);
        return;
    }
    for (const Command command : commands) {
        m_steps.enqueue({command, m_devicePath, formatType});
    }
    const QPointer<MemoryCardFormatter> self(this);
    // busy has not changed yet, but users rely on the signal.
    Q_EMIT busyChanged();
    if (self) {
        doNextCommand();
    }
}

void MemoryCardFormatter::doNextCommand()
{
    if (m_running) {
        return;
    }
    m_startsAfterError = false;
    if (m_steps.isEmpty()) {
        setStatus(Idle);
        return;
    }
    const Step step = m_steps.dequeue();
    switch (step.command) {
    case Command::Unmount:
    case Command::Mount:
        startMountOperation(step.command);
        break;
    case Command::Format:
    case Command::Probe:
        startHelper(step);
        break;
    case Command::RemoveFiles:
        startRemovingFiles(step);
        break;
    default:
        qCWarning(lcMemoryCardLog) << "Unknown command" << Status(step.command);
        break;
    }
}

void MemoryCardFormatter::startHelper(const Step &step)
{
    const bool probes = step.command == Command::Probe;
    QStringList arguments;
    if (probes) {
        arguments.append(probeCommand);
    }
    // Any other type has no command word, on purpose: the helper's exit code decides.
    for (const FormatType &type : formatTypes) {
        if (step.formatType == type.name) {
            arguments.append(type.helperCommand);
        }
    }
    arguments.append(QFileInfo(step.devicePath).fileName());
    m_running = step.command;
    if (m_helper.start(probes ? HelperProcess::Kind::Prober : HelperProcess::Kind::Formatter,
                       arguments)) {
        setStatus(Status(step.command));
    }
}

void MemoryCardFormatter::startMountOperation(Command command)
{
    const bool mounts = command == Command::Mount;
    if (m_deviceName.isEmpty()) {
        // The verbs are swapped on purpose: programs that read logs expect exactly these lines.
        // The status and the rest of the queue do not change, which is intended, too.
        qCCritical(lcMemoryCardLog)
            << "Cannot" << (mounts ? "unmount" : "mount") << "without device name";
        return;
    }
    m_running = command;
    const QLatin1String method = mounts ? DiskService::mountMethod : DiskService::unmountMethod;
    auto *reply = new QDBusPendingCallWatcher(DiskService::call(method, m_deviceName), this);
    connect(reply, &QDBusPendingCallWatcher::finished, this,
            &MemoryCardFormatter::mountOperationFinished);
}

void MemoryCardFormatter::mountOperationFinished(QDBusPendingCallWatcher *reply)
{
    reply->deleteLater();
    const QPointer<MemoryCardFormatter> self(this);
    const bool mounts = m_running == Command::Mount;
    if (!reply->isError()) {
        setStatus(mounts ? Mounting : Unmounting);
        if (self) {
            finishCommand();
        }
        return;
    }
    const QString method = mounts ? DiskService::mountMethod : DiskService::unmountMethod;
    const QString name = reply->error().name();
    qCWarning(lcMemoryCardLog) << method << "error:" << name.toLatin1().constData();
    const auto code = DiskService::errorCode(name);
    // The card is already in the requested state, or about to be.
    const bool isForgiven =
        code && (*code == ErrorAlreadyMounted || *code == ErrorAlreadyUnmounting);
    if (!isForgiven) {
        // Before any signal is emitted: requests made from handlers start a new sequence.
        dropSequence();
    }
    if (code && mounts) {
        Q_EMIT mountError(*code);
    } else if (code) {
        Q_EMIT unmountError(*code);
    }
    if (self && isForgiven) {
        finishCommand();
    } else if (self) {
        endInError();
    }
}

void MemoryCardFormatter::startRemovingFiles(const Step &step)
{
    m_running = step.command;
    auto remover = std::make_unique<FileRemover>(step.devicePath);
    // Queued: QThreadPool::clear() deletes removers on this thread, which then emit error().
    connect(remover.get(), &FileRemover::completed, this, &MemoryCardFormatter::fileRemoverFinished,
            Qt::QueuedConnection);
    connect(remover.get(), &FileRemover::error, this, &MemoryCardFormatter::fileRemoverError,
            Qt::QueuedConnection);
    if (FileRemover::start(std::move(remover))) {
        setStatus(RemovingFiles);
    }
}

void MemoryCardFormatter::finishCommand()
{
    m_running.reset();
    doNextCommand();
}

void MemoryCardFormatter::fail()
{
    dropSequence();
    endInError();
}

void MemoryCardFormatter::dropSequence()
{
    const auto isNoProbe = [](const Step &step) { return step.command != Command::Probe; };
    m_steps.erase(std::remove_if(m_steps.begin(), m_steps.end(), isNoProbe), m_steps.end());
}

void MemoryCardFormatter::endInError()
{
    m_running.reset();
    m_startsAfterError = !m_steps.isEmpty();
    const QPointer<MemoryCardFormatter> self(this);
    setStatus(Error);
    if (self && m_startsAfterError) {
        doNextCommand();
    }
}
