// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "deviceinfo/locationconfiguration.h"
#include "files.h"
#include "files/regularfile.h"
#include "interfaceof.h"
#include "loggedtest.h"
#include "mgconfitem.h"

#include <QTranslator>
#include <QtTest>

class TestLocationConfiguration : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void propertiesAndMethods();
    void hasTheSwitchesOfThePlatform();

    void startsWithTheStoredFlag_data();
    void startsWithTheStoredFlag();
    void theFlagIsStored();
    void theSameFlagWritesNothing();
    void theFlagIsNotFollowed();
    void theFlagIsStoredBeforeItIsTold();

    void savesTheSwitches_data();
    void savesTheSwitches();
    void savingReplacesEverything();
    void restores_data();
    void restores();
    void whatIsNoMapRestoresAsNothing_data();
    void whatIsNoMapRestoresAsNothing();
    void statesAreAskedAfterTheSwitchesBefore();
    void restoresInOrder();
    void anotherObjectRestores();
    void sharesWithAnotherProcess();
    void restoresOverChangesThatAreNotDeliveredYet();

    void agreement_data();
    void agreement();
    void agreementInEnglish_data();
    void agreementInEnglish();
    void noAgreement_data();
    void noAgreement();
    void anAgreementThatCannotBeOpened_data();
    void anAgreementThatCannotBeOpened();
    void englishThatCannotBeOpened_data();
    void englishThatCannotBeOpened();
    void agreementContent_data();
    void agreementContent();
    void agreementsAreReadOnEveryRead();

private:
    void setSwitches(bool gps, bool mls, int mlsOnline, int here);
    void addAgreements();
};

using State = LocationSettings::OnlineAGpsState;

namespace {

const QString flagKey = QStringLiteral("/settings/location/custom_settings_enabled");
const QString savedKey = QStringLiteral("/settings/location/custom_settings");
const QString noTextId = QStringLiteral("settings_location-la-no_agreement_text_found");

QVariant stored(const QString &key)
{
    return MGConfItem(key).value();
}

void store(const QString &key, const QVariant &value)
{
    MGConfItem(key).set(value);
}

QVariantMap savedMap(bool gps, bool mls, bool mlsOnline, bool here)
{
    return {{QStringLiteral("gps/enabled"), gps},
            {QStringLiteral("mls/enabled"), mls},
            {QStringLiteral("mls/online_enabled"), mlsOnline},
            {QStringLiteral("here/enabled"), here}};
}

QString warning(const char *locale)
{
    return QStringLiteral(
               "warning [default] No agreement found for \"%1\" , falling back to english")
        .arg(QString::fromLatin1(locale));
}

class Translator : public QTranslator
{
public:
    bool isEmpty() const override { return false; }
    QString translate(const char *context, const char *sourceText, const char *disambiguation,
                      int n) const override
    {
        Q_UNUSED(context)
        Q_UNUSED(disambiguation)
        Q_UNUSED(n)
        return sourceText == noTextId.toLatin1() ? QStringLiteral("Tekstiä ei ole") : QString();
    }
};

} // namespace

void TestLocationConfiguration::init()
{
    for (const char *key : {"gps_enabled", "mls_enabled", "mls_online_state", "here_state",
                            "custom_settings", "custom_settings_enabled"}) {
        MGConfItem(QStringLiteral("/settings/location/") + QString::fromLatin1(key)).unset();
    }
    for (const char *directory : {"/usr/share/geoclue-provider-mlsdb/agreements",
                                  "/usr/share/libherepositioning/agreements"}) {
        Files::remove(QString::fromLatin1(directory));
    }
    QLocale::setDefault(QLocale(QStringLiteral("fi_FI")));
    LoggedTest::init();
}

void TestLocationConfiguration::setSwitches(bool gps, bool mls, int mlsOnline, int here)
{
    LocationSettings settings;
    settings.setGpsEnabled(gps);
    settings.setMlsEnabled(mls);
    settings.setMlsOnlineState(State(mlsOnline));
    settings.setHereState(State(here));
}

