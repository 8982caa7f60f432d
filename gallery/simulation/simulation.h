// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef SIMULATION_H
#define SIMULATION_H

#include "simulator/coverdaemon.h"

#include <QDBusServiceWatcher>
#include <QObject>
#include <QStringList>

#include <memory>

class QQmlEngine;
class QQmlError;

/*
    Simulates the device around the gallery's pages. It changes the language as a home screen does,
    reports the calls that the sample services on the session bus receive, and has a smart back cover.
*/
class Simulation : public QObject
{
    Q_OBJECT
    // The name of a language, such as "fi".
    Q_PROPERTY(QString language READ language WRITE setLanguage NOTIFY languageChanged)
    Q_PROPERTY(Cover cover READ cover WRITE setCover NOTIFY coverChanged)

public:
    enum Cover { NoDaemon, NoCover, CoverStarting, CoverReady };
    Q_ENUM(Cover)

    explicit Simulation(QQmlEngine *engine);

    QString language() const;
    void setLanguage(const QString &language);
    Cover cover() const { return m_cover; }
    void setCover(Cover cover);

Q_SIGNALS:
    void languageChanged();
    void coverChanged();
    void callReceived(const QString &service, const QString &method, const QStringList &arguments);
    // A warning of the QML engine, such as a mistake in a binding.
    void warning(const QString &text);

private:
    void startCoverDaemon();
    void announceCover();
    void reportWarnings(const QList<QQmlError> &errors);

    // The pages reach it only through the system bus.
    std::unique_ptr<CoverDaemon> m_coverDaemon;
    QDBusServiceWatcher m_coverDaemonWatcher;
    Cover m_cover = NoCover;
};

#endif
