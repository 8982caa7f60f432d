// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "documents/termsofusemanager.h"
#include "files.h"
#include "files/regularfile.h"
#include "loggedtest.h"
#include "texts.h"

#include <QtTest>

#include <functional>

class TestTermsOfUseManager : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void vendorPath();
    void hasVendorTermsOfUse();

    void findsTheBestFile_data();
    void findsTheBestFile();

    void readsTitleAndBody_data();
    void readsTitleAndBody();
    void filesThatCannotBeOpened_data();
    void filesThatCannotBeOpened();

    void vendorTermsAndSummary();
    void vendorTermsWithoutAPath();
    void readsOnEveryCall();
};

using Make = std::function<void(const QString &)>;
Q_DECLARE_METATYPE(Make)

namespace {

const QString platformDirectory = "/usr/share/marlo-settings/platform-eula"_s;
const QString vendorDirectory = "/var/lib/marlo-vendor"_s;
const QString noTerms =
    "warning [default] TermsOfUseManager: unable to load either the specified locale or the "
    "English terms"_s;

QString platformFile(const QString &locale)
{
    return platformDirectory + "/tarnwick_termsofuse-%1.txt"_s.arg(locale);
}

QString noLocalTerms(const QString &locale)
{
    return "warning [default] TermsOfUseManager: unable to load locale-specific "
           "terms for locale \"%1\""_s.arg(locale);
}

} // namespace

void TestTermsOfUseManager::init()
{
    Files::remove(platformDirectory);
    Files::remove(vendorDirectory);
    LoggedTest::init();
}

void TestTermsOfUseManager::vendorPath()
{
    TermsOfUseManager manager;
    QSignalSpy changed(&manager, &TermsOfUseManager::vendorPathChanged);
    QCOMPARE(manager.vendorPath(), QString());
    manager.setVendorPath(QString());
    manager.setVendorPath(""_s);
    QVERIFY(changed.isEmpty());
    manager.setVendorPath(vendorDirectory);
    QCOMPARE(manager.vendorPath(), vendorDirectory);
    QCOMPARE(changed.size(), 1);
    manager.setVendorPath(vendorDirectory);
    QCOMPARE(changed.size(), 1);
    manager.setVendorPath(QString());
    QCOMPARE(manager.vendorPath(), QString());
    QCOMPARE(changed.size(), 2);
}

void TestTermsOfUseManager::hasVendorTermsOfUse()
{
    TermsOfUseManager manager;
    QVERIFY(!manager.hasVendorTermsOfUse());
    manager.setVendorPath(vendorDirectory);
    QVERIFY(!manager.hasVendorTermsOfUse());
    // Every read checks the path again. The path may be any kind of entry.
    Files::makeDirectory(vendorDirectory);
    QVERIFY(manager.hasVendorTermsOfUse());
    Files::remove(vendorDirectory);
    QVERIFY(!manager.hasVendorTermsOfUse());
    Files::write(vendorDirectory, {});
    QVERIFY(manager.hasVendorTermsOfUse());
    // Qt's resources are not in the file system, and a path ends at no NUL.
    for (const QString &path :
         {QString(), "no path at all"_s, ":/"_s, vendorDirectory + QChar::Null}) {
        manager.setVendorPath(path);
        QVERIFY(!manager.hasVendorTermsOfUse());
    }
}

