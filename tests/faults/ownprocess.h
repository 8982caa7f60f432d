// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef OWNPROCESS_H
#define OWNPROCESS_H

#include <QByteArray>
#include <QString>
#include <QStringList>
#include <QtTest>

/*
    Runs a test in a process of its own: what a fault does to a process (a bus that is gone, a limit
    that is reached) the other tests are to be spared.
*/
namespace OwnProcess {

// Whether this is one.
bool isThis();

// Runs the current test, with its data, in one; the command is what starts it, for example in a
// namespace of its own. Empty if it passed; else, or if it was skipped, what it wrote, of which
// skipped() returns the reason.
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
