// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef CARDHELPER_H
#define CARDHELPER_H

#include <QByteArray>
#include <QFile>
#include <QList>
#include <QString>
#include <QStringList>

/*
    The program /usr/libexec/sdcardhelper in the throw-away root. It does what the scenario of a
    test says (see the script of that name) and records its arguments. It is missing before
    install().
*/
class CardHelper
{
public:
    CardHelper();
    // Ends the processes that are still running.
    ~CardHelper();
    Q_DISABLE_COPY_MOVE(CardHelper)

    // Ends the test program if there is no such scenario.
    void install(const QString &scenario, const QByteArray &output = QByteArray());
    // Installs a file that cannot be run.
    void installNotExecutable();
    void remove();
    // Lets a helper that waits in the scenario "held" continue.
    void release();

    // The arguments of each run, the first one first.
    QList<QStringList> runs() const;
    // The process of each run that has not ended.
    QList<qint64> running() const;

private:
    struct Run {
        qint64 pid;
        QStringList arguments;
    };
    QList<Run> readRuns() const;

    QFile m_go;
};

#endif
