// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef OWNPROCESS_H
#define OWNPROCESS_H

#include <QByteArray>
#include <QString>
#include <QStringList>
#include <QtTest>

/*
    Runs a test in a process of its own, so that a fault that affects the whole process (a missing
    bus, a limit that is reached) does not affect the other tests.
*/
namespace OwnProcess {

// Whether this process runs only one test.
bool isThis();

// Runs the current test, with its data, in a new process. The command starts the process, for
// example in a namespace of its own. Returns an empty text if the test passed, and otherwise its
// output. If the test was skipped, skipped() returns the reason from the output.
QByteArray runCurrentTest(const QStringList &command = {});
QByteArray skipped(const QByteArray &output);

} // namespace OwnProcess

// The first line of a test that runs in a process of its own.
#define IN_A_PROCESS_OF_ITS_OWN(...)                                                               \
    if (!OwnProcess::isThis()) {                                                                   \
        const QByteArray output = OwnProcess::runCurrentTest(__VA_ARGS__);                         \
        if (!OwnProcess::skipped(output).isEmpty()) {                                              \
            QSKIP(OwnProcess::skipped(output).constData());                                        \
        }                                                                                          \
        QVERIFY2(output.isEmpty(), output.constData());                                            \
        return;                                                                                    \
    }

#endif
