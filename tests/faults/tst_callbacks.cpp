// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// QML handlers answer each signal of each type: they read and write all of its properties and call
// all of its methods.

#include "everytype.h"
#include "files.h"
#include "messagelog.h"
#include "patience.h"
#include "simulator/diskservicepeer.h"
#include "simulator/serviceprocess.h"

#include <QAbstractListModel>
#include <QMetaMethod>
#include <QMetaProperty>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QThreadPool>
#include <QtTest>

#include <cctype>
#include <memory>

class TestCallbacks : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();

    void kivInfo();
    void locationConfiguration();
    void memoryCardFormatter();
    void quickActionsModel();
    void eventsWidgetsModel();
    void titlesView();
    void termsOfUseManager();

private:
    // Makes an object whose handlers answer its signals, with this declaration in it.
    void make(const char *type, const QByteArray &declaration = {});
    // The signals whose handlers have not been called.
    QStringList unheard() const;

    std::unique_ptr<MessageLog> m_log;
    QQmlEngine m_engine;
    std::unique_ptr<QObject> m_object;
};

namespace {

const QString actionsDirectory = QStringLiteral("/usr/share/glimmera/quickactions");
const QString widgetsDirectory = QStringLiteral("/usr/share/glimmera/eventswidgets");

QByteArray anyLiteral(int type)
{
    switch (type) {
    case QMetaType::Bool:
        return "Math.random() < 0.5";
    case QMetaType::Int:
        return "0";
    case QMetaType::QString:
        return "'any' + calls % 3";
    case QMetaType::QStringList:
        return "['any', 'other']";
    case QMetaType::QUrl:
        return "'file:///nonexistent'";
    default:
        return {};
    }
}

QByteArray handler(QByteArray signal)
{
    signal[0] = char(std::toupper(signal.at(0)));
    return "on" + signal;
}

// The signals that a type declares itself.
QList<QByteArray> ownSignals(const QMetaObject *meta, const QMetaObject *base)
{
    QList<QByteArray> names;
    for (int i = base->methodCount(); i < meta->methodCount(); ++i) {
        if (meta->method(i).methodType() == QMetaMethod::Signal) {
            names.append(meta->method(i).name());
        }
    }
    return names;
}

} // namespace

void TestCallbacks::initTestCase()
{
    QLocale::setDefault(QLocale(QStringLiteral("en_GB")));
    m_engine.addImportPath(QStringLiteral(QML_BUILD_DIR));
}

void TestCallbacks::init()
{
    m_object.reset();
    Files::remove(actionsDirectory);
    Files::remove(widgetsDirectory);
    EveryType::installFiles();
    m_log = std::make_unique<MessageLog>();
}

void TestCallbacks::make(const char *type, const QByteArray &declaration)
{
    const auto create = [this](const QByteArray &document) {
        QQmlComponent component(&m_engine);
        component.setData("import QtQml 2.15\nimport com.marlo.settings.system 1.0\n" + document,
                          QUrl(QStringLiteral("test.qml")));
        std::unique_ptr<QObject> created(component.create());
        if (created == nullptr) {
            qFatal("%s", qPrintable(component.errorString()));
        }
        return created;
    };
    // Looks up the members in an object that has no handlers.
    const std::unique_ptr<QObject> model = create(QByteArray(type) + " { }");
    const bool isModel = qobject_cast<QAbstractListModel *>(model.get()) != nullptr;
    const QMetaObject *base =
        isModel ? &QAbstractListModel::staticMetaObject : &QObject::staticMetaObject;
    const QMetaObject *meta = model->metaObject();

    QByteArray uses;
    for (int i = base->propertyCount(); i < meta->propertyCount(); ++i) {
        const QMetaProperty property = meta->property(i);
        uses += "        got = " + QByteArray(property.name()) + ";\n";
        const QByteArray literal =
            anyLiteral(property.isEnumType() ? int(QMetaType::Int) : property.userType());
        if (property.isWritable() && !literal.isEmpty()) {
            uses += "        " + QByteArray(property.name()) + " = " + literal + ";\n";
        }
    }
    for (int i = base->methodCount(); i < meta->methodCount(); ++i) {
        const QMetaMethod method = meta->method(i);
        if (method.access() != QMetaMethod::Public || method.methodType() == QMetaMethod::Signal) {
            continue;
        }
        QByteArrayList arguments;
        for (int j = 0; j < method.parameterCount(); ++j) {
            arguments.append(anyLiteral(method.parameterType(j)));
        }
        uses += "        got = " + method.name() + '(' + arguments.join(", ") + ");\n";
    }
    QList<QByteArray> names = ownSignals(meta, base);
    if (isModel) {
        names += {"rowsAboutToBeInserted", "rowsInserted", "rowsAboutToBeRemoved", "rowsRemoved",
                  "dataChanged"};
    }
    QByteArray handlers;
    for (const QByteArray &name : qAsConst(names)) {
        handlers += "    " + handler(name) + ": answer('" + name + "')\n";
    }
    // The number of answers is limited, because endless answers would be a mistake of the page.
    m_object = create(QByteArray(type)
                      + " {\n    property var heard: []\n"
                        "    property var all: ['"
                      + names.join("', '")
                      + "']\n"
                        "    property int calls: 0\n    property int depth: 0\n"
                        "    property var got\n"
                      + declaration
                      + "\n    function answer(name) {\n"
                        "        if (heard.indexOf(name) < 0) heard.push(name)\n"
                        "        if (depth > 1 || calls >= 200) return\n"
                        "        ++depth; ++calls\n"
                      + uses + "        --depth\n    }\n" + handlers + "}\n");
}

