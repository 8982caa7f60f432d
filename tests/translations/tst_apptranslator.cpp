// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "languagelistener.h"
#include "loggedtest.h"
#include "texts.h"
#include "translations/apptranslator.h"
#include "usedupdescriptors.h"

#include <QtTest>

#include <fcntl.h>
#include <unistd.h>

namespace {

int accesses = 0;

} // namespace

// Replaces the function of the C library, to count how often Qt looks for a file.
extern "C" Q_DECL_EXPORT int access(const char *path, int mode)
{
    ++accesses;
    return faccessat(AT_FDCWD, path, mode, 0);
}

// The plugin's test checks the translators of an engine.
class TestAppTranslator : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void loadsWhatIsNew();
    void triesAgainToReadAFile();
    void otherEventsReadNothing();

private:
    void send(QEvent::Type type);
    QString text() const { return m_translator->translate(nullptr, "settings-test-both"); }

    // A translator for Finnish that watches the engine, which is its parent.
    std::unique_ptr<QObject> m_engine;
    AppTranslator *m_translator = nullptr;
};

void TestAppTranslator::init()
{
    Files::installCatalog("settings-system-fi"_s);
    Files::remove("/usr/share/translations/settings-system-de.qm"_s);
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

void TestAppTranslator::loadsWhatIsNew()
{
    QVERIFY(AppTranslator(nullptr).isEmpty());
    QLocale::setDefault(QLocale("sv_SE"_s));
    QCOMPARE(text(), "Molemmat"_s);
    send(QEvent::LanguageChange);
    QVERIFY(m_translator->isEmpty());
    QLocale::setDefault(QLocale("de_DE"_s));
    send(QEvent::LanguageChange);
    QVERIFY(m_translator->isEmpty());
    // A catalog that appears.
    Files::installCatalog("settings-system-de"_s);
    send(QEvent::LanguageChange);
    QCOMPARE(text(), "Beide"_s);
    // A damaged file is read once.
    Files::write("/usr/share/translations/settings-system-de.qm"_s, "damaged");
    send(QEvent::LanguageChange);
    send(QEvent::LanguageChange);
    QVERIFY(m_translator->isEmpty());
    QCOMPARE(m_log->takeTexts().size(), 1);
}

void TestAppTranslator::triesAgainToReadAFile()
{
    // Like a program that passes language changes on.
    const LanguageListener listener([this] { send(QEvent::LanguageChange); });
    QCoreApplication::installTranslator(m_translator);
    QCOMPARE(listener.count, 1);
    QLocale::setDefault(QLocale("de_DE"_s));
    Files::installCatalog("settings-system-de"_s);
    {
        const UsedUpDescriptors none;
        send(QEvent::LanguageChange);
        QVERIFY(m_translator->isEmpty());
        QCoreApplication::sendPostedEvents();
        // Delivers what was posted meanwhile.
        QCoreApplication::sendPostedEvents();
    }
    // The translator has announced that it is empty, and nothing when it stayed empty.
    QCOMPARE(listener.count, 2);
    QCOMPARE(m_log->takeTexts().size(), 2);
    send(QEvent::LanguageChange);
    QCOMPARE(text(), "Beide"_s);
}

void TestAppTranslator::otherEventsReadNothing()
{
    Files::removeCatalog("settings-system-fi"_s);
    for (const auto type : {QEvent::LocaleChange, QEvent::User, QEvent::LanguageChange}) {
        QEvent event(type);
        accesses = 0;
        QVERIFY(!m_translator->eventFilter(m_engine.get(), &event));
        QCOMPARE(accesses > 0, type == QEvent::LanguageChange);
        QCOMPARE(m_translator->isEmpty(), type == QEvent::LanguageChange);
    }
}

QTEST_GUILESS_MAIN(TestAppTranslator)

#include "tst_apptranslator.moc"
