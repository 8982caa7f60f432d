// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

/*
    usage: gallery-with-card COMMAND [ARG]...

    Runs a command with a real memory card if possible. The card is a loop device that the
    distribution's own disk service mounts. GALLERY_CARD is then the name of the device, and
    GALLERY_CARD_NETWORK the network namespace in which its disk service has to run.

    A second process holds the card. However the command ends, the kernel ends this process, too, and
    with it the daemons, the mounts and the loop device.
*/

#include "simulator/realcard.h"

#include <QCoreApplication>

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>

#include <fcntl.h>
#include <sched.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <unistd.h>

namespace {

[[noreturn]] void holdCard(pid_t command, int report, int argc, char **argv)
{
    // A missing prerequisite ends the process by abort(). Nobody needs a core dump of that.
    const rlimit noCore = {0, 0};
    setrlimit(RLIMIT_CORE, &noCore);
    prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (getppid() != command) {
        _exit(1);
    }
    RealCard::becomePrivate();
    const QCoreApplication application(argc, argv);
    const RealCard card;
    RealCard::installHelper();
    const QByteArray name = card.name().toLatin1();
    if (write(report, name.constData(), size_t(name.size())) == name.size()) {
        close(report);
        while (true) {
            pause();
        }
    }
    _exit(1);
}

bool enterMounts(const QByteArray &process)
{
    const int mounts = open((process + "/ns/mnt").constData(), O_RDONLY | O_CLOEXEC);
    const int directory = open(".", O_PATH | O_DIRECTORY | O_CLOEXEC);
    return mounts >= 0 && setns(mounts, CLONE_NEWNS) == 0 && fchdir(directory) == 0;
}

// Returns whether there is a card now.
bool makeCard(int argc, char **argv)
{
    const pid_t self = getpid();
    std::array<int, 2> report = {};
    if (pipe2(report.data(), O_CLOEXEC) != 0) {
        return false;
    }
    const pid_t holder = fork();
    if (holder == 0) {
        close(report[0]);
        holdCard(self, report[1], argc, argv);
    }
    close(report[1]);
    std::array<char, 64> name = {};
    const ssize_t size = read(report[0], name.data(), name.size() - 1);
    close(report[0]);
    const QByteArray process = "/proc/" + QByteArray::number(holder);
    if (holder < 0 || size <= 0 || !enterMounts(process)) {
        return false;
    }
    qputenv("GALLERY_CARD", name.data());
    qputenv("GALLERY_CARD_NETWORK", process + "/ns/net");
    return true;
}

} // namespace

int main(int argc, char *argv[])
{
    if (argc < 2) {
        std::fputs("usage: gallery-with-card COMMAND [ARG]...\n", stderr);
        return 2;
    }
    QString whyNot = RealCard::whyNot();
    if (whyNot.isEmpty() && !makeCard(argc, argv)) {
        whyNot = QStringLiteral("none could be set up");
    }
    if (!whyNot.isEmpty()) {
        std::fprintf(stderr, "gallery: the memory card is simulated: %s\n", qPrintable(whyNot));
    }
    execvp(argv[1], argv + 1);
    std::fprintf(stderr, "gallery: cannot run %s: %s\n", argv[1], std::strerror(errno));
    return 127;
}
