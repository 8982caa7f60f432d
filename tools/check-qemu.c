// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Succeeds if clone() knows CLONE_PIDFD. Without it, as in Debian 12's qemu, QProcess starts no
// program. Qt takes the -1 that the failed call returns for the process, so QProcess::kill() kills
// every process.
#define _GNU_SOURCE
#include <sched.h>
#include <signal.h>
#include <sys/syscall.h>
#include <unistd.h>

int main(void)
{
    int descriptor;
    return syscall(SYS_clone, CLONE_PIDFD | SIGCHLD, 0, &descriptor, 0, 0) < 0;
}