void TestLocationConfiguration::propertiesAndMethods()
{
    QCOMPARE(LocationConfiguration::staticMetaObject.superClass()->className(), "LocationSettings");
    const QStringList expected = {
        QStringLiteral("QString hereAgreementText readonly constant"),
        QStringLiteral("QString mlsOnlineAgreementText readonly constant"),
        QStringLiteral("bool customSettingsEnabled customSettingsEnabledChanged()"),
        QStringLiteral("signal void customSettingsEnabledChanged()"),
        QStringLiteral("void saveCustomSettings()"),
        QStringLiteral("void restoreCustomSettings()"),
    };
    QCOMPARE(interfaceOf(LocationConfiguration::staticMetaObject), expected);
}

void TestLocationConfiguration::hasTheSwitchesOfThePlatform()
{
    LocationConfiguration configuration;
    QSignalSpy changed(&configuration, &LocationSettings::mlsOnlineStateChanged);
    QVERIFY(configuration.setProperty("gpsEnabled", true));
    QVERIFY(configuration.setProperty("mlsEnabled", true));
    QVERIFY(configuration.setProperty("mlsOnlineState", 2));
    QVERIFY(configuration.setProperty("hereState", 1));
    QCOMPARE(configuration.property("gpsEnabled"), QVariant(true));
    QCOMPARE(configuration.property("mlsEnabled"), QVariant(true));
    QCOMPARE(configuration.property("mlsOnlineState").toInt(), 2);
    QCOMPARE(configuration.property("hereState").toInt(), 1);
    QCOMPARE(changed.size(), 1);
}

void TestLocationConfiguration::startsWithTheStoredFlag_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<bool>("enabled");
    QTest::newRow("not set") << QVariant() << false;
    QTest::newRow("true") << QVariant(true) << true;
    QTest::newRow("false") << QVariant(false) << false;
    QTest::newRow("1") << QVariant(1) << true;
    QTest::newRow("0") << QVariant(0) << false;
    QTest::newRow("\"true\"") << QVariant(QStringLiteral("true")) << true;
    QTest::newRow("\"false\"") << QVariant(QStringLiteral("false")) << false;
    QTest::newRow("list") << QVariant(QStringList{QStringLiteral("a"), QStringLiteral("b")})
                          << false;
    QTest::newRow("map") << QVariant(savedMap(true, true, true, true)) << false;
}

void TestLocationConfiguration::startsWithTheStoredFlag()
{
    QFETCH(QVariant, value);
    QFETCH(bool, enabled);
    store(flagKey, value);
    const LocationConfiguration configuration;
    QCOMPARE(configuration.customSettingsEnabled(), enabled);
    // Reading does not write.
    QCOMPARE(stored(flagKey), value);
}

void TestLocationConfiguration::theFlagIsStored()
{
    LocationConfiguration configuration;
    QSignalSpy changed(&configuration, &LocationConfiguration::customSettingsEnabledChanged);
    configuration.setCustomSettingsEnabled(true);
    QVERIFY(configuration.customSettingsEnabled());
    QCOMPARE(changed.size(), 1);
    QCOMPARE(stored(flagKey), QVariant(true));
    const LocationConfiguration later;
    QVERIFY(later.customSettingsEnabled());

    configuration.setCustomSettingsEnabled(false);
    QVERIFY(!configuration.customSettingsEnabled());
    QCOMPARE(changed.size(), 2);
    QCOMPARE(stored(flagKey), QVariant(false));
}

void TestLocationConfiguration::theSameFlagWritesNothing()
{
    LocationConfiguration configuration;
    QSignalSpy changed(&configuration, &LocationConfiguration::customSettingsEnabledChanged);
    configuration.setCustomSettingsEnabled(false);
    QVERIFY(!stored(flagKey).isValid());
    configuration.setCustomSettingsEnabled(true);
    store(flagKey, false);
    configuration.setCustomSettingsEnabled(true);
    QCOMPARE(stored(flagKey), QVariant(false));
    QCOMPARE(changed.size(), 1);
}

