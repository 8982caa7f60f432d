// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef JAIL_H
#define JAIL_H

#include <condition_variable>
#include <functional>
#include <mutex>
#include <thread>

/*
    A thread to which there is nothing but an empty file system in memory: all others are taken off
    its mount namespace, so that what removes files, however wrong it goes, meets none but those
    that were made for it. The rest of the program, which keeps files of what it finds, is as it was.
*/
class Jail
{
public:
    // Ends the program when there is no right to mount, which the sandbox grants to everybody.
    Jail();
    ~Jail();
    Jail(const Jail &) = delete;
    Jail &operator=(const Jail &) = delete;

    // Runs the task there and waits for it. Returns what did not hold, or null: the file of a crash
    // can only be written outside.
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
