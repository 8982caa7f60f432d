// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "files.h"
#include "loggedtest.h"
#include "plugin/translations/apptranslator.h"

#include <QtTest>

class TestAppTranslator : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void loadsForTheDefaultLocale();
    void loadsEngineeringEnglish();
    void followsLanguageChanges();
    void loadsWhatIsNew();
    void isEmptyForLanguageWithoutCatalog();
    void passesEveryEventOn();
    void otherEventsReadNothing();
    void leavesTheApplicationWithItsParent();
};

namespace {

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

void send(QObject *receiver, QEvent::Type type)
{
    QEvent event(type);
    QCoreApplication::sendEvent(receiver, &event);
}

QString text(const AppTranslator &translator)
{
    return translator.translate(nullptr, "settings-test-both");
}

} // namespace

void TestAppTranslator::init()
{
    for (const auto *name :
         {"settings-system_eng_en", "settings-system-fi", "settings-system-de"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    QLocale::setDefault(QLocale(QStringLiteral("fi_FI")));
    LoggedTest::init();
}

void TestAppTranslator::loadsForTheDefaultLocale()
{
    AppTranslator translator(nullptr);
    QVERIFY(translator.isEmpty());
    translator.loadDefaultLocale();
    QCOMPARE(text(translator), QStringLiteral("Molemmat"));
}

void TestAppTranslator::loadsEngineeringEnglish()
{
    AppTranslator translator(nullptr);
    translator.loadEngineeringEnglish();
    QCOMPARE(text(translator), QStringLiteral("Both, engineering English"));
}

void TestAppTranslator::followsLanguageChanges()
{
    QObject engine;
    AppTranslator translator(&engine);
    translator.loadDefaultLocale();
    engine.installEventFilter(&translator);

    QLocale::setDefault(QLocale(QStringLiteral("de_DE")));
    QCOMPARE(text(translator), QStringLiteral("Molemmat"));
    send(&engine, QEvent::LanguageChange);
    QCOMPARE(text(translator), QStringLiteral("Beide"));
}

void TestAppTranslator::loadsWhatIsNew()
{
    const QString path = QStringLiteral("/usr/share/translations/settings-system-fi.qm");
    const auto contentOf = [](const QString &path) {
        QFile file(path);
        return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
    };
    const QByteArray finnish = contentOf(path);
    const QByteArray german =
        contentOf(QStringLiteral("/usr/share/translations/settings-system-de.qm"));
    QObject engine;
    AppTranslator translator(&engine);
    translator.loadDefaultLocale();
    engine.installEventFilter(&translator);

    Files::write(path, german);
    QCOMPARE(text(translator), QStringLiteral("Molemmat"));
    send(&engine, QEvent::LanguageChange);
    QCOMPARE(text(translator), QStringLiteral("Beide"));

    // A catalog that appears.
    Files::remove(path);
    send(&engine, QEvent::LanguageChange);
    QVERIFY(translator.isEmpty());
    Files::write(path, finnish);
    send(&engine, QEvent::LanguageChange);
    QCOMPARE(text(translator), QStringLiteral("Molemmat"));
}

void TestAppTranslator::isEmptyForLanguageWithoutCatalog()
{
    QObject engine;
    AppTranslator translator(&engine);
    translator.loadDefaultLocale();
    engine.installEventFilter(&translator);

    QLocale::setDefault(QLocale(QStringLiteral("sv_SE")));
    send(&engine, QEvent::LanguageChange);
    QVERIFY(translator.isEmpty());
}

void TestAppTranslator::passesEveryEventOn()
{
    QObject engine;
    EventCounter behind;
    AppTranslator translator(&engine);
    engine.installEventFilter(&behind);
    engine.installEventFilter(&translator);

    QEvent change(QEvent::LanguageChange);
    QVERIFY(!translator.eventFilter(&engine, &change));
    send(&engine, QEvent::LanguageChange);
    send(&engine, QEvent::User);
    QCOMPARE(behind.seen, (QVector<QEvent::Type>{QEvent::LanguageChange, QEvent::User}));
}

void TestAppTranslator::otherEventsReadNothing()
{
    QObject engine;
    AppTranslator translator(&engine);
    translator.loadDefaultLocale();
    engine.installEventFilter(&translator);

    Files::removeCatalog(QStringLiteral("settings-system-fi"));
    send(&engine, QEvent::LocaleChange);
    send(&engine, QEvent::User);
    QCOMPARE(text(translator), QStringLiteral("Molemmat"));
    send(&engine, QEvent::LanguageChange);
    QVERIFY(translator.isEmpty());
}

void TestAppTranslator::leavesTheApplicationWithItsParent()
{
    auto *engine = new QObject;
    auto *translator = new AppTranslator(engine);
    translator->loadDefaultLocale();
    QCoreApplication::installTranslator(translator);
    QCOMPARE(qtTrId("settings-test-both"), QStringLiteral("Molemmat"));
    delete engine;
    QCOMPARE(qtTrId("settings-test-both"), QStringLiteral("settings-test-both"));
}

QTEST_GUILESS_MAIN(TestAppTranslator)

#include "tst_apptranslator.moc"
