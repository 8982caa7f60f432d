// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "listmodeltest.h"

#include "files.h"
#include "texts.h"
#include "words.h"

#include <QtTest>

ListModelTest::ListModelTest(QString directory, QString suffix)
    : m_directory(std::move(directory)), m_suffix(std::move(suffix))
{
}

void ListModelTest::init()
{
    Files::remove(m_directory);
    Files::makeDirectory(m_directory);
    Files::installCatalogs(words("maps_eng_en maps-fi atlas_eng_en"));
    QLocale::setDefault(QLocale("fi_FI"_s));
    LoggedTest::init();
}

void ListModelTest::cleanup()
{
    m_tester.reset();
    m_events.reset();
    removeModel();
    QCOMPARE(takeMessages(), QStringList());
    LoggedTest::cleanup();
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
    QFile open(inDirectory(file));
    QVERIFY(open.open(QIODevice::WriteOnly));
    open.write(content);
}

void ListModelTest::writeBroken() const
{
    Files::write(inDirectory("broken"_s + m_suffix), "[");
}

void ListModelTest::followsTheDirectory()
{
    const auto write = [this](const QString &name) {
        Files::write(inDirectory(name + m_suffix), definition(name, ""));
    };
    // The directory above it is missing, too.
    Files::remove(QFileInfo(m_directory).path());
    loadEverything();
    QCOMPARE(rows(), QString());
    write("a"_s);
    QTRY_COMPARE(rows(), "a"_s);
    write("b"_s);
    QTRY_COMPARE(rows(), "a b"_s);
    Files::remove(inDirectory("a"_s + m_suffix));
    QTRY_COMPARE(rows(), "b"_s);
    QVERIFY(QFile::rename(inDirectory("b"_s + m_suffix), inDirectory("b.bak"_s)));
    QTRY_COMPARE(rows(), QString());

    write("c"_s);
    QTRY_COMPARE(rows(), "c"_s);
    Files::remove(m_directory);
    QTRY_COMPARE(rows(), QString());
    write("d"_s);
    QTRY_COMPARE(rows(), "d"_s);
    rewrite("d"_s + m_suffix, "[");
    QTRY_VERIFY(!messages().isEmpty());
    takeMessages();
}

void ListModelTest::readsWrittenFilesOnceTheyAreClosed()
{
    Files::write(inDirectory("a"_s + m_suffix), definition("a"_s, ""));
    loadEverything();
    QFile file(inDirectory("a"_s + m_suffix));
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write("[");
    QVERIFY(file.flush());
    waitForNothing();
    QCOMPARE(takeMessages(), QStringList());
    file.close();
    QTRY_COMPARE(messages().size(), 1);
    takeMessages();
}

void ListModelTest::ignoresOtherFiles()
{
    writeBroken();
    loadEverything();
    QCOMPARE(takeMessages().size(), 1);
    Files::write(inDirectory("other.txt"_s), "x");
    rewrite("other.txt"_s, "more");
    Files::remove(inDirectory("other.txt"_s));
    waitForNothing();
    QCOMPARE(takeMessages(), QStringList());
}

void ListModelTest::catalogsGoWithTheModel()
{
    Files::write(inDirectory("a"_s + m_suffix), definition("a"_s, "maps"));
    loadEverything();
    QCOMPARE(qtTrId("maps-title"), "Kartat"_s);
    removeModel();
    QCOMPARE(qtTrId("maps-title"), "maps-title"_s);
}

void ListModelTest::dyingModelMayBeAsked()
{
    Files::write(inDirectory("a"_s + m_suffix), definition("a"_s, "maps"));
    loadEverything();
    const LanguageListener listener([this] {
        const QList<int> roles = m_watched->roleNames().keys();
        for (int row = 0; row < m_watched->rowCount(); ++row) {
            for (const int role : roles) {
                m_watched->data(m_watched->index(row), role);
            }
        }
    });
    removeModel();
    QVERIFY(listener.count > 0);
}

LanguageListener::LanguageListener(std::function<void()> answer) : m_answer(std::move(answer))
{
    QCoreApplication::instance()->installEventFilter(this);
}

bool LanguageListener::eventFilter(QObject *watched, QEvent *event)
{
    if (event->type() == QEvent::LanguageChange) {
        ++count;
        m_answer();
    }
    return QObject::eventFilter(watched, event);
}
