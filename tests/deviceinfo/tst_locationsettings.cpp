// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "locationswitches.h"
#include "loggedtest.h"
#include "patience.h"
#include "texts.h"

#include <QProcess>
#include <QtTest>

#include <cstdio>

class TestLocationSettings : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void defaults();
    void settersStore();
    void sameValuesStoreNothing();
    void readsStoredValues();
    void nonsenseReadsAsTheDefault_data();
    void nonsenseReadsAsTheDefault();
    void refusesOtherNumbers_data();
    void refusesOtherNumbers();
    void objectsAgree();
    void emitsOnRealChangesOnly();
    void aHandlerMayCallBack();
    void aHandlerMayDelete();
    void otherKeysChangeNothing();
    void followsAnotherProcess();
    void changesThatAreNotDeliveredYet();
    void anotherProcessFollows();
};

namespace {

// Another process: it prints its switches after each change, and sets two for each line it reads.
int another(QCoreApplication &application)
{
    LocationSettings settings;
    const auto say = [&settings] {
        const Switches switches = switchesOf(settings);
        std::printf("%d %d %d %d\n", switches[0], switches[1], switches[2], switches[3]);
        std::fflush(stdout);
    };
    for (const auto changed :
         {&LocationSettings::gpsEnabledChanged, &LocationSettings::mlsEnabledChanged,
          &LocationSettings::mlsOnlineStateChanged, &LocationSettings::hereStateChanged}) {
        QObject::connect(&settings, changed, &settings, say);
    }

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
    for (const QString &key : switchKeys) {
        MGConfItem(key).unset();
    }
    LoggedTest::init();
}

void TestLocationSettings::defaults()
{
    QCOMPARE(switchesOf(LocationSettings()), Switches({0, 0, 0, 0}));
    QVERIFY(!stored(gpsKey).isValid());
}

void TestLocationSettings::settersStore()
{
    LocationSettings settings;
    QStringList changes;
    recordChanges(&settings, &changes);

    setSwitches(&settings, {1, 1, 1, 2});
    QCOMPARE(switchesOf(settings), Switches({1, 1, 1, 2}));
    QCOMPARE(changes.join(QLatin1Char(',')), "gps 1,mls 1,mls online 1,here 2"_s);
    QCOMPARE(stored(gpsKey), QVariant(true));
    QCOMPARE(stored(mlsKey), QVariant(true));
    QCOMPARE(stored(mlsOnlineKey), QVariant(1));
    QCOMPARE(stored(hereKey), QVariant(2));

    changes.clear();
    setSwitches(&settings, {0, 0, 0, 0});
    QCOMPARE(switchesOf(settings), Switches({0, 0, 0, 0}));
    QCOMPARE(changes.join(QLatin1Char(',')), "gps 0,mls 0,mls online 0,here 0"_s);
}

void TestLocationSettings::sameValuesStoreNothing()
{
    LocationSettings settings;
    setSwitches(&settings, {0, 0, 0, 0});
    for (const QString &key : switchKeys) {
        QVERIFY2(!stored(key).isValid(), qPrintable(key));
    }
}

void TestLocationSettings::readsStoredValues()
{
    store(gpsKey, true);
    store(mlsKey, true);
    store(mlsOnlineKey, 2);
    store(hereKey, 1);
    QCOMPARE(switchesOf(LocationSettings()), Switches({1, 1, 2, 1}));
}

void TestLocationSettings::nonsenseReadsAsTheDefault_data()
{
    QTest::addColumn<QByteArray>("value");
    // The lower 32 bits of the third value are 2.
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
    QStringList changes;
    recordChanges(&followed, &changes);
    DconfTool::write(hereKey, value);
    QTRY_COMPARE(changes, QStringList("here 0"_s));
    const LocationSettings fresh;
    QCOMPARE(fresh.hereState(), State(0));

    // A valid state can be set again.
    followed.setHereState(State(1));
    QCOMPARE(fresh.hereState(), State(1));
    QCOMPARE(stored(hereKey), QVariant(1));
}

void TestLocationSettings::refusesOtherNumbers_data()
{
    QTest::addColumn<int>("number");
    QTest::newRow("3") << 3;
    QTest::newRow("-1") << -1;
    QTest::newRow("large") << std::numeric_limits<int>::max();
}

void TestLocationSettings::refusesOtherNumbers()
{
    QFETCH(int, number);
    LocationSettings settings;
    setSwitches(&settings, {0, 0, 1, 2});
    QStringList changes;
    recordChanges(&settings, &changes);
    // As QML does.
    settings.setProperty("hereState", number);
    settings.setProperty("mlsOnlineState", number);
    QCOMPARE(switchesOf(settings), Switches({0, 0, 1, 2}));
    QCOMPARE(stored(hereKey), QVariant(2));
    QCOMPARE(changes, QStringList());
    const QString warning =
        "LocationSettings: %1 is not a state of an online service"_s.arg(number);
    QCOMPARE(m_log->takeTexts(), QStringList({warning, warning}));
}

void TestLocationSettings::objectsAgree()
{
    LocationSettings one;
    LocationSettings another;
    QStringList changes;
    recordChanges(&another, &changes);
    one.setMlsEnabled(true);
    QCOMPARE(changes, QStringList("mls 1"_s));
    another.setMlsEnabled(false);
    QVERIFY(!one.mlsEnabled());
}

void TestLocationSettings::emitsOnRealChangesOnly()
{
    const LocationSettings settings;
    QStringList changes;
    recordChanges(&settings, &changes);
    store(gpsKey, false); // the same as not set
    store(hereKey, 0);
    store(hereKey, 7); // counts as 0
    QCOMPARE(changes, QStringList());
}

void TestLocationSettings::aHandlerMayCallBack()
{
    LocationSettings settings;
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    QSignalSpy mlsChanged(&settings, &LocationSettings::mlsEnabledChanged);
    connect(&settings, &LocationSettings::gpsEnabledChanged, this, [&settings] {
        settings.setMlsEnabled(settings.gpsEnabled());
        settings.setGpsEnabled(false);
    });
    settings.setGpsEnabled(true);
    QCOMPARE(switchesOf(settings), Switches({0, 0, 0, 0}));
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
    QStringList changes;
    recordChanges(&settings, &changes);
    store("/settings/location/custom_settings_enabled"_s, true);
    store("/settings/location/custom_settings"_s, QVariantMap{{"gps/enabled"_s, false}});
    QCOMPARE(switchesOf(settings), Switches({1, 0, 0, 0}));
    QCOMPARE(changes, QStringList());
}

void TestLocationSettings::followsAnotherProcess()
{
    const LocationSettings settings;
    QStringList changes;
    recordChanges(&settings, &changes);
    DconfTool::waitUntilStored();
    DconfTool::write(gpsKey, "true");
    DconfTool::write(mlsOnlineKey, "2");
    const auto all = [&changes] { return changes.join(QLatin1Char(',')); };
    QTRY_COMPARE(all(), "gps 1,mls online 2"_s);
    QCOMPARE(switchesOf(settings), Switches({1, 0, 2, 0}));
    DconfTool::reset("/settings/location/"_s);
    QTRY_COMPARE(all(), "gps 1,mls online 2,gps 0,mls online 0"_s);
    QCOMPARE(switchesOf(settings), Switches({0, 0, 0, 0}));
}

void TestLocationSettings::changesThatAreNotDeliveredYet()
{
    LocationSettings settings;
    QSignalSpy gpsChanged(&settings, &LocationSettings::gpsEnabledChanged);
    QSignalSpy mlsChanged(&settings, &LocationSettings::mlsEnabledChanged);
    DconfTool::waitUntilStored();
    for (const QString &key : switchKeys) {
        DconfTool::write(key, key == gpsKey || key == mlsKey ? "true" : "2");
    }
    QVERIFY(gpsChanged.isEmpty());
    QCOMPARE(switchesOf(settings), Switches({1, 1, 2, 2}));

    setSwitches(&settings, {0, 1, 0, 0});
    QTRY_COMPARE(DconfTool::read(hereKey), QByteArray("0")); // stored last
    QCOMPARE(DconfTool::read(mlsOnlineKey), QByteArray("0"));
    QCOMPARE(DconfTool::read(mlsKey), QByteArray("true"));
    QCOMPARE(DconfTool::read(gpsKey), QByteArray("false"));
    QTRY_COMPARE(mlsChanged.size(), 1);
    QCOMPARE(switchesOf(settings), Switches({0, 1, 0, 0}));
}

void TestLocationSettings::anotherProcessFollows()
{
    LocationSettings settings;
    settings.setGpsEnabled(true);
    DconfTool::waitUntilStored();
    QStringList changes;
    recordChanges(&settings, &changes);

    QProcess process;
    process.setProcessChannelMode(QProcess::ForwardedErrorChannel);
    process.start(QCoreApplication::applicationFilePath(), {"--another"_s});
    QByteArray said;
    connect(&process, &QProcess::readyRead, this, [&] { said += process.readAll(); });
    TRY_COMPARE(said, QByteArray("1 0 0 0\n"));
    settings.setMlsEnabled(true);
    TRY_COMPARE(said, QByteArray("1 0 0 0\n1 1 0 0\n"));
    settings.setMlsOnlineState(State(2));
    TRY_COMPARE(said, QByteArray("1 0 0 0\n1 1 0 0\n1 1 2 0\n"));

    // And the other way round.
    changes.clear();
    process.write("now you\n");
    TRY_COMPARE(changes.join(QLatin1Char(',')), "gps 0,here 1"_s);
    QCOMPARE(switchesOf(settings), Switches({0, 1, 2, 1}));

    process.closeWriteChannel();
    TRY_COMPARE(process.state(), QProcess::NotRunning);
    QCOMPARE(process.exitStatus(), QProcess::NormalExit);
    QCOMPARE(process.exitCode(), 0);
    QCOMPARE(said, QByteArray("1 0 0 0\n1 1 0 0\n1 1 2 0\n0 1 2 0\n0 1 2 1\n"));
}

int main(int argc, char *argv[])
{
    QCoreApplication application(argc, argv);
    if (QCoreApplication::arguments().contains("--another"_s)) {
        return another(application);
    }
    TestLocationSettings test;
    return QTest::qExec(&test, argc, argv);
}

#include "tst_locationsettings.moc"
