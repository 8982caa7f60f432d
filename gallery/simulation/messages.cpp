// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "messages.h"

#include <QCoreApplication>
#include <QEvent>
#include <QMetaObject>

#include <mutex>

namespace {

constexpr int maxCount = 200;

// A message handler is a plain function, and any thread may log.
std::mutex mutex;
Messages *receiver = nullptr;
QtMessageHandler previousHandler = nullptr;

void pass(QtMsgType type, const QMessageLogContext &context, const QString &text)
{
    previousHandler(type, context, text);
    if (type == QtDebugMsg) {
        return;
    }
    const std::lock_guard<std::mutex> lock(mutex);
    if (receiver != nullptr) {
        QMetaObject::invokeMethod(receiver, "add", Qt::QueuedConnection, Q_ARG(QString, text));
    }
}

} // namespace

Messages::Messages(QObject *parent) : QAbstractListModel(parent)
{
    const std::lock_guard<std::mutex> lock(mutex);
    receiver = this;
    previousHandler = qInstallMessageHandler(pass);
}

Messages::~Messages()
{
    const std::lock_guard<std::mutex> lock(mutex);
    receiver = nullptr;
    // Another handler may have been installed since then. It stays.
    const QtMessageHandler current = qInstallMessageHandler(previousHandler);
    if (current != pass) {
        qInstallMessageHandler(current);
    }
}

void Messages::clear()
{
    // What was logged before may still be in the event queue.
    QCoreApplication::removePostedEvents(this, QEvent::MetaCall);
    beginResetModel();
    m_texts.clear();
    endResetModel();
    Q_EMIT countChanged();
}

int Messages::rowCount(const QModelIndex &parent) const
{
    return parent.isValid() ? 0 : m_texts.size();
}

QVariant Messages::data(const QModelIndex &index, int role) const
{
    return role == Qt::DisplayRole && checkIndex(index, CheckIndexOption::IndexIsValid)
        ? m_texts.at(index.row())
        : QVariant();
}

QHash<int, QByteArray> Messages::roleNames() const
{
    return {{Qt::DisplayRole, QByteArrayLiteral("text")}};
}

void Messages::add(const QString &text)
{
    if (m_texts.size() == maxCount) {
        beginRemoveRows({}, 0, 0);
        m_texts.removeFirst();
        endRemoveRows();
    }
    beginInsertRows({}, m_texts.size(), m_texts.size());
    m_texts.append(text);
    endInsertRows();
    Q_EMIT countChanged();
}
