// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/androidsupport.h"
#include "files.h"
#include "interfaceof.h"
#include "loggedtest.h"

#include <QtTest>

class TestAndroidSupport : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void isOneConstantProperty();
    void isVisibleWithTheDaemon();
    void anyEntryWillDo();
    void looksOnEveryRead();
};

namespace {

const QString daemonPath = QStringLiteral("/usr/sbin/apkd");

} // namespace

void TestAndroidSupport::init()
{
    Files::remove(daemonPath);
    LoggedTest::init();
}

void TestAndroidSupport::isOneConstantProperty()
{
    const QStringList expected = {
        QStringLiteral("bool dataDirectoriesVisible readonly constant"),
    };
    QCOMPARE(interfaceOf(AndroidSupport::staticMetaObject), expected);
}

void TestAndroidSupport::isVisibleWithTheDaemon()
{
    const AndroidSupport support;
    QVERIFY(!support.dataDirectoriesVisible());
    Files::write(daemonPath, {});
    const AndroidSupport supportNow;
    QVERIFY(supportNow.dataDirectoriesVisible());
}

void TestAndroidSupport::anyEntryWillDo()
{
    const AndroidSupport support;
    Files::makeDirectory(daemonPath);
    QVERIFY(support.dataDirectoriesVisible());
    Files::remove(daemonPath);
    Files::makePipe(daemonPath);
    QVERIFY(support.dataDirectoriesVisible());
    Files::remove(daemonPath);
    Files::makeLink(QStringLiteral("/dev/null"), daemonPath);
    QVERIFY(support.dataDirectoriesVisible());
    Files::remove(daemonPath);
    Files::makeLink(QStringLiteral("/nowhere"), daemonPath);
    QVERIFY(!support.dataDirectoriesVisible());
}

void TestAndroidSupport::looksOnEveryRead()
{
    const AndroidSupport support;
    QVERIFY(!support.dataDirectoriesVisible());
    Files::write(daemonPath, "#!/bin/sh\n");
    QVERIFY(support.dataDirectoriesVisible());
    Files::remove(daemonPath);
    QVERIFY(!support.dataDirectoriesVisible());
}

QTEST_GUILESS_MAIN(TestAndroidSupport)

#include "tst_androidsupport.moc"
