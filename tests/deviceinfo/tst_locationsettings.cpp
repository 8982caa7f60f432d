// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "locationsettings.h"
#include "loggedtest.h"
#include "mgconfitem.h"

#include <QProcess>
#include <QtTest>

#include <cstdio>

class TestLocationSettings : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void properties();
    void statesAreNumbers();
    void defaults();
    void settersStore();
    void sameValuesStoreNothing();
    void readsWhatIsStored();
    void nonsenseReadsAsTheDefault_data();
    void nonsenseReadsAsTheDefault();
    void refusesWhatIsNoState_data();
    void refusesWhatIsNoState();
    void objectsAgree();
    void emitsOnRealChangesOnly();
    void aHandlerMayCallBack();
    void aHandlerMayDelete();
    void otherKeysChangeNothing();
    void followsAnotherProcess();
    void changesThatAreNotDeliveredYet();
    void anotherProcessFollows();
};

using State = LocationSettings::OnlineAGpsState;

namespace {

const QString gpsKey = QStringLiteral("/settings/location/gps_enabled");
const QString mlsKey = QStringLiteral("/settings/location/mls_enabled");
const QString mlsOnlineKey = QStringLiteral("/settings/location/mls_online_state");
const QString hereKey = QStringLiteral("/settings/location/here_state");

QVariant stored(const QString &key)
{
    return MGConfItem(key).value();
}

void store(const QString &key, const QVariant &value)
{
    MGConfItem(key).set(value);
}

// Another process: it prints a line for each change, and sets two switches for each line it reads.
int another(QCoreApplication &application)
{
    LocationSettings settings;
    const auto say = [&settings] {
        std::printf("%d %d %d %d\n", settings.gpsEnabled(), settings.mlsEnabled(),
                    settings.mlsOnlineState(), settings.hereState());
        std::fflush(stdout);
    };
    QObject::connect(&settings, &LocationSettings::gpsEnabledChanged, &settings, say);
    QObject::connect(&settings, &LocationSettings::mlsEnabledChanged, &settings, say);
    QObject::connect(&settings, &LocationSettings::mlsOnlineStateChanged, &settings, say);
    QObject::connect(&settings, &LocationSettings::hereStateChanged, &settings, say);

    QSocketNotifier input(0, QSocketNotifier::Read);
    QObject::connect(&input, &QSocketNotifier::activated, &settings, [&] {
        char line[64];
        if (std::fgets(line, sizeof(line), stdin) == nullptr) {
            application.quit();
        } else {
            settings.setGpsEnabled(false);
            settings.setHereState(LocationSettings::OnlineAGpsDisabled);
        }
    });
    say();
    return QCoreApplication::exec();
}

} // namespace

void TestLocationSettings::init()
{
    for (const QString &key : {gpsKey, mlsKey, mlsOnlineKey, hereKey}) {
        MGConfItem(key).unset();
    }
    LoggedTest::init();
}

void TestLocationSettings::properties()
{
    const QMetaObject &type = LocationSettings::staticMetaObject;
    QStringList names;
    for (int i = type.propertyOffset(); i < type.propertyCount(); ++i) {
        const QMetaProperty property = type.property(i);
        names.append(QString::fromLatin1(property.name()));
        QVERIFY(property.isReadable());
        QVERIFY(property.isWritable());
        QCOMPARE(property.notifySignal().methodSignature(),
                 QByteArray(property.name()) + "Changed()");
    }
    const QStringList expected = {QStringLiteral("gpsEnabled"), QStringLiteral("mlsEnabled"),
                                  QStringLiteral("mlsOnlineState"), QStringLiteral("hereState")};
    QCOMPARE(names, expected);
}

void TestLocationSettings::statesAreNumbers()
{
    const QMetaEnum states = QMetaEnum::fromType<State>();
    QCOMPARE(states.keyCount(), 3);
    for (int i = 0; i < states.keyCount(); ++i) {
        QCOMPARE(states.value(i), i);
    }
    LocationSettings settings;
    QVERIFY(settings.setProperty("hereState", 2));
    QCOMPARE(settings.property("hereState").toInt(), 2);
    QCOMPARE(settings.hereState(), LocationSettings::OnlineAGpsEnabled);
}

