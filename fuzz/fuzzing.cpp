// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "fuzzing.h"

#include <QCoreApplication>
#include <QFile>
#include <QtGlobal>

#include <cstdio>
#include <cstdlib>

#include <fcntl.h>
#include <unistd.h>

extern "C" int LLVMFuzzerInitialize(int *argc, char ***argv);

namespace {

// The code under test warns about almost every input.
void keepQuiet(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    Q_UNUSED(context)
    Fuzzing::require(type != QtFatalMsg, qPrintable(text));
}

} // namespace

// Called once, before the first input, by the fuzzer and by replay.cpp.
int LLVMFuzzerInitialize(int *argc, char ***argv)
{
    // Inputs name files and services. They must not reach real files and services of this machine.
    if (!qEnvironmentVariableIsSet("MARLO_THROW_AWAY_ROOT")) {
        qFatal("this program runs only in the throw-away root of simulator");
    }
    static const QCoreApplication application(*argc, *argv);
    qInstallMessageHandler(keepQuiet);
    return 0;
}

void Fuzzing::require(bool holds, const char *what)
{
    if (!holds) {
        std::fprintf(stderr, "This should have held: %s\n", what);
        std::abort();
    }
}

QString Fuzzing::writeFile(const char *name, const QByteArray &content)
{
    const QString path = qEnvironmentVariable("HOME") + QLatin1Char('/') + QLatin1String(name);
    const int fd =
        open(QFile::encodeName(path).constData(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    require(fd >= 0 && write(fd, content.constData(), size_t(content.size())) == content.size(),
            "the file can be written");
    close(fd);
    return path;
}

std::uint8_t Bytes::takeByte()
{
    if (m_rest.isEmpty()) {
        return 0;
    }
    const auto byte = std::uint8_t(m_rest.at(0));
    m_rest.remove(0, 1);
    return byte;
}

QByteArray Bytes::takeUntil(char separator)
{
    const int end = m_rest.indexOf(separator);
    const QByteArray taken = end < 0 ? m_rest : m_rest.left(end);
    m_rest = end < 0 ? QByteArray() : m_rest.mid(end + 1);
    return taken;
}
