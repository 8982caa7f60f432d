// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "stage.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QEvent>
#include <QLocale>
#include <QQmlEngine>
#include <QQmlError>
#include <QQmlInfo>

namespace {

// The signal of the sample services (gallery/peer).
const QLatin1String peerPath("/");
const QLatin1String peerInterface("com.marlo.settings.gallery.Peer");
const QLatin1String peerSignal("CallReceived");

} // namespace

Stage::Stage(QQmlEngine *engine) : m_engine(engine)
{
    connect(engine, &QQmlEngine::warnings, this, &Stage::reportWarnings);
    if (!QDBusConnection::sessionBus().connect(
            QString(), peerPath, peerInterface, peerSignal, this,
            SIGNAL(callReceived(QString, QString, QStringList)))) {
        qmlWarning(this) << "no session bus: received calls will not be shown";
    }
}

QString Stage::language() const
{
    return QLocale().bcp47Name();
}

void Stage::setLanguage(const QString &language)
{
    if (language == this->language()) {
        return;
    }
    QLocale::setDefault(QLocale(language));
    // Translators that follow the language filter this event; the engine retranslates on it.
    QEvent languageChange(QEvent::LanguageChange);
    QCoreApplication::sendEvent(m_engine, &languageChange);
    Q_EMIT languageChanged();
}

void Stage::reportWarnings(const QList<QQmlError> &errors)
{
    for (const QQmlError &error : errors) {
        if (error.messageType() != QtInfoMsg) {
            Q_EMIT warning(error.toString());
        }
    }
}
