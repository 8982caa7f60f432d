// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"
#include "deviceinfo/locationconfiguration.h"
#include "files.h"
#include "files/regularfile.h"
#include "locationswitches.h"
#include "loggedtest.h"
#include "patience.h"
#include "texts.h"

#include <QTranslator>
#include <QtTest>

#include <functional>

class TestLocationConfiguration : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void startsWithTheStoredFlag_data();
    void startsWithTheStoredFlag();
    void theFlagIsStoredBeforeItsSignal();
    void theFlagIsSetOnceAfterItIsStored();
    void theSameFlagWritesNothing();
    void theFlagIsNotFollowed();

    void savesTheSwitches_data();
    void savesTheSwitches();
    void savingReplacesEverything();
    void restores_data();
    void restores();
    void statesAreReadAfterTheSwitchesBefore();
    void restoresInOrder();
    void mayBeDeletedInAnyHandler();
    void storesWhatOtherProcessesRead();

    void agreement_data();
    void agreement();
    void missingAgreementsAreTranslated();
    void agreementContent_data();
    void agreementContent();
    void agreementsAreReadOnEveryRead();
};

namespace {

const QString flagKey = "/settings/location/custom_settings_enabled"_s;
const QString savedKey = "/settings/location/custom_settings"_s;
const QString noTextId = "settings_location-la-no_agreement_text_found"_s;
const QString mlsAgreements = "/usr/share/geoclue-provider-mlsdb/agreements/mls_consent_"_s;
const QString hereAgreements = "/usr/share/libherepositioning/agreements/here_consent_"_s;

// Makes agreements whose paths begin with the text.
using Make = std::function<void(const QString &)>;

QVariantMap savedMap(bool gps, bool mls, bool mlsOnline, bool here)
{
    return {{"gps/enabled"_s, gps},
            {"mls/enabled"_s, mls},
            {"mls/online_enabled"_s, mlsOnline},
            {"here/enabled"_s, here}};
}

void setSwitches(const Switches &values)
{
    LocationSettings settings;
    setSwitches(&settings, values);
}

QString warning(const QString &locale)
{
    return "warning [default] No agreement found for \"%1\" , falling back to english"_s.arg(
        locale);
}

class Translator : public QTranslator
{
public:
    bool isEmpty() const override { return false; }
    QString translate(const char *, const char *sourceText, const char *, int) const override
    {
        return sourceText == noTextId.toLatin1() ? "Tekstiä ei ole"_s : QString();
    }
};

} // namespace

Q_DECLARE_METATYPE(Make)

void TestLocationConfiguration::init()
{
    for (const QString &key : switchKeys + QStringList{flagKey, savedKey}) {
        MGConfItem(key).unset();
    }
    for (const QString &agreements : {mlsAgreements, hereAgreements}) {
        Files::remove(QFileInfo(agreements).path());
    }
    QLocale::setDefault(QLocale("fi_FI"_s));
    LoggedTest::init();
}

void TestLocationConfiguration::startsWithTheStoredFlag_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<bool>("enabled");
    const auto row = [](const char *name, const QVariant &value, bool enabled) {
        QTest::newRow(name) << value << enabled;
    };
    row("not set", {}, false);
    row("true", true, true);
    row("false", false, false);
    row("1", 1, true);
    row("0", 0, false);
    row("\"true\"", "true"_s, true);
    row("\"false\"", "false"_s, false);
    row("list", QStringList{"a"_s, "b"_s}, false);
    row("map", savedMap(true, true, true, true), false);
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

void TestLocationConfiguration::theFlagIsStoredBeforeItsSignal()
{
    LocationConfiguration configuration;
    QVariantList seen;
    connect(&configuration, &LocationConfiguration::customSettingsEnabledChanged, this,
            [&] { seen << configuration.customSettingsEnabled() << stored(flagKey); });
    configuration.setCustomSettingsEnabled(true);
    QCOMPARE(seen, QVariantList({true, true}));
    QVERIFY(LocationConfiguration().customSettingsEnabled());
    configuration.setCustomSettingsEnabled(false);
    QCOMPARE(seen, QVariantList({true, true, false, false}));
}

