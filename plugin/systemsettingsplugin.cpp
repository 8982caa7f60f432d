// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "systemsettingsplugin.h"

#include "deviceinfo/androidsupport.h"
#include "deviceinfo/bluetoothinfo.h"
#include "deviceinfo/kivinfo.h"
#include "deviceinfo/locationconfiguration.h"
#include "deviceinfo/modemfeaturereader.h"
#include "documents/termsofusemanager.h"
#include "documents/textfilereader.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "eventswidgets/titlesview.h"
#include "memorycard/memorycardformatter.h"
#include "quickactions/quickactionsmodel.h"
#include "translations/apptranslator.h"

#include <QCoreApplication>
#include <QQmlEngine>

namespace {

constexpr int versionMajor = 1;
constexpr int versionMinor = 0;

} // namespace

void SystemSettingsPlugin::registerTypes(const char *uri)
{
    // The engine takes ownership.
    qmlRegisterSingletonType<TextFileReader>(
        uri, versionMajor, versionMinor, "TextFileReader",
        [](QQmlEngine *, QJSEngine *) -> QObject * { return new TextFileReader; });
    qmlRegisterType<AndroidSupport>(uri, versionMajor, versionMinor, "AndroidSupport");
    qmlRegisterType<LocationConfiguration>(uri, versionMajor, versionMinor,
                                           "LocationConfiguration");
    qmlRegisterType<BluetoothInfo>(uri, versionMajor, versionMinor, "BluetoothInfo");
    qmlRegisterType<KivInfo>(uri, versionMajor, versionMinor, "KivInfo");
    qmlRegisterType<QuickActionsModel>(uri, versionMajor, versionMinor, "QuickActionsModel");
    qmlRegisterType<EventsWidgetsModel>(uri, versionMajor, versionMinor, "EventsWidgetsModel");
    qmlRegisterType<TitlesView>(uri, versionMajor, versionMinor, "TitlesView");
    qmlRegisterType<MemoryCardFormatter>(uri, versionMajor, versionMinor, "MemoryCardFormatter");
    qmlRegisterType<ModemFeatureReader>(uri, versionMajor, versionMinor, "ModemFeatures");
    qmlRegisterType<TermsOfUseManager>(uri, versionMajor, versionMinor, "TermsOfUseManager");
}

void SystemSettingsPlugin::initializeEngine(QQmlEngine *engine, const char * /*uri*/)
{
    // The translator installed last is asked first, so engineering English is used only for texts
    // that the catalog of the language lacks. Both are installed while they are empty, so that the
    // language change that a loaded catalog announces arrives through the event loop.
    auto *engineeringEnglish = new AppTranslator(engine);
    QCoreApplication::installTranslator(engineeringEnglish);
    engineeringEnglish->loadEngineeringEnglish();

    auto *language = new AppTranslator(engine);
    QCoreApplication::installTranslator(language);
    language->loadDefaultLocale();
    engine->installEventFilter(language);
}
