// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The example docs/examples/memory-card.qml always detects the end of an operation, and shows why
// it failed.

#include "cardhelper.h"
#include "loggedtest.h"
#include "simulator/diskservicepeer.h"

#include <QAccessible>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QQuickItem>
#include <QQuickWindow>
#include <QTranslator>
#include <QtTest>

#include <algorithm>
#include <memory>

namespace {

const QString waiting = QStringLiteral("Waiting for the disk service…");
const QString hasVfat = QStringLiteral("File system: vfat");

// Puts the texts of the page in brackets.
class Brackets : public QTranslator
{
public:
    bool isEmpty() const override { return false; }
    QString translate(const char *context, const char *text, const char *, int) const override
    {
        return qstrcmp(context, "memory-card") == 0
            ? QStringLiteral("[%1]").arg(QLatin1String(text))
            : QString();
    }
};

QList<QQuickItem *> visibleItems(QQuickItem *item)
{
    QList<QQuickItem *> items;
    if (item->isVisible()) {
        items.append(item);
    }
    const auto children = item->childItems();
    for (QQuickItem *child : children) {
        items += visibleItems(child);
    }
    return items;
}

} // namespace

class TestCardPage : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase() { m_engine.addImportPath(QStringLiteral(QML_BUILD_DIR)); }
    void init();
    void cleanup();

    void showsThatTheDiskServiceHasNotAnswered();
    void endsAfterEachFailure_data();
    void endsAfterEachFailure();
    void showsAForgivenError_data();
    void showsAForgivenError();
    void formatsAfterAQuestion();
    void namesWhatFailed_data();
    void namesWhatFailed();
    void probesEachCard();
    void canBeTranslated();
    void namesTheProgressForScreenReaders();

private:
    QQuickItem *find(const QString &text);
    bool shows(const QString &text) { return find(text) != nullptr; }
    void press(const QString &text);
    void openPage();

    QQmlEngine m_engine;
    std::unique_ptr<CardHelper> m_helper;
    std::unique_ptr<QQuickWindow> m_window;
    std::unique_ptr<QObject> m_page;
};

void TestCardPage::init()
{
    LoggedTest::init();
    m_helper = std::make_unique<CardHelper>();
    m_helper->install(QStringLiteral("done"), "vfat\n");
}

void TestCardPage::cleanup()
{
    m_window.reset(); // also releases what it has drawn of the page
    m_page.reset();
    m_helper.reset();
    LoggedTest::cleanup();
}

// Returns when the first probe has ended.
void TestCardPage::openPage()
{
    QQmlComponent component(&m_engine, QStringLiteral(SOURCE_DIR "/docs/examples/memory-card.qml"));
    m_page.reset(component.create());
    QVERIFY2(m_page != nullptr, qPrintable(component.errorString()));
    m_window = std::make_unique<QQuickWindow>();
    m_window->resize(360, 640);
    auto *page = qobject_cast<QQuickItem *>(m_page.get());
    page->setSize(m_window->size());
    page->setParentItem(m_window->contentItem());
    m_window->show();
    QVERIFY(QTest::qWaitForWindowExposed(m_window.get()));
    QTRY_VERIFY(!m_page->property("running").toBool());
}

QQuickItem *TestCardPage::find(const QString &text)
{
    const auto items = visibleItems(m_window->contentItem());
    const auto found = std::find_if(items.begin(), items.end(), [&text](const QQuickItem *item) {
        return item->property("text") == text;
    });
    return found == items.end() ? nullptr : *found;
}

void TestCardPage::press(const QString &text)
{
    QQuickItem *button = nullptr;
    QTRY_VERIFY((button = find(text)) != nullptr);
    QVERIFY2(button->isEnabled(), qPrintable(text));
    QVERIFY(QMetaObject::invokeMethod(button, "clicked"));
}

void TestCardPage::showsThatTheDiskServiceHasNotAnswered()
{
    DiskServicePeer service({QStringLiteral("hung")});
    openPage();
    QVERIFY(shows(hasVfat));
    press(QStringLiteral("Mount"));
    QTRY_COMPARE(service.calls().size(), 1);
    QVERIFY(shows(waiting));
    QVERIFY(!find(QStringLiteral("Unmount"))->isEnabled());
    service.replyToKept();
    QTRY_VERIFY(shows(hasVfat));
    QVERIFY(find(QStringLiteral("Unmount"))->isEnabled());
}

void TestCardPage::endsAfterEachFailure_data()
{
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<QString>("problem");
    const auto row = [](const char *name, const char *scenario, const char *problem) {
        QTest::newRow(name) << scenario << problem;
    };
    row("an error with a code", "DeviceBusy", "A program uses the card.");
    row("an error without a code", "UnknownError", "The disk service did not answer.");
    row("no disk service", "absent", "The disk service did not answer.");
}

// The second failure does not change the formatter's status, which is already Error.
void TestCardPage::endsAfterEachFailure()
{
    QFETCH(const QString, scenario);
    QFETCH(const QString, problem);
    const DiskServicePeer service({scenario});
    openPage();
    for (int i = 0; i < 2; ++i) {
        press(QStringLiteral("Unmount"));
        QVERIFY(shows(waiting));
        QTRY_VERIFY(shows(problem));
        QCOMPARE(m_log->takeTexts().size(), 1);
    }
}

