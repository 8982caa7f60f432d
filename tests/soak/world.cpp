// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "world.h"
#include "texts.h"

#include "files.h"
#include "mgconfitem.h"
#include "places.h"
#include "words.h"

#include <QDBusConnection>
#include <QDBusConnectionInterface>
#include <QDBusReply>
#include <QFile>

#include <array>
#include <csignal>

namespace {

const QString elsewhere = "/usr/share/glimmera/elsewhere"_s;
const QString availableFile = "/usr/share/glimmera/available"_s;
const QString mountTable = "/etc/mtab"_s;
const QString device = "/dev/soak-card1"_s;
const QString session = "com.marlo.torch"_s;

const QStringList names = words("a b c d e f");
const QStringList catalogs =
    words("maps-fi maps-de maps_eng_en settings-system-fi settings-system_eng_en");
const QStringList keys = {Places::enabledActions, Places::blockedActions, Places::enabledWidgets,
                          "/settings/location/gps_enabled"_s,
                          "/settings/location/custom_settings"_s};
const QStringList files =
    words("/usr/share/marlo-settings/platform-eula/tarnwick_termsofuse-fi.txt "
          "/usr/share/marlo-settings/platform-eula/tarnwick_termsofuse-en_GB.txt "
          "/var/lib/bluetooth/board-address /usr/share/modem-software/features.ini "
          "/usr/sbin/apkd /usr/share/libherepositioning/agreements/here_consent_en_GB.txt");
const QStringList values = QStringList(QString())
    + words("title enabled path title.nothing fi_FI.UTF-8 en_GB vfat ext4 soak-card1 "
            "/dev/soak-card1 /dev/soak-card2 /usr/share/marlo-settings/platform-eula "
            "/usr/share/glimmera/quickactions");
const QStringList diskScenarios =
    words("done slow hung gone DeviceBusy AlreadyMounted UnknownError Mount=done absent");
const QStringList helperScenarios = words("done done exit=1 crash slow held noisy");
const QStringList coverProperties = words("KIVID Ready");

const std::array<QByteArray, 6> actions = {
    "title=a-title\ntranslation-catalog=maps\npriority=%1\nremote-service=com.marlo.torch\n"
    "remote-path=/\nremote-interface=com.marlo.torch\nremote-method=toggle\n"
    "[remote-arguments]\nsize=1\n1\\argument=%1\n",
    "title=%1\nicon=%1\nremote-service=com.marlo.absent\nremote-path=/\n"
    "remote-interface=a.b\nremote-method=c\nrequires-package=p\n",
    "[section without an end\n",
    "title=@Variant(\\0\\0\\0)\n",
    "",
    "translation-catalog=missing\nremote-service=nonsense\n",
};
const std::array<QByteArray, 6> widgets = {
    R"({"translation_catalog": "maps", "widgets": [{"path": "/w/%1", "title": "%1", "order": %1}]})",
    R"({"widgets": [{"path": "/w/a"}, {"path": "/w/b", "default_enabled": true}, {"path": "/w/c",
        "available_path": "/usr/share/glimmera/available"}, {"path": "/w/%1"}]})",
    R"({"widgets": [)",
    R"([%1])",
    "",
    R"({"widgets": [{}, 1, null, {"path": "/w/a", "order": -1}]})",
};

} // namespace

World::World(QRandomGenerator *random) : m_random(random)
{
    // Done before anything can search the machine's own table for cards.
    Files::remove(mountTable);
    Files::write(mountTable, {});
    settle();
}

void World::changeSomething()
{
    switch (random(12)) {
    case 0:
    case 1:
        return changeDefinition(Places::quickActions, ".conf"_s, anyOf(actions));
    case 2:
    case 3:
        return changeWidgets();
    case 4:
        return changeCatalogs();
    case 5:
        return changeTexts();
    case 6:
        return random(20) == 0 ? killSettingsService() : changeSettings();
    case 7:
    case 8:
        return random(10) == 0 ? changeDiskService() : changeCard();
    case 9:
        return changeHelper();
    case 10:
        return changeCover();
    default:
        return changeService();
    }
}

void World::settle()
{
    m_diskService.reset();
    m_cover.reset();
    m_service.reset();
    m_helper.reset();
    m_helper = std::make_unique<CardHelper>();
}

QString World::text()
{
    const QStringList texts = {Places::quickActions + QLatin1Char('/') + anyOf(names) + ".conf"_s,
                               "/w/"_s + anyOf(names), anyOf(files), anyOf(values)};
    return anyOf(texts);
}

