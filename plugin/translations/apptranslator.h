// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef APPTRANSLATOR_H
#define APPTRANSLATOR_H

#include <QTranslator>

/*
    A translator of the settings pages' catalog, "settings-system" in /usr/share/translations.

    Installed as an event filter on an object, it loads the catalog anew whenever a language change
    reaches that object, so that pages follow the language of the system without a restart.
*/
class AppTranslator : public QTranslator
{
    Q_OBJECT

public:
    explicit AppTranslator(QObject *parent);

    // Both load in place of what was loaded before. A catalog that does not exist is no error: the
    // translator is then empty, and look-ups fall through to those installed before it.
    void loadEngineeringEnglish();
    void loadDefaultLocale();

    bool eventFilter(QObject *watched, QEvent *event) override;
};

#endif
