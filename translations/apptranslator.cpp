// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "apptranslator.h"

#include "catalogfiles.h"

#include <QCryptographicHash>
#include <QEvent>
#include <QFile>
#include <QLocale>

using namespace CatalogFiles;

namespace {

const QLatin1String catalog("settings-system");

bool loadForDefaultLocale(QTranslator *translator)
{
    return translator->load(QLocale(), catalog, localePrefix, directory);
}

// A digest of the file that would be loaded now; empty without a file.
QByteArray digestForDefaultLocale()
{
    QTranslator translator;
    QCryptographicHash digest(QCryptographicHash::Sha1);
    if (!loadForDefaultLocale(&translator)) {
        return {};
    }
    QFile file(translator.filePath());
    return file.open(QIODevice::ReadOnly) && digest.addData(&file) ? digest.result() : QByteArray();
}

} // namespace

void AppTranslator::loadEngineeringEnglish()
{
    static_cast<void>(load(catalog + engineeringEnglishSuffix, directory));
}

void AppTranslator::loadDefaultLocale()
{
    // First: if the file is replaced in between, the next language change loads it.
    m_loaded = digestForDefaultLocale();
    static_cast<void>(loadForDefaultLocale(this));
}

bool AppTranslator::eventFilter(QObject *watched, QEvent *event)
{
    // Loading a file posts another language change, which a host passes on to the watched object.
    // Only a new file is loaded; otherwise this would never end.
    if (event->type() == QEvent::LanguageChange && digestForDefaultLocale() != m_loaded) {
        loadDefaultLocale();
    }
    return QTranslator::eventFilter(watched, event);
}