void TestLocationConfiguration::theFlagIsNotFollowed()
{
    const LocationConfiguration configuration;
    QSignalSpy changed(&configuration, &LocationConfiguration::customSettingsEnabledChanged);
    MGConfItem witness(flagKey);
    QSignalSpy seen(&witness, &MGConfItem::valueChanged);
    store(flagKey, true);
    QCOMPARE(seen.size(), 1);
    QVERIFY(!configuration.customSettingsEnabled());
    QVERIFY(changed.isEmpty());
}

void TestLocationConfiguration::theFlagIsStoredBeforeItIsTold()
{
    LocationConfiguration configuration;
    bool flag = false;
    QVariant inStore;
    connect(&configuration, &LocationConfiguration::customSettingsEnabledChanged, this, [&] {
        flag = configuration.customSettingsEnabled();
        inStore = stored(flagKey);
    });
    configuration.setCustomSettingsEnabled(true);
    QVERIFY(flag);
    QCOMPARE(inStore, QVariant(true));
}

void TestLocationConfiguration::savesTheSwitches_data()
{
    QTest::addColumn<bool>("gps");
    QTest::addColumn<bool>("mls");
    QTest::addColumn<int>("mlsOnline");
    QTest::addColumn<int>("here");
    QTest::newRow("all off") << false << false << 0 << 0;
    QTest::newRow("all on") << true << true << 2 << 2;
    QTest::newRow("gps") << true << false << 0 << 1;
    QTest::newRow("mls") << false << true << 1 << 0;
    QTest::newRow("mls online") << false << false << 2 << 1;
    QTest::newRow("here") << false << false << 1 << 2;
}

void TestLocationConfiguration::savesTheSwitches()
{
    QFETCH(bool, gps);
    QFETCH(bool, mls);
    QFETCH(int, mlsOnline);
    QFETCH(int, here);
    setSwitches(gps, mls, mlsOnline, here);
    LocationConfiguration configuration;
    configuration.saveCustomSettings();
    QCOMPARE(stored(savedKey), QVariant(savedMap(gps, mls, mlsOnline == 2, here == 2)));

    // Nothing else is touched.
    QCOMPARE(configuration.gpsEnabled(), gps);
    QCOMPARE(int(configuration.mlsOnlineState()), mlsOnline);
    QVERIFY(!configuration.customSettingsEnabled());
    QVERIFY(!stored(flagKey).isValid());
}

void TestLocationConfiguration::savingReplacesEverything()
{
    store(savedKey, QVariantMap{{QStringLiteral("another"), 1}});
    LocationConfiguration configuration;
    configuration.saveCustomSettings();
    QCOMPARE(stored(savedKey), QVariant(savedMap(false, false, false, false)));
    store(savedKey, QStringLiteral("no map"));
    configuration.saveCustomSettings();
    QCOMPARE(stored(savedKey), QVariant(savedMap(false, false, false, false)));
}