void TestLocationSettings::defaults()
{
    const LocationSettings settings;
    QVERIFY(!settings.gpsEnabled());
    QVERIFY(!settings.mlsEnabled());
    QCOMPARE(settings.mlsOnlineState(), State(0));
    QCOMPARE(settings.hereState(), State(0));
    QVERIFY(!stored(gpsKey).isValid());
}

void TestLocationSettings::settersStore()
{
    LocationSettings settings;
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    QSignalSpy mlsChanged(&settings, &LocationSettings::mlsEnabledChanged);
    QSignalSpy mlsOnlineChanged(&settings, &LocationSettings::mlsOnlineStateChanged);
    QSignalSpy hereChanged(&settings, &LocationSettings::hereStateChanged);

    settings.setGpsEnabled(true);
    QVERIFY(settings.gpsEnabled());
    QCOMPARE(gpsChanged.size(), 1);
    QCOMPARE(stored(gpsKey), QVariant(true));
    settings.setMlsEnabled(true);
    QVERIFY(settings.mlsEnabled());
    QCOMPARE(mlsChanged.size(), 1);
    QCOMPARE(stored(mlsKey), QVariant(true));
    settings.setMlsOnlineState(State(1));
    QCOMPARE(settings.mlsOnlineState(), State(1));
    QCOMPARE(mlsOnlineChanged.size(), 1);
    QCOMPARE(stored(mlsOnlineKey), QVariant(1));
    settings.setHereState(State(2));
    QCOMPARE(settings.hereState(), State(2));
    QCOMPARE(hereChanged.size(), 1);
    QCOMPARE(stored(hereKey), QVariant(2));

    settings.setGpsEnabled(false);
    settings.setMlsEnabled(false);
    settings.setMlsOnlineState(State(0));
    settings.setHereState(State(0));
    QVERIFY(!settings.gpsEnabled());
    QVERIFY(!settings.mlsEnabled());
    QCOMPARE(settings.mlsOnlineState(), State(0));
    QCOMPARE(settings.hereState(), State(0));
    for (const QSignalSpy *spy : {&gpsChanged, &mlsChanged, &mlsOnlineChanged, &hereChanged}) {
        QCOMPARE(spy->size(), 2);
    }
}

void TestLocationSettings::sameValuesStoreNothing()
{
    LocationSettings settings;
    settings.setGpsEnabled(false);
    settings.setMlsEnabled(false);
    settings.setMlsOnlineState(State(0));
    settings.setHereState(State(0));
    for (const QString &key : {gpsKey, mlsKey, mlsOnlineKey, hereKey}) {
        QVERIFY2(!stored(key).isValid(), qPrintable(key));
    }
}

void TestLocationSettings::readsWhatIsStored()
{
    store(gpsKey, true);
    store(mlsKey, true);
    store(mlsOnlineKey, 2);
    store(hereKey, 1);
    const LocationSettings settings;
    QVERIFY(settings.gpsEnabled());
    QVERIFY(settings.mlsEnabled());
    QCOMPARE(settings.mlsOnlineState(), State(2));
    QCOMPARE(settings.hereState(), State(1));
}

void TestLocationSettings::nonsenseReadsAsTheDefault_data()
{
    QTest::addColumn<QByteArray>("value");
    // 2 in the lower 32 bits of the third one.
    for (const char *value :
         {"3", "-1", "int64 4294967298", "'2'", "['2']", "{'a': <1>}", "1e300", "handle 2"}) {
        QTest::newRow(value) << QByteArray(value);
    }
}

void TestLocationSettings::nonsenseReadsAsTheDefault()
{
    QFETCH(QByteArray, value);
    store(hereKey, 2);
    DconfTool::waitUntilStored();
    LocationSettings followed;
    QSignalSpy hereChanged(&followed, &LocationSettings::hereStateChanged);
    DconfTool::write(hereKey, value);
    QTRY_COMPARE(hereChanged.size(), 1);
    QCOMPARE(followed.hereState(), State(0));
    const LocationSettings fresh;
    QCOMPARE(fresh.hereState(), State(0));

    // A valid state can be set again.
    followed.setHereState(State(1));
    QCOMPARE(fresh.hereState(), State(1));
    QCOMPARE(stored(hereKey), QVariant(1));
}

