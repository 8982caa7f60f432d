// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef STAGE_H
#define STAGE_H

#include "coverdaemon.h"
#include "recordingservice.h"

#include <QObject>
#include <QStringList>

class QQmlEngine;
class QQmlError;

/*
    Plays the device around the gallery's pages: changes the language as a home screen does, tells
    which calls the sample services on the session bus receive, attaches and removes a smart back
    cover, has a step counter or none, and is a disk service that only says that it is done.
*/
class Stage : public QObject
{
    Q_OBJECT
    // The name of a language, such as "fi".
    Q_PROPERTY(QString language READ language WRITE setLanguage NOTIFY languageChanged)
    Q_PROPERTY(
        bool coverAttached READ coverAttached WRITE setCoverAttached NOTIFY coverAttachedChanged)
    // Whether there is the file that makes the steps widget available.
    Q_PROPERTY(bool stepCounterInstalled READ stepCounterInstalled WRITE setStepCounterInstalled
                   NOTIFY stepCounterInstalledChanged)
    // What the disk service answers with, such as "DeviceBusy"; empty when all goes well.
    Q_PROPERTY(QString diskServiceError READ diskServiceError WRITE setDiskServiceError NOTIFY
                   diskServiceErrorChanged)

public:
    explicit Stage(QQmlEngine *engine);

    QString language() const;
    void setLanguage(const QString &language);
    bool coverAttached() const { return m_coverAttached; }
    void setCoverAttached(bool attached);
    bool stepCounterInstalled() const;
    void setStepCounterInstalled(bool installed);
    QString diskServiceError() const { return m_diskServiceError; }
    void setDiskServiceError(const QString &error);

Q_SIGNALS:
    void languageChanged();
    void coverAttachedChanged();
    void stepCounterInstalledChanged();
    void diskServiceErrorChanged();
    void callReceived(const QString &service, const QString &method, const QStringList &arguments);
    // A mistake in QML. What an object of a module reports for information is none.
    void warning(const QString &text);

private:
    void tellOfCover();
    void reportWarnings(const QList<QQmlError> &errors);

    QQmlEngine *m_engine;
    // The pages meet these on the system bus alone. The cover daemon's name is owned before there is
    // a page: QtDBus may lose a signal that follows too soon on a new owner.
    CoverDaemon m_coverDaemon;
    bool m_coverAttached = false;
    RecordingService m_diskService;
    QString m_diskServiceError;
};

#endif