void TestLocationConfiguration::restores_data()
{
    QTest::addColumn<QVariantMap>("saved");
    QTest::addColumn<QList<int>>("before");
    QTest::addColumn<QList<int>>("after");

    const QVariantMap allOn = savedMap(true, true, true, true);
    const QVariantMap allOff = savedMap(false, false, false, false);
    const QVariantMap nothing;
    QTest::newRow("on from off") << allOn << QList<int>{0, 0, 1, 1} << QList<int>{1, 1, 2, 2};
    QTest::newRow("on from on") << allOn << QList<int>{1, 1, 2, 2} << QList<int>{1, 1, 2, 2};
    QTest::newRow("off from on") << allOff << QList<int>{1, 1, 2, 2} << QList<int>{0, 0, 1, 1};
    QTest::newRow("off from off") << allOff << QList<int>{0, 0, 1, 1} << QList<int>{0, 0, 1, 1};
    QTest::newRow("on, not agreed") << allOn << QList<int>{0, 0, 0, 0} << QList<int>{1, 1, 0, 0};
    QTest::newRow("off, not agreed") << allOff << QList<int>{1, 1, 0, 0} << QList<int>{0, 0, 0, 0};
    QTest::newRow("agreed to one") << allOn << QList<int>{0, 0, 0, 1} << QList<int>{1, 1, 0, 2};
    QTest::newRow("agreed to the other")
        << allOn << QList<int>{0, 0, 1, 0} << QList<int>{1, 1, 2, 0};
    QTest::newRow("gps") << savedMap(true, false, false, false) << QList<int>{0, 1, 2, 2}
                         << QList<int>{1, 0, 1, 1};
    QTest::newRow("mls") << savedMap(false, true, false, false) << QList<int>{1, 0, 2, 2}
                         << QList<int>{0, 1, 1, 1};
    QTest::newRow("mls online") << savedMap(false, false, true, false) << QList<int>{1, 1, 1, 2}
                                << QList<int>{0, 0, 2, 1};
    QTest::newRow("here") << savedMap(false, false, false, true) << QList<int>{1, 1, 2, 1}
                          << QList<int>{0, 0, 1, 2};
    QTest::newRow("nothing saved") << nothing << QList<int>{1, 1, 2, 2} << QList<int>{0, 0, 1, 1};
    QTest::newRow("nothing saved, not agreed")
        << nothing << QList<int>{1, 1, 0, 0} << QList<int>{0, 0, 0, 0};
    QTest::newRow("one entry") << QVariantMap{{QStringLiteral("mls/enabled"), true}}
                               << QList<int>{1, 0, 2, 2} << QList<int>{0, 1, 1, 1};
    QTest::newRow("entries of other types")
        << QVariantMap{{QStringLiteral("gps/enabled"), 1},
                       {QStringLiteral("mls/enabled"), QStringLiteral("true")},
                       {QStringLiteral("mls/online_enabled"), QStringLiteral("false")},
                       {QStringLiteral("here/enabled"),
                        QStringList{QStringLiteral("a"), QStringLiteral("b")}}}
        << QList<int>{0, 0, 2, 2} << QList<int>{1, 1, 1, 1};
}

void TestLocationConfiguration::restores()
{
    QFETCH(QVariantMap, saved);
    QFETCH(QList<int>, before);
    QFETCH(QList<int>, after);
    if (!saved.isEmpty()) {
        store(savedKey, saved);
    }
    setSwitches(before[0] != 0, before[1] != 0, before[2], before[3]);
    LocationConfiguration configuration;
    configuration.restoreCustomSettings();
    const QList<int> now = {configuration.gpsEnabled(), configuration.mlsEnabled(),
                            configuration.mlsOnlineState(), configuration.hereState()};
    QCOMPARE(now, after);

    // Nothing else is touched.
    QCOMPARE(stored(savedKey).toMap(), saved);
    QVERIFY(!configuration.customSettingsEnabled());
    QVERIFY(!stored(flagKey).isValid());
}

void TestLocationConfiguration::whatIsNoMapRestoresAsNothing_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::newRow("boolean") << QVariant(true);
    QTest::newRow("text") << QVariant(QStringLiteral("gps/enabled"));
    QTest::newRow("list") << QVariant(QStringList(QStringLiteral("gps/enabled")));
}

void TestLocationConfiguration::whatIsNoMapRestoresAsNothing()
{
    QFETCH(QVariant, value);
    store(savedKey, value);
    setSwitches(true, true, 2, 0);
    LocationConfiguration configuration;
    configuration.restoreCustomSettings();
    QVERIFY(!configuration.gpsEnabled());
    QVERIFY(!configuration.mlsEnabled());
    QCOMPARE(configuration.mlsOnlineState(), State(1));
    QCOMPARE(configuration.hereState(), State(0));
}