void TestCardPage::showsAForgivenError_data()
{
    QTest::addColumn<QString>("button");
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<QString>("note");
    const auto row = [](const char *button, const char *scenario, const char *note) {
        QTest::newRow(button) << button << scenario << note;
    };
    row("Mount", "AlreadyMounted", "The card was mounted already.");
    row("Unmount", "AlreadyUnmounting", "The card is already being unmounted.");
}

void TestCardPage::showsAForgivenError()
{
    QFETCH(const QString, button);
    QFETCH(const QString, scenario);
    QFETCH(const QString, note);
    const DiskServicePeer service({scenario});
    openPage();
    press(button);
    QTRY_VERIFY(shows(note));
    QTRY_VERIFY(shows(hasVfat));
    QCOMPARE(m_log->takeTexts().size(), 1);
}

void TestCardPage::formatsAfterAQuestion()
{
    DiskServicePeer service({QStringLiteral("done")});
    openPage();
    m_helper->install(QStringLiteral("held"), "ext4\n");
    press(QStringLiteral("Format as ext4"));
    QTRY_VERIFY(shows(QStringLiteral("All files are lost. The card gets the file system ext4.")));
    QCOMPARE(m_helper->runs().size(), 1); // the probe
    press(QStringLiteral("Erase"));
    QTRY_VERIFY(shows(QStringLiteral("Formatting…")));
    m_helper->release();
    QTRY_VERIFY(shows(QStringLiteral("Detecting the file system…")));
    m_helper->release();
    QTRY_VERIFY(shows(QStringLiteral("File system: ext4")));
    const QString card = QStringLiteral("mmcblk1p1");
    const QStringList probe = {QStringLiteral("probe"), card};
    QCOMPARE(m_helper->runs(),
             QList<QStringList>({probe, {QStringLiteral("format_ext4"), card}, probe}));
    QCOMPARE(service.members(), QStringList({QStringLiteral("Unmount"), QStringLiteral("Mount")}));
}

void TestCardPage::namesWhatFailed_data()
{
    QTest::addColumn<QString>("service");
    QTest::addColumn<QString>("problem");
    QTest::addColumn<int>("messages");
    const auto row = [](const char *name, const char *service, const char *problem, int messages) {
        QTest::newRow(name) << service << problem << messages;
    };
    // The failed probe logs one of the messages.
    row("the helper", "done", "Formatting failed.", 2);
    row("the disk service", "NotMounted", "The card is not mounted.", 2);
}

void TestCardPage::namesWhatFailed()
{
    QFETCH(const QString, service);
    QFETCH(const QString, problem);
    QFETCH(const int, messages);
    m_helper->install(QStringLiteral("exit=1"));
    const DiskServicePeer peer({service});
    openPage();
    QVERIFY(shows(QStringLiteral("The file system could not be detected.")));
    press(QStringLiteral("Format as ext4"));
    press(QStringLiteral("Erase"));
    QTRY_VERIFY(shows(problem));
    QCOMPARE(m_log->takeTexts().size(), messages);
}

void TestCardPage::probesEachCard()
{
    openPage();
    QVERIFY(shows(hasVfat));
    m_page->setProperty("cardName", QString());
    QVERIFY(shows(QStringLiteral("File system: unknown")));
    QVERIFY(!find(QStringLiteral("Mount"))->isEnabled());
    m_helper->install(QStringLiteral("done"), "ext4\n");
    m_page->setProperty("cardName", QStringLiteral("mmcblk2p1"));
    QTRY_VERIFY(shows(QStringLiteral("File system: ext4")));
}

void TestCardPage::canBeTranslated()
{
    Brackets brackets;
    QCoreApplication::installTranslator(&brackets);
    const DiskServicePeer service({QStringLiteral("hung")});
    openPage();
    const auto isTranslated = [this] {
        const auto items = visibleItems(m_window->contentItem());
        return std::all_of(items.begin(), items.end(), [](const QQuickItem *item) {
            const QString text = item->property("text").toString();
            return text.isEmpty() || text.startsWith(QLatin1Char('['));
        });
    };
    QVERIFY(isTranslated());
    press(QStringLiteral("[Format as vfat]"));
    press(QStringLiteral("[Erase]"));
    QVERIFY(isTranslated());
    QTRY_VERIFY(m_page->property("running").toBool());
    QVERIFY(isTranslated());
}

// Texts and buttons name themselves.
void TestCardPage::namesTheProgressForScreenReaders()
{
    const DiskServicePeer service({QStringLiteral("hung")});
    openPage();
    press(QStringLiteral("Mount"));
    QTRY_VERIFY(shows(waiting));
    const auto items = visibleItems(m_window->contentItem());
    const auto bar = std::find_if(items.begin(), items.end(), [](const QQuickItem *item) {
        return item->property("indeterminate").toBool();
    });
    QVERIFY(bar != items.end());
    QAccessibleInterface *accessible = QAccessible::queryAccessibleInterface(*bar);
    QVERIFY(accessible != nullptr);
    QCOMPARE(accessible->text(QAccessible::Name), waiting);
}

QTEST_MAIN(TestCardPage)

#include "tst_cardpage.moc"
