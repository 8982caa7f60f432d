// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "languagelistener.h"
#include "loggedtest.h"
#include "texts.h"
#include "translations/catalogtable.h"
#include "words.h"

#include <QTextCodec>
#include <QTranslator>
#include <QtTest>

class TestCatalogTable : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void sharesOneCatalogAmongItsUsers();
    void installsCatalogsThatDoNotExist();
    void keepsItsLanguageUntilItIsRemoved();
    void removingTheUnknownIsHarmless();
    void mayBeCalledBackByLanguageChanges();
    void tablesShareNothing();
    void treatsADamagedCatalogAsMissing();
    void refusesNamesThatLeaveTheDirectory();
    void looksUpTheIdentifierInTheEncodingOfTheLocale();

private:
    QList<QTranslator *> translators() const { return m_owner->findChildren<QTranslator *>(); }

    std::unique_ptr<QObject> m_owner;
    std::unique_ptr<CatalogTable> m_table;
};

namespace {

const QString maps = "maps"_s;
const QString a = "/definitions/a"_s;
const QString b = "/definitions/b"_s;

QString title()
{
    return qtTrId("maps-title");
}

QString englishOnly()
{
    return qtTrId("maps-english");
}

} // namespace

void TestCatalogTable::init()
{
    Files::installCatalogs(words("maps_eng_en maps-fi maps-de"));
    QLocale::setDefault(QLocale("fi_FI"_s));
    LoggedTest::init();
    m_owner = std::make_unique<QObject>();
    m_table = std::make_unique<CatalogTable>(m_owner.get());
}

void TestCatalogTable::cleanup()
{
    m_table.reset();
    m_owner.reset();
    QCOMPARE(title(), "maps-title"_s);
    LoggedTest::cleanup();
}

void TestCatalogTable::sharesOneCatalogAmongItsUsers()
{
    m_table->addDefinition(a, maps);
    m_table->addDefinition(a, maps);
    m_table->addDefinition(b, maps);
    QCOMPARE(translators().size(), 2);

    // One removal removes every use of a definition file. The language wins over engineering
    // English.
    m_table->removeDefinition(a, maps);
    QCOMPARE(title(), "Kartat"_s);
    QCOMPARE(englishOnly(), "Maps, English only"_s);

    m_table->removeDefinition(b, maps);
    QCOMPARE(title(), "maps-title"_s);
    QCOMPARE(englishOnly(), "maps-english"_s);
}

void TestCatalogTable::installsCatalogsThatDoNotExist()
{
    m_table->addDefinition(a, "nowhere"_s);
    QCOMPARE(translators().size(), 2);
    QVERIFY(translators().at(0)->isEmpty());
    QVERIFY(translators().at(1)->isEmpty());
    QCOMPARE(title(), "maps-title"_s);

    // Empty translators are installed, too: once the test loads a file into one, titles use it.
    QVERIFY(translators().at(1)->load("maps-fi"_s, "/usr/share/translations"_s));
    QCOMPARE(title(), "Kartat"_s);
    m_table->removeDefinition(a, "nowhere"_s);
    QCOMPARE(title(), "maps-title"_s);
}

void TestCatalogTable::keepsItsLanguageUntilItIsRemoved()
{
    m_table->addDefinition(a, maps);
    QLocale::setDefault(QLocale("de_DE"_s));
    m_table->addDefinition(b, maps);
    QCOMPARE(title(), "Kartat"_s);

    m_table->removeDefinition(a, maps);
    m_table->removeDefinition(b, maps);
    // A caller that is using a translator can continue to use it.
    QCOMPARE(translators().size(), 2);
    m_table->addDefinition(a, maps);
    QCOMPARE(translators().size(), 4);
    QCOMPARE(title(), "Karten"_s);
}

void TestCatalogTable::removingTheUnknownIsHarmless()
{
    // An empty name is no catalog.
    m_table->addDefinition(a, QString());
    QCOMPARE(translators().size(), 0);
    m_table->removeDefinition(a, QString());

    m_table->removeDefinition(a, maps);
    m_table->addDefinition(a, maps);
    m_table->removeDefinition(b, maps);
    m_table->removeDefinition(a, "atlas"_s);
    QCOMPARE(title(), "Kartat"_s);
}

void TestCatalogTable::mayBeCalledBackByLanguageChanges()
{
    // Installing or removing a catalog with texts sends a language change immediately.
    LanguageListener listener([this] {
        m_table->addDefinition(b, "nowhere"_s);
        m_table->removeDefinition(b, "nowhere"_s);
        m_table->addDefinition(b, maps);
    });
    m_table->addDefinition(a, maps);
    QCOMPARE(listener.count, 1);
    m_table->removeDefinition(a, maps);
    QCOMPARE(title(), "Kartat"_s);
    m_table->clear();
}

void TestCatalogTable::tablesShareNothing()
{
    QObject otherOwner;
    CatalogTable other(&otherOwner);
    other.addDefinition(a, maps);
    m_table->addDefinition(a, maps);
    QCOMPARE(otherOwner.findChildren<QTranslator *>().size(), 2);
    QCOMPARE(translators().size(), 2);

    m_table->removeDefinition(a, maps);
    QCOMPARE(title(), "Kartat"_s);
}

void TestCatalogTable::treatsADamagedCatalogAsMissing()
{
    Files::write("/usr/share/translations/maps-fi.qm"_s, "damaged");
    m_table->addDefinition(a, maps);
    m_table->addDefinition(b, maps);
    QCOMPARE(title(), "Maps"_s);
    QCOMPARE(m_log->takeTexts(),
             QStringList(
                 "The translation catalog \"/usr/share/translations/maps-fi.qm\" is not used: it "
                 "does not begin like a catalog"_s));
    m_table->clear();
}

void TestCatalogTable::refusesNamesThatLeaveTheDirectory()
{
    const QString name = "../elsewhere/maps"_s;
    m_table->addDefinition(a, name);
    m_table->addDefinition(b, name);
    QCOMPARE(m_log->takeTexts(),
             QStringList("The translation catalog \"%1\" of \"%2\" is not used: "
                         "its name leads out of \"/usr/share/translations\""_s.arg(name, a)));
    m_table->removeDefinition(a, name);
    QCOMPARE(translators().size(), 0);
}

void TestCatalogTable::looksUpTheIdentifierInTheEncodingOfTheLocale()
{
    class Echo : public QTranslator
    {
    public:
        bool isEmpty() const override { return false; }
        QString translate(const char *, const char *id, const char *, int) const override
        {
            return QString::fromLatin1(id);
        }
    };
    Echo echo;
    QCoreApplication::installTranslator(&echo);
    QTextCodec *const before = QTextCodec::codecForLocale();
    QTextCodec::setCodecForLocale(QTextCodec::codecForName("ISO-8859-1"));
    const QString text = CatalogTable::text("ä"_s);
    QTextCodec::setCodecForLocale(before);
    QCOMPARE(text, "ä"_s);
}

QTEST_GUILESS_MAIN(TestCatalogTable)

#include "tst_catalogtable.moc"
