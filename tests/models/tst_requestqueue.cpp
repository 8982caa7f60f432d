// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "models/requestqueue.h"

#include <QAbstractEventDispatcher>
#include <QEventLoop>
#include <QtTest>

#include <functional>
#include <memory>

namespace {

// Logs what it does. The handler is what QML does while rows change.
class Model : public QObject
{
public:
    void scan()
    {
        if (requests.defer(&Model::scan)) {
            return;
        }
        const RequestQueue<Model>::Change change(&requests);
        log.append(QStringLiteral("scan"));
        handler();
    }
    void check()
    {
        if (requests.defer(&Model::check)) {
            return;
        }
        const RequestQueue<Model>::Change change(&requests);
        log.append(QStringLiteral("check"));
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

QStringList list(const char *names)
{
    return QString::fromLatin1(names).split(QLatin1Char(' '), Qt::SkipEmptyParts);
}

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
    model.choose(QStringLiteral("a"));
    model.check();
    QCOMPARE(model.log, list("scan a check"));
    QCoreApplication::processEvents();
    QCOMPARE(model.log, list("scan a check"));
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
    QCOMPARE(model.log, list("scan"));
    model.handler = [] {};
    QCoreApplication::processEvents();
    QCOMPARE(model.log, list("scan check scan"));
}

void TestRequestQueue::updatesAreAcceptedAgainAfterwards()
{
    Model model;
    model.handler = [&model] { model.check(); };
    for (const char *expected : {"scan check", "scan check scan check"}) {
        model.scan();
        QCoreApplication::processEvents();
        QCOMPARE(model.log, list(expected));
    }
}

void TestRequestQueue::choicesRunInOrderAfterTheUpdates()
{
    Model model;
    model.handler = [&model] {
        model.choose(QStringLiteral("a"));
        model.choose(QStringLiteral("b"));
        model.choose(QStringLiteral("a"));
        model.check();
    };
    model.scan();
    QCOMPARE(model.log, list("scan"));
    QCoreApplication::processEvents();
    QCOMPARE(model.log, list("scan check a b a"));
}

void TestRequestQueue::laterChoiceRunsWhatWaits()
{
    Model model;
    model.handler = [&model] {
        model.choose(QStringLiteral("a"));
        model.check();
    };
    model.scan();
    model.choose(QStringLiteral("b"));
    QCOMPARE(model.log, list("scan check a b"));
    QCoreApplication::processEvents();
    QCOMPARE(model.log, list("scan check a b"));
}

void TestRequestQueue::choiceWithinAChoiceWaits()
{
    Model model;
    model.onChoice = [&model] {
        model.choose(QStringLiteral("b"));
        model.log.append(QStringLiteral("end of a"));
    };
    model.choose(QStringLiteral("a"));
    model.onChoice = [] {};
    QCOMPARE(model.log, (QStringList{QStringLiteral("a"), QStringLiteral("end of a")}));
    QCoreApplication::processEvents();
    QCOMPARE(model.log.last(), QStringLiteral("b"));
    QCOMPARE(model.log.size(), 3);
}

void TestRequestQueue::nestedEventLoopRunsNothing()
{
    Model model;
    bool busy = true;
    model.handler = [&] {
        model.check();
        model.choose(QStringLiteral("a"));
        // What was posted earlier is delivered, and then there is nothing to do.
        QCoreApplication::processEvents();
        busy = QAbstractEventDispatcher::instance()->processEvents(QEventLoop::AllEvents);
    };
    // A run that is already posted when the next change begins does nothing either.
    model.scan();
    model.scan();
    QVERIFY(!busy);
    QCOMPARE(model.log, list("scan scan"));
    model.handler = [] {};
    QCoreApplication::processEvents();
    QCOMPARE(model.log, list("scan scan check a a"));
}

void TestRequestQueue::handlersWithoutEndReturnToTheEventLoop()
{
    Model model;
    model.handler = [&model] {
        model.scan();
        model.choose(QStringLiteral("a"));
    };
    model.onChoice = [&model] { model.choose(QStringLiteral("b")); };
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
