// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "memorycardformatter.h"

#include "diskservice.h"
#include "fileremover.h"
#include "processlimits.h"

#include <QDBusError>
#include <QDBusPendingCall>
#include <QDBusPendingCallWatcher>
#include <QFileInfo>
#include <QLoggingCategory>

#include <algorithm>
#include <memory>
#include <utility>

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

// Qt 5.15 starts a plain QProcess with clone(). If clone() fails, Qt treats the process as running
// with the process id -1: killing it would kill all processes of the user. Qt starts a subclass
// with fork() instead, and reports a failure of fork().
class HelperProcess : public QProcess
{
public:
    using QProcess::QProcess;
};

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
    accepted. Formatting, removing files and probing use the \l devicePath and the type of their
    request; mounting and unmounting use the \l deviceName that is set when the step starts.
    The formatter logs messages in the category \c{org.tarnwickos.settings.memorycard}. Why files
    could not be removed is logged as a warning in the category
    \c{com.marlo.settings.system.memorycard}.

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
    requested meanwhile are queued and run afterwards. If the request to the disk service fails,
    they are dropped, except the probe of a new \l devicePath. A page must remember that it has
    requested an operation.

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
    the file system must be the one in the mount table. A device that has the root directory is not
    a card: none of its mount directories is emptied. A mount directory that cannot be opened counts
    as empty. If the card is mounted more than once, the operation succeeds if one mount directory
    can be emptied.

    \section2 Work outlives its formatter
    Destroying a formatter stops neither the removal of files nor a helper that is formatting,
    because a half-formatted card cannot be used. Before the process exits, it waits for the removal
    to finish.
*/

MemoryCardFormatter::~MemoryCardFormatter()
{
    if (m_process == nullptr || m_process->state() == QProcess::NotRunning) {
        return;
    }
    // If m_process were deleted with this object, it would kill the helper and wait for it. A card
    // that is half formatted cannot be used, so a helper that formats continues, even after the
    // application has ended.
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

    The kernel name of the block device, such as \c mmcblk1p1, which the disk service mounts and
    unmounts. It can be set at any time, but must not be empty during an operation.
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
    if (m_devicePath == path || isRefused("Cannot change device path")) {
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
    if (!isRefused("format() called") && requireValue("devicePath", m_devicePath)
        && requireValue("type", type)) {
        startSequence({Unmounting, Formatting, Mounting}, type);
    }
}

/*!
    \qmlmethod void MemoryCardFormatter::removeAllFiles()

    Mounts the card, unless it is already mounted, and removes all files and directories on it, on a
    thread of the application's global thread pool. If some cannot be removed, the others are
    removed first, and the status then becomes \c Error. It also becomes \c Error if no thread can
    be started, or if the application clears the thread pool before the removal starts. An empty \l devicePath leads to \c Error
    with a warning.
*/
void MemoryCardFormatter::removeAllFiles()
{
    if (!isRefused("removeAllFiles() called") && requireValue("devicePath", m_devicePath)) {
        startSequence({Mounting, RemovingFiles});
    }
}

/*!
    \qmlmethod void MemoryCardFormatter::mount()
    \qmlmethod void MemoryCardFormatter::unmount()

    Mounts or unmounts the card.
*/
void MemoryCardFormatter::mount()
{
    if (!isRefused("mount() called")) {
        startSequence({Mounting});
    }
}

void MemoryCardFormatter::unmount()
{
    if (!isRefused("unmount() called")) {
        startSequence({Unmounting});
    }
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

bool MemoryCardFormatter::isRefused(const char *request) const
{
    if (busy()) {
        qCWarning(lcMemoryCardLog) << request << "when not idle. Status is" << m_status;
    }
    return busy();
}

bool MemoryCardFormatter::requireValue(const char *name, const QString &value)
{
    if (!value.isEmpty()) {
        return true;
    }
    qCWarning(lcMemoryCardLog) << name << "is empty.";
    setStatus(Error);
    return false;
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

void MemoryCardFormatter::startSequence(std::initializer_list<Status> commands,
                                        const QString &formatType)
{
    enqueue(commands, formatType);
    // busy has not changed yet, but users rely on the signal.
    Q_EMIT busyChanged();
    startIfNothingRuns();
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
    if (command.command == Unmounting || command.command == Mounting) {
        startMountOperation(command.command);
        return;
    }
    if (m_process == nullptr) {
        m_process = new HelperProcess(this);
        m_process->setStandardErrorFile(QProcess::nullDevice());
        // Queued: a QProcess cannot be started again while it reports that its start failed.
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
    // Nobody reads the output. A broken pipe would end a helper that outlives the application.
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
    if (!ProcessLimits::hasDescriptorsLeft()) {
        // Reported later, as QProcess does when it finds that the helper cannot start.
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
        // The verbs are swapped on purpose: programs that read logs expect exactly these lines.
        // The status and the rest of the queue do not change, which is intended, too.
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
    const auto code = DiskService::errorCode(name);
    // The card is already in the requested state, or about to be.
    const bool isForgiven =
        code && (*code == ErrorAlreadyMounted || *code == ErrorAlreadyUnmounting);
    if (!isForgiven) {
        // Dropped before any signal is emitted: requests made from handlers start a new sequence. A
        // path that was set during the request is still probed.
        const auto isNoProbe = [](const Command &command) { return command.command != Probing; };
        m_commands.erase(std::remove_if(m_commands.begin(), m_commands.end(), isNoProbe),
                         m_commands.end());
    }
    if (code && m_running == Mounting) {
        Q_EMIT mountError(*code);
    } else if (code) {
        Q_EMIT unmountError(*code);
    }
    if (isForgiven) {
        finishCommand();
    } else {
        endInError();
    }
}

void MemoryCardFormatter::startRemovingFiles(const Command &command)
{
    m_running = RemovingFiles;
    auto remover = std::make_unique<FileRemover>(command.devicePath);
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
    m_running = Idle;
    doNextCommand();
}

void MemoryCardFormatter::fail()
{
    m_commands.clear();
    endInError();
}

void MemoryCardFormatter::endInError()
{
    m_running = Idle;
    setStatus(Error);
    if (!m_commands.isEmpty()) {
        startIfNothingRuns();
    }
}
