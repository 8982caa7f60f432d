// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "listmodeltest.h"

#include "dconftool.h"
#include "files.h"
#include "mgconfitem.h"
#include "patience.h"
#include "texts.h"
#include "words.h"

#include <QtTest>

namespace {

QVariant cell(const QAbstractListModel &model, int row, const QByteArray &role)
{
    return model.data(model.index(row), model.roleNames().key(role));
}

} // namespace

ListModelTest::ListModelTest(QString directory, QString suffix, QString key, QByteArray kind)
    : m_directory(std::move(directory)), m_suffix(std::move(suffix)), m_key(std::move(key)),
      m_kind(std::move(kind))
{
}

void ListModelTest::init()
{
    Files::remove(m_directory);
    Files::makeDirectory(m_directory);
    Files::installCatalogs(words("maps_eng_en maps-fi atlas_eng_en"));
    QLocale::setDefault(QLocale("fi_FI"_s));
    MGConfItem(m_key).unset();
    LoggedTest::init();
}

void ListModelTest::cleanup()
{
    m_tester.reset();
    m_events.reset();
    removeModel();
    QCOMPARE(takeMessages().join(QLatin1Char('\n')), QString());
    LoggedTest::cleanup();
}

void ListModelTest::loadEverything()
{
    makeModel();
    complete();
    events();
}

QStringList ListModelTest::paths(const QString &names) const
{
    QStringList paths;
    for (const QString &name : words(names)) {
        paths.append(path(name));
    }
    return paths;
}

void ListModelTest::define(const QString &names, const QByteArray &catalog) const
{
    for (const QString &name : words(names)) {
        Files::write(inDirectory(name + m_suffix), definition(name, catalog));
    }
}

void ListModelTest::choose(const char *verb, const QString &name) const
{
    if (!QMetaObject::invokeMethod(m_watched, verb + m_kind, Q_ARG(QString, path(name)))) {
        qFatal("the model has no %s%s()", verb, m_kind.constData());
    }
}

void ListModelTest::store(const QString &names) const
{
    MGConfItem(m_key).set(paths(names));
}

QString ListModelTest::stored() const
{
    QStringList names;
    const QStringList paths = MGConfItem(m_key).value().toStringList();
    for (const QString &path : paths) {
        names.append(QFileInfo(path).completeBaseName());
    }
    return names.join(QLatin1Char(' '));
}

QString ListModelTest::rowsOf(const QAbstractListModel &model) const
{
    QStringList names;
    for (int row = 0; row < model.rowCount(); ++row) {
        names.append(QFileInfo(cell(model, row, "path").toString()).completeBaseName());
    }
    return names.join(QLatin1Char(' '));
}

QString ListModelTest::enabledRows() const
{
    const QStringList names = words(rows());
    QStringList enabled;
    for (int row = 0; row < names.size(); ++row) {
        if (cell(*m_watched, row, "enabled").toBool()) {
            enabled.append(names.at(row));
        }
    }
    enabled.sort();
    return enabled.join(QLatin1Char(' '));
}

QStringList ListModelTest::newMessages()
{
    return m_log->takeReport().split(QLatin1Char('\n'), Qt::SkipEmptyParts);
}

QStringList ListModelTest::messages()
{
    m_messages += newMessages();
    return m_messages;
}

QStringList ListModelTest::takeMessages()
{
    messages();
    return std::exchange(m_messages, {});
}

void ListModelTest::watch(QAbstractListModel *model)
{
    m_tester = std::make_unique<QAbstractItemModelTester>(
        model, QAbstractItemModelTester::FailureReportingMode::Warning);
    m_events = std::make_unique<RowEvents>(model);
    m_watched = model;
}

void ListModelTest::waitForNothing()
{
    QTest::qWait(1500);
}

QString ListModelTest::inDirectory(const QString &file) const
{
    return m_directory + QLatin1Char('/') + file;
}

void ListModelTest::rewrite(const QString &file, const QByteArray &content) const
{
    QFile rewritten(inDirectory(file));
    if (!rewritten.open(QIODevice::WriteOnly) || rewritten.write(content) != content.size()) {
        qFatal("cannot write %s", qPrintable(rewritten.fileName()));
    }
}

void ListModelTest::writeBroken() const
{
    Files::write(inDirectory("broken"_s + m_suffix), "[");
}

void ListModelTest::followsTheDirectory()
{
    // The directory above it is missing, too.
    Files::remove(QFileInfo(m_directory).path());
    loadEverything();
    QCOMPARE(rows(), QString());
    define("a"_s);
    TRY_COMPARE(rows(), "a"_s);
    define("b"_s);
    TRY_COMPARE(rows(), "a b"_s);
    Files::remove(inDirectory("a"_s + m_suffix));
    TRY_COMPARE(rows(), "b"_s);
    QVERIFY(QFile::rename(inDirectory("b"_s + m_suffix), inDirectory("b.bak"_s)));
    TRY_COMPARE(rows(), QString());

    define("c"_s);
    TRY_COMPARE(rows(), "c"_s);
    Files::remove(m_directory);
    TRY_COMPARE(rows(), QString());
    define("d"_s);
    TRY_COMPARE(rows(), "d"_s);
    rewrite("d"_s + m_suffix, "[");
    TRY(!messages().isEmpty());
    takeMessages();
}

void ListModelTest::readsWrittenFilesOnceTheyAreClosed()
{
    define("a"_s);
    loadEverything();
    QFile file(inDirectory("a"_s + m_suffix));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write("[");
    QVERIFY(file.flush());
    waitForNothing();
    QCOMPARE(takeMessages(), QStringList());
    file.close();
    TRY_COMPARE(messages().size(), 1);
    takeMessages();
}

