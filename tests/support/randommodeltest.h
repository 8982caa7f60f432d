// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef RANDOMMODELTEST_H
#define RANDOMMODELTEST_H

#include "messagelog.h"
#include "rowevents.h"
#include "texts.h"

#include <QAbstractListModel>
#include <QList>
#include <QRandomGenerator>
#include <QStringList>
#include <QVariant>

#include <memory>

/*
    The second model of a RandomModelTest: does everything one by one and searches from the top.
*/
class NaiveModel : public QObject
{
public:
    virtual int count() const = 0;
    // The values of a row, in the order of the roles.
    virtual QVariantList shown(int row) const = 0;

    QStringList events; // as RowEvents writes them
    QStringList enabledList;
    QStringList warnings;
};

/*
    The rows of a naive model. A row has a path.
*/
template<typename Row> class NaiveRows : public NaiveModel
{
public:
    int count() const override { return rows.size(); }

protected:
    int find(const QString &path) const
    {
        for (int row = 0; row < rows.size(); ++row) {
            if (rows.at(row).path == path) {
                return row;
            }
        }
        return -1;
    }
    void insert(int row, const Row &value)
    {
        rows.insert(row, value);
        events.append("inserted %1"_s.arg(row));
    }
    void change(int row, const Row &value)
    {
        rows[row] = value;
        events.append("changed %1"_s.arg(row));
    }
    // Returns the removed rows.
    QList<Row> removeAllBut(const QStringList &paths)
    {
        QList<Row> removed;
        int row = 0;
        while (row < rows.size()) {
            if (paths.contains(rows.at(row).path)) {
                ++row;
            } else {
                removed.append(rows.takeAt(row));
                events.append("removed %1"_s.arg(row));
            }
        }
        return removed;
    }

    QList<Row> rows;
};

/*
    Runs a model next to a naive second one, through many random changes of files and settings. After
    each step both have the same rows, have emitted the same signals, have logged the same messages and
    agree on the user's list. The environment variable RANDOM_STEPS sets the number of steps per seed.
*/
class RandomModelTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void steps_data();
    void steps();

protected:
    // The directory of the definition files, the dconf key of the user's list, and what
    // enable...() and disable...() take.
    RandomModelTest(QString directory, QString key, QByteArray kind);

    // Restores all settings and files except the directory and the key.
    virtual void reset() { }
    virtual void makeModels() = 0;
    virtual void removeModels() = 0;
    virtual QAbstractListModel *model() const = 0;
    virtual NaiveModel *naive() const = 0;
    // Takes one random step and returns its description.
    virtual QString step() = 0;
    // Empty if the models agree.
    virtual QString difference();

    // Steps that change the user's list.
    QString choose(const QByteArray &verb, const QString &path);
    QString store(const QStringList &list);
    QString storeNothing();
    QString storeInAnotherProcess(const QStringList &list);
    // The model reloads after a change of the directory, and counts that in m_reloads.
    void waitForReload();

    // True with this probability.
    bool chance(int percent) { return m_random.bounded(100) < percent; }
    template<typename List> typename List::value_type anyOf(const List &list)
    {
        return list.at(m_random.bounded(list.size()));
    }
    QByteArray oneOf(const QByteArrayList &texts) { return anyOf(texts); }
    // Shorter than the size.
    QStringList listOf(const QStringList &paths, int size);

    const QString m_directory;
    const QString m_key;
    const QByteArray m_kind;
    QRandomGenerator m_random;
    std::unique_ptr<RowEvents> m_events;
    QVariant m_stored; // what the key should hold
    int m_reloads = 0;

private:
    std::unique_ptr<MessageLog> m_log;
};

#endif
