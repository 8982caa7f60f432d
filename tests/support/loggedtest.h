// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LOGGEDTEST_H
#define LOGGEDTEST_H

#include "messagelog.h"

#include <QObject>

#include <memory>

/*
    A test in which a function fails if it logs a message that it does not expect. A subclass that
    has more to prepare overrides init() or cleanup(), and calls these.
*/
class LoggedTest : public QObject
{
    Q_OBJECT

protected Q_SLOTS:
    void init();
    void cleanup();

protected:
    std::unique_ptr<MessageLog> m_log;
};

#endif
