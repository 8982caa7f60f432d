// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LISTMODELTEST_H
#define LISTMODELTEST_H

#include "languagelistener.h"
#include "loggedtest.h"
#include "rowevents.h"

#include <QAbstractItemModelTester>
#include <QAbstractListModel>
#include <QStringList>

#include <functional>
#include <memory>
#include <utility>

/*
    The base of the tests for the two models of definition files. It has an empty directory for the
    files, catalogs, the recorded signals of the model, and tests of behaviour that both models
    share.
*/
class ListModelTest : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    // Following the directory
    void followsTheDirectory();
    void readsWrittenFilesOnceTheyAreClosed();

    // The user's choices
    void choices_data();
    void choices();
    void choicesBeforeCompletion();
    void choicesInHandlersAreStoredAtOnce();
    void choicesKeepOtherProcessesChanges();
    void followsOtherProcesses();

    // Catalogs
    void catalogsGoWithTheModel();
    void catalogNameWithASlash();
    void dyingModelMayBeUsed();

protected Q_SLOTS:
    void init();
    void cleanup();

protected:
    // The directory of the definition files, which end in the suffix, the key of the user's list,
    // and what enable...() and disable...() take: "Action" or "Widget".
    ListModelTest(QString directory, QString suffix, QString key, QByteArray kind);

    // Creates a model that lists everything, and records its signals.
    virtual void makeModel() = 0;
    // Loads the rows for the first time, and again.
    virtual void complete() = 0;
    virtual void reload() = 0;
    virtual void removeModel() = 0;
    // The content of a definition file for one row of this name, with a catalog.
    virtual QByteArray definition(const QString &name, const QByteArray &catalog) const = 0;
    // The identity of the row of this name.
    virtual QString path(const QString &name) const = 0;
    QStringList paths(const QString &names) const;
    // The messages since the last call, without expected warnings of the model tester.
    virtual QStringList newMessages();

    // Creates a model and loads its rows.
    void loadEverything();
    // Writes a definition file for each name.
    void define(const QString &names, const QByteArray &catalog = {}) const;
    // Enables or disables the row of this name.
    void choose(const char *verb, const QString &name) const;
    void store(const QString &names) const;
    QString stored() const;

    // Begins to check the model and to record its signals.
    void watch(QAbstractListModel *model);
    // The model's recorded signals since the last call.
    QString events() { return m_events->take(); }
    // Records another signal of the model under this name.
    template<typename Model>
    void record(const Model *model, void (Model::*signal)(), const QString &name)
    {
        m_events->record(model, signal, name);
    }
    // The names of the rows, and the sorted names of those that are enabled, separated by blanks.
    QString rows() const { return rowsOf(*m_watched); }
    QString rowsOf(const QAbstractListModel &model) const;
    QString enabledRows() const;

    // All messages since takeMessages().
    QStringList messages();
    QStringList takeMessages();

    // Waits for longer than the delay of a reload, to show that something does not happen.
    static void waitForNothing();

    QString inDirectory(const QString &file) const;
    // Writes the file without replacing it, as an editor does.
    void rewrite(const QString &file, const QByteArray &content) const;
    // Writes a definition that cannot be read: each load logs one message.
    void writeBroken() const;

    // Calls the handler once, with the next signal.
    template<typename Sender, typename Signal>
    static void once(const Sender *sender, Signal signal, const std::function<void()> &handler)
    {
        auto done = std::make_shared<bool>(false);
        connect(sender, signal, sender, [done, handler] {
            if (!std::exchange(*done, true)) {
                handler();
            }
        });
    }

    QAbstractListModel *m_watched = nullptr;

private:
    const QString m_directory;
    const QString m_suffix;
    const QString m_key;
    const QByteArray m_kind;
    QStringList m_messages;
    std::unique_ptr<RowEvents> m_events;
    std::unique_ptr<QAbstractItemModelTester> m_tester;
};

#endif
