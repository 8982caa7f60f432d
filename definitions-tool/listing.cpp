// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "listing.h"

#include "definitionfiles.h"
#include "eventswidgets/eventswidgetsfile.h"
#include "eventswidgets/eventswidgetsmodel.h"
#include "installedcatalogs.h"
#include "quickactions/quickaction.h"
#include "quickactions/quickactionsmodel.h"
#include "translations/catalogfiles.h"

#include <QLocale>
#include <QSet>

#include <algorithm>
#include <iterator>

using namespace CatalogFiles;

namespace {

QString enabledText(bool enabled)
{
    return enabled ? QStringLiteral("enabled ") : QStringLiteral("disabled");
}

QString availableText(bool available)
{
    return available ? QStringLiteral("available  ") : QStringLiteral("unavailable");
}

QString listQuickActions()
{
    QuickActionsModel model;
    model.setShowPotential(true);
    model.componentComplete();
    QString text = QStringLiteral("quick actions: %1\n").arg(model.count());
    for (int row = 0; row < model.count(); ++row) {
        const auto value = [&model, row](int role) { return model.data(model.index(row), role); };
        text += QStringLiteral("  %1  %2  %3\n")
                    .arg(enabledText(value(QuickActionsModel::EnabledRole).toBool()),
                         value(QuickActionsModel::PathRole).toString(),
                         value(QuickActionsModel::TitleRole).toString());
    }
    return text;
}

QString listEventsWidgets()
{
    EventsWidgetsModel model;
    model.componentComplete();
    QString text = QStringLiteral("events widgets: %1\n").arg(model.rowCount());
    for (int row = 0; row < model.rowCount(); ++row) {
        const auto value = [&model, row](int role) { return model.data(model.index(row), role); };
        text += QStringLiteral("  %1  %2  %3  %4\n")
                    .arg(enabledText(value(EventsWidgetsModel::EnabledRole).toBool()),
                         availableText(value(EventsWidgetsModel::AvailableRole).toBool()),
                         value(EventsWidgetsModel::PathRole).toString(),
                         value(EventsWidgetsModel::TitleRole).toString());
    }
    return text;
}

QStringList namedCatalogs()
{
    QSet<QString> catalogs;
    const QStringList files = DefinitionFiles::inDirectory(QuickAction::directory)
        + DefinitionFiles::inDirectory(EventsWidgetsFile::directory);
    for (const QString &file : files) {
        if (DefinitionFiles::isQuickAction(file)) {
            catalogs.insert(QuickAction(file, false).translationCatalog());
        } else if (const auto widgets = readEventsWidgetsFile(file)) {
            catalogs.insert(widgets->translationCatalog);
        }
    }
    QStringList names;
    std::copy_if(catalogs.cbegin(), catalogs.cend(), std::back_inserter(names), isCatalogName);
    names.sort();
    return names;
}

// Returns the path, or "none" if the models do not load the file.
QString loadedFile(const QString &path)
{
    const bool isLoaded = !path.isEmpty() && CheckedTranslator().loadFile(path).isEmpty();
    return isLoaded ? path : QStringLiteral("none");
}

QString fileFor(const QLocale &locale, const QString &catalog)
{
    return loadedFile(findLanguage(catalog, locale));
}

} // namespace

QString listDefinitions()
{
    return listQuickActions() + listEventsWidgets();
}

QString listCatalogs()
{
    InstalledCatalogs installed{QString()};
    QString text;
    const QStringList catalogs = namedCatalogs();
    for (const QString &catalog : catalogs) {
        text += QStringLiteral("%1\n  engineering English: %2\n  current locale, %3: %4\n")
                    .arg(catalog, loadedFile(findEngineeringEnglish(catalog)), QLocale().name(),
                         fileFor(QLocale(), catalog));
        for (const InstalledCatalogs::Language &language : installed.find(catalog).languages) {
            if (!language.name.isEmpty()) {
                text += QStringLiteral("  %1: %2\n")
                            .arg(language.name, fileFor(QLocale(language.name), catalog));
            }
        }
    }
    return text;
}
