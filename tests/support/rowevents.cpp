// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "rowevents.h"
#include "texts.h"

namespace {

// Rows below a parent are an error in a list model, so the text must mark them.
QString rows(const QModelIndex &parent, int first, int last)
{
    const QString text = QString::number(first) + (last == first ? QString() : "-%1"_s.arg(last));
    return parent.isValid() ? text + " below a parent"_s : text;
}

} // namespace

RowEvents::RowEvents(const QAbstractItemModel *model)
{
    using Model = QAbstractItemModel;
    QObject::connect(model, &Model::rowsInserted, &m_context,
                     [this](const QModelIndex &parent, int first, int last) {
                         m_events.append("inserted "_s + rows(parent, first, last));
                     });
    QObject::connect(model, &Model::rowsRemoved, &m_context,
                     [this](const QModelIndex &parent, int first, int last) {
                         m_events.append("removed "_s + rows(parent, first, last));
                     });
    QObject::connect(model, &Model::rowsMoved, &m_context,
                     [this](const QModelIndex &parent, int first, int last, const QModelIndex &,
                            int destination) {
                         const int row = destination > first ? destination - 1 : destination;
                         m_events.append("moved %1 %2"_s.arg(rows(parent, first, last)).arg(row));
                     });
    QObject::connect(
        model, &Model::dataChanged, &m_context,
        [this](const QModelIndex &top, const QModelIndex &bottom, const QVector<int> &roles) {
            m_events.append("changed "_s + rows(top.parent(), top.row(), bottom.row()));
            for (const int role : roles) {
                m_events.last() += " (%1)"_s.arg(role);
            }
        });
    QObject::connect(model, &Model::modelReset, &m_context, [this] { m_events.append("reset"_s); });
    QObject::connect(model, &Model::layoutChanged, &m_context,
                     [this] { m_events.append("layout"_s); });
}

QString RowEvents::take()
{
    QString events = m_events.join(", "_s);
    m_events.clear();
    return events;
}
