// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "loggedtest.h"
#include "texts.h"
#include "translations/apptranslator.h"

#include <QtTest>

class TestAppTranslator : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void loadsForTheDefaultLocale();
    void loadsEngineeringEnglish();
    void followsLanguageChanges();
    void loadsWhatIsNew();
    void passesEveryEventOn();
    void otherEventsReadNothing();
    void leavesTheApplicationWithItsParent();

private:
    void send(QEvent::Type type);
    QString text() const { return m_translator->translate(nullptr, "settings-test-both"); }

    // A translator for Finnish that watches the engine, which is its parent.
    std::unique_ptr<QObject> m_engine;
    AppTranslator *m_translator = nullptr;
};

namespace {

const QString finnish = "Molemmat"_s;
const QString german = "Beide"_s;

// Records the events that pass a filter that was installed later.
class EventCounter : public QObject
{
public:
    bool eventFilter(QObject *watched, QEvent *event) override
    {
        seen.append(event->type());
        return QObject::eventFilter(watched, event);
    }
    QVector<QEvent::Type> seen;
};

} // namespace

void TestAppTranslator::init()
{
    for (const auto *name :
         {"settings-system_eng_en", "settings-system-fi", "settings-system-de"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    QLocale::setDefault(QLocale("fi_FI"_s));
    LoggedTest::init();
    m_engine = std::make_unique<QObject>();
    m_translator = new AppTranslator(m_engine.get());
    m_translator->loadDefaultLocale();
    m_engine->installEventFilter(m_translator);
}

void TestAppTranslator::cleanup()
{
    m_engine.reset();
    LoggedTest::cleanup();
}

void TestAppTranslator::send(QEvent::Type type)
{
    QEvent event(type);
    QCoreApplication::sendEvent(m_engine.get(), &event);
}

void TestAppTranslator::loadsForTheDefaultLocale()
{
    QCOMPARE(text(), finnish);
    QVERIFY(AppTranslator(nullptr).isEmpty());
}

void TestAppTranslator::loadsEngineeringEnglish()
{
    AppTranslator translator(nullptr);
    translator.loadEngineeringEnglish();
    QCOMPARE(translator.translate(nullptr, "settings-test-both"), "Both, engineering English"_s);
}

void TestAppTranslator::followsLanguageChanges()
{
    QLocale::setDefault(QLocale("de_DE"_s));
    QCOMPARE(text(), finnish);
    send(QEvent::LanguageChange);
    QCOMPARE(text(), german);

    // A language without a catalog.
    QLocale::setDefault(QLocale("sv_SE"_s));
    send(QEvent::LanguageChange);
    QVERIFY(m_translator->isEmpty());
}

void TestAppTranslator::loadsWhatIsNew()
{
    const QString path = "/usr/share/translations/settings-system-fi.qm"_s;
    QFile other("/usr/share/translations/settings-system-de.qm"_s);
    QVERIFY(other.open(QIODevice::ReadOnly));
    Files::write(path, other.readAll());
    QCOMPARE(text(), finnish);
    send(QEvent::LanguageChange);
    QCOMPARE(text(), german);

    // A catalog that appears.
    Files::remove(path);
    send(QEvent::LanguageChange);
    QVERIFY(m_translator->isEmpty());
    Files::installCatalog("settings-system-fi"_s);
    send(QEvent::LanguageChange);
    QCOMPARE(text(), finnish);
}

void TestAppTranslator::passesEveryEventOn()
{
    EventCounter behind;
    m_engine->removeEventFilter(m_translator);
    m_engine->installEventFilter(&behind);
    m_engine->installEventFilter(m_translator);

    QEvent change(QEvent::LanguageChange);
    QVERIFY(!m_translator->eventFilter(m_engine.get(), &change));
    send(QEvent::LanguageChange);
    send(QEvent::User);
    QCOMPARE(behind.seen, (QVector<QEvent::Type>{QEvent::LanguageChange, QEvent::User}));
}

void TestAppTranslator::otherEventsReadNothing()
{
    Files::removeCatalog("settings-system-fi"_s);
    send(QEvent::LocaleChange);
    send(QEvent::User);
    QCOMPARE(text(), finnish);
    send(QEvent::LanguageChange);
    QVERIFY(m_translator->isEmpty());
}

void TestAppTranslator::leavesTheApplicationWithItsParent()
{
    QCoreApplication::installTranslator(m_translator);
    QCOMPARE(qtTrId("settings-test-both"), finnish);
    m_engine.reset();
    QCOMPARE(qtTrId("settings-test-both"), "settings-test-both"_s);
}

QTEST_GUILESS_MAIN(TestAppTranslator)

#include "tst_apptranslator.moc"
