// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef LANGUAGEFORWARDER_H
#define LANGUAGEFORWARDER_H

#include <QCoreApplication>
#include <QEvent>
#include <QObject>
#include <QQmlEngine>

/*
    Passes the application's language changes on to a QML engine.

    Qt sends them to the application and its windows, but not to engines.
*/
class LanguageForwarder : public QObject
{
public:
    explicit LanguageForwarder(QQmlEngine *engine) : QObject(engine), m_engine(engine)
    {
        QCoreApplication::instance()->installEventFilter(this);
    }

    bool eventFilter(QObject *watched, QEvent *event) override
    {
        // A filter of the application sees the events of every object.
        if (event->type() == QEvent::LanguageChange && watched == QCoreApplication::instance()) {
            QEvent change(QEvent::LanguageChange);
            QCoreApplication::sendEvent(m_engine, &change);
        }
        return QObject::eventFilter(watched, event);
    }

private:
    QQmlEngine *m_engine;
};

#endif
