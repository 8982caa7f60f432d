// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The module in a QML engine, loaded from the build tree.

#include "files.h"
#include "gallery/simulation/languageforwarder.h"
#include "languagelistener.h"
#include "loggedtest.h"
#include "members.h"
#include "moduletypes.h"
#include "patience.h"
#include "texts.h"

#include <QJsonObject>
#include <QPluginLoader>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QQmlExtensionInterface>
#include <QQmlExtensionPlugin>
#include <QtTest>

#include <utility>

class TestPlugin : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void metaData();
    void oneInstance();
    void registersUnderTheGivenUri();
    void propertiesAnnounceTheirChanges();
    void oneTextFileReaderPerEngine();
    void otherVersionsAreNotThere();
    void followsLanguageChanges();
    void restsAfterEachLanguageChange();
    void translatorsGoWithTheirEngine();

private:
    static QString libraryPath();
    // Evaluates a small document that imports the module.
    static std::unique_ptr<QObject> create(QQmlEngine *engine, const QByteArray &object,
                                           const QByteArray &version = "1.0");
};

namespace {

QString both()
{
    return qtTrId("settings-test-both");
}

QString englishOnly()
{
    return qtTrId("settings-test-english");
}

QString catalogPath(const char *name)
{
    return "/usr/share/translations/%1.qm"_s.arg(QLatin1String(name));
}

void changeLanguage(const QString &locale)
{
    QLocale::setDefault(QLocale(locale));
    QEvent change(QEvent::LanguageChange);
    QCoreApplication::sendEvent(QCoreApplication::instance(), &change);
}

} // namespace

QString TestPlugin::libraryPath()
{
    return QML_BUILD_DIR "/com/marlo/settings/system/libmarlosystemsettingsplugin.so"_s;
}

std::unique_ptr<QObject> TestPlugin::create(QQmlEngine *engine, const QByteArray &object,
                                            const QByteArray &version)
{
    engine->addImportPath(QLatin1String(QML_BUILD_DIR));
    QQmlComponent component(engine);
    component.setData("import QtQml 2.15\nimport com.marlo.settings.system " + version + "\n"
                          + object,
                      QUrl("test.qml"_s));
    std::unique_ptr<QObject> created(component.create());
    if (created == nullptr) {
        qWarning("%s", qPrintable(component.errorString()));
    }
    return created;
}

void TestPlugin::init()
{
    for (const auto *name :
         {"settings-system_eng_en", "settings-system-fi", "settings-system-de"}) {
        Files::installCatalog(QString::fromLatin1(name));
    }
    // Without it BluetoothInfo warns.
    Files::write("/var/lib/bluetooth/board-address"_s, "00:1A:7D:DA:71:13\n");
    QLocale::setDefault(QLocale("fi_FI"_s));
    LoggedTest::init();
}

void TestPlugin::metaData()
{
    const QPluginLoader loader(libraryPath());
    const QJsonObject metaData = loader.metaData();
    QCOMPARE(metaData.value("IID"_s).toString(), "com.marlo.settings.system"_s);
    QCOMPARE(metaData.value("className"_s).toString(), "SystemSettingsPlugin"_s);
    QCOMPARE(metaData.value("MetaData"_s).toObject(), QJsonObject());
}

void TestPlugin::oneInstance()
{
    QPluginLoader loader(libraryPath());
    QPointer<QObject> instance = loader.instance();
    QVERIFY2(instance != nullptr, qPrintable(loader.errorString()));
    QCOMPARE(instance->metaObject()->className(), "SystemSettingsPlugin");
    QVERIFY(qobject_cast<QQmlExtensionInterface *>(instance) != nullptr);
    QVERIFY(instance->parent() == nullptr);
    QCOMPARE(loader.instance(), instance.data());
    // It declares no properties, signals or slots of its own.
    QCOMPARE(instance->metaObject()->propertyCount(),
             QQmlExtensionPlugin::staticMetaObject.propertyCount());
    QCOMPARE(instance->metaObject()->methodCount(),
             QQmlExtensionPlugin::staticMetaObject.methodCount());

    delete instance.data();
    QVERIFY(instance == nullptr);
    QVERIFY(loader.instance() != nullptr);
}

