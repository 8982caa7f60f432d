// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "systemsettingsplugin.h"

#include "apptranslator.h"
#include "quickactionsmodel.h"

#include <QCoreApplication>
#include <QQmlEngine>

namespace {

constexpr int versionMajor = 1;
constexpr int versionMinor = 0;

} // namespace

void SystemSettingsPlugin::registerTypes(const char *uri)
{
    qmlRegisterType<QuickActionsModel>(uri, versionMajor, versionMinor, "QuickActionsModel");
}

void SystemSettingsPlugin::initializeEngine(QQmlEngine *engine, const char *uri)
{
    Q_UNUSED(uri)

    // The translator installed last is asked first: engineering English answers only for what the
    // catalog of the language lacks. Both are installed while they are empty, which announces no
    // language change to an application that is still loading.
    auto *engineeringEnglish = new AppTranslator(engine);
    QCoreApplication::installTranslator(engineeringEnglish);
    engineeringEnglish->loadEngineeringEnglish();

    auto *language = new AppTranslator(engine);
    QCoreApplication::installTranslator(language);
    language->loadDefaultLocale();
    engine->installEventFilter(language);
}
