// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LISTMODELTEST_H
#define LISTMODELTEST_H

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
    void followsTheDirectory();
    void readsWrittenFilesOnceTheyAreClosed();
    void ignoresOtherFiles();
    void catalogsGoWithTheModel();
    void dyingModelMayBeAsked();

protected Q_SLOTS:
    void init();
    void cleanup();

protected:
    // The directory of the definition files, which end in the suffix.
    ListModelTest(QString directory, QString suffix);

    // Creates a model that lists everything, loads its rows and records its signals.
    virtual void loadEverything() = 0;
    virtual void removeModel() = 0;
    // The names of the rows, separated by blanks.
    virtual QString rowsOf(const QAbstractListModel &model) const = 0;
    // The content of a definition file for one row of this name, with a catalog.
    virtual QByteArray definition(const QString &name, const QByteArray &catalog) const = 0;
    // The messages since the last call, without expected warnings of the model tester.
    virtual QStringList newMessages();

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
    QString rows() const { return rowsOf(*m_watched); }

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

private:
    const QString m_directory;
    const QString m_suffix;
    const QAbstractListModel *m_watched = nullptr;
    QStringList m_messages;
    std::unique_ptr<RowEvents> m_events;
    std::unique_ptr<QAbstractItemModelTester> m_tester;
};

// Calls a function on every language change of the application. Installing or removing a catalog
// causes such a change.
class LanguageListener : public QObject
{
public:
    explicit LanguageListener(std::function<void()> answer);
    bool eventFilter(QObject *watched, QEvent *event) override;

    int count = 0;

private:
    std::function<void()> m_answer;
};

#endif