void TestPlugin::registersUnderTheGivenUri()
{
    QPluginLoader loader(libraryPath());
    qobject_cast<QQmlExtensionInterface *>(loader.instance())->registerTypes("another.module");
    QQmlEngine engine;
    for (const ModuleType &type : ModuleType::all()) {
        const QByteArray object = type.name.toUtf8() + (type.isSingleton ? "" : " { }");
        QVERIFY(create(&engine,
                       "import another.module 1.0 as Another\n"
                       "QtObject { property QtObject it: Another."
                           + object + " }")
                != nullptr);
    }
}

// The file plugins.qmltypes, which another test compares with the module, does not say which signal
// announces a property, or that none does.
void TestPlugin::propertiesAnnounceTheirChanges()
{
    QQmlEngine engine;
    QStringList others;
    for (const ModuleType &type : ModuleType::all()) {
        const QByteArray object = type.name.toUtf8() + (type.isSingleton ? "" : " { }");
        const auto document = create(&engine, "QtObject { property QtObject it: " + object + " }");
        QVERIFY(document != nullptr);
        const auto *it = document->property("it").value<QObject *>();
        QCOMPARE(it->metaObject()->className(), type.className.constData());
        for (const QMetaProperty &property : Members::properties(*it)) {
            const QByteArray signal =
                property.isConstant() ? QByteArray("constant") : property.notifySignal().name();
            if (signal != QByteArray(property.name()) + "Changed") {
                others.append(type.name + QLatin1Char('.') + QLatin1String(property.name()) + ": "_s
                              + QLatin1String(signal));
            }
        }
    }
    const QStringList expected = {
        "AndroidSupport.dataDirectoriesVisible: constant"_s,
        "BluetoothInfo.adapterAddress: constant"_s,
        "LocationConfiguration.hereAgreementText: constant"_s,
        "LocationConfiguration.mlsOnlineAgreementText: constant"_s,
        "MemoryCardFormatter.supportedFormatTypes: constant"_s,
        "ModemFeatures.variant: constant"_s,
        "TermsOfUseManager.hasVendorTermsOfUse: vendorPathChanged"_s,
        "TitlesView.values: valueChanged"_s,
    };
    QCOMPARE(others, expected);
}

void TestPlugin::oneTextFileReaderPerEngine()
{
    const QByteArray reader = "QtObject { property var reader: TextFileReader\n"
                              "property bool same: reader === TextFileReader }";
    const auto readerOf = [](const std::unique_ptr<QObject> &object) {
        return object->property("reader").value<QObject *>();
    };
    auto engine = std::make_unique<QQmlEngine>();
    const auto one = create(engine.get(), reader);
    const auto another = create(engine.get(), reader);
    QVERIFY(one != nullptr && another != nullptr);
    const QPointer<QObject> instance = readerOf(one);
    QVERIFY(instance != nullptr);
    QCOMPARE(instance->metaObject()->className(), "TextFileReader");
    QVERIFY(instance->parent() == nullptr);
    QVERIFY(one->property("same").toBool());
    QCOMPARE(readerOf(another), instance.data());

    QQmlEngine anotherEngine;
    const auto elsewhere = create(&anotherEngine, reader);
    QVERIFY(elsewhere != nullptr);
    const QPointer<QObject> anotherInstance = readerOf(elsewhere);
    QVERIFY(anotherInstance != nullptr);
    QVERIFY(anotherInstance != instance);

    // Each is deleted with its engine.
    engine.reset();
    QVERIFY(instance == nullptr);
    QVERIFY(anotherInstance != nullptr);
}

void TestPlugin::otherVersionsAreNotThere()
{
    for (const QByteArray version : {"0.9", "1.1", "2.0"}) {
        QQmlEngine engine;
        QVERIFY(create(&engine, "QtObject {}", version) == nullptr);
        const QString errors = m_log->takeReport();
        QVERIFY2(errors.contains("is not installed"_s), qPrintable(errors));
    }
}

