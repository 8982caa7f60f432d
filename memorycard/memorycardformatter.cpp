// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "memorycardformatter.h"

#include "diskservice.h"
#include "filedescriptor.h"
#include "fileremover.h"

#include <QDBusError>
#include <QDBusPendingCall>
#include <QDBusPendingCallWatcher>
#include <QFileInfo>
#include <QLoggingCategory>
#include <QThreadPool>

#include <algorithm>
#include <array>

#include <sys/eventfd.h>

namespace {

Q_LOGGING_CATEGORY(lcMemoryCardLog, "org.tarnwickos.settings.memorycard", QtWarningMsg)

const QLatin1String helperProgram("/usr/libexec/sdcardhelper");
const QLatin1String helperFormatVfat("format_vfat");
const QLatin1String helperFormatExt4("format_ext4");
const QLatin1String helperProbe("probe");

const QLatin1String vfat("vfat");
const QLatin1String ext4("ext4");
const QLatin1String mkfsVfat("/sbin/mkfs.vfat");
const QLatin1String mkfsExt4("/sbin/mkfs.ext4");

// Whether the process may open enough files to start a helper or a thread. With too few left, a thread
// that lacks one for its event loop ends the process, and Qt 5.15 may take a helper for running that
// never started. That one has the process id -1, and killing it would kill all processes of the user.
bool hasDescriptorsLeft()
{
    std::array<FileDescriptor, 16> spare; // a helper takes up to 8
    for (FileDescriptor &descriptor : spare) {
        descriptor = FileDescriptor(eventfd(0, EFD_CLOEXEC));
    }
    return spare.back().isOpen();
}

} // namespace

