// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "loggedtest.h"
#include "texts.h"
#include "translations/catalogfiles.h"

#include <QFile>
#include <QLocale>
#include <QRandomGenerator>
#include <QTranslator>
#include <QtTest>

class TestCatalogFiles : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void choosesTheFilesThatQtChooses_data();
    void choosesTheFilesThatQtChooses();
    void namesStayInTheDirectory();
};

void TestCatalogFiles::choosesTheFilesThatQtChooses_data()
{
    QTest::addColumn<QString>("catalog");
    QTest::addColumn<QString>("locale");
    for (const auto &catalog : {"maps"_s, "city_maps.v2"_s, "_maps"_s, "kartta-\u00e4"_s}) {
        for (const auto &locale : {"fi_FI"_s, "de_AT"_s, "zh_Hant_TW"_s, "pt_BR"_s, "C"_s}) {
            QTest::addRow("%s in %s", qPrintable(catalog), qPrintable(locale)) << catalog << locale;
        }
    }
}

void TestCatalogFiles::choosesTheFilesThatQtChooses()
{
    QFETCH(QString, catalog);
    QFETCH(QString, locale);
    const QString directory = "/usr/share/translations"_s;
    Files::installCatalog("maps-fi"_s);
    QFile compiled(directory + "/maps-fi.qm"_s);
    QVERIFY(compiled.open(QIODevice::ReadOnly));
    const QByteArray content = compiled.readAll();
    compiled.remove();

    // Every name that could be tried, and others.
    QStringList names;
    const QStringList languages = QLocale(locale).uiLanguages();
    for (QString language : languages + QStringList{"fi"_s, "de"_s, "zh"_s, "zh_TW"_s, ""_s}) {
        language.replace("-"_s, "_"_s);
        while (true) {
            names += {catalog + "-"_s + language, catalog + "-"_s + language.toLower()};
            const int end = language.lastIndexOf("_"_s);
            if (end < 0) {
                break;
            }
            language.truncate(end);
        }
    }
    for (QString name = catalog + "_eng_en"_s; !name.isEmpty(); name.chop(1)) {
        names += name;
    }
    for (const QString &name : QStringList(names)) {
        names += name + ".qm"_s;
    }
    names.removeDuplicates();

    QRandomGenerator random(1);
    for (int round = 0; round < 25; ++round) {
        QStringList present;
        for (const QString &name : qAsConst(names)) {
            // From many files to few.
            const QString path = directory + "/"_s + name;
            if (random.bounded(25) < 25 - round) {
                continue;
            }
            present.append(path);
            switch (random.bounded(8)) {
            case 0:
                Files::makeDirectory(path);
                break;
            case 1:
                Files::makeLink("/nowhere"_s, path);
                break;
            default:
                Files::write(path, content);
            }
        }
        QTranslator translator;
        QCOMPARE(CatalogFiles::findLanguage(catalog, QLocale(locale)),
                 translator.load(QLocale(locale), catalog, "-"_s, directory) ? translator.filePath()
                                                                             : QString());
        QCOMPARE(CatalogFiles::findEngineeringEnglish(catalog),
                 translator.load(catalog + "_eng_en"_s, directory) ? translator.filePath()
                                                                   : QString());
        for (const QString &path : qAsConst(present)) {
            Files::remove(path);
        }
    }
}

void TestCatalogFiles::namesStayInTheDirectory()
{
    for (const auto &name : {"maps"_s, "city_maps.v2"_s, ".."_s, ":maps"_s, "maps-fi"_s}) {
        QVERIFY2(CatalogFiles::isCatalogName(name), qPrintable(name));
    }
    for (const auto &name : {""_s, "/"_s, "/tmp/maps"_s, "../maps"_s, "maps/city"_s, "maps/"_s}) {
        QVERIFY2(!CatalogFiles::isCatalogName(name), qPrintable(name));
    }
    QVERIFY(!CatalogFiles::isCatalogName("maps"_s + QChar::Null));
    // For QTranslator this would be a resource of the program.
    QCOMPARE(CatalogFiles::findEngineeringEnglish(":maps"_s), QString());
}

QTEST_GUILESS_MAIN(TestCatalogFiles)

#include "tst_catalogfiles.moc"
