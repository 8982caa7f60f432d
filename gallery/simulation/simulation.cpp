// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "simulation.h"

#include "languageforwarder.h"

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

// The English sample texts are in British English.
const QLatin1String english("en");
const QString britishEnglish = QStringLiteral("en_GB");

// The interface of the cover daemon.
const QString coverService = QStringLiteral("com.marlo.kivd");
const QString coverIdProperty = QStringLiteral("KIVID");
const QString coverReadyProperty = QStringLiteral("Ready");
const QString sampleCover = QStringLiteral("MARLO-COVER-07");

} // namespace

Simulation::Simulation(QQmlEngine *engine)
    : m_coverDaemonWatcher(coverService, QDBusConnection::systemBus(),
                           QDBusServiceWatcher::WatchForRegistration)
{
    connect(engine, &QQmlEngine::warnings, this, &Simulation::reportWarnings);
    if (!QDBusConnection::sessionBus().connect(
            QString(), peerPath, peerInterface, peerSignal, this,
            SIGNAL(callReceived(QString, QString, QStringList)))) {
        qmlWarning(this) << "no session bus: received calls will not be shown";
    }
    new LanguageForwarder(engine);
    // The locale has no country until now.
    QLocale::setDefault(QLocale(britishEnglish));
    // QtDBus may lose a signal that is sent right after the daemon's name gets a new owner.
    connect(&m_coverDaemonWatcher, &QDBusServiceWatcher::serviceRegistered, this,
            &Simulation::announceCover);
    startCoverDaemon();
}

QString Simulation::language() const
{
    return QLocale().name().section(QLatin1Char('_'), 0, 0);
}

void Simulation::setLanguage(const QString &language)
{
    if (language == this->language()) {
        return;
    }
    QLocale::setDefault(QLocale(language == english ? britishEnglish : language));
    // As the home screen does. The engine gets it from the forwarder.
    QEvent languageChange(QEvent::LanguageChange);
    QCoreApplication::sendEvent(QCoreApplication::instance(), &languageChange);
    Q_EMIT languageChanged();
}

void Simulation::setCover(Cover cover)
{
    if (cover == m_cover) {
        return;
    }
    m_cover = cover;
    if (cover == NoDaemon) {
        m_coverDaemon.reset();
    } else if (m_coverDaemon == nullptr) {
        startCoverDaemon();
    } else {
        announceCover();
    }
    Q_EMIT coverChanged();
}

void Simulation::startCoverDaemon()
{
    m_coverDaemon = std::make_unique<CoverDaemon>();
    announceCover();
}

void Simulation::announceCover()
{
    if (m_coverDaemon == nullptr) {
        return;
    }
    const QString id = m_cover == NoCover ? QString() : sampleCover;
    const int ready = m_cover == CoverStarting ? 0 : 1;
    m_coverDaemon->answer(coverIdProperty, {id});
    m_coverDaemon->answer(coverReadyProperty, {ready});
    m_coverDaemon->sendChanges({{coverIdProperty, id}, {coverReadyProperty, ready}});
}

void Simulation::reportWarnings(const QList<QQmlError> &errors)
{
    for (const QQmlError &error : errors) {
        if (error.messageType() != QtInfoMsg) {
            Q_EMIT warning(error.toString());
        }
    }
}
