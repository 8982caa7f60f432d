// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef APPTRANSLATOR_H
#define APPTRANSLATOR_H

#include <QByteArray>
#include <QTranslator>

/*
    A translator of the settings pages' catalog, "settings-system" in /usr/share/translations.

    Installed as an event filter on an object, it reloads the catalog when a language change reaches
    that object, so that pages follow the language of the system without a restart.
*/
class AppTranslator : public QTranslator
{
    Q_OBJECT

public:
    using QTranslator::QTranslator;

    // Without its catalog the translator is empty, which is not an error.
    void loadEngineeringEnglish();
    void loadDefaultLocale();

    bool eventFilter(QObject *watched, QEvent *event) override;

private:
    // The digest of the file that loadDefaultLocale() loaded.
    QByteArray m_loaded;
};

#endif
