// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LANGUAGELISTENER_H
#define LANGUAGELISTENER_H

#include <QCoreApplication>
#include <QEvent>
#include <QObject>
#include <QScopedValueRollback>

#include <functional>

// Counts the language changes of the application and calls a function on each, but not for those
// that the function causes. Installing or removing a catalog causes such a change.
class LanguageListener : public QObject
{
public:
    explicit LanguageListener(std::function<void()> answer = [] {}) : m_answer(std::move(answer))
    {
        QCoreApplication::instance()->installEventFilter(this);
    }
    bool eventFilter(QObject *watched, QEvent *event) override
    {
        if (watched == QCoreApplication::instance() && event->type() == QEvent::LanguageChange
            && !m_answering) {
            const QScopedValueRollback<bool> answering(m_answering, true);
            ++count;
            m_answer();
        }
        return QObject::eventFilter(watched, event);
    }

    int count = 0;

private:
    const std::function<void()> m_answer;
    bool m_answering = false;
};

#endif
