// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "ownprocess.h"
#include "texts.h"

#include <QCoreApplication>
#include <QProcess>

namespace {

constexpr char marker[] = "TEST_IN_A_PROCESS_OF_ITS_OWN";
constexpr int patience = 120000; // ms, for a very busy machine

} // namespace

bool OwnProcess::isThis()
{
    return qEnvironmentVariableIsSet(marker);
}

QByteArray OwnProcess::runCurrentTest(const QStringList &command)
{
    QString test = QString::fromLatin1(QTest::currentTestFunction());
    if (QTest::currentDataTag() != nullptr) {
        test += QLatin1Char(':') + QString::fromUtf8(QTest::currentDataTag());
    }
    QProcess process;
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(QLatin1String(marker), "1"_s);
    process.setProcessEnvironment(environment);
    process.setProcessChannelMode(QProcess::MergedChannels);
    const QStringList words = command + QStringList{QCoreApplication::applicationFilePath(), test};
    process.start(words.first(), words.mid(1));
    const bool ended = process.waitForFinished(patience);
    const QByteArray output = process.readAll();
    if (!ended) {
        return "does not end: " + output;
    }
    // The test, initTestCase() and cleanupTestCase().
    const bool passed = process.exitStatus() == QProcess::NormalExit && process.exitCode() == 0
        && output.contains("Totals: 3 passed, 0 failed, 0 skipped");
    return passed ? QByteArray()
                  : "status " + QByteArray::number(process.exitCode()) + ": " + output;
}

QByteArray OwnProcess::skipped(const QByteArray &output)
{
    const int begin = output.indexOf("SKIP   : ");
    if (begin < 0) {
        return {};
    }
    const int reason = output.indexOf(") ", begin) + 2;
    return output.mid(reason, output.indexOf('\n', reason) - reason);
}
