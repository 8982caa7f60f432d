// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "locationswitches.h"
#include "loggedtest.h"
#include "patience.h"
#include "texts.h"

#include <QtTest>

#include <limits>

class TestLocationSettings : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void settersStore();
    void sameValuesStoreNothing();
    void nonsenseReadsAsTheDefault();
    void refusesOtherNumbers();
    void emitsOnRealChangesOnly();
    void aHandlerMayCallBack();
    void aHandlerMayDelete();
    void followsAnotherProcess();
    void changesThatAreNotDeliveredYet();
};

void TestLocationSettings::init()
{
    for (const QString &key : switchKeys) {
        MGConfItem(key).unset();
    }
    LoggedTest::init();
}

void TestLocationSettings::settersStore()
{
    LocationSettings settings;
    QStringList changes;
    recordChanges(&settings, &changes);

    setSwitches(&settings, {1, 1, 1, 2});
    QCOMPARE(switchesOf(settings), Switches({1, 1, 1, 2}));
    QCOMPARE(switchesOf(LocationSettings()), Switches({1, 1, 1, 2}));
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
    QCOMPARE(switchesOf(settings), Switches({0, 0, 0, 0}));
    setSwitches(&settings, {0, 0, 0, 0});
    for (const QString &key : switchKeys) {
        QVERIFY2(!stored(key).isValid(), qPrintable(key));
    }
}

void TestLocationSettings::nonsenseReadsAsTheDefault()
{
    LocationSettings followed;
    // The lower 32 bits of the third value are 2.
    for (const char *value :
         {"3", "-1", "int64 4294967298", "'2'", "['2']", "{'a': <1>}", "1e300", "handle 2"}) {
        // A valid state can be set again.
        followed.setHereState(State(2));
        QCOMPARE(stored(hereKey), QVariant(2));
        DconfTool::waitUntilStored();
        QStringList changes;
        QObject recorder;
        connect(&followed, &LocationSettings::hereStateChanged, &recorder,
                [&] { changes.append(QString::number(followed.hereState())); });
        DconfTool::write(hereKey, value);
        TRY_COMPARE(changes, QStringList("0"_s));
        QCOMPARE(LocationSettings().hereState(), State(0));
    }
}

void TestLocationSettings::refusesOtherNumbers()
{
    LocationSettings settings;
    setSwitches(&settings, {0, 0, 1, 2});
    QStringList changes;
    recordChanges(&settings, &changes);
    for (const int number : {3, -1, std::numeric_limits<int>::max()}) {
        // As QML does.
        settings.setProperty("hereState", number);
        settings.setProperty("mlsOnlineState", number);
        const QString warning =
            "LocationSettings: %1 is not a state of an online service"_s.arg(number);
        QCOMPARE(m_log->takeTexts(), QStringList({warning, warning}));
    }
    QCOMPARE(switchesOf(settings), Switches({0, 0, 1, 2}));
    QCOMPARE(stored(hereKey), QVariant(2));
    QCOMPARE(changes, QStringList());
}

void TestLocationSettings::emitsOnRealChangesOnly()
{
    LocationSettings settings;
    settings.setMlsEnabled(true);
    QStringList changes;
    recordChanges(&settings, &changes);
    store(gpsKey, false); // the same as not set
    store(hereKey, 0);
    store(hereKey, 7); // counts as 0
    store("/settings/location/custom_settings_enabled"_s, true);
    store("/settings/location/custom_settings"_s, QVariantMap{{"mls/enabled"_s, false}});
    QCOMPARE(changes, QStringList());
    QCOMPARE(switchesOf(settings), Switches({0, 1, 0, 0}));
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

void TestLocationSettings::followsAnotherProcess()
{
    const LocationSettings settings;
    QStringList changes;
    recordChanges(&settings, &changes);
    DconfTool::waitUntilStored();
    DconfTool::write(gpsKey, "true");
    DconfTool::write(mlsOnlineKey, "2");
    const auto all = [&changes] { return changes.join(QLatin1Char(',')); };
    TRY_COMPARE(all(), "gps 1,mls online 2"_s);
    QCOMPARE(switchesOf(settings), Switches({1, 0, 2, 0}));
    DconfTool::reset("/settings/location/"_s);
    TRY_COMPARE(all(), "gps 1,mls online 2,gps 0,mls online 0"_s);
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
    TRY_COMPARE(DconfTool::read(hereKey), QByteArray("0")); // stored last
    QCOMPARE(DconfTool::read(mlsOnlineKey), QByteArray("0"));
    QCOMPARE(DconfTool::read(mlsKey), QByteArray("true"));
    QCOMPARE(DconfTool::read(gpsKey), QByteArray("false"));
    TRY_COMPARE(mlsChanged.size(), 1);
    QCOMPARE(switchesOf(settings), Switches({0, 1, 0, 0}));
}

QTEST_GUILESS_MAIN(TestLocationSettings)

#include "tst_locationsettings.moc"
