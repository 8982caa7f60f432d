// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef STAGE_H
#define STAGE_H

#include <QObject>
#include <QStringList>

class QQmlEngine;
class QQmlError;

/*
    Plays the device around the gallery's pages: changes the language as a home screen does, and
    tells which calls the sample services on the session bus receive.
*/
class Stage : public QObject
{
    Q_OBJECT
    // The name of a language, such as "fi".
    Q_PROPERTY(QString language READ language WRITE setLanguage NOTIFY languageChanged)

public:
    explicit Stage(QQmlEngine *engine);

    QString language() const;
    void setLanguage(const QString &language);

Q_SIGNALS:
    void languageChanged();
    void callReceived(const QString &service, const QString &method, const QStringList &arguments);
    // A mistake in QML. What an object of a module reports for information is none.
    void warning(const QString &text);

private:
    void reportWarnings(const QList<QQmlError> &errors);

    QQmlEngine *m_engine;
};

#endif