QStringList TestCallbacks::unheard() const
{
    QStringList names = m_object->property("all").toStringList();
    const QStringList heard = m_object->property("heard").toStringList();
    for (const QString &name : heard) {
        names.removeAll(name);
    }
    return names;
}

void TestCallbacks::kivInfo()
{
    ServiceProcess daemon("system", QStringLiteral("com.marlo.kivd"), "replies");
    make("KivInfo");
    TRY_COMPARE(unheard().join(QLatin1Char(' ')), QString());
    daemon.sendSignals(100);
    TRY_COMPARE(m_object->property("kivId").toString(), QStringLiteral("cover-100"));
}

void TestCallbacks::locationConfiguration()
{
    make("LocationConfiguration");
    for (int i = 0; i < 100 && !unheard().isEmpty(); ++i) {
        for (const char *name : {"gpsEnabled", "mlsEnabled", "customSettingsEnabled"}) {
            m_object->setProperty(name, !m_object->property(name).toBool());
        }
        for (const char *name : {"mlsOnlineState", "hereState"}) {
            m_object->setProperty(name, m_object->property(name).toInt() == 1 ? 2 : 1);
        }
        QTest::qWait(0);
    }
    QCOMPARE(unheard().join(QLatin1Char(' ')), QString());
}

void TestCallbacks::memoryCardFormatter()
{
    // Requests every operation for a card that does not exist.
    DiskServicePeer service(
        {QStringLiteral("Mount=DeviceBusy"), QStringLiteral("Unmount=NotMounted")});
    make("MemoryCardFormatter");
    m_object->setProperty("deviceName", QStringLiteral("testcard1"));
    m_object->setProperty("devicePath", QStringLiteral("/dev/testcard1"));
    for (int i = 0; i < 1000 && !unheard().isEmpty(); ++i) {
        QMetaObject::invokeMethod(m_object.get(), i % 2 == 0 ? "mount" : "unmount");
        QTest::qWait(10);
    }
    QCOMPARE(unheard().join(QLatin1Char(' ')), QString());
    // Once the handlers stop answering, the formatter becomes idle and still works.
    m_object->setProperty("calls", 200);
    TRY(!m_object->property("busy").toBool());
    QTest::qWait(100);
    TRY(!m_object->property("busy").toBool());
    m_object->setProperty("devicePath", QStringLiteral("/dev/testcard2"));
    TRY_COMPARE(m_object->property("filesystemType").toString(), QStringLiteral("vfat"));
    m_object.reset();
    QVERIFY(QThreadPool::globalInstance()->waitForDone(patience));
}

void TestCallbacks::quickActionsModel()
{
    make("QuickActionsModel", "    showPotential: true");
    const QString path = actionsDirectory + QStringLiteral("/lamp.conf");
    for (int i = 0; i < 20 && !unheard().isEmpty(); ++i) {
        Files::write(actionsDirectory + QStringLiteral("/%1.conf").arg(i), "title=a\n");
        m_object->setProperty("showPotential", i % 2 == 0);
        QMetaObject::invokeMethod(m_object.get(), i % 4 < 2 ? "enableAction" : "disableAction",
                                  Q_ARG(QString, path));
        QTest::qWait(100);
    }
    QCOMPARE(unheard().join(QLatin1Char(' ')), QString());
    TRY(QMetaObject::invokeMethod(m_object.get(), "showPotentialChanged"));
}

void TestCallbacks::eventsWidgetsModel()
{
    make("EventsWidgetsModel");
    for (int i = 0; i < 20 && !unheard().isEmpty(); ++i) {
        const QString file = widgetsDirectory + QStringLiteral("/new.json");
        if (i % 2 == 0) {
            Files::write(file, R"({ "widgets": [ { "path": "new" } ] })");
        } else {
            Files::remove(file);
        }
        QMetaObject::invokeMethod(m_object.get(), i % 4 < 2 ? "disableWidget" : "enableWidget",
                                  Q_ARG(QString, QStringLiteral("weather")));
        QTest::qWait(100);
    }
    QCOMPARE(unheard().join(QLatin1Char(' ')), QString());
}

void TestCallbacks::titlesView()
{
    make("TitlesView", "    role: 'title'; property var other: EventsWidgetsModel { }");
    m_object->setProperty("model", m_object->property("other"));
    m_object->setProperty("match", 7);
    for (const char *name : {"role", "matchRole"}) {
        m_object->setProperty(name, QStringLiteral("path"));
    }
    m_object->setProperty("matchRole", QString());
    TRY_COMPARE(unheard().join(QLatin1Char(' ')), QString());
    m_object->setProperty("calls", 200);
    m_object->setProperty("matchRole", QString());
    m_object->setProperty("role", QStringLiteral("title"));
    QCOMPARE(m_object->property("value").toString(), QStringLiteral("Weather"));
}

void TestCallbacks::termsOfUseManager()
{
    make("TermsOfUseManager");
    m_object->setProperty("vendorPath", QStringLiteral("/usr/share/marlo-settings/vendor"));
    QCOMPARE(unheard().join(QLatin1Char(' ')), QString());
    m_object->setProperty("calls", 200);
    m_object->setProperty("vendorPath", QStringLiteral("/usr/share/marlo-settings/vendor"));
    QVERIFY(m_object->property("hasVendorTermsOfUse").toBool());
}

QTEST_GUILESS_MAIN(TestCallbacks)

#include "tst_callbacks.moc"
