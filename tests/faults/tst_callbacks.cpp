// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Handlers answer each signal of each type: they read and write all of its properties and call all of
// its methods.

#include "everytype.h"
#include "files.h"
#include "loggedtest.h"
#include "members.h"
#include "patience.h"
#include "places.h"
#include "simulator/diskservicepeer.h"
#include "simulator/serviceprocess.h"

#include <QAbstractListModel>
#include <QThreadPool>
#include <QtTest>

#include <memory>

// The handlers of an object, which use all of its members.
class Handlers : public QObject
{
    Q_OBJECT

public:
    Handlers(QObject *object, std::vector<EveryType::Use> uses) : m_uses(std::move(uses))
    {
        const QMetaObject &model = QAbstractListModel::staticMetaObject;
        std::vector<QMetaMethod> all = Members::signalsOf(*object);
        if (qobject_cast<QAbstractListModel *>(object) != nullptr) {
            for (int i = 0; i < model.methodCount(); ++i) {
                if (QByteArray(model.method(i).name()).startsWith("rows")
                    || model.method(i).name() == "dataChanged") {
                    all.push_back(model.method(i));
                }
            }
        }
        for (const QMetaMethod &signal : all) {
            unheard.append(QString::fromLatin1(signal.name()));
            connect(object, signal, this,
                    staticMetaObject.method(staticMetaObject.indexOfSlot("answer()")));
        }
    }

    // Endless answers would be a mistake of the page.
    void stop() { m_answers = limit; }

    // The signals that have not been emitted.
    QStringList unheard;

public Q_SLOTS:
    void answer()
    {
        const QMetaMethod signal = sender()->metaObject()->method(senderSignalIndex());
        unheard.removeAll(QString::fromLatin1(signal.name()));
        if (m_depth > 1 || m_answers >= limit) {
            return;
        }
        ++m_depth;
        ++m_answers;
        for (const EveryType::Use &use : m_uses) {
            use.run();
        }
        --m_depth;
    }

private:
    static constexpr int limit = 200;

    const std::vector<EveryType::Use> m_uses;
    int m_answers = 0;
    int m_depth = 0;
};

class TestCallbacks : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase() { QLocale::setDefault(QLocale("en_GB"_s)); }
    void init();
    void cleanup();

    void kivInfo();
    void locationConfiguration();
    void memoryCardFormatter();
    void quickActionsModel();
    void eventsWidgetsModel();
    void titlesView();
    void termsOfUseManager();

private:
    // Makes an object of each type, and handlers for the one of this type.
    void make(const char *type);
    QString unheard() const { return m_handlers->unheard.join(QLatin1Char(' ')); }
    void set(const char *property, const QVariant &value)
    {
        m_object->setProperty(property, value);
    }
    void call(const char *method, const QString &argument)
    {
        QMetaObject::invokeMethod(m_object, method, Q_ARG(QString, argument));
    }

    std::unique_ptr<EveryType> m_types;
    std::unique_ptr<Handlers> m_handlers;
    QObject *m_object = nullptr;
};

void TestCallbacks::init()
{
    Files::remove(Places::quickActions);
    Files::remove(Places::eventsWidgets);
    EveryType::installFiles();
    LoggedTest::init();
}

void TestCallbacks::cleanup()
{
    m_handlers.reset();
    m_types.reset();
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
    m_log.reset(); // members are called in ways that they warn of
}

void TestCallbacks::make(const char *type)
{
    const QString name = QString::fromLatin1(type);
    m_types = std::make_unique<EveryType>();
    m_object = m_types->object(name);
    m_handlers = std::make_unique<Handlers>(m_object, m_types->uses(name));
}

void TestCallbacks::kivInfo()
{
    ServiceProcess daemon("system", "com.marlo.kivd"_s, "replies");
    make("KivInfo");
    TRY_COMPARE(unheard(), QString());
    daemon.sendSignals(100);
    TRY_COMPARE(m_object->property("kivId").toString(), "cover-100"_s);
}