/*!
    \qmltype MemoryCardFormatter
    \inqmlmodule com.marlo.settings.system
    \brief Formats, empties, mounts, unmounts and probes a memory card.

    A card has two names: the disk service knows it by \l deviceName, and \l devicePath is the device node
    of its partition. Every operation is a sequence of commands that run one after the other, without
    blocking. \l status shows which one:

    \table
    \header \li Operation \li Status on success
    \row \li a new \l devicePath \li \c Probing, \c Idle
    \row \li format() \li \c Unmounting, \c Formatting, \c Mounting, \c Idle
    \row \li removeAllFiles() \li \c Mounting, \c RemovingFiles, \c Idle
    \row \li mount() \li \c Mounting, \c Idle
    \row \li unmount() \li \c Unmounting, \c Idle
    \endtable

    Mounting and unmounting are done by the disk service: the methods \c Mount and \c Unmount of
    \c org.freedesktop.UDisks2.Filesystem at \c{/org/freedesktop/UDisks2/block_devices/<deviceName>}
    of the service \c org.freedesktop.UDisks2 on the system bus. Removing files finds the card by its
    \l devicePath in \c{/etc/mtab}.

    Formatting and probing are done by the program \c /usr/libexec/sdcardhelper. It is run with
    \c format_vfat, \c format_ext4 or \c probe and the name of the partition, such as \c mmcblk1p1,
    has to exit with 0 on success, and writes the type of the file system that it has found to its
    standard output.

    A failed command ends the sequence and leads to the status \c Error, from which every operation
    is accepted again. Formatting, removing files and probing use the \l devicePath, and the type, of
    their request, even if the properties change before they start: two formats that are requested one
    after the other each make their own type. Mounting and unmounting use the \l deviceName that is set
    when the step starts.

    A label that shows the file system of a card:

    \qml
    Label {
        text: card.filesystemType

        MemoryCardFormatter {
            id: card

            devicePath: "/dev/mmcblk1p1"
        }
    }
    \endqml

    \section1 When an operation has ended

    The signals of a formatter that already had an operation do not always show that the next one has
    ended. The status \c Error does not change when another operation fails, and the status \c Idle
    does not change when mount() finds the card mounted. A page therefore creates a formatter for each
    operation, in a Loader, and starts the operation in the handler of devicePathChanged(), before the
    probe of the new path is queued. The probe then follows the operation. The status leaves \c Idle
    and always arrives at \c Idle or \c Error. There the operation has ended, and after \c Idle
    \l filesystemType is that of the card as it is now.

    \list
    \li Until the disk service answers the first request, the status is still \c Idle and \l busy is
        \c false. The page knows that it has started an operation: it shows that it waits for the disk
        service and disables its buttons.
    \li \c ErrorAlreadyMounted and \c ErrorAlreadyUnmounting do not stop an operation. The card is
        already in the requested state, or about to be: the page shows a note, and the status goes on.
    \li Any other error of mountError() and unmountError() is followed by \c Error. Failures that have
        no code, such as those of the helper program, change only the status. The step before it shows
        what failed.
    \endlist

    A complete page:

    \quotefile memory-card.qml

    Warnings are logged in the category \c org.tarnwickos.settings.memorycard, whose debug messages
    are off by default.

    \image gallery-memory-card.png The gallery's page of this type

    \section1 What may surprise
    \section2 The status of the disk service comes afterwards
    \c Formatting, \c RemovingFiles and \c Probing are set when the work begins. \c Unmounting and
    \c Mounting are set when the disk service has reported success. Until then the status is still
    the previous one, and for the first step of a sequence \l busy is \c false. A page that shows
    progress remembers its request.

    \section2 busyChanged() is emitted once more
    It is emitted when an operation has been accepted, although \l busy changes only with the
    status. Pages may use it to learn that an operation was not refused.

    \section2 Early requests are queued
    Operations are refused while \l busy is \c true. While the first request to the disk service is
    under way, \l busy is still \c false: operations are accepted then, and run afterwards. If the
    request fails, they are dropped, except the probe of a new \l devicePath. Two formats that are
    requested in this way each make their own type.

    \section2 Formatting needs a mounted card
    format() unmounts the card first. A card that is not mounted leads to \c Error with \c
    ErrorNotMounted: only a card that was known to work is formatted. Call mount() first; its \c
    ErrorAlreadyMounted is harmless.

    \section2 Two errors are forgiven
    \c ErrorAlreadyMounted and \c ErrorAlreadyUnmounting are signalled, and the sequence continues:
    the card is already in the requested state, or about to be. The status of that step is not
    shown.

    \section2 Some errors have no signal
    mountError() and unmountError() carry the disk service's own errors. Others, such as a service
    that does not exist, only lead to the status \c Error. The signal comes before the status.

    \section2 Any type can be requested
    A type other than \c vfat and \c ext4 (case-sensitive) runs the helper program without a command
    word, and its exit code decides. A device's helper may support more than this module.

    \section2 A failed probe still changes the type
    The output of the helper replaces \l filesystemType even if the helper fails, usually with an
    empty text: a card that cannot be read has no known type. A helper that crashes or cannot be
    started leaves the type as it was, perhaps that of another card, so check \l status first. A new
    \l devicePath is probed immediately, an empty one too.

    \section2 Without a device name a sequence waits
    Mounting and unmounting use the \l deviceName that is set when the step starts. If it is empty
    then, the step only logs a critical message. The status stays, and so does the rest of the
    sequence, which runs before the next operation: an unmount() after a format() without a name
    formats the card. If the name is empty in the middle of a sequence, the formatter stays busy and
    refuses every operation; only a new object helps. The message says "unmount" for mounting and
    "mount" for unmounting, because programs that read logs expect exactly these lines.

    \section2 A directory that cannot be opened counts as empty
    removeAllFiles() removes all that it can, continues after a failure, and then ends in \c Error.
    The directory on which the card is mounted counts as empty if it cannot be opened: the operation
    ends well, and nothing has been removed. If a card is mounted more than once, it is enough that
    one of its mount directories can be emptied.

    \section2 Some mount directories are refused
    A mount directory that is a symbolic link, the root directory or a directory on another device
    than the card's is not emptied. The card has been unmounted meanwhile, or the mount table is
    wrong.

    \section2 Work outlives its formatter
    Destroying a formatter does not stop the removal of files, nor a helper that formats: a card
    that is half formatted cannot be used. The process waits for the removal when it ends, as it
    does for all work in the global thread pool.
*/

MemoryCardFormatter::MemoryCardFormatter(QObject *parent) : QObject(parent)
{
}

MemoryCardFormatter::~MemoryCardFormatter()
{
    if (m_process == nullptr || m_process->state() == QProcess::NotRunning) {
        return;
    }
    // A child process would be killed here and waited for. A card that is half formatted cannot be
    // used, and the user has agreed to the formatting: the helper may finish. Its process object is
    // deleted afterwards. If the application ends earlier, the helper still goes on.
    m_process->setParent(nullptr);
    connect(m_process, &QProcess::stateChanged, m_process, [process = m_process](auto state) {
        if (state == QProcess::NotRunning) {
            process->deleteLater();
        }
    });
    if (m_running != Formatting) {
        m_process->kill();
    }
}

