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

// Whether the process can open enough descriptors to start a helper or a thread. With too few, a
// thread that gets none for its event loop ends the process. Qt 5.15 may also treat a helper that
// never started as running, with the process id -1: killing it would kill all processes of the
// user.
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

    A card has two names: the disk service knows it by \l deviceName, and \l devicePath is the
    device node of its partition. Every operation is a sequence of commands that run one after the
    other, without blocking. \l status shows which one:

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
    of the service \c org.freedesktop.UDisks2 on the system bus. Removing files finds the card by
    its \l devicePath in \c{/etc/mtab}.

    Formatting and probing are done by the program \c /usr/libexec/sdcardhelper. Its arguments are
    \c format_vfat, \c format_ext4 or \c probe, and the name of the partition, such as \c mmcblk1p1.
    It must exit with 0 on success. For \c probe it writes the type of the file system to its
    standard output.

    A failed command ends the sequence and sets the status to \c Error. In this status every
    operation is accepted. Formatting, removing files and probing use the \l devicePath that was set
    when they were requested, even if it changes before they start. Each format() makes the type
    that it was called with. Mounting and unmounting use the \l deviceName that is set when the step
    starts.
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

    If a formatter is used for several operations, its signals do not always show that an operation
    has ended. The status \c Error does not change when another operation fails, and the status
    \c Idle does not change when mount() finds the card mounted. A page therefore creates a
    formatter for each operation, in a Loader, and starts the operation in the handler of
    devicePathChanged(), before the probe of the new path is queued. The probe then runs after the
    operation. The status therefore always leaves \c Idle. When it becomes \c Idle or \c Error, the
    operation has ended. After \c Idle, \l filesystemType is the current type of the card.

    \list
    \li Until the disk service answers the first request, the status is still \c Idle and \l busy is
        \c false. The page knows that it has started an operation: it shows that it waits for the
        disk service and disables its buttons.
    \li \c ErrorAlreadyMounted and \c ErrorAlreadyUnmounting do not stop an operation. The card is
        already in the requested state, or about to be: the page shows a note and waits for the end.
    \li Any other error of mountError() and unmountError() is followed by \c Error. Failures that
        have no code, such as those of the helper program, change only the status. The status before
        \c Error then shows which step failed.
    \endlist

    A complete page:

    \quotefile memory-card.qml

    Warnings are logged in the category \c org.tarnwickos.settings.memorycard, whose debug messages
    are off by default.

    \image gallery-memory-card.png The gallery's page of this type

    \section1 What may surprise
    \section2 Mounting and unmounting change the status afterwards
    \c Formatting, \c RemovingFiles and \c Probing are set when the work begins. \c Unmounting and
    \c Mounting are set when the disk service has reported success. Until then the status is still
    the previous one, and for the first step of a sequence \l busy is \c false. A page that shows
    progress must remember which operation it has requested.

    \section2 busyChanged() is emitted without a change
    It is also emitted when an operation has been accepted, although \l busy changes only with the
    status. Pages may use it to learn that an operation was not refused.

    \section2 Early requests are queued
    Operations are refused while \l busy is \c true. While the first request to the disk service is
    under way, \l busy is still \c false: operations are accepted then, and run afterwards. If the
    request fails, they are dropped, except the probe of a new \l devicePath. If format() is called
    twice in this way, each call makes the type that it was called with.

    \section2 Formatting needs a mounted card
    format() unmounts the card first. A card that is not mounted leads to \c Error with \c
    ErrorNotMounted: only a card that was known to work is formatted. Call mount() first; its \c
    ErrorAlreadyMounted is harmless.

    \section2 Two errors do not end the sequence
    \c ErrorAlreadyMounted and \c ErrorAlreadyUnmounting are reported, and the sequence continues:
    the card is already in the requested state, or about to be. The status of that step is not
    shown.

    \section2 Some errors have no signal
    mountError() and unmountError() carry the disk service's own errors. Others, such as a service
    that does not exist, only lead to the status \c Error. The signal is emitted before the status
    changes.

    \section2 Any type can be requested
    For a type other than \c vfat and \c ext4 (case-sensitive), the helper program gets only the
    name of the partition. Its exit code determines whether the step succeeds. The helper of a
    device may support more than this module.

    \section2 A failed probe still changes the type
    Even if the helper fails, its output replaces \l filesystemType. The output is then usually
    empty: a card that cannot be read has no known type. A helper that crashes or cannot be
    started leaves the type unchanged. It may then be the type of another card, so check \l status
    first. A new \l devicePath is probed immediately, even an empty one.

    \section2 Without a device name a sequence waits
    Mounting and unmounting use the \l deviceName that is set when the step starts. If it is empty
    then, the step only logs a critical message. The status does not change. The rest of the
    sequence stays in the queue and runs before the next operation: if format() is called without a
    name and unmount() later, the card is formatted. If the name is empty in the middle of a
    sequence, the formatter stays busy and refuses every operation; only a new object helps. The
    message says "unmount" for mounting and "mount" for unmounting, because programs that read logs
    expect exactly these lines.

    \section2 A directory that cannot be opened counts as empty
    removeAllFiles() removes all that it can, continues after a failure, and then ends in \c Error.
    The directory on which the card is mounted counts as empty if it cannot be opened: the operation
    succeeds without removing anything. If a card is mounted more than once, it is enough that one
    of its mount directories can be emptied.

    \section2 Some mount directories are refused
    The formatter does not empty a mount directory that is a symbolic link, the root directory or on
    a different device than the card. In these cases the card has been unmounted meanwhile, or the
    mount table is wrong.

    \section2 Work outlives its formatter
    Destroying a formatter stops neither the removal of files nor a helper that is formatting: a
    card that is half formatted cannot be used. When the process ends, it waits for the removal, as
    it does for all work in the global thread pool.