void TestPlugin::followsLanguageChanges()
{
    // The plugin passes every event on to the engine.
    class Engine : public QQmlEngine
    {
    public:
        bool event(QEvent *event) override
        {
            languageChanges += event->type() == QEvent::LanguageChange ? 1 : 0;
            return QQmlEngine::event(event);
        }
        int languageChanges = 0;
    };

    Engine engine;
    const auto object = create(&engine,
                               "QtObject { property string both: qsTrId('settings-test-both')\n"
                               "property string english: qsTrId('settings-test-english') }");
    QVERIFY(object != nullptr);
    // The language wins over engineering English.
    QCOMPARE(object->property("both").toString(), "Molemmat"_s);
    QCOMPARE(object->property("english").toString(), "English only"_s);

    QLocale::setDefault(QLocale("de_DE"_s));
    QEvent change(QEvent::LanguageChange);
    QCoreApplication::sendEvent(&engine, &change);
    QCOMPARE(engine.languageChanges, 1);
    engine.retranslate();
    QCOMPARE(object->property("both").toString(), "Beide"_s);
    QCOMPARE(object->property("english").toString(), "English only"_s);

    QLocale::setDefault(QLocale("sv_SE"_s));
    QCoreApplication::sendEvent(&engine, &change);
    QCOMPARE(both(), "Both, engineering English"_s);
}

void TestPlugin::restsAfterEachLanguageChange()
{
    QCoreApplication::sendPostedEvents(); // what other tests left
    const QByteArray document = "QtObject { property string both: qsTrId('settings-test-both') }";
    QQmlEngine engine;
    LanguageListener changes;
    new LanguageForwarder(&engine);
    const auto object = create(&engine, document);
    QVERIFY(object != nullptr);
    QCOMPARE(changes.count, 0); // the import announces nothing at once
    // Whether there were exactly this many changes, and no more follow.
    const auto restsAfter = [&changes](int count) {
        const auto hasCount = [&] { return changes.count == count; };
        const bool came = becomesTrue(hasCount);
        QTest::qWait(100);
        return came && std::exchange(changes.count, 0) == count;
    };
    // Each of the two translators announces the catalog that it has loaded.
    QVERIFY(restsAfter(2));

    // One change is sent here; the other one announces the catalog that was loaded.
    changeLanguage("de_DE"_s);
    QVERIFY(restsAfter(2));
    QCOMPARE(object->property("both").toString(), "Beide"_s);

    // The same locale and the same file.
    changeLanguage("de_DE"_s);
    QVERIFY(restsAfter(1));

    // A package replaces the file.
    QVERIFY(QFile::remove(catalogPath("settings-system-de")));
    QVERIFY(QFile::rename(catalogPath("settings-system-fi"), catalogPath("settings-system-de")));
    changeLanguage("de_DE"_s);
    QVERIFY(restsAfter(2));
    QCOMPARE(object->property("both").toString(), "Molemmat"_s);

    // A locale without a catalog.
    changeLanguage("sv_SE"_s);
    QVERIFY(restsAfter(2));
    QCOMPARE(object->property("both").toString(), "Both, engineering English"_s);
}

void TestPlugin::translatorsGoWithTheirEngine()
{
    auto first = std::make_unique<QQmlEngine>();
    QVERIFY(create(first.get(), "QtObject {}") != nullptr);
    QLocale::setDefault(QLocale("de_DE"_s));
    auto second = std::make_unique<QQmlEngine>();
    QVERIFY(create(second.get(), "QtObject {}") != nullptr);

    // Each engine has a pair. The later engine's language wins; the earlier one stays installed.
    QCOMPARE(first->findChildren<QTranslator *>().size(), 2);
    QCOMPARE(second->findChildren<QTranslator *>().size(), 2);
    QCOMPARE(both(), "Beide"_s);
    second.reset();
    QCOMPARE(both(), "Molemmat"_s);
    first.reset();
    QCOMPARE(both(), "settings-test-both"_s);
    QCOMPARE(englishOnly(), "settings-test-english"_s);
}

QTEST_GUILESS_MAIN(TestPlugin)

#include "tst_plugin.moc"