/*!
    \qmlproperty enumeration MemoryCardFormatter::status
    \readonly

    The state of the formatter:

    \value MemoryCardFormatter.Idle Nothing; the last sequence ended well, if there was one.
    \value MemoryCardFormatter.Unmounting The card has been unmounted.
    \value MemoryCardFormatter.Formatting The card is being formatted.
    \value MemoryCardFormatter.RemovingFiles The files on the card are being removed.
    \value MemoryCardFormatter.Mounting The card has been mounted.
    \value MemoryCardFormatter.Probing The helper finds out which file system is on the card.
    \value MemoryCardFormatter.Error Nothing; the last sequence failed.

    While the disk service is asked to mount or unmount, the status is still the one before.
*/
MemoryCardFormatter::Status MemoryCardFormatter::status() const
{
    return m_status;
}

/*!
    \qmlproperty string MemoryCardFormatter::deviceName

    The kernel name of the block device, such as \c mmcblk1p1, which the disk service mounts and
    unmounts. It may be set at any time, even while the formatter is \l busy, and is used by every
    step that starts afterwards.

    If the name is empty when a step of mounting or unmounting starts, the formatter only logs a
    critical message. The status stays, and so does the rest of the queue; the next operation that is
    accepted runs it first. In the middle of a sequence the formatter then stays \l busy and refuses
    every operation: only a new MemoryCardFormatter helps.
*/
QString MemoryCardFormatter::deviceName() const
{
    return m_deviceName;
}

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

    The device node of the card's partition, such as \c /dev/mmcblk1p1. A new path is probed at
    once, or when a request to the disk service that is under way has ended, well or not. While the
    formatter is \l busy the path cannot be changed; that gives a warning.
*/
QString MemoryCardFormatter::devicePath() const
{
    return m_devicePath;
}

void MemoryCardFormatter::setDevicePath(const QString &path)
{
    if (m_devicePath == path) {
        return;
    }
    if (busy()) {
        qCWarning(lcMemoryCardLog)
            << "Cannot change device path when not idle. Status is" << m_status;
        return;
    }
    m_devicePath = path;
    Q_EMIT devicePathChanged();
    enqueue({Probing});
    startIfNothingRuns();
}

/*!
    \qmlproperty string MemoryCardFormatter::filesystemType
    \readonly

    The type of the file system on the card, such as \c vfat. It is the standard output of the helper
    program's last probe, without white space around it. It is usually empty after a helper that exits
    with an error; a helper that crashes or cannot be started does not change it.
*/
QString MemoryCardFormatter::filesystemType() const
{
    return m_filesystemType;
}

/*!
    \qmlproperty list<string> MemoryCardFormatter::supportedFormatTypes
    \readonly

    The types that format() can make: \c vfat if \c /sbin/mkfs.vfat can be run, \c ext4 if
    \c /sbin/mkfs.ext4 can, in this order. Looked up on every read.
*/
QStringList MemoryCardFormatter::supportedFormatTypes() const
{
    QStringList types;
    if (QFileInfo(mkfsVfat).isExecutable()) {
        types.append(vfat);
    }
    if (QFileInfo(mkfsExt4).isExecutable()) {
        types.append(ext4);
    }
    return types;
}

/*!
    \qmlproperty bool MemoryCardFormatter::busy
    \readonly

    Whether \l status is neither \c Idle nor \c Error. The operations are refused then, with a
    warning. It is false while the disk service carries out the first step of a sequence: operations
    that are requested meanwhile are queued. If the running one fails, they are dropped; only the probe
    of a new \l devicePath still runs.
*/
bool MemoryCardFormatter::busy() const
{
    return m_status != Idle && m_status != Error;
}

