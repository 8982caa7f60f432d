// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "models/requestqueue.h"
#include "texts.h"
#include "words.h"

#include <QAbstractEventDispatcher>
#include <QEventLoop>
#include <QtTest>

#include <functional>
#include <memory>

namespace {

// Logs its steps. The handler simulates what QML does while rows change.
class Model : public QObject
{
public:
    void scan()
    {
        if (requests.defer(&Model::scan)) {
            return;
        }
        const RequestQueue<Model>::Change change(&requests);
        log.append("scan"_s);
        handler();
    }
    void check()
    {
        if (requests.defer(&Model::check)) {
            return;
        }
        const RequestQueue<Model>::Change change(&requests);
        log.append("check"_s);
    }
    void choose(const QString &name)
    {
        requests.choose([this, name] {
            log.append(name);
            onChoice();
        });
    }

    RequestQueue<Model> requests{this};
    QStringList log;
    std::function<void()> handler = [] {};
    std::function<void()> onChoice = [] {};
};

} // namespace

class TestRequestQueue : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void runsAtOnceWhileNothingChanges();
    void updatesRunOnce();
    void updatesAreAcceptedAgainAfterwards();
    void choicesRunInOrderAfterTheUpdates();
    void laterChoiceRunsWhatWaits();
    void choiceWithinAChoiceWaits();
    void nestedEventLoopRunsNothing();
    void handlersWithoutEndReturnToTheEventLoop();
    void requestsOfADestroyedModelAreDropped();
};

void TestRequestQueue::runsAtOnceWhileNothingChanges()
{
    Model model;
    model.scan();
    model.choose("a"_s);
    model.check();
    QCOMPARE(model.log, words("scan a check"));
    QCoreApplication::processEvents();
    QCOMPARE(model.log, words("scan a check"));
}

void TestRequestQueue::updatesRunOnce()
{
    Model model;
    model.handler = [&model] {
        for (int i = 0; i < 1000; ++i) {
            model.check();
            model.scan();
        }
    };
    model.scan();
    QCOMPARE(model.log, words("scan"));
    model.handler = [] {};
    QCoreApplication::processEvents();
    QCOMPARE(model.log, words("scan check scan"));
}

void TestRequestQueue::updatesAreAcceptedAgainAfterwards()
{
    Model model;
    model.handler = [&model] { model.check(); };
    for (const QStringList &expected : {words("scan check"), words("scan check scan check")}) {
        model.scan();
        QCoreApplication::processEvents();
        QCOMPARE(model.log, expected);
    }
}

void TestRequestQueue::choicesRunInOrderAfterTheUpdates()
{
    Model model;
    model.handler = [&model] {
        model.choose("a"_s);
        model.choose("b"_s);
        model.choose("a"_s);
        model.check();
    };
    model.scan();
    QCOMPARE(model.log, words("scan"));
    QCoreApplication::processEvents();
    QCOMPARE(model.log, words("scan check a b a"));
}

void TestRequestQueue::laterChoiceRunsWhatWaits()
{
    Model model;
    model.handler = [&model] {
        model.choose("a"_s);
        model.check();
    };
    model.scan();
    model.choose("b"_s);
    QCOMPARE(model.log, words("scan check a b"));
    QCoreApplication::processEvents();
    QCOMPARE(model.log, words("scan check a b"));
}

void TestRequestQueue::choiceWithinAChoiceWaits()
{
    Model model;
    model.onChoice = [&model] {
        model.choose("b"_s);
        model.log.append("end-of-a"_s);
    };
    model.choose("a"_s);
    model.onChoice = [] {};
    QCOMPARE(model.log, words("a end-of-a"));
    QCoreApplication::processEvents();
    QCOMPARE(model.log, words("a end-of-a b"));
}

void TestRequestQueue::nestedEventLoopRunsNothing()
{
    Model model;
    bool busy = true;
    model.handler = [&] {
        model.check();
        model.choose("a"_s);
        // The first call delivers earlier events. After it, nothing must be left to do.
        QCoreApplication::processEvents();
        busy = QAbstractEventDispatcher::instance()->processEvents(QEventLoop::AllEvents);
    };
    // A run that is already posted when the next change begins does nothing either.
    model.scan();
    model.scan();
    QVERIFY(!busy);
    QCOMPARE(model.log, words("scan scan"));
    model.handler = [] {};
    QCoreApplication::processEvents();
    QCOMPARE(model.log, words("scan scan check a a"));
}

void TestRequestQueue::handlersWithoutEndReturnToTheEventLoop()
{
    Model model;
    model.handler = [&model] {
        model.scan();
        model.choose("a"_s);
    };
    model.onChoice = [&model] { model.choose("b"_s); };
    model.scan();
    for (int i = 0; i < 5; ++i) {
        const int before = model.log.size();
        QCoreApplication::sendPostedEvents();
        QVERIFY(model.log.size() > before);
    }
    model.handler = [] {};
    model.onChoice = [] {};
    QCoreApplication::processEvents();
    const QStringList settled = model.log;
    QCoreApplication::processEvents();
    QCOMPARE(model.log, settled);
}

void TestRequestQueue::requestsOfADestroyedModelAreDropped()
{
    auto model = std::make_unique<Model>();
    bool ran = false;
    model->handler = [&] { model->requests.choose([&ran] { ran = true; }); };
    model->scan();
    model.reset();
    QCoreApplication::processEvents();
    QVERIFY(!ran);
}

QTEST_GUILESS_MAIN(TestRequestQueue)

#include "tst_requestqueue.moc"
