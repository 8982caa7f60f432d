// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef MESSAGES_H
#define MESSAGES_H

#include <QAbstractListModel>
#include <QStringList>

/*
    The latest messages of this process except debug messages, the oldest first. The message handler that
    was installed before still gets every message.
*/
class Messages : public QAbstractListModel
{
    Q_OBJECT
    Q_PROPERTY(int count READ count NOTIFY countChanged)
    Q_PROPERTY(QString latest READ latest NOTIFY countChanged)

public:
    explicit Messages(QObject *parent = nullptr);
    ~Messages() override;
    Q_DISABLE_COPY_MOVE(Messages)

    int count() const { return m_texts.size(); }
    QString latest() const { return m_texts.isEmpty() ? QString() : m_texts.last(); }
    Q_INVOKABLE void clear();

    int rowCount(const QModelIndex &parent = QModelIndex()) const override;
    QVariant data(const QModelIndex &index, int role) const override;
    QHash<int, QByteArray> roleNames() const override;

    // Called by the message handler, in the thread of this object.
    Q_INVOKABLE void add(const QString &text);

Q_SIGNALS:
    void countChanged();

private:
    QStringList m_texts;
};

#endif