/*!
    \qmlmethod void MemoryCardFormatter::format(string type)

    Unmounts the card, makes a file system of the \a type \c vfat or \c ext4 on it, and mounts it.
    \b {Everything on the card is lost.} The helper program is run for any other type too, without a
    command word, and decides. An empty type or \l devicePath leads to \c Error with a warning, and
    so does a card that is not mounted, with unmountError().

    \b {Set \l deviceName before.} Without it the formatter only logs a critical message. The
    formatting stays in the queue and runs before the next operation, even if that is only unmount()
    or a new \l devicePath. The \l deviceName must not be empty before the card is mounted again,
    either: the formatter would stay \l busy for ever.
*/
void MemoryCardFormatter::format(const QString &type)
{
    if (busy()) {
        qCWarning(lcMemoryCardLog) << "format() called when not idle. Status is" << m_status;
        return;
    }
    if (m_devicePath.isEmpty()) {
        qCWarning(lcMemoryCardLog) << "devicePath is empty.";
        setStatus(Error);
        return;
    }
    if (type.isEmpty()) {
        qCWarning(lcMemoryCardLog) << "type is empty.";
        setStatus(Error);
        return;
    }
    enqueue({Unmounting, Formatting, Mounting}, type);
    // As in the other operations: busy has not changed yet, but users rely on the signal.
    Q_EMIT busyChanged();
    startIfNothingRuns();
}

/*!
    \qmlmethod void MemoryCardFormatter::removeAllFiles()

    Mounts the card, unless it is mounted, and removes all files and directories on it. What cannot
    be removed stays and leads to \c Error once all else is gone. An empty \l devicePath leads to
    \c Error with a warning. Without a \l deviceName the removal stays in the queue, as a
    formatting does: see format().

    A mount directory that is a symbolic link, that is the root directory, or that lies on another
    device than \l devicePath is not the card. Nothing is removed there, which leads to \c Error
    unless the card is mounted elsewhere, too.

    The files are removed on a thread of the application's global thread pool. Destroying the formatter
    does not wait for the removal, but the process does when it ends.
*/
void MemoryCardFormatter::removeAllFiles()
{
    if (busy()) {
        qCWarning(lcMemoryCardLog)
            << "removeAllFiles() called when not idle. Status is" << m_status;
        return;
    }
    if (m_devicePath.isEmpty()) {
        qCWarning(lcMemoryCardLog) << "devicePath is empty.";
        setStatus(Error);
        return;
    }
    enqueue({Mounting, RemovingFiles});
    Q_EMIT busyChanged();
    startIfNothingRuns();
}

/*!
    \qmlmethod void MemoryCardFormatter::mount()

    Mounts the card. A card that is mounted gives mountError(), and the sequence goes on as if it
    had not been. Without a \l deviceName nothing happens but a critical message, and the command is
    lost.
*/
void MemoryCardFormatter::mount()
{
    if (busy()) {
        qCWarning(lcMemoryCardLog) << "mount() called when not idle. Status is" << m_status;
        return;
    }
    enqueue({Mounting});
    Q_EMIT busyChanged();
    startIfNothingRuns();
}

/*!
    \qmlmethod void MemoryCardFormatter::unmount()

    Unmounts the card. Without a \l deviceName nothing happens but a critical message, and the
    command is lost.
*/
void MemoryCardFormatter::unmount()
{
    if (busy()) {
        qCWarning(lcMemoryCardLog) << "unmount() called when not idle. Status is" << m_status;
        return;
    }
    enqueue({Unmounting});
    Q_EMIT busyChanged();
    startIfNothingRuns();
}

/*!
    \qmlsignal MemoryCardFormatter::statusChanged()

    Emitted after \l status has changed.
*/

/*!
    \qmlsignal MemoryCardFormatter::deviceNameChanged()

    Emitted after \l deviceName has changed.
*/

/*!
    \qmlsignal MemoryCardFormatter::devicePathChanged()

    Emitted after \l devicePath has changed, before it is probed.
*/

/*!
    \qmlsignal MemoryCardFormatter::filesystemTypeChanged()

    Emitted after \l filesystemType has changed.
*/

/*!
    \qmlsignal MemoryCardFormatter::busyChanged()

    Emitted after \l busy has changed, and whenever an operation has been accepted.
*/