void TestLocationConfiguration::theFlagIsSetOnceAfterItIsStored()
{
    LocationConfiguration configuration;
    QSignalSpy changed(&configuration, &LocationConfiguration::customSettingsEnabledChanged);
    const MGConfItem witness(flagKey);
    QVariantList seen;
    connect(&witness, &MGConfItem::valueChanged, this, [&] {
        seen << configuration.customSettingsEnabled();
        configuration.setCustomSettingsEnabled(true);
    });
    configuration.setCustomSettingsEnabled(true);
    QCOMPARE(seen, QVariantList{false});
    QVERIFY(configuration.customSettingsEnabled());
    QCOMPARE(changed.size(), 1);
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

void TestLocationConfiguration::savesTheSwitches_data()
{
    QTest::addColumn<Switches>("switches");
    QTest::newRow("all off") << Switches{0, 0, 0, 0};
    QTest::newRow("all on") << Switches{1, 1, 2, 2};
    QTest::newRow("gps") << Switches{1, 0, 0, 1};
    QTest::newRow("mls") << Switches{0, 1, 1, 0};
    QTest::newRow("mls online") << Switches{0, 0, 2, 1};
    QTest::newRow("here") << Switches{0, 0, 1, 2};
}

void TestLocationConfiguration::savesTheSwitches()
{
    QFETCH(const Switches, switches);
    setSwitches(switches);
    LocationConfiguration configuration;
    configuration.saveCustomSettings();
    QCOMPARE(stored(savedKey),
             QVariant(savedMap(switches[0], switches[1], switches[2] == 2, switches[3] == 2)));

    // Nothing else is changed.
    QCOMPARE(switchesOf(configuration), switches);
    QVERIFY(!configuration.customSettingsEnabled());
    QVERIFY(!stored(flagKey).isValid());
}

void TestLocationConfiguration::savingReplacesEverything()
{
    LocationConfiguration configuration;
    for (const QVariant &before : {QVariant(QVariantMap{{"another"_s, 1}}), QVariant("no map"_s)}) {
        store(savedKey, before);
        configuration.saveCustomSettings();
        QCOMPARE(stored(savedKey), QVariant(savedMap(false, false, false, false)));
    }
}

void TestLocationConfiguration::restores_data()
{
    QTest::addColumn<QVariant>("saved");
    QTest::addColumn<Switches>("before");
    QTest::addColumn<Switches>("after");

    const auto row = [](const char *name, const QVariant &saved, const Switches &before,
                        const Switches &after) { QTest::newRow(name) << saved << before << after; };
    const QVariantMap allOn = savedMap(true, true, true, true);
    const QVariantMap allOff = savedMap(false, false, false, false);
    row("on from off", allOn, {0, 0, 1, 1}, {1, 1, 2, 2});
    row("on from on", allOn, {1, 1, 2, 2}, {1, 1, 2, 2});
    row("off from on", allOff, {1, 1, 2, 2}, {0, 0, 1, 1});
    row("off from off", allOff, {0, 0, 1, 1}, {0, 0, 1, 1});
    row("on, not agreed", allOn, {0, 0, 0, 0}, {1, 1, 0, 0});
    row("off, not agreed", allOff, {1, 1, 0, 0}, {0, 0, 0, 0});
    row("agreed to one", allOn, {0, 0, 0, 1}, {1, 1, 0, 2});
    row("agreed to the other", allOn, {0, 0, 1, 0}, {1, 1, 2, 0});
    row("gps", savedMap(true, false, false, false), {0, 1, 2, 2}, {1, 0, 1, 1});
    row("mls", savedMap(false, true, false, false), {1, 0, 2, 2}, {0, 1, 1, 1});
    row("mls online", savedMap(false, false, true, false), {1, 1, 1, 2}, {0, 0, 2, 1});
    row("here", savedMap(false, false, false, true), {1, 1, 2, 1}, {0, 0, 1, 2});
    row("nothing saved", {}, {1, 1, 2, 2}, {0, 0, 1, 1});
    row("nothing saved, not agreed", {}, {1, 1, 0, 0}, {0, 0, 0, 0});
    const QString mls = "mls/enabled"_s;
    row("one entry", QVariantMap{{mls, true}}, {1, 0, 2, 2}, {0, 1, 1, 1});
    row("entries of other types",
        QVariantMap{{"gps/enabled"_s, 1},
                    {mls, "true"_s},
                    {"mls/online_enabled"_s, "false"_s},
                    {"here/enabled"_s, QStringList{mls, mls}}},
        {0, 0, 2, 2}, {1, 1, 1, 1});
    row("a boolean, no map", true, {1, 1, 2, 0}, {0, 0, 1, 0});
    row("text, no map", mls, {1, 1, 2, 0}, {0, 0, 1, 0});
    row("a list, no map", QStringList(mls), {1, 1, 2, 0}, {0, 0, 1, 0});
}

void TestLocationConfiguration::restores()
{
    QFETCH(const QVariant, saved);
    QFETCH(const Switches, before);
    QFETCH(const Switches, after);
    store(savedKey, saved);
    setSwitches(before);
    LocationConfiguration configuration;
    configuration.restoreCustomSettings();
    QCOMPARE(switchesOf(configuration), after);

    // Nothing else is changed.
    QCOMPARE(stored(savedKey), saved);
    QVERIFY(!configuration.customSettingsEnabled());
    QVERIFY(!stored(flagKey).isValid());
}

void TestLocationConfiguration::statesAreReadAfterTheSwitchesBefore()
{
    store(savedKey, savedMap(true, true, true, true));
    LocationConfiguration configuration;
    // Like a platform that offers the online services only with positioning by network.
    connect(&configuration, &LocationSettings::mlsEnabledChanged, this,
            [&configuration] { configuration.setMlsOnlineState(State(1)); });
    connect(&configuration, &LocationSettings::mlsOnlineStateChanged, this,
            [&configuration] { configuration.setHereState(State(1)); });
    configuration.restoreCustomSettings();
    QCOMPARE(switchesOf(configuration), Switches({1, 1, 2, 2}));
}

void TestLocationConfiguration::restoresInOrder()
{
    store(savedKey, savedMap(true, true, true, true));
    setSwitches({0, 0, 1, 1});
    LocationConfiguration configuration;
    QStringList changes;
    recordChanges(&configuration, &changes);
    configuration.restoreCustomSettings();
    QCOMPARE(changes.join(QLatin1Char(',')), "gps 1,mls 1,mls online 2,here 2"_s);
}

void TestLocationConfiguration::mayBeDeletedInAnyHandler()
{
    store(savedKey, savedMap(true, true, true, true));
    using Signal = void (LocationSettings::*)();
    const QList<Signal> changes = {
        &LocationSettings::gpsEnabledChanged, &LocationSettings::mlsEnabledChanged,
        &LocationSettings::mlsOnlineStateChanged, &LocationSettings::hereStateChanged};
    for (int i = 0; i < changes.size(); ++i) {
        setSwitches({0, 0, 1, 1});
        auto *configuration = new LocationConfiguration;
        connect(configuration, changes.at(i), this, [configuration] { delete configuration; });
        configuration->restoreCustomSettings();
        // The later switches stay as they are.
        const Switches restored = {1, 1, 2, 2};
        QCOMPARE(switchesOf(LocationSettings()),
                 restored.mid(0, i + 1) + Switches({0, 0, 1, 1}).mid(i + 1));
    }

    auto *configuration = new LocationConfiguration;
    const MGConfItem flag(flagKey);
    connect(&flag, &MGConfItem::valueChanged, this, [configuration] { delete configuration; });
    configuration->setCustomSettingsEnabled(true);
    QCOMPARE(stored(flagKey), QVariant(true));
}

void TestLocationConfiguration::storesWhatOtherProcessesRead()
{
    setSwitches({1, 0, 2, 1});
    LocationConfiguration configuration;
    configuration.saveCustomSettings();
    configuration.setCustomSettingsEnabled(true);
    // The flag is stored last.
    TRY_COMPARE(DconfTool::read(flagKey), QByteArray("true"));
    QCOMPARE(DconfTool::read(savedKey),
             QByteArray("{'gps/enabled': <true>, 'here/enabled': <false>, 'mls/enabled': <false>, "
                        "'mls/online_enabled': <true>}"));
}

void TestLocationConfiguration::agreement_data()
{
    QTest::addColumn<QByteArray>("property");
    QTest::addColumn<QString>("base");
    QTest::addColumn<QString>("locale");
    QTest::addColumn<Make>("make");
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("isWarned");

    const auto row = [](const char *name, const char *locale, const Make &make, const QString &text,
                        bool isWarned) {
        QTest::addRow("mls: %s", name) << QByteArray("mlsOnlineAgreementText") << mlsAgreements
                                       << locale << make << text << isWarned;
        QTest::addRow("here: %s", name) << QByteArray("hereAgreementText") << hereAgreements
                                        << locale << make << text << isWarned;
    };
    const Make english = [](const QString &base) {
        Files::write(base + "en_GB.txt"_s, "Agreement\n");
        Files::write(base + "fi.txt"_s, "not the name of a locale");
    };
    const auto finnish = [english](const Make &make) -> Make {
        return [=](const QString &base) {
            english(base);
            make(base + "fi_FI.txt"_s);
        };
    };
    const QString agreement = "Agreement\n"_s;
    row("in the language", "fi_FI",
        finnish([](const QString &path) { Files::write(path, "Sopimus\n"); }), "Sopimus\n"_s,
        false);
    row("in English instead", "fi_FI", english, agreement, true);
    row("in English instead of C", "C", english, agreement, true);
    row("in English, the language", "en_GB", english, agreement, false);
    const Make none = [](const QString &) {};
    row("none", "fi_FI", none, noTextId, true);
    row("none in English, the language", "en_GB", none, noTextId, true);
    row(
        "English that cannot be opened", "fi_FI",
        [](const QString &base) {
            Files::makeDirectory(QFileInfo(base).path());
            Files::makePipe(base + "en_GB.txt"_s);
        },
        noTextId, true);
    // If the Finnish file exists, the English file is not used instead.
    row("directory", "fi_FI", finnish(Files::makeDirectory), noTextId, false);
    row("pipe", "fi_FI", finnish(Files::makePipe), noTextId, false);
    row("device", "fi_FI",
        finnish([](const QString &path) { Files::makeLink("/dev/zero"_s, path); }), noTextId,
        false);
    row("too large", "fi_FI",
        finnish([](const QString &path) { Files::makeSparse(path, maximumTextSize + 1); }),
        noTextId, false);
    row("as large as possible", "fi_FI",
        finnish([](const QString &path) { Files::makeSparse(path, maximumTextSize); }), QString(),
        false);
}

void TestLocationConfiguration::agreement()
{
    QFETCH(const QByteArray, property);
    QFETCH(const QString, base);
    QFETCH(const QString, locale);
    QFETCH(const Make, make);
    QFETCH(const QString, text);
    QFETCH(const bool, isWarned);
    QLocale::setDefault(QLocale(locale));
    make(base);
    QCOMPARE(LocationConfiguration().property(property).toString(), text);
    QCOMPARE(m_log->takeReport(), isWarned ? warning(locale) : QString());
}

void TestLocationConfiguration::missingAgreementsAreTranslated()
{
    Translator translator;
    QVERIFY(QCoreApplication::installTranslator(&translator));
    const LocationConfiguration configuration;
    QCOMPARE(configuration.mlsOnlineAgreementText(), "Tekstiä ei ole"_s);
    QCOMPARE(configuration.hereAgreementText(), "Tekstiä ei ole"_s);
    QCOMPARE(m_log->takeAll().size(), 2);
}

void TestLocationConfiguration::agreementContent_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("text");
    const auto row = [](const char *name, const QByteArray &content, const QString &text) {
        QTest::newRow(name) << content << text;
    };
    row("lines", " One\n\nTwo \n", " One\n\nTwo \n"_s);
    row("UTF-8", "Hyväksyn ✓", "Hyväksyn ✓"_s);
    row("byte-order mark", "\uFEFFText", "Text"_s);
    row("no UTF-8", "a\xFF", "a\uFFFD"_s);
    row("NUL", QByteArray("before\0after", 12), "before"_s);
    row("NUL first", QByteArray("\0after", 6), ""_s);
    row("carriage returns", "One\r\nTwo\r\n", "One\nTwo\n"_s);
    row("empty", "", ""_s);
    row("long", QByteArray(300000, 'x'), QString(300000, QLatin1Char('x')));
}

void TestLocationConfiguration::agreementContent()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, text);
    Files::write(hereAgreements + "fi_FI.txt"_s, content);
    const LocationConfiguration configuration;
    QCOMPARE(configuration.hereAgreementText(), text);
    QVERIFY(!configuration.hereAgreementText().isNull());
}

void TestLocationConfiguration::agreementsAreReadOnEveryRead()
{
    Files::write(mlsAgreements + "fi_FI.txt"_s, "one");
    Files::write(mlsAgreements + "de_DE.txt"_s, "zwei");
    const LocationConfiguration configuration;
    QCOMPARE(configuration.mlsOnlineAgreementText(), "one"_s);
    Files::write(mlsAgreements + "fi_FI.txt"_s, "two");
    QCOMPARE(configuration.mlsOnlineAgreementText(), "two"_s);
    QLocale::setDefault(QLocale("de_DE"_s));
    QCOMPARE(configuration.mlsOnlineAgreementText(), "zwei"_s);
}

QTEST_GUILESS_MAIN(TestLocationConfiguration)

#include "tst_locationconfiguration.moc"
