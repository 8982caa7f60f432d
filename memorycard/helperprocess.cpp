// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "helperprocess.h"

#include "faultlog.h"
#include "files/literals.h"
#include "processlimits.h"

#include <QFile>
#include <QSocketNotifier>

#include <algorithm>
#include <array>
#include <utility>
#include <vector>

#include <sys/mman.h>
#include <unistd.h>

namespace {

constexpr QLatin1String program = "/usr/libexec/sdcardhelper"_L1;

constexpr const char *noProcess = "no process can be started";

// In bytes. A warning has no more of the standard error.
constexpr std::size_t maxErrorLine = 200;

} // namespace

HelperProcess::~HelperProcess()
{
    if (m_process == nullptr || m_process->state() == QProcess::NotRunning) {
        return;
    }
    // If the QProcess were deleted with its owner, it would kill the helper and wait for it. A card
    // that is half formatted cannot be used, so a helper that formats continues, even after the
    // application has ended.
    m_process->setParent(nullptr);
    connect(m_process, &QProcess::stateChanged, m_process, [process = m_process](auto state) {
        if (state == QProcess::NotRunning) {
            process->deleteLater();
        }
    });
    if (m_kind != Kind::Formatter) {
        m_process->kill();
    }
}

bool HelperProcess::start(Kind kind, const QStringList &arguments)
{
    m_kind = kind;
    m_isAwaited = true;
    if (!ProcessLimits::hasDescriptorsLeft()) {
        reportFailedStartLater("too many files are open");
        return false;
    }
    // A limit of processes counts threads, too.
    if (!ProcessLimits::canStartThread()) {
        reportFailedStartLater(noProcess);
        return false;
    }
    if (m_process == nullptr) {
        makeProcess();
    }
    // Nobody reads the output of a formatter. A broken pipe would end one that outlives the
    // application.
    m_process->setStandardOutputFile(kind == Kind::Prober ? QString() : QProcess::nullDevice());
    m_process->setStandardErrorFile(redirectErrors());
    m_process->start(program, arguments);
    if (m_process->state() != QProcess::NotRunning && m_process->processId() <= 0) {
        abandonProcess();
        return false;
    }
    // A missing program is reported later. Until then the process is starting.
    return m_process->state() != QProcess::NotRunning;
}

void HelperProcess::makeProcess()
{
    m_process = new QProcess(m_owner);
    // Queued: a QProcess cannot be started again while it reports that its start failed, nor be
    // deleted while it reports an end.
    connect(
        m_process, &QProcess::errorOccurred, this,
        [this](QProcess::ProcessError error) {
            // A helper that has started ends with finished(), even if it crashes. Qt reports some
            // failed starts twice: the second report must not hit the next command.
            if (error == QProcess::FailedToStart && m_process != nullptr
                && m_process->state() == QProcess::NotRunning) {
                reportFailedStart(m_process->errorString());
            }
        },
        Qt::QueuedConnection);
    connect(m_process, QOverload<int, QProcess::ExitStatus>::of(&QProcess::finished), this,
            &HelperProcess::reportEnd, Qt::QueuedConnection);
}

// Qt 5.15 does not notice that clone() fails, and treats the process as running with the process id
// -1. Killing or destroying such a QProcess would kill all processes of the user, so the object
// stays until the end of the application, with three descriptors, and does nothing any more.
void HelperProcess::abandonProcess()
{
    static std::vector<QProcess *> abandoned;
    abandoned.push_back(m_process);
    const auto notifiers = m_process->findChildren<QSocketNotifier *>();
    for (QSocketNotifier *notifier : notifiers) {
        notifier->setEnabled(false);
    }
    m_process->disconnect();
    m_process->setParent(nullptr);
    m_process = nullptr;
    reportFailedStartLater(noProcess);
}

// Returns the name of a new file in memory. A pipe would end a helper that outlives the
// application.
QString HelperProcess::redirectErrors()
{
    m_errors = FileDescriptor(memfd_create("errors of the card helper", MFD_CLOEXEC));
    const QString name = QStringLiteral("/proc/self/fd/%1").arg(m_errors.get());
    return access(QFile::encodeName(name).constData(), W_OK) == 0 ? name : QProcess::nullDevice();
}

// As QProcess does when it finds that the helper cannot start.
void HelperProcess::reportFailedStartLater(const char *reason)
{
    QMetaObject::invokeMethod(
        this, [this, reason] { reportFailedStart(QString::fromLatin1(reason)); },
        Qt::QueuedConnection);
}

void HelperProcess::reportFailedStart(const QString &reason)
{
    if (std::exchange(m_isAwaited, false)) {
        qCWarning(lcCardFaults) << "Cannot start" << program << "because" << reason;
        Q_EMIT failedToStart(QProcess::FailedToStart);
    }
}

void HelperProcess::reportEnd(int code, QProcess::ExitStatus status)
{
    m_isAwaited = false;
    if (status != QProcess::NormalExit) {
        qCWarning(lcCardFaults) << program << m_process->arguments() << "was ended by signal"
                                << code << "with the error" << firstLineOfErrors();
    } else if (code != 0) {
        qCWarning(lcCardFaults) << program << m_process->arguments() << "exited with" << code
                                << "and the error" << firstLineOfErrors();
    }
    m_errors.close();
    Q_EMIT finished(code, status);
}

QString HelperProcess::firstLineOfErrors() const
{
    std::array<char, maxErrorLine> text = {};
    const ssize_t size = pread(m_errors.get(), text.data(), text.size(), 0);
    const QByteArray errors(text.data(), static_cast<int>(std::max<ssize_t>(size, 0)));
    return QString::fromLocal8Bit(errors.trimmed().split('\n').first().trimmed());
}
