// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "apptranslator.h"

#include "catalogfiles.h"

#include <QEvent>
#include <QLocale>

using namespace CatalogFiles;

namespace {

const QLatin1String catalog("settings-system");

} // namespace

AppTranslator::AppTranslator(QObject *parent) : QTranslator(parent)
{
}

void AppTranslator::loadEngineeringEnglish()
{
    static_cast<void>(load(catalog + engineeringEnglishSuffix, directory));
}

void AppTranslator::loadDefaultLocale()
{
    static_cast<void>(load(QLocale(), catalog, localePrefix, directory));
}

bool AppTranslator::eventFilter(QObject *watched, QEvent *event)
{
    if (event->type() == QEvent::LanguageChange) {
        loadDefaultLocale();
    }
    return QTranslator::eventFilter(watched, event);
}