void TestCallbacks::locationConfiguration()
{
    make("LocationConfiguration");
    for (int i = 0; i < 100 && !unheard().isEmpty(); ++i) {
        for (const char *name : {"gpsEnabled", "mlsEnabled", "customSettingsEnabled"}) {
            set(name, !m_object->property(name).toBool());
        }
        for (const char *name : {"mlsOnlineState", "hereState"}) {
            set(name, m_object->property(name).toInt() == 1 ? 2 : 1);
        }
        QTest::qWait(0);
    }
    QCOMPARE(unheard(), QString());
}

void TestCallbacks::memoryCardFormatter()
{
    // There is no such card.
    const DiskServicePeer service({"Mount=DeviceBusy"_s, "Unmount=NotMounted"_s});
    make("MemoryCardFormatter");
    set("devicePath", "/dev/testcard1"_s);
    // One kind of request at a time, because a request that fails cancels all that wait.
    for (const char *request : {"mount", "unmount"}) {
        const QString error = QLatin1String(request) + "Error"_s;
        const auto fails = [&] {
            QMetaObject::invokeMethod(m_object, request);
            return !m_handlers->unheard.contains(error);
        };
        TRY(fails());
    }
    TRY_COMPARE(unheard(), QString());
    // Once the handlers stop answering, the formatter becomes idle and still works.
    m_handlers->stop();
    TRY(!m_object->property("busy").toBool());
    QTest::qWait(100);
    TRY(!m_object->property("busy").toBool());
    const QSignalSpy probed(m_object, SIGNAL(statusChanged()));
    set("devicePath", "/dev/testcard2"_s);
    TRY_COMPARE(probed.size(), 2);
    QCOMPARE(m_object->property("filesystemType").toString(), "vfat"_s);
}

void TestCallbacks::quickActionsModel()
{
    make("QuickActionsModel");
    const QString file = Places::quickActions + "/%1.conf"_s;
    for (int i = 0; i < 20 && !unheard().isEmpty(); ++i) {
        Files::write(file.arg(i), "title=a\n");
        set("showPotential", i % 2 == 0);
        call(i % 4 < 2 ? "enableAction" : "disableAction", file.arg("lamp"_s));
        call("enableAction", file.arg(i));
        QMetaObject::invokeMethod(m_object, "move", Q_ARG(int, 0), Q_ARG(int, 1));
        QTest::qWait(100);
    }
    QCOMPARE(unheard(), QString());
}

void TestCallbacks::eventsWidgetsModel()
{
    make("EventsWidgetsModel");
    // Its rows do not move.
    m_handlers->unheard.removeAll("rowsMoved"_s);
    m_handlers->unheard.removeAll("rowsAboutToBeMoved"_s);
    const QString file = Places::eventsWidgets + "/new.json"_s;
    for (int i = 0; i < 20 && !unheard().isEmpty(); ++i) {
        if (i % 2 == 0) {
            Files::write(file, R"({ "widgets": [ { "path": "new" } ] })");
        } else {
            Files::remove(file);
        }
        call(i % 4 < 2 ? "disableWidget" : "enableWidget", "weather"_s);
        QTest::qWait(100);
    }
    QCOMPARE(unheard(), QString());
}

void TestCallbacks::titlesView()
{
    make("TitlesView");
    for (const char *type : {"QuickActionsModel", "EventsWidgetsModel"}) {
        set("model", QVariant::fromValue(m_types->object(QLatin1String(type))));
    }
    set("match", 7);
    for (const char *name : {"role", "matchRole"}) {
        set(name, "path"_s);
    }
    set("matchRole", QString());
    TRY_COMPARE(unheard(), QString());
    m_handlers->stop();
    set("matchRole", QString());
    set("role", "title"_s);
    QCOMPARE(m_object->property("value").toString(), "Weather"_s);
}

void TestCallbacks::termsOfUseManager()
{
    make("TermsOfUseManager");
    const QString path = m_object->property("vendorPath").toString();
    set("vendorPath", QString());
    QCOMPARE(unheard(), QString());
    m_handlers->stop();
    set("vendorPath", path);
    QVERIFY(m_object->property("hasVendorTermsOfUse").toBool());
}

QTEST_GUILESS_MAIN(TestCallbacks)

#include "tst_callbacks.moc"
