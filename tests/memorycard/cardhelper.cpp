// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "cardhelper.h"

#include "files.h"
#include "texts.h"

#include <QFile>
#include <QProcess>

#include <csignal>
#include <memory>

namespace {

const QString program = "/usr/libexec/sdcardhelper"_s;
const QString directory = "/usr/libexec/sdcardhelper.d"_s;
const QString script = QLatin1String(SDCARDHELPER);

constexpr auto executable = QFile::ReadOwner | QFile::ExeOwner;

QString inDirectory(const char *name)
{
    return directory + QLatin1Char('/') + QLatin1String(name);
}

// A zombie process does not count as running.
bool isRunning(qint64 pid)
{
    QFile file("/proc/%1/stat"_s.arg(pid));
    if (!file.open(QIODevice::ReadOnly)) {
        return false;
    }
    const QByteArray stat = file.readAll();
    return stat.mid(stat.lastIndexOf(')') + 2, 1) != "Z";
}

} // namespace

CardHelper::CardHelper()
{
    remove();
    Files::remove(directory);
    Files::makeDirectory(directory);
    Files::makePipe(inDirectory("go"));
    // Opened for reading too, so that neither open() nor write() waits for the helper.
    m_go.setFileName(inDirectory("go"));
    if (!m_go.open(QIODevice::ReadWrite | QIODevice::Unbuffered)) {
        qFatal("cannot open %s", qPrintable(m_go.fileName()));
    }
}

CardHelper::~CardHelper()
{
    const auto left = running();
    for (const qint64 pid : left) {
        kill(static_cast<pid_t>(pid), SIGKILL);
    }
    remove();
    Files::remove(directory);
}

void CardHelper::install(const QString &scenario, const QByteArray &output)
{
    if (QProcess::execute(script, {"--check"_s, scenario}) != 0) {
        qFatal("no such scenario: %s", qPrintable(scenario));
    }
    Files::write(inDirectory("output"), output);
    // Creates a new file each time, because nothing may write to a running program.
    remove();
    Files::write(program,
                 "#!/bin/sh\nexec %1 %2 %3 \"$@\"\n"_s.arg(script, directory, scenario).toUtf8());
    QFile::setPermissions(program, executable);
}

void CardHelper::installNotExecutable()
{
    remove();
    Files::write(program, "#!/bin/sh\n");
    QFile::setPermissions(program, QFile::ReadOwner);
}

void CardHelper::remove()
{
    Files::remove(program);
}

void CardHelper::release()
{
    m_go.write("\n");
}

QList<QStringList> CardHelper::runs() const
{
    QList<QStringList> runs;
    const auto all = readRuns();
    for (const Run &run : all) {
        runs.append(run.arguments);
    }
    return runs;
}

QList<qint64> CardHelper::running() const
{
    QList<qint64> running;
    const auto all = readRuns();
    for (const Run &run : all) {
        if (isRunning(run.pid)) {
            running.append(run.pid);
        }
    }
    return running;
}

QList<CardHelper::Run> CardHelper::readRuns() const
{
    QFile file(inDirectory("runs"));
    if (!file.open(QIODevice::ReadOnly)) {
        return {};
    }
    QList<QByteArray> words = file.readAll().split('\0');
    words.removeLast();
    QList<Run> runs;
    while (words.size() >= 2) {
        Run run = {words.takeFirst().toLongLong(), {}};
        for (int left = words.takeFirst().toInt(); left > 0; --left) {
            run.arguments.append(QFile::decodeName(words.takeFirst()));
        }
        runs.append(run);
    }
    return runs;
}
