// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "stage.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QEvent>
#include <QFile>
#include <QLocale>
#include <QQmlEngine>
#include <QQmlError>
#include <QQmlInfo>

namespace {

// The signal of the sample services (gallery/peer).
const QLatin1String peerPath("/");
const QLatin1String peerInterface("com.marlo.settings.gallery.Peer");
const QLatin1String peerSignal("CallReceived");

// What the cover daemon tells of.
const QString coverIdProperty = QStringLiteral("KIVID");
const QString coverReadyProperty = QStringLiteral("Ready");
const QString sampleCover = QStringLiteral("MARLO-COVER-07");

// What the definition of the steps widget (gallery/sample) waits for.
const QString stepCounterFile = QStringLiteral("/usr/libexec/step-counter");

const QString diskService = QStringLiteral("org.freedesktop.UDisks2");
const QLatin1String diskServiceErrorPrefix("org.freedesktop.UDisks2.Error.");

} // namespace

Stage::Stage(QQmlEngine *engine)
    : m_engine(engine), m_diskService(QDBusConnection::SystemBus, diskService)
{
    connect(engine, &QQmlEngine::warnings, this, &Stage::reportWarnings);
    if (!QDBusConnection::sessionBus().connect(
            QString(), peerPath, peerInterface, peerSignal, this,
            SIGNAL(callReceived(QString, QString, QStringList)))) {
        qmlWarning(this) << "no session bus: received calls will not be shown";
    }
    tellOfCover();
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

void Stage::setCoverAttached(bool attached)
{
    if (attached == m_coverAttached) {
        return;
    }
    m_coverAttached = attached;
    tellOfCover();
    Q_EMIT coverAttachedChanged();
}

void Stage::tellOfCover()
{
    const QString id = m_coverAttached ? sampleCover : QString();
    const int ready = m_coverAttached ? 1 : 0;
    m_coverDaemon.answer(coverIdProperty, {id});
    m_coverDaemon.answer(coverReadyProperty, {ready});
    m_coverDaemon.sendChanges({{coverIdProperty, id}, {coverReadyProperty, ready}});
}

bool Stage::stepCounterInstalled() const
{
    return QFile::exists(stepCounterFile);
}

void Stage::setStepCounterInstalled(bool installed)
{
    if (installed == stepCounterInstalled()) {
        return;
    }
    QFile file(stepCounterFile);
    if (installed ? !file.open(QIODevice::WriteOnly) : !file.remove()) {
        qmlWarning(this) << stepCounterFile << ": " << file.errorString();
    }
    Q_EMIT stepCounterInstalledChanged();
}

void Stage::setDiskServiceError(const QString &error)
{
    if (error == m_diskServiceError) {
        return;
    }
    m_diskServiceError = error;
    if (error.isEmpty()) {
        m_diskService.setAnswer(RecordingService::Answer::Reply);
    } else {
        m_diskService.setAnswer(RecordingService::Answer::Error, diskServiceErrorPrefix + error);
    }
    Q_EMIT diskServiceErrorChanged();
}

void Stage::reportWarnings(const QList<QQmlError> &errors)
{
    for (const QQmlError &error : errors) {
        if (error.messageType() != QtInfoMsg) {
            Q_EMIT warning(error.toString());
        }
    }
}
