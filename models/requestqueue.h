// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef REQUESTQUEUE_H
#define REQUESTQUEUE_H

#include <QMetaObject>
#include <QScopedValueRollback>

#include <algorithm>
#include <deque>
#include <functional>
#include <utility>
#include <vector>

/*
    Queues requests that reach a model while it changes its rows. QML may call back from a handler
    of a row signal, and a second change in the middle of the first would break the model and its
    views. Such a request waits until control returns to the event loop.

    An update reads files or settings again: it runs once, however often it was requested. A choice
    changes the user's settings: all choices run, in the order of the requests. They run after the
    updates, because each choice starts from the stored settings.
*/
template<typename Model> class RequestQueue
{
public:
    using Update = void (Model::*)();
    using Choice = std::function<void()>;

    explicit RequestQueue(Model *model) : m_model(model) { }
    Q_DISABLE_COPY_MOVE(RequestQueue)

    // Exists while the model changes its rows. Changes do not nest.
    class Change
    {
    public:
        explicit Change(RequestQueue *queue) : m_queue(queue) { queue->m_changing = true; }
        ~Change()
        {
            m_queue->m_changing = false;
            m_queue->runLater();
        }
        Q_DISABLE_COPY_MOVE(Change)

    private:
        RequestQueue *m_queue;
    };

    // Whether the update has to wait. If not, the caller continues with it.
    bool defer(Update update)
    {
        if (m_changing
            && std::find(m_updates.begin(), m_updates.end(), update) == m_updates.end()) {
            m_updates.push_back(update);
        }
        return m_changing;
    }

    // Runs the choice after all waiting requests: now, or later if rows are being changed or another
    // choice runs.
    void choose(Choice choice)
    {
        m_choices.push_back(std::move(choice));
        run();
    }

private:
    void run()
    {
        // If a handler requests a choice while another one runs, the new one waits until the other
        // is complete.
        if (m_changing || m_running) {
            return;
        }
        {
            const QScopedValueRollback<bool> running(m_running, true);
            for (const Update update : std::exchange(m_updates, {})) {
                (m_model->*update)();
            }
            // Later requests wait for the event loop. Otherwise two handlers that react to each
            // other would never return to it.
            for (auto count = m_choices.size(); count > 0; --count) {
                const Choice choice = std::move(m_choices.front());
                m_choices.pop_front();
                choice();
            }
        }
        runLater();
    }

    void runLater()
    {
        if (!m_posted && !m_running && !(m_updates.empty() && m_choices.empty())) {
            m_posted = QMetaObject::invokeMethod(
                m_model,
                [this] {
                    m_posted = false;
                    run();
                },
                Qt::QueuedConnection);
        }
    }

    Model *m_model;
    std::vector<Update> m_updates;
    std::deque<Choice> m_choices;
    bool m_changing = false;
    bool m_running = false;
    bool m_posted = false;
};

#endif
