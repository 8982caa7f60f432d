// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "apptranslator.h"

#include <QEvent>
#include <QLocale>

namespace {

const QLatin1String catalog("settings-system");
const QLatin1String engineeringEnglishCatalog("settings-system_eng_en");
const QLatin1String prefix("-");
const QLatin1String directory("/usr/share/translations");

} // namespace

AppTranslator::AppTranslator(QObject *parent) : QTranslator(parent)
{
}

void AppTranslator::loadEngineeringEnglish()
{
    static_cast<void>(load(engineeringEnglishCatalog, directory));
}

void AppTranslator::loadDefaultLocale()
{
    static_cast<void>(load(QLocale(), catalog, prefix, directory));
}

bool AppTranslator::eventFilter(QObject *watched, QEvent *event)
{
    if (event->type() == QEvent::LanguageChange) {
        loadDefaultLocale();
    }
    return QTranslator::eventFilter(watched, event);
}
