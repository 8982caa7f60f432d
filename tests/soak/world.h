// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef WORLD_H
#define WORLD_H

#include "cardhelper.h"
#include "scratchfilesystem.h"
#include "simulator/coverdaemon.h"
#include "simulator/diskservicepeer.h"
#include "simulator/recordingservice.h"

#include <QRandomGenerator>
#include <QStringList>
#include <QVariant>

#include <memory>

/*
    The environment of the module: definition files, catalogs, texts, settings, a memory card, and
    the services that it calls. All of these appear, disappear and fail at random.
*/
class World
{
public:
    explicit World(QRandomGenerator *random);

    void changeSomething();
    // Ends all peers and replaces the helper, so that nothing blocks or keeps recorded calls.
    void settle();

    // Values for properties and arguments, some of them valid.
    QString text();
    QVariant value();

private:
    template<typename List> auto anyOf(const List &list) -> decltype(list[0])
    {
        return list[random(int(std::size(list)))];
    }
    int random(int bound) { return int(m_random->bounded(bound)); }
    bool often() { return random(4) != 0; }

    void writeOrRemove(const QString &path, const QByteArray &content);
    // Writes or removes a file of the directory, or changes the directory itself.
    void changeDefinition(const QString &directory, const QString &suffix, QByteArray content);
    void changeWidgets();
    void changeDirectory(const QString &directory);
    void changeCatalogs();
    void changeTexts();
    void changeSettings();
    void killSettingsService();
    void changeCard();
    void changeDiskService();
    void changeHelper();
    void changeCover();
    void changeService();

    QRandomGenerator *m_random;
    ScratchFileSystem m_card;
    std::unique_ptr<CardHelper> m_helper;
    std::unique_ptr<DiskServicePeer> m_diskService;
    std::unique_ptr<CoverDaemon> m_cover;
    std::unique_ptr<RecordingService> m_service;
};

#endif
