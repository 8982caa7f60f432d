// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The example docs/examples/memory-card.qml always detects the end of an operation, and shows why
// it failed.

#include "cardhelper.h"
#include "loggedtest.h"
#include "patience.h"
#include "simulator/diskservicepeer.h"
#include "texts.h"

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

const QString waiting = "Waiting for the disk service…"_s;
const QString hasVfat = "File system: vfat"_s;

// Puts the texts of the page in brackets.
class Brackets : public QTranslator
{
public:
    bool isEmpty() const override { return false; }
    QString translate(const char *context, const char *text, const char *, int) const override
    {
        return qstrcmp(context, "memory-card") == 0 ? "[%1]"_s.arg(QLatin1String(text)) : QString();
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
    void initTestCase() { m_engine.addImportPath(QLatin1String(QML_BUILD_DIR)); }
    void init();
    void cleanup();

    void showsThatTheDiskServiceHasNotAnswered();
    void endsAfterEachFailure_data();
    void endsAfterEachFailure();
    void formatsAfterAQuestion();
    void namesWhatFailed_data();
    void namesWhatFailed();
    void probesEachCard();
    void canBeTranslated();

private:
    QQuickItem *find(const QString &text);
    bool shows(const QString &text) { return find(text) != nullptr; }
    // Return whether there is such a button or page.
    bool press(const QString &text);
    bool openPage();

    QQmlEngine m_engine;
    std::unique_ptr<CardHelper> m_helper;
    std::unique_ptr<QQuickWindow> m_window;
    std::unique_ptr<QObject> m_page;
};

void TestCardPage::init()
{
    LoggedTest::init();
    m_helper = std::make_unique<CardHelper>();
    m_helper->install("done"_s, "vfat\n");
}

void TestCardPage::cleanup()
{
    m_window.reset(); // also releases what it has drawn of the page
    m_page.reset();
    m_helper.reset();
    LoggedTest::cleanup();
}

// Waits until the first probe has ended.
bool TestCardPage::openPage()
{
    QQmlComponent component(&m_engine, SOURCE_DIR "/docs/examples/memory-card.qml"_s);
    m_page.reset(component.create());
    if (m_page == nullptr) {
        qWarning("%s", qPrintable(component.errorString()));
        return false;
    }
    m_window = std::make_unique<QQuickWindow>();
    m_window->resize(360, 640);
    auto *page = qobject_cast<QQuickItem *>(m_page.get());
    page->setSize(m_window->size());
    page->setParentItem(m_window->contentItem());
    m_window->show();
    const auto isStill = [this] { return !m_page->property("running").toBool(); };
    return QTest::qWaitForWindowExposed(m_window.get()) && becomesTrue(isStill);
}

QQuickItem *TestCardPage::find(const QString &text)
{
    const auto items = visibleItems(m_window->contentItem());
    const auto found = std::find_if(items.begin(), items.end(), [&text](const QQuickItem *item) {
        return item->property("text") == text;
    });
    return found == items.end() ? nullptr : *found;
}

bool TestCardPage::press(const QString &text)
{
    const auto isShown = [&] { return shows(text); };
    return becomesTrue(isShown) && find(text)->isEnabled()
        && QMetaObject::invokeMethod(find(text), "clicked");
}

void TestCardPage::showsThatTheDiskServiceHasNotAnswered()
{
    DiskServicePeer service({"hung"_s});
    QVERIFY(openPage());
    QVERIFY(shows(hasVfat));
    QVERIFY(press("Mount"_s));
    TRY_COMPARE(service.calls().size(), 1);
    QVERIFY(shows(waiting));
    QVERIFY(!find("Unmount"_s)->isEnabled());
    // Screen readers get this name of the progress. Texts and buttons name themselves.
    const auto items = visibleItems(m_window->contentItem());
    const auto bar = std::find_if(items.begin(), items.end(), [](const QQuickItem *item) {
        return item->property("indeterminate").toBool();
    });
    QVERIFY(bar != items.end());
    QCOMPARE(QAccessible::queryAccessibleInterface(*bar)->text(QAccessible::Name), waiting);
    service.replyToKept();
    TRY(shows(hasVfat));
    QVERIFY(find("Unmount"_s)->isEnabled());
}

void TestCardPage::endsAfterEachFailure_data()
{
    QTest::addColumn<QString>("button");
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("isForgiven");
    const auto row = [](const char *name, const char *button, const char *scenario,
                        const char *text, bool isForgiven = false) {
        QTest::newRow(name) << button << scenario << text << isForgiven;
    };
    row("an error with a code", "Unmount", "DeviceBusy", "A program uses the card.");
    row("an error without a code", "Unmount", "UnknownError", "The disk service did not answer.");
    row("no disk service", "Unmount", "absent", "The disk service did not answer.");
    row("mounted already", "Mount", "AlreadyMounted", "The card was mounted already.", true);
    row("unmounting already", "Unmount", "AlreadyUnmounting",
        "The card is already being unmounted.", true);
}

// The second failure does not change the formatter's status, which is already Error.
void TestCardPage::endsAfterEachFailure()
{
    QFETCH(const QString, button);
    QFETCH(const QString, scenario);
    QFETCH(const QString, text);
    QFETCH(const bool, isForgiven);
    const DiskServicePeer service({scenario});
    QVERIFY(openPage());
    for (int i = 0; i < 2; ++i) {
        QVERIFY(press(button));
        QVERIFY(shows(waiting));
        TRY(shows(text));
        TRY(shows(hasVfat) || !isForgiven);
        QCOMPARE(m_log->takeTexts().size(), 1);
    }
}

void TestCardPage::formatsAfterAQuestion()
{
    DiskServicePeer service({"done"_s});
    QVERIFY(openPage());
    m_helper->install("held"_s, "ext4\n");
    QVERIFY(press("Format as ext4"_s));
    TRY(shows("All files are lost. The card gets the file system ext4."_s));
    QCOMPARE(m_helper->runs().size(), 1); // the probe
    QVERIFY(press("Erase"_s));
    TRY(shows("Formatting…"_s));
    m_helper->release();
    TRY(shows("Detecting the file system…"_s));
    m_helper->release();
    TRY(shows("File system: ext4"_s));
    const QString card = "mmcblk1p1"_s;
    const QStringList probe = {"probe"_s, card};
    QCOMPARE(m_helper->runs(), QList<QStringList>({probe, {"format_ext4"_s, card}, probe}));
    QCOMPARE(service.members(), QStringList({"Unmount"_s, "Mount"_s}));
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
    m_helper->install("exit=1"_s);
    const DiskServicePeer peer({service});
    QVERIFY(openPage());
    QVERIFY(shows("The file system could not be detected."_s));
    QVERIFY(press("Format as ext4"_s));
    QVERIFY(press("Erase"_s));
    TRY(shows(problem));
    QCOMPARE(m_log->takeTexts().size(), messages);
}

void TestCardPage::probesEachCard()
{
    QVERIFY(openPage());
    QVERIFY(shows(hasVfat));
    m_page->setProperty("cardName", QString());
    QVERIFY(shows("File system: unknown"_s));
    QVERIFY(!find("Mount"_s)->isEnabled());
    m_helper->install("done"_s, "ext4\n");
    m_page->setProperty("cardName", "mmcblk2p1"_s);
    TRY(shows("File system: ext4"_s));
}

void TestCardPage::canBeTranslated()
{
    Brackets brackets;
    QCoreApplication::installTranslator(&brackets);
    const DiskServicePeer service({"hung"_s});
    QVERIFY(openPage());
    const auto isTranslated = [this] {
        const auto items = visibleItems(m_window->contentItem());
        return std::all_of(items.begin(), items.end(), [](const QQuickItem *item) {
            const QString text = item->property("text").toString();
            return text.isEmpty() || text.startsWith(QLatin1Char('['));
        });
    };
    QVERIFY(isTranslated());
    QVERIFY(press("[Format as vfat]"_s));
    QVERIFY(press("[Erase]"_s));
    QVERIFY(isTranslated());
    TRY(m_page->property("running").toBool());
    QVERIFY(isTranslated());
}

QTEST_MAIN(TestCardPage)

#include "tst_cardpage.moc"
