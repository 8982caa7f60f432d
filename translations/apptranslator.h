// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef APPTRANSLATOR_H
#define APPTRANSLATOR_H

#include "checkedtranslator.h"

#include <QDateTime>
#include <QString>

/*
    A translator of the settings pages' catalog, "settings-system" in /usr/share/translations.

    Installed as an event filter on an object, it reloads the catalog when a language change reaches
    that object, so that pages follow the language of the system without a restart.
*/
class AppTranslator : public CheckedTranslator
{
    Q_OBJECT

public:
    using CheckedTranslator::CheckedTranslator;

    // Without its catalog the translator is empty, which is not an error.
    void loadEngineeringEnglish();
    void loadDefaultLocale();

    bool eventFilter(QObject *watched, QEvent *event) override;

private:
    // A file that is replaced or rewritten is another version.
    struct Version {
        QString path;
        qint64 size = 0;
        QDateTime changed;
        bool operator==(const Version &other) const
        {
            return path == other.path && size == other.size && changed == other.changed;
        }
    };

    static Version findDefaultLocale();

    Version m_loaded;
};

#endif
