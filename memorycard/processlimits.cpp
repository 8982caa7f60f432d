// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "processlimits.h"

#include "files/filedescriptor.h"

#include <array>

#include <pthread.h>
#include <sys/eventfd.h>

bool ProcessLimits::hasDescriptorsLeft()
{
    std::array<FileDescriptor, 16> spare; // a helper takes up to 10, emptying a card up to 14
    for (FileDescriptor &descriptor : spare) {
        descriptor = FileDescriptor(eventfd(0, EFD_CLOEXEC));
    }
    return spare.back().isOpen();
}

bool ProcessLimits::canStartThread()
{
    pthread_t thread = {};
    const auto doNothing = [](void *) -> void * { return nullptr; };
    return pthread_create(&thread, nullptr, doNothing, nullptr) == 0
        && pthread_join(thread, nullptr) == 0;
}