/*!
    \qmlsignal MemoryCardFormatter::mountError(enumeration error)

    Emitted when the disk service does not mount the card, before \l status changes. The \a error is
    one of the disk service's own, \c {org.freedesktop.UDisks2.Error.*}; others lead to the status
    \c Error only.

    \value MemoryCardFormatter.ErrorFailed The operation failed.
    \value MemoryCardFormatter.ErrorCancelled The operation was cancelled.
    \value MemoryCardFormatter.ErrorAlreadyCancelled The operation had been cancelled before.
    \value MemoryCardFormatter.ErrorNotAuthorized The user may not do this.
    \value MemoryCardFormatter.ErrorNotAuthorizedCanObtain The user may not, but can get leave to.
    \value MemoryCardFormatter.ErrorNotAuthorizedDismissed The user did not grant leave.
    \value MemoryCardFormatter.ErrorAlreadyMounted The card is mounted; the sequence goes on.
    \value MemoryCardFormatter.ErrorNotMounted The card is not mounted.
    \value MemoryCardFormatter.ErrorOptionNotPermitted An option is not permitted.
    \value MemoryCardFormatter.ErrorMountedByOtherUser Another user has mounted the card.
    \value MemoryCardFormatter.ErrorAlreadyUnmounting The card is being unmounted; the sequence goes
           on.
    \value MemoryCardFormatter.ErrorNotSupported The operation is not supported.
    \value MemoryCardFormatter.ErrorTimedout The operation took too long.
    \value MemoryCardFormatter.ErrorWouldWakeup The operation would wake up a sleeping disk.
    \value MemoryCardFormatter.ErrorDeviceBusy Something uses the card.
*/

/*!
    \qmlsignal MemoryCardFormatter::unmountError(enumeration error)

    Emitted when the disk service does not unmount the card, as mountError() is when it does not
    mount it; the values of \a error are the same.
*/

void MemoryCardFormatter::commandError(QProcess::ProcessError error)
{
    // The end of a helper that has started, by a crash too, is left to commandFinished(). Qt reports
    // some failed starts twice: the second report must not hit the command that follows.
    const bool startsHelper = m_running == Formatting || m_running == Probing;
    if (error == QProcess::FailedToStart && startsHelper
        && m_process->state() == QProcess::NotRunning) {
        fail();
    }
}

void MemoryCardFormatter::commandFinished(int code, QProcess::ExitStatus status)
{
    if (m_running == Probing && status == QProcess::NormalExit) {
        const QByteArray output = m_process->readAllStandardOutput().trimmed();
        const QString filesystemType = QString::fromLatin1(output);
        if (m_filesystemType != filesystemType) {
            m_filesystemType = filesystemType;
            Q_EMIT filesystemTypeChanged();
        }
    }
    if (code != 0 || status != QProcess::NormalExit) {
        fail();
    } else {
        finishCommand();
    }
}

void MemoryCardFormatter::fileRemoverFinished()
{
    finishCommand();
}

void MemoryCardFormatter::fileRemoverError()
{
    fail();
}

void MemoryCardFormatter::setStatus(Status status)
{
    if (m_status == status) {
        return;
    }
    const bool wasBusy = busy();
    m_status = status;
    qCDebug(lcMemoryCardLog) << "New status" << status;
    Q_EMIT statusChanged();
    if (busy() != wasBusy) {
        Q_EMIT busyChanged();
    }
}

void MemoryCardFormatter::enqueue(std::initializer_list<Status> commands, const QString &formatType)
{
    for (const Status command : commands) {
        m_commands.enqueue({command, m_devicePath, formatType});
    }
}

void MemoryCardFormatter::startIfNothingRuns()
{
    if (m_running == Idle) {
        doNextCommand();
    }
}

void MemoryCardFormatter::doNextCommand()
{
    if (m_commands.isEmpty()) {
        setStatus(Idle);
        return;
    }
    const Command command = m_commands.dequeue();
    if (m_process == nullptr && !isMountCommand(command.command)) {
        m_process = new QProcess(this);
        m_process->setStandardErrorFile(QProcess::nullDevice());
        // Queued: a process cannot be started again from the signal that it did not start.
        connect(m_process, &QProcess::errorOccurred, this, &MemoryCardFormatter::commandError,
                Qt::QueuedConnection);
        connect(m_process, QOverload<int, QProcess::ExitStatus>::of(&QProcess::finished), this,
                &MemoryCardFormatter::commandFinished);
    }
    switch (command.command) {
    case Unmounting:
    case Mounting:
        startMountOperation(command.command);
        break;
    case Formatting:
        startFormatting(command);
        break;
    case RemovingFiles:
        startRemovingFiles(command);
        break;
    case Probing:
        startProbing(command);
        break;
    default:
        qCWarning(lcMemoryCardLog) << "Unknown command" << command.command;
        break;
    }
}

