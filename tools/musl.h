// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// What libstdc++ and Qt found in glibc when they were built; musl's headers lack it. For
// tools/lint-musl.
#include <locale.h>
#include <pthread.h>

#define __GLIBC_PREREQ(major, minor) 0

typedef locale_t __locale_t;
extern "C" int pthread_cond_clockwait(pthread_cond_t *, pthread_mutex_t *, clockid_t,
                                      const struct timespec *);
extern "C" int pthread_mutex_clocklock(pthread_mutex_t *, clockid_t, const struct timespec *);