void TestLocationConfiguration::statesAreAskedAfterTheSwitchesBefore()
{
    store(savedKey, savedMap(true, true, true, true));
    LocationConfiguration configuration;
    // As a platform may do that offers the online services only with positioning by network.
    connect(&configuration, &LocationSettings::mlsEnabledChanged, this,
            [&configuration] { configuration.setMlsOnlineState(State(1)); });
    connect(&configuration, &LocationSettings::mlsOnlineStateChanged, this,
            [&configuration] { configuration.setHereState(State(1)); });
    configuration.restoreCustomSettings();
    QCOMPARE(configuration.mlsOnlineState(), State(2));
    QCOMPARE(configuration.hereState(), State(2));
}

void TestLocationConfiguration::restoresInOrder()
{
    store(savedKey, savedMap(true, true, true, true));
    setSwitches(false, false, 1, 1);
    LocationConfiguration configuration;
    QStringList order;
    connect(&configuration, &LocationSettings::gpsEnabledChanged, this,
            [&order] { order.append(QStringLiteral("gps")); });
    connect(&configuration, &LocationSettings::mlsEnabledChanged, this,
            [&order] { order.append(QStringLiteral("mls")); });
    connect(&configuration, &LocationSettings::mlsOnlineStateChanged, this,
            [&order] { order.append(QStringLiteral("mls online")); });
    connect(&configuration, &LocationSettings::hereStateChanged, this,
            [&order] { order.append(QStringLiteral("here")); });
    configuration.restoreCustomSettings();
    QCOMPARE(order.join(QLatin1Char(',')), QStringLiteral("gps,mls,mls online,here"));
}

void TestLocationConfiguration::anotherObjectRestores()
{
    setSwitches(true, false, 2, 1);
    {
        LocationConfiguration configuration;
        configuration.saveCustomSettings();
    }
    setSwitches(false, true, 1, 2);
    LocationConfiguration configuration;
    configuration.restoreCustomSettings();
    QVERIFY(configuration.gpsEnabled());
    QVERIFY(!configuration.mlsEnabled());
    QCOMPARE(configuration.mlsOnlineState(), State(2));
    QCOMPARE(configuration.hereState(), State(1));

    // If the settings were saved before the user agreed to a service, restoring them later disables
    // it.
    setSwitches(true, false, 0, 1);
    configuration.saveCustomSettings();
    configuration.restoreCustomSettings();
    QCOMPARE(configuration.mlsOnlineState(), State(0));
    setSwitches(true, false, 2, 1);
    configuration.restoreCustomSettings();
    QCOMPARE(configuration.mlsOnlineState(), State(1));
}

void TestLocationConfiguration::sharesWithAnotherProcess()
{
    setSwitches(true, false, 2, 1);
    LocationConfiguration configuration;
    configuration.saveCustomSettings();
    configuration.setCustomSettingsEnabled(true);
    // Stored last.
    QTRY_COMPARE(DconfTool::read(flagKey), QByteArray("true"));
    QCOMPARE(DconfTool::read(savedKey),
             QByteArray("{'gps/enabled': <true>, 'here/enabled': <false>, 'mls/enabled': <false>, "
                        "'mls/online_enabled': <true>}"));

    DconfTool::write(savedKey, "{'mls/enabled': <true>, 'here/enabled': <true>}");
    MGConfItem saved(savedKey);
    QTRY_COMPARE(saved.value().toMap().size(), 2);
    configuration.restoreCustomSettings();
    QVERIFY(!configuration.gpsEnabled());
    QVERIFY(configuration.mlsEnabled());
    QCOMPARE(configuration.mlsOnlineState(), State(1));
    QCOMPARE(configuration.hereState(), State(2));
}

