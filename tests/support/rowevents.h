// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef ROWEVENTS_H
#define ROWEVENTS_H

#include <QAbstractItemModel>
#include <QStringList>

/*
    The signals of a list model as texts, in their order: "inserted 2", "removed 0", "moved 0 2" (the
    row and its new number), "changed 1" for all roles, "changed 1 (261)" for one, "reset", "layout".
    A signal about several rows is written as "removed 0-2".
*/
class RowEvents
{
public:
    explicit RowEvents(const QAbstractItemModel *model);
    Q_DISABLE_COPY_MOVE(RowEvents)

    // Records another signal of the model under this name.
    template<typename Model>
    void record(const Model *model, void (Model::*signal)(), const QString &name)
    {
        QObject::connect(model, signal, &m_context, [this, name] { m_events.append(name); });
    }

    // All events since the last call, separated by ", ".
    QString take();

private:
    QStringList m_events;
    QObject m_context;
};

#endif
