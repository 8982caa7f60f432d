// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef REQUESTQUEUE_H
#define REQUESTQUEUE_H

#include <QMetaObject>

#include <algorithm>
#include <utility>
#include <vector>

/*
    Queues updates that are requested while a model changes its rows. QML may call back from a
    handler of a row signal, and a second change in the middle of the first would break the model
    and its views. The updates wait until control returns to the event loop. Each kind of update
    runs once, however often it was requested.
*/
template<typename Model> class RequestQueue
{
public:
    using Update = void (Model::*)();

    explicit RequestQueue(Model *model) : m_model(model) { }
    Q_DISABLE_COPY_MOVE(RequestQueue)

    // Exists while the model changes its rows. Scopes do not nest.
    class ChangeScope
    {
    public:
        explicit ChangeScope(RequestQueue *queue) : m_queue(queue) { queue->m_changing = true; }
        ~ChangeScope()
        {
            m_queue->m_changing = false;
            if (!m_queue->m_updates.empty()) {
                QMetaObject::invokeMethod(
                    m_queue->m_model, [queue = m_queue] { queue->run(); }, Qt::QueuedConnection);
            }
        }
        Q_DISABLE_COPY_MOVE(ChangeScope)

    private:
        RequestQueue *m_queue;
    };

    // Whether the update has to wait. If not, the caller continues with it.
    [[nodiscard]] bool defer(Update update)
    {
        if (m_changing
            && std::find(m_updates.begin(), m_updates.end(), update) == m_updates.end()) {
            m_updates.push_back(update);
        }
        return m_changing;
    }

private:
    void run()
    {
        // In the event loop of a handler, the updates defer themselves again.
        for (const Update update : std::exchange(m_updates, {})) {
            (m_model->*update)();
        }
    }

    Model *m_model;
    std::vector<Update> m_updates;
    bool m_changing = false;
};

#endif
