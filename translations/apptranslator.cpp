// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "apptranslator.h"

#include "catalogfiles.h"

#include <QEvent>
#include <QFileInfo>
#include <QLocale>

namespace {

const QString catalog = QStringLiteral("settings-system");

} // namespace

void AppTranslator::loadEngineeringEnglish()
{
    loadFileIfFound(CatalogFiles::findEngineeringEnglish(catalog));
}

void AppTranslator::loadDefaultLocale()
{
    // First: if the file is replaced in between, the next language change loads it.
    m_loaded = findDefaultLocale();
    if (!loadFileIfFound(m_loaded.path)) {
        m_loaded = {}; // The next language change tries again.
    }
}

bool AppTranslator::eventFilter(QObject *watched, QEvent *event)
{
    // Loading a file posts another language change, which a host passes on to the watched object.
    // So only a new file is loaded, or one that could not be read: while the translator stays empty
    // it posts nothing. Otherwise this would never end.
    if (event->type() == QEvent::LanguageChange && !(findDefaultLocale() == m_loaded)) {
        loadDefaultLocale();
    }
    return QTranslator::eventFilter(watched, event);
}

AppTranslator::Version AppTranslator::findDefaultLocale()
{
    const QString path = CatalogFiles::findLanguage(catalog, QLocale());
    const QFileInfo file(path);
    return {path, file.size(), file.metadataChangeTime()};
}