void TestLocationSettings::refusesWhatIsNoState_data()
{
    QTest::addColumn<int>("number");
    QTest::newRow("3") << 3;
    QTest::newRow("-1") << -1;
    QTest::newRow("large") << std::numeric_limits<int>::max();
}

void TestLocationSettings::refusesWhatIsNoState()
{
    QFETCH(int, number);
    LocationSettings settings;
    settings.setHereState(State(2));
    settings.setMlsOnlineState(State(1));
    QSignalSpy hereChanged(&settings, &LocationSettings::hereStateChanged);
    // As QML does.
    settings.setProperty("hereState", number);
    settings.setProperty("mlsOnlineState", number);
    QCOMPARE(settings.hereState(), State(2));
    QCOMPARE(settings.mlsOnlineState(), State(1));
    QCOMPARE(stored(hereKey), QVariant(2));
    QVERIFY(hereChanged.isEmpty());
    const QString warning =
        QStringLiteral("LocationSettings: %1 is no state of an online service").arg(number);
    QCOMPARE(m_log->takeTexts(), QStringList({warning, warning}));
}

void TestLocationSettings::objectsAgree()
{
    LocationSettings one;
    LocationSettings another;
    QSignalSpy changed(&another, &LocationSettings::mlsEnabledChanged);
    one.setMlsEnabled(true);
    QVERIFY(another.mlsEnabled());
    QCOMPARE(changed.size(), 1);
    another.setMlsEnabled(false);
    QVERIFY(!one.mlsEnabled());
}

void TestLocationSettings::emitsOnRealChangesOnly()
{
    const LocationSettings settings;
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    QSignalSpy hereChanged(&settings, &LocationSettings::hereStateChanged);
    store(gpsKey, false); // as good as not set
    store(hereKey, 0);
    store(hereKey, 7); // counts as 0
    QVERIFY(gpsChanged.isEmpty());
    QVERIFY(hereChanged.isEmpty());
}

void TestLocationSettings::aHandlerMayCallBack()
{
    LocationSettings settings;
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    QSignalSpy mlsChanged(&settings, &LocationSettings::mlsEnabledChanged);
    // Positioning by network goes with the satellites, which this one never leaves on.
    connect(&settings, &LocationSettings::gpsEnabledChanged, this, [&settings] {
        settings.setMlsEnabled(settings.gpsEnabled());
        settings.setGpsEnabled(false);
    });
    settings.setGpsEnabled(true);
    QVERIFY(!settings.gpsEnabled());
    QVERIFY(!settings.mlsEnabled());
    QCOMPARE(gpsChanged.size(), 2);
    QCOMPARE(mlsChanged.size(), 2);
    QCOMPARE(stored(gpsKey), QVariant(false));
}

void TestLocationSettings::aHandlerMayDelete()
{
    auto *settings = new LocationSettings;
    LocationSettings another;
    connect(&another, &LocationSettings::hereStateChanged, this, [settings] { delete settings; });
    settings->setHereState(State(2));
    QCOMPARE(another.hereState(), State(2));
}

void TestLocationSettings::otherKeysChangeNothing()
{
    LocationSettings settings;
    settings.setGpsEnabled(true);
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    store(QStringLiteral("/settings/location/custom_settings_enabled"), true);
    store(QStringLiteral("/settings/location/custom_settings"),
          QVariantMap{{QStringLiteral("gps/enabled"), false}});
    QVERIFY(settings.gpsEnabled());
    QVERIFY(!settings.mlsEnabled());
    QVERIFY(gpsChanged.isEmpty());
}