void ListModelTest::choices_data()
{
    QTest::addColumn<QString>("before");
    QTest::addColumn<QByteArray>("verb");
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("list");
    QTest::addColumn<QString>("enabled");
    const auto row = [](const char *text, const char *before, const char *verb, const char *name,
                        const char *list, const char *enabled) {
        QTest::newRow(text) << before << QByteArray(verb) << name << list << enabled;
    };
    row("enable", "b", "enable", "a", "b a", "a b");
    row("enable again", "a", "enable", "a", "a a", "a");
    row("enable, in upper case", "b", "enable", "A", "b A", "b");
    row("enable what is unknown", "gone", "enable", "x", "gone x", "");
    row("disable the last one", "a", "disable", "a", "", "");
    row("disable every entry", "b a c a", "disable", "a", "b c", "b");
    row("disable what is not enabled", "b", "disable", "a", "b", "b");
    row("disable, in upper case", "a b", "disable", "B", "a b", "a b");
}

void ListModelTest::choices()
{
    QFETCH(QString, before);
    QFETCH(QByteArray, verb);
    QFETCH(QString, name);
    define("a b"_s);
    store(before);
    loadEverything();
    choose(verb, name);
    QVERIFY(MGConfItem(m_key).value().isValid());
    QTEST(stored(), "list");
    QTEST(enabledRows(), "enabled");
}

void ListModelTest::choicesBeforeCompletion()
{
    define("a b c"_s);
    store("a b"_s);
    makeModel();
    choose("enable", "c"_s);
    QCOMPARE(stored(), "a b c"_s);
    choose("disable", "a"_s);
    QCOMPARE(stored(), "b c"_s);
    QCOMPARE(rows(), QString());
    complete();
    QCOMPARE(enabledRows(), "b c"_s);
}

void ListModelTest::choicesInHandlersAreStoredAtOnce()
{
    define("a b c"_s);
    store("a b"_s);
    makeModel();
    QString listThen;
    once(m_watched, &QAbstractItemModel::rowsInserted, [&] {
        choose("disable", "b"_s);
        choose("enable", "c"_s);
        listThen = stored();
    });
    complete();
    QCOMPARE(listThen, "a c"_s);
    // The model may be destroyed before control returns to the event loop. Until then, the rows
    // show the list from before.
    QCOMPARE(enabledRows().count(QLatin1Char('b')), 1);
    TRY_COMPARE(enabledRows().count(QLatin1Char('b')), 0);
}

void ListModelTest::choicesKeepOtherProcessesChanges()
{
    define("a b c"_s);
    store("a"_s);
    loadEverything();
    DconfTool::waitUntilStored();
    // The model has not been notified when the choice is made.
    DconfTool::write(m_key, paths("a b"_s));
    choose("enable", "c"_s);
    QCOMPARE(stored(), "a b c"_s);
    DconfTool::waitUntilStored();
    DconfTool::write(m_key, paths("b c a"_s));
    choose("disable", "c"_s);
    QCOMPARE(stored(), "b a"_s);
}

void ListModelTest::followsOtherProcesses()
{
    define("a b"_s);
    store("a"_s);
    loadEverything();
    DconfTool::waitUntilStored();
    DconfTool::write(m_key, paths("a b"_s));
    TRY_COMPARE(enabledRows(), "a b"_s);
    DconfTool::reset(m_key);
    TRY_COMPARE(enabledRows(), QString());
}

void ListModelTest::catalogsGoWithTheModel()
{
    define("a"_s, "maps");
    makeModel();
    // A new row has its texts when views learn of it.
    QString text;
    once(m_watched, &QAbstractItemModel::rowsInserted, [&] { text = qtTrId("maps-title"); });
    complete();
    QCOMPARE(text, "Kartat"_s);
    QCOMPARE(qtTrId("maps-title"), "Kartat"_s);
    removeModel();
    QCOMPARE(qtTrId("maps-title"), "maps-title"_s);
}

void ListModelTest::catalogNameWithASlash()
{
    const QString elsewhere = "/usr/share/elsewhere"_s;
    Files::makeDirectory(elsewhere);
    QVERIFY(QFile::copy("/usr/share/translations/maps-fi.qm"_s, elsewhere + "/maps-fi.qm"_s));
    define("a"_s, "../elsewhere/maps");
    define("b"_s, "/usr/share/elsewhere/maps");
    loadEverything();
    QCOMPARE(rows().size(), 3);
    QCOMPARE(qtTrId("maps-title"), "maps-title"_s);
    const QStringList warnings = takeMessages();
    QCOMPARE(warnings.size(), 2);
    for (const QString &name : {"a"_s, "b"_s}) {
        const QString file = inDirectory(name + m_suffix);
        QVERIFY(warnings.first().contains(file) || warnings.last().contains(file));
    }
    reload();
    QCOMPARE(takeMessages(), QStringList());
    Files::remove(elsewhere);
}

void ListModelTest::dyingModelMayBeUsed()
{
    define("a"_s, "maps");
    loadEverything();
    const LanguageListener listener([this] {
        const QList<int> roles = m_watched->roleNames().keys();
        for (int row = 0; row < m_watched->rowCount(); ++row) {
            for (const int role : roles) {
                m_watched->data(m_watched->index(row), role);
            }
        }
        choose("enable", "a"_s);
        reload();
    });
    removeModel();
    QVERIFY(listener.count > 0);
    QVERIFY(!stored().isEmpty());
    // Nothing was loaded into the dying model.
    QCOMPARE(qtTrId("maps-title"), "maps-title"_s);
}
