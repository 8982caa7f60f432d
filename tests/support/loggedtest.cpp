// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "loggedtest.h"

#include <QTest>

void LoggedTest::init()
{
    m_log = std::make_unique<MessageLog>();
}

void LoggedTest::cleanup()
{
    QCOMPARE(m_log->takeReport(), QString());
    m_log.reset();
}