QVariant World::value()
{
    const QVariantList values = {random(2) == 0,
                                 random(8) - 2,
                                 text(),
                                 QStringList{text(), text()},
                                 QVariantList{random(3), text()},
                                 QVariantMap{{anyOf(names), random(100)}},
                                 QVariant()};
    return anyOf(values);
}

void World::changeDefinition(const QString &directory, const QString &suffix, QByteArray content)
{
    if (random(20) == 0) {
        changeDirectory(directory);
    } else {
        writeOrRemove(directory + QLatin1Char('/') + anyOf(names) + suffix,
                      content.replace("%1", QByteArray::number(random(9))));
    }
}

void World::writeOrRemove(const QString &path, const QByteArray &content)
{
    if (often()) {
        Files::write(path, content);
    } else {
        Files::remove(path);
    }
}

void World::changeWidgets()
{
    if (random(8) != 0) {
        changeDefinition(Places::eventsWidgets, ".json"_s, anyOf(widgets));
    } else {
        writeOrRemove(availableFile, {});
    }
}

void World::changeDirectory(const QString &directory)
{
    Files::remove(directory);
    const int choice = random(3); // otherwise it is made with its next file
    if (choice == 0) {
        Files::makeDirectory(directory);
    } else if (choice == 1) {
        Files::makeDirectory(elsewhere);
        Files::makeLink(elsewhere, directory);
    }
}

void World::changeCatalogs()
{
    if (random(2) == 0) {
        Files::installCatalog(anyOf(catalogs));
    } else {
        Files::removeCatalog(anyOf(catalogs));
    }
}

void World::changeTexts()
{
    writeOrRemove(anyOf(files), QByteArray(random(2000), char('a' + random(26))) + "\nvariant=x\n");
}

void World::changeSettings()
{
    const QString key = anyOf(keys);
    MGConfItem(key).set(often() ? QVariant(QStringList{text(), text(), text()}) : value());
}

void World::killSettingsService()
{
    const QDBusReply<uint> pid =
        QDBusConnection::sessionBus().interface()->servicePid("ca.desrt.dconf"_s);
    QFile name("/proc/%1/comm"_s.arg(pid.value()));
    if (pid.isValid() && name.open(QIODevice::ReadOnly) && name.readAll() == "dconf-service\n") {
        kill(pid_t(pid.value()), SIGKILL);
    }
}

void World::changeCard()
{
    const QString card = QFile::decodeName(m_card.path("card"));
    if (random(3) == 0) {
        Files::write(
            mountTable,
            often() ? (device + QLatin1Char(' ') + card + QLatin1String(" tmpfs rw 0 0\n")).toUtf8()
                    : QByteArray());
    }
    Files::write(card + QLatin1Char('/') + anyOf(names) + QLatin1Char('/') + anyOf(names)
                     + QLatin1Char('/') + QString::number(random(50)),
                 {});
}

void World::changeDiskService()
{
    m_diskService.reset(); // only one can own the name at a time
    m_diskService = std::make_unique<DiskServicePeer>(QStringList(anyOf(diskScenarios)));
}

void World::changeHelper()
{
    const int choice = random(8);
    if (choice == 0) {
        m_helper->remove();
    } else if (choice == 1) {
        m_helper->installNotExecutable();
    } else if (choice < 4) {
        m_helper->release();
    } else {
        m_helper->install(anyOf(helperScenarios), QByteArray(random(40), 'x'));
    }
}

void World::changeCover()
{
    if (m_cover == nullptr) {
        m_cover = std::make_unique<CoverDaemon>();
    }
    const QVariant value = random(2) == 0 ? QVariant(text()) : QVariant(random(3));
    const int choice = random(8);
    if (choice == 0) {
        m_cover.reset();
    } else if (choice == 1) {
        m_cover->answerWithError(anyOf(coverProperties));
    } else if (choice == 2) {
        m_cover->sendPropertiesChanged({text()});
    } else if (choice < 5) {
        m_cover->sendChanges({{anyOf(coverProperties), value}});
    } else {
        m_cover->answer(anyOf(coverProperties), {value});
    }
}

void World::changeService()
{
    if (m_service == nullptr) {
        m_service = std::make_unique<RecordingService>(QDBusConnection::SessionBus, session);
    }
    using Answer = RecordingService::Answer;
    if (random(6) == 0) {
        m_service.reset();
    } else {
        const auto answers = {Answer::Error, Answer::Nothing, Answer::Reply, Answer::Reply};
        m_service->setAnswer(*(answers.begin() + random(4)), "com.marlo.Error"_s);
    }
}
