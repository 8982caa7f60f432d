// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "loggedtest.h"
#include "translations/catalogtable.h"

#include <QScopedValueRollback>
#include <QtTest>

#include <functional>

class TestCatalogTable : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void sharesOneCatalogAmongItsUsers();
    void prefersTheCatalogOfTheRegion();
    void fallsBackToCatalogsInstalledBefore();
    void installsCatalogsThatDoNotExist();
    void laterCatalogsWin();
    void keepsItsLanguageUntilItIsRemoved();
    void removingTheUnknownIsHarmless();
    void leavesTheApplicationWithItsOwner();
    void mayBeCalledBackByLanguageChanges();
    void tablesShareNothing();
    void treatsADamagedCatalogAsMissing();
    void refusesNamesThatLeaveTheDirectory();

private:
    QList<QTranslator *> translators() const { return m_owner->findChildren<QTranslator *>(); }

    std::unique_ptr<QObject> m_owner;
    std::unique_ptr<CatalogTable> m_table;
};

namespace {

const QString maps = QStringLiteral("maps");
const QString a = QStringLiteral("/definitions/a");
const QString b = QStringLiteral("/definitions/b");

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
    for (const auto *name : {"maps_eng_en", "maps-fi", "maps-de", "atlas_eng_en"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    QLocale::setDefault(QLocale(QStringLiteral("fi_FI")));
    LoggedTest::init();
    m_owner = std::make_unique<QObject>();
    m_table = std::make_unique<CatalogTable>(m_owner.get());
}

void TestCatalogTable::cleanup()
{
    m_table.reset();
    m_owner.reset();
    QCOMPARE(title(), QStringLiteral("maps-title"));
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
    QCOMPARE(title(), QStringLiteral("Kartat"));
    QCOMPARE(englishOnly(), QStringLiteral("Maps, English only"));

    m_table->removeDefinition(b, maps);
    QCOMPARE(title(), QStringLiteral("maps-title"));
    QCOMPARE(englishOnly(), QStringLiteral("maps-english"));
}

void TestCatalogTable::prefersTheCatalogOfTheRegion()
{
    // Finnish, to distinguish it from the other catalog.
    const QString regional = QStringLiteral("/usr/share/translations/maps-de_AT.qm");
    QVERIFY(QFile::copy(QStringLiteral("/usr/share/translations/maps-fi.qm"), regional));
    QLocale::setDefault(QLocale(QStringLiteral("de_AT")));
    m_table->addDefinition(a, maps);
    QCOMPARE(title(), QStringLiteral("Kartat"));
    Files::remove(regional);
}

void TestCatalogTable::fallsBackToCatalogsInstalledBefore()
{
    // Installed earlier and with the same title, as the catalog of the settings pages may be.
    Files::installCatalog(QStringLiteral("settings-system_eng_en"));
    QTranslator settings;
    QVERIFY(settings.load(QStringLiteral("settings-system_eng_en"),
                          QStringLiteral("/usr/share/translations")));
    QCoreApplication::installTranslator(&settings);
    m_table->addDefinition(b, QStringLiteral("nowhere"));
    QCOMPARE(title(), QStringLiteral("Maps, settings"));
    m_table->addDefinition(a, maps);
    QCOMPARE(title(), QStringLiteral("Kartat"));
    m_table->removeDefinition(a, maps);
    QCOMPARE(title(), QStringLiteral("Maps, settings"));
}

void TestCatalogTable::installsCatalogsThatDoNotExist()
{
    m_table->addDefinition(a, QStringLiteral("nowhere"));
    QCOMPARE(translators().size(), 2);
    QVERIFY(translators().at(0)->isEmpty());
    QVERIFY(translators().at(1)->isEmpty());
    QCOMPARE(title(), QStringLiteral("maps-title"));

    // Empty translators are installed, too: once the test loads a file into one, titles use it.
    QVERIFY(translators().at(1)->load(QStringLiteral("maps-fi"),
                                      QStringLiteral("/usr/share/translations")));
    QCOMPARE(title(), QStringLiteral("Kartat"));
    m_table->removeDefinition(a, QStringLiteral("nowhere"));
    QCOMPARE(title(), QStringLiteral("maps-title"));
}

void TestCatalogTable::laterCatalogsWin()
{
    m_table->addDefinition(a, maps);
    m_table->addDefinition(b, QStringLiteral("atlas"));
    QCOMPARE(title(), QStringLiteral("Atlas"));
    m_table->removeDefinition(b, QStringLiteral("atlas"));
    QCOMPARE(title(), QStringLiteral("Kartat"));
}

void TestCatalogTable::keepsItsLanguageUntilItIsRemoved()
{
    m_table->addDefinition(a, maps);
    QLocale::setDefault(QLocale(QStringLiteral("de_DE")));
    m_table->addDefinition(b, maps);
    QCOMPARE(title(), QStringLiteral("Kartat"));

    m_table->removeDefinition(a, maps);
    m_table->removeDefinition(b, maps);
    // A caller that is using a translator can continue to use it.
    QCOMPARE(translators().size(), 2);
    m_table->addDefinition(a, maps);
    QCOMPARE(translators().size(), 4);
    QCOMPARE(title(), QStringLiteral("Karten"));
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
    m_table->removeDefinition(a, QStringLiteral("atlas"));
    QCOMPARE(title(), QStringLiteral("Kartat"));
}

void TestCatalogTable::leavesTheApplicationWithItsOwner()
{
    m_table->addDefinition(a, maps);
    m_table.reset();
    QCOMPARE(title(), QStringLiteral("maps-title"));
    QCOMPARE(translators().size(), 2);
}

void TestCatalogTable::mayBeCalledBackByLanguageChanges()
{
    // Installing or removing a catalog with texts sends a language change immediately.
    class Listener : public QObject
    {
    public:
        explicit Listener(std::function<void()> answer) : m_answer(std::move(answer)) { }
        bool eventFilter(QObject *watched, QEvent *event) override
        {
            // The handler changes the language itself.
            if (event->type() == QEvent::LanguageChange && !m_answering) {
                const QScopedValueRollback<bool> answering(m_answering, true);
                ++count;
                m_answer();
            }
            return QObject::eventFilter(watched, event);
        }
        int count = 0;

    private:
        std::function<void()> m_answer;
        bool m_answering = false;
    };

    Listener listener([this] {
        m_table->addDefinition(b, QStringLiteral("nowhere"));
        m_table->removeDefinition(b, QStringLiteral("nowhere"));
        m_table->addDefinition(b, maps);
    });
    QCoreApplication::instance()->installEventFilter(&listener);
    m_table->addDefinition(a, maps);
    QCOMPARE(listener.count, 1);
    m_table->removeDefinition(a, maps);
    QCOMPARE(title(), QStringLiteral("Kartat"));
    m_table->clear();
    QCoreApplication::instance()->removeEventFilter(&listener);
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
    QCOMPARE(title(), QStringLiteral("Kartat"));
}

void TestCatalogTable::treatsADamagedCatalogAsMissing()
{
    Files::write(QStringLiteral("/usr/share/translations/maps-fi.qm"), "damaged");
    m_table->addDefinition(a, maps);
    m_table->addDefinition(b, maps);
    QCOMPARE(title(), QStringLiteral("Maps"));
    QCOMPARE(m_log->takeTexts(),
             QStringList(QStringLiteral(
                 "The translation catalog \"/usr/share/translations/maps-fi.qm\" is not used: it "
                 "does not begin like a catalog")));
    m_table->clear();
}

void TestCatalogTable::refusesNamesThatLeaveTheDirectory()
{
    // Without the refusal these would be valid paths of a catalog.
    const QString outside = QStringLiteral("/usr/share/other/maps");
    Files::write(outside + QStringLiteral("_eng_en.qm"), {});
    QVERIFY(QFile::remove(outside + QStringLiteral("_eng_en.qm")));
    QVERIFY(QFile::copy(QStringLiteral("/usr/share/translations/maps-fi.qm"),
                        outside + QStringLiteral("_eng_en.qm")));
    for (const QString &name : {outside, QStringLiteral("../../..") + outside}) {
        m_table->addDefinition(a, name);
        m_table->addDefinition(b, name);
        QCOMPARE(title(), QStringLiteral("maps-title"));
        QCOMPARE(m_log->takeTexts(),
                 QStringList(QStringLiteral("The translation catalog \"%1\" of \"%2\" is not used: "
                                            "its name leads out of \"/usr/share/translations\"")
                                 .arg(name, a)));
        m_table->removeDefinition(a, name);
    }
    QCOMPARE(translators().size(), 0);
}

QTEST_GUILESS_MAIN(TestCatalogTable)

#include "tst_catalogtable.moc"
