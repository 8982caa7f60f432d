// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/androidsupport.h"
#include "files.h"
#include "loggedtest.h"
#include "texts.h"

#include <QtTest>

class TestAndroidSupport : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void isVisibleWithAnyEntry_data();
    void isVisibleWithAnyEntry();
};

using Make = void (*)(const QString &);
Q_DECLARE_METATYPE(Make)

namespace {

const QString daemonPath = "/usr/sbin/apkd"_s;

} // namespace

void TestAndroidSupport::init()
{
    Files::remove(daemonPath);
    LoggedTest::init();
}

void TestAndroidSupport::isVisibleWithAnyEntry_data()
{
    QTest::addColumn<Make>("make");
    QTest::addColumn<bool>("visible");
    QTest::newRow("empty file") << Make([](const QString &path) { Files::write(path, {}); })
                                << true;
    QTest::newRow("directory") << Make(Files::makeDirectory) << true;
    QTest::newRow("pipe") << Make(Files::makePipe) << true;
    QTest::newRow("link") << Make([](const QString &path) { Files::makeLink("/dev/null"_s, path); })
                          << true;
    QTest::newRow("link to nothing")
        << Make([](const QString &path) { Files::makeLink("/nowhere"_s, path); }) << false;
}

// The path is checked on every read.
void TestAndroidSupport::isVisibleWithAnyEntry()
{
    QFETCH(const Make, make);
    QFETCH(const bool, visible);
    const AndroidSupport support;
    QVERIFY(!support.dataDirectoriesVisible());
    make(daemonPath);
    QCOMPARE(support.dataDirectoriesVisible(), visible);
    Files::remove(daemonPath);
    QVERIFY(!support.dataDirectoriesVisible());
}

QTEST_GUILESS_MAIN(TestAndroidSupport)

#include "tst_androidsupport.moc"
