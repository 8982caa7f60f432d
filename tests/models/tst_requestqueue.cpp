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
        const RequestQueue<Model>::ChangeScope change(&requests);
        log.append("scan"_s);
        handler();
    }
    void check()
    {
        if (requests.defer(&Model::check)) {
            return;
        }
        const RequestQueue<Model>::ChangeScope change(&requests);
        log.append("check"_s);
        onCheck();
    }
    RequestQueue<Model> requests{this};
    QStringList log;
    std::function<void()> handler = [] {};
    std::function<void()> onCheck = [] {};
};

} // namespace

class TestRequestQueue : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void updatesRunOnce();
    void nestedEventLoopRunsNothing();
    void handlersWithoutEndReturnToTheEventLoop();
    void updatesOfADestroyedModelAreDropped();
};

void TestRequestQueue::updatesRunOnce()
{
    Model model;
    for (int round = 0; round < 2; ++round) {
        model.log.clear();
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
        // At once while nothing changes.
        model.check();
        QCOMPARE(model.log, words("scan check scan check"));
    }
}

void TestRequestQueue::nestedEventLoopRunsNothing()
{
    Model model;
    bool busy = true;
    model.handler = [&] {
        model.check();
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
    QCOMPARE(model.log, words("scan scan check"));
}

void TestRequestQueue::handlersWithoutEndReturnToTheEventLoop()
{
    Model model;
    model.handler = [&model] { model.scan(); };
    model.scan();
    for (int i = 0; i < 5; ++i) {
        const int before = model.log.size();
        QCoreApplication::sendPostedEvents();
        QVERIFY(model.log.size() > before);
    }
    model.handler = [] {};
    QCoreApplication::processEvents();
    const QStringList settled = model.log;
    QCoreApplication::processEvents();
    QCOMPARE(model.log, settled);
}

void TestRequestQueue::updatesOfADestroyedModelAreDropped()
{
    auto model = std::make_unique<Model>();
    bool isChecked = false;
    model->onCheck = [&isChecked] { isChecked = true; };
    model->handler = [&model] { model->check(); };
    model->scan();
    model.reset();
    QCoreApplication::processEvents();
    QVERIFY(!isChecked);
}

QTEST_GUILESS_MAIN(TestRequestQueue)

#include "tst_requestqueue.moc"