*/

MemoryCardFormatter::MemoryCardFormatter(QObject *parent) : QObject(parent)
{
}

MemoryCardFormatter::~MemoryCardFormatter()
{
    if (m_process == nullptr || m_process->state() == QProcess::NotRunning) {
        return;
    }
    // A child process object would kill the helper here and wait for it. The user has agreed to the
    // formatting, and a card that is half formatted cannot be used: let the helper finish. The
    // process object is deleted afterwards. If the application ends first, the helper continues.
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

    \value MemoryCardFormatter.Idle Nothing runs; the last sequence, if any, succeeded.
    \value MemoryCardFormatter.Unmounting The card has been unmounted.
    \value MemoryCardFormatter.Formatting The card is being formatted.
    \value MemoryCardFormatter.RemovingFiles The files on the card are being removed.
    \value MemoryCardFormatter.Mounting The card has been mounted.
    \value MemoryCardFormatter.Probing The helper identifies the file system on the card.
    \value MemoryCardFormatter.Error Nothing runs; the last sequence failed.

    While a request to mount or unmount is under way, the status is still the previous one.
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
    critical message. The status does not change. The rest of the queue remains and runs before the
    next operation that is accepted. If this happens in the middle of a sequence, the formatter
    stays \l busy and refuses every operation: only a new MemoryCardFormatter helps.
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

    The device node of the card's partition, such as \c /dev/mmcblk1p1. A new path is probed
    immediately. If a request to the disk service is under way, the probe waits until the request
    has succeeded or failed. While the formatter is \l busy, the path cannot be changed: trying to
    do so gives a warning.
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

    The type of the file system on the card, such as \c vfat: the standard output of the helper
    program in the last probe, without leading and trailing white space. It is usually empty after
    the helper has exited with an error. If the helper crashes or cannot be started, the type does
    not change.
*/
QString MemoryCardFormatter::filesystemType() const
{
    return m_filesystemType;
}

/*!
    \qmlproperty list<string> MemoryCardFormatter::supportedFormatTypes
    \readonly

    The types that format() supports, in this order: \c vfat if \c /sbin/mkfs.vfat is executable,
    and \c ext4 if \c /sbin/mkfs.ext4 is executable. They are checked whenever the property is read.
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

    Whether \l status is neither \c Idle nor \c Error. While \c true, operations are refused with a
    warning. While the disk service carries out the first step of a sequence, \c busy is \c false,
    and other operations are queued. If this step fails, they are dropped; only the probe of a new
    \l devicePath still runs.
*/
bool MemoryCardFormatter::busy() const
{
    return m_status != Idle && m_status != Error;
}

/*!
    \qmlmethod void MemoryCardFormatter::format(string type)

    Unmounts the card, makes a file system of the \a type \c vfat or \c ext4 on it, and mounts it.
    \b {Everything on the card is lost.} For any other type, the helper program gets only the name
    of the partition, and its exit code determines whether the step succeeds. An empty type or
    \l devicePath leads to \c Error with a warning. A card that is not mounted leads to
    unmountError() and \c Error.

    \b {Set \l deviceName first.} Without it the formatter only logs a critical message. The
    formatting stays in the queue and runs before the next operation, even if that is only unmount()
    or a new \l devicePath. Do not clear \l deviceName until the card is mounted again, either: the
    formatter would stay \l busy forever.
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

    Mounts the card, unless it is already mounted, and removes all files and directories on it. If
    some cannot be removed, the others are removed first, and the status then becomes \c Error. An
    empty \l devicePath leads to \c Error with a warning. Without a \l deviceName the removal stays
    in the queue, as described for format().

    A mount directory that is a symbolic link, the root directory or on a different device than
    \l devicePath is not the card. Nothing is removed there. The operation then ends in \c Error,
    unless the card is mounted on another directory, too.

    The files are removed on a thread of the application's global thread pool. Destroying the
    formatter does not wait for the removal, but the process does when it ends.
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

    Mounts the card. If the card is already mounted, mountError() is emitted and the sequence
    continues. Without a \l deviceName the formatter only logs a critical message and drops the
    command.
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

    Unmounts the card. Without a \l deviceName the formatter only logs a critical message and drops
    the command.
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

    Emitted before \l status changes, when the disk service could not mount the card. Each \a error
    stands for an error of the disk service, \c {org.freedesktop.UDisks2.Error.*}. Any other error
    only changes the status to \c Error.

    \value MemoryCardFormatter.ErrorFailed The operation failed.
    \value MemoryCardFormatter.ErrorCancelled The operation was cancelled.
    \value MemoryCardFormatter.ErrorAlreadyCancelled The operation had been cancelled before.
    \value MemoryCardFormatter.ErrorNotAuthorized The user is not authorized.
    \value MemoryCardFormatter.ErrorNotAuthorizedCanObtain The user is not authorized, but
           can obtain authorization.
    \value MemoryCardFormatter.ErrorNotAuthorizedDismissed The user is not authorized and
           dismissed the dialog.
    \value MemoryCardFormatter.ErrorAlreadyMounted The card is mounted; the sequence goes on.
    \value MemoryCardFormatter.ErrorNotMounted The card is not mounted.
    \value MemoryCardFormatter.ErrorOptionNotPermitted An option is not permitted.
    \value MemoryCardFormatter.ErrorMountedByOtherUser Another user has mounted the card.
    \value MemoryCardFormatter.ErrorAlreadyUnmounting The card is being unmounted; the sequence goes
           on.
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

void MemoryCardFormatter::commandError(QProcess::ProcessError error)
{
    // Handles only failed starts: commandFinished() handles the end of a helper that has started,
    // even a crash. Qt reports some failed starts twice: the second report must not hit the next
    // command.
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
    if (isMountCommand(command.command)) {
        startMountOperation(command.command);
        return;
    }
    if (m_process == nullptr) {
        m_process = new QProcess(this);
        m_process->setStandardErrorFile(QProcess::nullDevice());
        // Queued: a process cannot be started again from the signal that it did not start.
        connect(m_process, &QProcess::errorOccurred, this, &MemoryCardFormatter::commandError,
                Qt::QueuedConnection);
        connect(m_process, QOverload<int, QProcess::ExitStatus>::of(&QProcess::finished), this,
                &MemoryCardFormatter::commandFinished);
    }
    switch (command.command) {
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
