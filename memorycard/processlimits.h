// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef PROCESSLIMITS_H
#define PROCESSLIMITS_H

// What this process can still open and start. Qt does not report every failure to do so.
namespace ProcessLimits {

// Whether there are enough file descriptors to start a helper or to empty a card. QProcess does not
// always report that a helper did not start, and a thread that gets no descriptor for its event
// loop ends the process.
[[nodiscard]] bool hasDescriptorsLeft();

// Whether a thread can be started. A thread pool that fails to do so waits for it forever.
[[nodiscard]] bool canStartThread();

} // namespace ProcessLimits

#endif
