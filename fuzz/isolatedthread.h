// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ISOLATEDTHREAD_H
#define ISOLATEDTHREAD_H

#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>

/*
    A thread that sees only an empty file system in memory. Its mount namespace contains no other
    mount, so code under test that removes the wrong files can only remove files made for the test.
    The other threads keep the normal file system: the fuzzer writes what it finds there.
*/
class IsolatedThread
{
public:
    // Ends the program if it may not mount, as in a container without namespaces.
    IsolatedThread();
    ~IsolatedThread();
    IsolatedThread(const IsolatedThread &) = delete;
    IsolatedThread &operator=(const IsolatedThread &) = delete;

    // Runs the task in the thread and waits for it. Returns the task's failure, or null: the file
    // of a crash can only be written outside the thread.
    const char *run(const std::function<const char *()> &task);

private:
    void serve();

    std::mutex m_mutex;
    std::condition_variable m_changed;
    const std::function<const char *()> *m_task = nullptr;
    const char *m_result = nullptr;
    bool m_ended = false;
    std::thread m_thread;
};

#endif