void TestLocationConfiguration::restoresOverChangesThatAreNotDeliveredYet()
{
    LocationConfiguration configuration;
    configuration.saveCustomSettings();
    DconfTool::waitUntilStored();
    DconfTool::run({QStringLiteral("load"), QStringLiteral("/settings/location/")},
                   "[/]\ngps_enabled=true\nmls_online_state=2\n");
    configuration.restoreCustomSettings();
    DconfTool::waitUntilStored();
    QCOMPARE(DconfTool::read(QStringLiteral("/settings/location/gps_enabled")),
             QByteArray("false"));
    QCOMPARE(DconfTool::read(QStringLiteral("/settings/location/mls_online_state")),
             QByteArray("1"));
}

void TestLocationConfiguration::addAgreements()
{
    QTest::addColumn<QByteArray>("property");
    QTest::addColumn<QString>("base");
    QTest::newRow("mls") << QByteArray("mlsOnlineAgreementText")
                         << QStringLiteral(
                                "/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_");
    QTest::newRow("here") << QByteArray("hereAgreementText")
                          << QStringLiteral(
                                 "/usr/share/libherepositioning/agreements/here_consent_");
}

void TestLocationConfiguration::agreement_data()
{
    addAgreements();
}

void TestLocationConfiguration::agreement()
{
    QFETCH(QByteArray, property);
    QFETCH(QString, base);
    Files::write(base + QStringLiteral("fi_FI.txt"), "Sopimus\n");
    Files::write(base + QStringLiteral("en_GB.txt"), "Agreement\n");
    Files::write(base + QStringLiteral("fi.txt"), "no locale's name");
    const LocationConfiguration configuration;
    QCOMPARE(configuration.property(property).toString(), QStringLiteral("Sopimus\n"));
}

void TestLocationConfiguration::agreementInEnglish_data()
{
    addAgreements();
}

void TestLocationConfiguration::agreementInEnglish()
{
    QFETCH(QByteArray, property);
    QFETCH(QString, base);
    Files::write(base + QStringLiteral("fi.txt"), "no locale's name");
    Files::write(base + QStringLiteral("en_GB.txt"), "Agreement\n");
    const LocationConfiguration configuration;
    QCOMPARE(configuration.property(property).toString(), QStringLiteral("Agreement\n"));
    QCOMPARE(m_log->takeReport(), warning("fi_FI"));

    QLocale::setDefault(QLocale::c());
    QCOMPARE(configuration.property(property).toString(), QStringLiteral("Agreement\n"));
    QCOMPARE(m_log->takeReport(), warning("C"));

    QLocale::setDefault(QLocale(QStringLiteral("en_GB")));
    QCOMPARE(configuration.property(property).toString(), QStringLiteral("Agreement\n"));
}

void TestLocationConfiguration::noAgreement_data()
{
    addAgreements();
}

void TestLocationConfiguration::noAgreement()
{
    QFETCH(QByteArray, property);
    const LocationConfiguration configuration;
    QCOMPARE(configuration.property(property).toString(), noTextId);
    QCOMPARE(m_log->takeReport(), warning("fi_FI"));

    Translator translator;
    QVERIFY(QCoreApplication::installTranslator(&translator));
    QCOMPARE(configuration.property(property).toString(), QStringLiteral("Tekstiä ei ole"));
    QCOMPARE(m_log->takeReport(), warning("fi_FI"));

    // English is looked for, and warned of, even where it is the language.
    QLocale::setDefault(QLocale(QStringLiteral("en_GB")));
    QCOMPARE(configuration.property(property).toString(), QStringLiteral("Tekstiä ei ole"));
    QCOMPARE(m_log->takeReport(), warning("en_GB"));
}

void TestLocationConfiguration::anAgreementThatCannotBeOpened_data()
{
    addAgreements();
}