void MemoryCardFormatter::startFormatting(const Command &command)
{
    QStringList arguments;
    // Any other type has no command word, on purpose: the helper's exit code decides.
    if (command.formatType == vfat) {
        arguments.append(helperFormatVfat);
    } else if (command.formatType == ext4) {
        arguments.append(helperFormatExt4);
    }
    arguments.append(QFileInfo(command.devicePath).fileName());
    // Nobody reads the output. A pipe would end the helper if it outlived the application.
    m_process->setStandardOutputFile(QProcess::nullDevice());
    runHelper(Formatting, arguments);
}

void MemoryCardFormatter::startProbing(const Command &command)
{
    m_process->setStandardOutputFile(QString());
    runHelper(Probing, {helperProbe, QFileInfo(command.devicePath).fileName()});
}

void MemoryCardFormatter::runHelper(Status command, const QStringList &arguments)
{
    m_running = command;
    if (!hasDescriptorsLeft()) {
        // Reported later, as when the process itself finds that it cannot start.
        QMetaObject::invokeMethod(
            this, [this] { commandError(QProcess::FailedToStart); }, Qt::QueuedConnection);
        return;
    }
    m_process->start(helperProgram, arguments);
    // A missing program is reported later. Until then the process is starting.
    if (m_process->state() != QProcess::NotRunning) {
        setStatus(command);
    }
}

void MemoryCardFormatter::startMountOperation(Status command)
{
    const bool mounts = command == Mounting;
    if (m_deviceName.isEmpty()) {
        // The verbs are crossed on purpose: programs that read logs expect exactly these lines.
        // The status and the rest of the queue stay as they are, which is intended, too.
        qCCritical(lcMemoryCardLog)
            << "Cannot" << (mounts ? "unmount" : "mount") << "without device name";
        return;
    }
    m_running = command;
    const QDBusMessage call =
        mounts ? DiskService::mountCall(m_deviceName) : DiskService::unmountCall(m_deviceName);
    auto *reply = new QDBusPendingCallWatcher(DiskService::send(call), this);
    connect(reply, &QDBusPendingCallWatcher::finished, this,
            [this, method = call.member()](auto *finished) {
                mountOperationFinished(method, finished);
            });
}

void MemoryCardFormatter::mountOperationFinished(const QString &method,
                                                 QDBusPendingCallWatcher *reply)
{
    reply->deleteLater();
    if (!reply->isError()) {
        setStatus(m_running);
        finishCommand();
        return;
    }
    const QString name = reply->error().name();
    qCWarning(lcMemoryCardLog) << method << "error:" << name.toLatin1().constData();
    if (DiskService::isForgiven(name)) {
        reportDiskServiceError(name);
        finishCommand();
    } else {
        fail(name);
    }
}

void MemoryCardFormatter::reportDiskServiceError(const QString &name)
{
    if (const auto code = DiskService::errorCode(name)) {
        if (m_running == Mounting) {
            Q_EMIT mountError(*code);
        } else {
            Q_EMIT unmountError(*code);
        }
    }
}

void MemoryCardFormatter::startRemovingFiles(const Command &command)
{
    if (!hasDescriptorsLeft()) {
        fileRemoverError();
        return;
    }
    m_running = RemovingFiles;
    // The pool deletes it.
    auto *remover = new FileRemover(command.devicePath);
    connect(remover, &FileRemover::completed, this, &MemoryCardFormatter::fileRemoverFinished);
    connect(remover, &FileRemover::error, this, &MemoryCardFormatter::fileRemoverError);
    QThreadPool::globalInstance()->start(remover);
    setStatus(RemovingFiles);
}

void MemoryCardFormatter::finishCommand()
{
    m_running = Idle;
    doNextCommand();
}

void MemoryCardFormatter::fail(const QString &diskServiceError)
{
    // Dropped before any signal is emitted: requests made from handlers start a new sequence.
    if (diskServiceError.isEmpty()) {
        m_commands.clear();
    } else {
        // A new path can be set while the request is under way, and is probed in any case.
        const auto isNoProbe = [](const Command &command) { return command.command != Probing; };
        m_commands.erase(std::remove_if(m_commands.begin(), m_commands.end(), isNoProbe),
                         m_commands.end());
    }
    reportDiskServiceError(diskServiceError);
    m_running = Idle;
    setStatus(Error);
    if (!m_commands.isEmpty()) {
        startIfNothingRuns();
    }
}

bool MemoryCardFormatter::isMountCommand(Status command)
{
    return command == Unmounting || command == Mounting;
}