void TestLocationSettings::followsAnotherProcess()
{
    const LocationSettings settings;
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    QSignalSpy mlsOnlineChanged(&settings, &LocationSettings::mlsOnlineStateChanged);
    DconfTool::waitUntilStored();
    DconfTool::write(gpsKey, "true");
    DconfTool::write(mlsOnlineKey, "2");
    QTRY_COMPARE(gpsChanged.size(), 1);
    QTRY_COMPARE(mlsOnlineChanged.size(), 1);
    QVERIFY(settings.gpsEnabled());
    QCOMPARE(settings.mlsOnlineState(), State(2));
    DconfTool::reset(QStringLiteral("/settings/location/"));
    QTRY_COMPARE(gpsChanged.size(), 2);
    QTRY_COMPARE(mlsOnlineChanged.size(), 2);
    QVERIFY(!settings.gpsEnabled());
    QCOMPARE(settings.mlsOnlineState(), State(0));
}

void TestLocationSettings::changesThatAreNotDeliveredYet()
{
    LocationSettings settings;
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    QSignalSpy mlsChanged(&settings, &LocationSettings::mlsEnabledChanged);
    DconfTool::waitUntilStored();
    const QStringList keys = {gpsKey, mlsKey, mlsOnlineKey, hereKey};
    for (const QString &key : keys) {
        DconfTool::write(key, key == gpsKey || key == mlsKey ? "true" : "2");
    }
    QVERIFY(gpsChanged.isEmpty());
    QVERIFY(settings.gpsEnabled());
    QCOMPARE(settings.hereState(), State(2));

    settings.setGpsEnabled(false);
    settings.setMlsEnabled(true);
    settings.setMlsOnlineState(State(0));
    settings.setHereState(State(0));
    QTRY_COMPARE(DconfTool::read(hereKey), QByteArray("0")); // stored last
    QCOMPARE(DconfTool::read(mlsOnlineKey), QByteArray("0"));
    QCOMPARE(DconfTool::read(mlsKey), QByteArray("true"));
    QCOMPARE(DconfTool::read(gpsKey), QByteArray("false"));
    QTRY_COMPARE(mlsChanged.size(), 1);
    QVERIFY(settings.mlsEnabled());
    QVERIFY(!settings.gpsEnabled());
}

void TestLocationSettings::anotherProcessFollows()
{
    LocationSettings settings;
    settings.setGpsEnabled(true);
    DconfTool::waitUntilStored();

    QProcess process;
    process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
    process.start(QCoreApplication::applicationFilePath(), {QStringLiteral("--another")});
    QByteArray said;
    connect(&process, &QProcess::readyRead, this, [&] { said += process.readAll(); });
    QTRY_COMPARE_WITH_TIMEOUT(said, QByteArray("1 0 0 0\n"), 60000);

    settings.setMlsEnabled(true);
    QTRY_COMPARE_WITH_TIMEOUT(said, QByteArray("1 0 0 0\n1 1 0 0\n"), 60000);
    settings.setMlsOnlineState(State(2));
    QTRY_COMPARE_WITH_TIMEOUT(said, QByteArray("1 0 0 0\n1 1 0 0\n1 1 2 0\n"), 60000);

    // And the other way round.
    process.write("now you\n");
    QTRY_VERIFY_WITH_TIMEOUT(!settings.gpsEnabled(), 60000);
    QTRY_COMPARE_WITH_TIMEOUT(settings.hereState(), State(1), 60000);
    QVERIFY(settings.mlsEnabled());
    QCOMPARE(settings.mlsOnlineState(), State(2));

    process.closeWriteChannel();
    QTRY_COMPARE_WITH_TIMEOUT(process.state(), QProcess::NotRunning, 60000);
    QCOMPARE(process.exitStatus(), QProcess::NormalExit);
    QCOMPARE(process.exitCode(), 0);
    QCOMPARE(said, QByteArray("1 0 0 0\n1 1 0 0\n1 1 2 0\n0 1 2 0\n0 1 2 1\n"));
}

int main(int argc, char *argv[])
{
    QCoreApplication application(argc, argv);
    if (QCoreApplication::arguments().contains(QStringLiteral("--another"))) {
        return another(application);
    }
    TestLocationSettings test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_locationsettings.moc"