void TestLocationConfiguration::anAgreementThatCannotBeOpened()
{
    QFETCH(QByteArray, property);
    QFETCH(QString, base);
    const QString path = base + QStringLiteral("fi_FI.txt");
    Files::write(base + QStringLiteral("en_GB.txt"), "Agreement\n");
    const LocationConfiguration configuration;
    Files::makeDirectory(path);
    QCOMPARE(configuration.property(property).toString(), noTextId);
    Files::remove(path);
    Files::makePipe(path);
    QCOMPARE(configuration.property(property).toString(), noTextId);
    Files::remove(path);
    Files::makeLink(QStringLiteral("/dev/zero"), path);
    QCOMPARE(configuration.property(property).toString(), noTextId);
    Files::remove(path);
    Files::makeSparse(path, maximumTextSize + 1);
    QCOMPARE(configuration.property(property).toString(), noTextId);
    Files::makeSparse(path, maximumTextSize);
    QCOMPARE(configuration.property(property).toString(), QString());
}

void TestLocationConfiguration::englishThatCannotBeOpened_data()
{
    addAgreements();
}

void TestLocationConfiguration::englishThatCannotBeOpened()
{
    QFETCH(QByteArray, property);
    QFETCH(QString, base);
    Files::makeDirectory(QFileInfo(base).path());
    Files::makePipe(base + QStringLiteral("en_GB.txt"));
    const LocationConfiguration configuration;
    QCOMPARE(configuration.property(property).toString(), noTextId);
    QCOMPARE(m_log->takeReport(), warning("fi_FI"));
}

void TestLocationConfiguration::agreementContent_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("text");
    QTest::newRow("lines") << QByteArray(" One\n\nTwo \n") << QStringLiteral(" One\n\nTwo \n");
    QTest::newRow("UTF-8") << QByteArray("Hyv\xC3\xA4ksyn \xE2\x9C\x93")
                           << QStringLiteral("Hyväksyn ✓");
    QTest::newRow("byte-order mark") << QByteArray("\xEF\xBB\xBFText") << QStringLiteral("Text");
    QTest::newRow("no UTF-8") << QByteArray("a\xFF") << QStringLiteral("a\uFFFD");
    QTest::newRow("NUL") << QByteArray("before\0after", 12) << QStringLiteral("before");
    QTest::newRow("NUL first") << QByteArray("\0after", 6) << QStringLiteral("");
    QTest::newRow("carriage returns")
        << QByteArray("One\r\nTwo\r\n") << QStringLiteral("One\nTwo\n");
    QTest::newRow("empty") << QByteArray() << QStringLiteral("");
    QTest::newRow("long") << QByteArray(300000, 'x') << QString(300000, QLatin1Char('x'));
}

void TestLocationConfiguration::agreementContent()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, text);
    Files::write(QStringLiteral("/usr/share/libherepositioning/agreements/here_consent_fi_FI.txt"),
                 content);
    const LocationConfiguration configuration;
    QCOMPARE(configuration.hereAgreementText(), text);
    QVERIFY(!configuration.hereAgreementText().isNull());
}

void TestLocationConfiguration::agreementsAreReadOnEveryRead()
{
    const QString base =
        QStringLiteral("/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_");
    Files::write(base + QStringLiteral("fi_FI.txt"), "one");
    Files::write(base + QStringLiteral("de_DE.txt"), "zwei");
    const LocationConfiguration configuration;
    QCOMPARE(configuration.mlsOnlineAgreementText(), QStringLiteral("one"));
    Files::write(base + QStringLiteral("fi_FI.txt"), "two");
    QCOMPARE(configuration.mlsOnlineAgreementText(), QStringLiteral("two"));
    QLocale::setDefault(QLocale(QStringLiteral("de_DE")));
    QCOMPARE(configuration.mlsOnlineAgreementText(), QStringLiteral("zwei"));
}

QTEST_GUILESS_MAIN(TestLocationConfiguration)

#include "tst_locationconfiguration.moc"