void TestTermsOfUseManager::findsTheBestFile_data()
{
    QTest::addColumn<QString>("locale");
    QTest::addColumn<QStringList>("files");
    QTest::addColumn<QString>("found");
    QTest::addColumn<bool>("isWarned");

    const auto row = [](const char *locale, const char *files, const char *found, bool isWarned) {
        QTest::addRow("%s of %s", locale, files)
            << QString::fromLatin1(locale) << QString::fromLatin1(files).split(QLatin1Char(','))
            << QString::fromLatin1(found) << isWarned;
    };
    row("fi_FI.UTF-8", "fi_FI.UTF-8,fi,fi_FI,en_GB", "fi_FI.UTF-8", false);
    row("fi_FI.UTF-8", "fi,fi_FI,en_GB", "fi", false); // the language alone comes first, on purpose
    row("fi_FI.UTF-8", "fi", "fi", false);
    row("fi_FI.UTF-8", "fi_FI,en_GB", "fi_FI", false);
    row("C.UTF-8", "C,en_GB", "C", false);
    row("fi_FI", "fi_FI,fi,en_GB", "fi_FI", false);
    row("fi_FI", "fi,en_GB", "fi", false);
    row("fi", "fi,en_GB", "fi", false);
    row("fil_PH", "fi,fil,en_GB", "fi", false); // the first two characters, whatever they are
    row("fil_PH.UTF-8", "fil_PH,en_GB", "fil_PH", false);
    row("sr_RS.UTF-8@latin", "sr_RS,en_GB", "sr_RS", false);
    row("sr_RS.a.b", "sr_RS.a,sr_RS", "sr_RS", false);
    row("x", "x,en_GB", "x", false);
    row("en_GB", "en_GB,en", "en_GB", false);
    row("en_GB", "en", "en", false);
    row("en_US", "en,en_GB", "en", false);
    row("en_GB.UTF-8", "en_GB", "en_GB", false);
    // English, with a warning.
    row("de_DE", "en_GB", "en_GB", true);
    row("de_DE", "en", "en", true);
    row("de_DE", "en_GB,en,fi,de_AT", "en_GB", true);
    row("de_DE.UTF-8", "en_GB", "en_GB", true);
    // If the locale has no encoding, only a file with the whole locale name matches.
    row("de_DE@euro", "de_DE,en_GB", "en_GB", true);
    row(".UTF-8", "en_GB", "en_GB", true);
    row(".UTF-8", ",en_GB", "en_GB", true); // a dot at the beginning ends no locale
    row("", "en_GB", "en_GB", true);
    row("d", "de,en_GB", "en_GB", true);
    row("../de", "de,en_GB", "en_GB", true);
    // Nothing, not even in English.
    row("de_DE", "fi,en_US,de_AT", "", true);
    row("en_GB.UTF-8", "fi,en_US,de_AT", "", true);
    row("en_GB", "fi,en_US,de_AT", "", false);
}

void TestTermsOfUseManager::findsTheBestFile()
{
    QFETCH(QString, locale);
    QFETCH(QStringList, files);
    QFETCH(QString, found);
    QFETCH(bool, isWarned);
    // The title of each file is its locale.
    for (const QString &file : files) {
        Files::write(platformFile(file), file.toUtf8() + "\nbody");
    }
    const QStringList terms = TermsOfUseManager().platformTermsOfUse(locale);
    QCOMPARE(terms, found.isEmpty() ? QStringList() : QStringList({found, "body"_s}));
    QStringList warnings;
    if (isWarned) {
        warnings.append(noLocalTerms(locale));
    }
    if (found.isEmpty()) {
        warnings.append(noTerms);
    }
    QCOMPARE(m_log->takeReport(), warnings.join(QLatin1Char('\n')));
}

void TestTermsOfUseManager::readsTitleAndBody_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("title");
    QTest::addColumn<QString>("body");

    const auto row = [](const char *name, const QByteArray &content, const char *title,
                        const char *body) { QTest::newRow(name) << content << title << body; };
    row("one line", "Terms", "Terms", "");
    row("one line with its end", "Terms\n", "Terms", "");
    row("lines", "Terms\n\n One\n\n Two \n\n", "Terms", "One\n\n Two");
    row("blanks", " \t Terms \n \t \n", "Terms", "");
    row("carriage returns", "Terms\r\nOne\r\nTwo\r\n", "Terms", "One\nTwo");
    row("empty", "", "", "");
    row("an empty line first", "\nTerms\n", "", "Terms");
    row("UTF-8", "Käyttö\n✓", "Käyttö", "✓");
    row("byte-order mark", "\uFEFFTerms\nbody", "Terms", "body");
    row("blanks outside ASCII", "\u00A0Terms\u2003\n\u00A0x", "Terms", "x");
    row("NUL", QByteArray("Terms \0x\nbody \0x\n", 17), "Terms", "body");
    const QByteArray title(100000, 'a');
    const QByteArray body(300000, 'b');
    row("long", title + '\n' + body, title.constData(), body.constData());
}

void TestTermsOfUseManager::readsTitleAndBody()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, title);
    QFETCH(QString, body);
    Files::write(platformFile("fi"_s), content);
    QCOMPARE(TermsOfUseManager().platformTermsOfUse("fi"_s), QStringList({title, body}));
}

