// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FAILINGCARD_H
#define FAILINGCARD_H

#include <QString>
#include <QTemporaryDir>

#include <atomic>
#include <thread>
#include <vector>

/*
    A mounted card that fails on request: a file system of one directory of files, which a thread
    of this process serves to the kernel.
*/
class FailingCard
{
public:
    // How removing a file fails. With Unreadable, listing the directory fails instead.
    enum class Fault { None, Unreadable, Stuck, Waits, Gone };

    // Ends the program if it is not allowed to mount; see whyNot().
    FailingCard(const QString &device, int files);
    ~FailingCard();
    Q_DISABLE_COPY_MOVE(FailingCard)

    // Why this process cannot mount a card; empty if it can.
    static QString whyNot();

    void setFault(Fault fault) { m_fault = fault; }
    int filesLeft() const { return m_left; }
    // The number of removals that are blocked until the fault changes.
    int waiting() const { return m_waiting; }

    QString directory() const { return m_dir.path(); }
    // Unmounts the card lazily: programs that are using it continue.
    void detach();

private:
    void serve();
    bool answer(const char *request);

    QTemporaryDir m_dir;
    const int m_count;
    int m_fuse = -1;
    std::atomic<Fault> m_fault = Fault::None;
    std::atomic<int> m_left;
    std::atomic<int> m_waiting = 0;
    std::atomic<bool> m_ends = false;
    std::vector<bool> m_removed;
    std::thread m_thread;
};

#endif