void TestTermsOfUseManager::filesThatCannotBeOpened_data()
{
    QTest::addColumn<Make>("make");
    QTest::addColumn<QString>("error");
    const auto row = [](const char *name, const Make &make, const char *error) {
        QTest::newRow(name) << make << error;
    };
    row("directory", Files::makeDirectory, "file to open is a directory");
    row("pipe", Files::makePipe, "file to open is not a regular file");
    row(
        "device", [](const QString &path) { Files::makeLink("/dev/zero"_s, path); },
        "file to open is not a regular file");
    row(
        "too large", [](const QString &path) { Files::makeSparse(path, maximumTextSize + 1); },
        "file to open is larger than 16777216 bytes");
    row(
        "larger than memory", [](const QString &path) { Files::makeSparse(path, qint64(1) << 40); },
        "file to open is larger than 16777216 bytes");
}

void TestTermsOfUseManager::filesThatCannotBeOpened()
{
    QFETCH(Make, make);
    QFETCH(QString, error);
    // If fi_FI exists, these files are not used instead.
    Files::write(platformFile("fi"_s), "fi\nbody");
    Files::write(platformFile("en_GB"_s), "en_GB\nbody");
    const QString path = platformFile("fi_FI"_s);
    make(path);
    QCOMPARE(TermsOfUseManager().platformTermsOfUse("fi_FI"_s), QStringList());
    QCOMPARE(m_log->takeReport(),
             "warning [default] TermsOfUseManager: unable to load terms from file "
             "\"%1\"\nwarning [default] \"%2\""_s.arg(path, error));
}

void TestTermsOfUseManager::vendorTermsAndSummary()
{
    Files::write(platformFile("fi"_s), "fi\nbody");
    Files::write(vendorDirectory + "/full/fi.txt"_s, "Full\nfull body\n");
    Files::write(vendorDirectory + "/full/en_GB.txt"_s, "English\n");
    Files::write(vendorDirectory + "/summary/fi.txt"_s, "Summary\nsummary body\n");
    TermsOfUseManager manager;
    manager.setVendorPath(vendorDirectory);
    const auto joined = [](const QStringList &terms) { return terms.join(QLatin1Char('|')); };
    const QString locale = "fi_FI.UTF-8"_s;
    QCOMPARE(joined(manager.vendorTermsOfUse(locale)), "Full|full body"_s);
    QCOMPARE(joined(manager.vendorTermsSummary(locale)), "Summary|summary body"_s);
    QCOMPARE(joined(manager.platformTermsOfUse(locale)), "fi|body"_s);

    const QString german = "de_DE"_s;
    QCOMPARE(joined(manager.vendorTermsOfUse(german)), "English|"_s);
    QCOMPARE(m_log->takeReport(), noLocalTerms(german));
    QCOMPARE(manager.vendorTermsSummary(german), QStringList());
    QCOMPARE(m_log->takeReport(), noLocalTerms(german) + QLatin1Char('\n') + noTerms);
}

void TestTermsOfUseManager::vendorTermsWithoutAPath()
{
    const TermsOfUseManager manager;
    const QString locale = "fi"_s;
    for (const QStringList &terms :
         {manager.vendorTermsOfUse(locale), manager.vendorTermsSummary(locale)}) {
        QCOMPARE(terms, QStringList());
    }
    const QString warnings = noLocalTerms(locale) + QLatin1Char('\n') + noTerms;
    QCOMPARE(m_log->takeReport(), warnings + QLatin1Char('\n') + warnings);
}

void TestTermsOfUseManager::readsOnEveryCall()
{
    const TermsOfUseManager manager;
    const QString locale = "fi"_s;
    for (const char *title : {"one", "two"}) {
        Files::write(platformFile(locale), title);
        QCOMPARE(manager.platformTermsOfUse(locale).value(0), QString::fromLatin1(title));
    }
    Files::remove(platformFile(locale));
    QCOMPARE(manager.platformTermsOfUse(locale), QStringList());
    QCOMPARE(m_log->takeReport(), noLocalTerms(locale) + QLatin1Char('\n') + noTerms);
}

QTEST_GUILESS_MAIN(TestTermsOfUseManager)

#include "tst_termsofusemanager.moc"
