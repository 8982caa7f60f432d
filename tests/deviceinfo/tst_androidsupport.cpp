// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/androidsupport.h"
#include "files.h"
#include "messagelog.h"

#include <QtTest>

class TestAndroidSupport : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void init();
    void cleanup();

    void isOneConstantProperty();
    void isVisibleWithTheDaemon();
    void anyEntryWillDo();
    void looksOnEveryRead();

private:
    std::unique_ptr<MessageLog> m_log;
};

namespace {

const QString daemonPath = QStringLiteral("/usr/sbin/apkd");

} // namespace

void TestAndroidSupport::init()
{
    Files::remove(daemonPath);
    m_log = std::make_unique<MessageLog>();
}

void TestAndroidSupport::cleanup()
{
    QCOMPARE(m_log->takeReport(), QString());
    m_log.reset();
}

void TestAndroidSupport::isOneConstantProperty()
{
    const QMetaObject &type = AndroidSupport::staticMetaObject;
    QCOMPARE(type.propertyCount() - type.propertyOffset(), 1);
    QCOMPARE(type.methodCount() - type.methodOffset(), 0);
    const QMetaProperty property = type.property(type.propertyOffset());
    QCOMPARE(property.name(), "dataDirectoriesVisible");
    QCOMPARE(property.userType(), int(QMetaType::Bool));
    QVERIFY(property.isConstant());
    QVERIFY(!property.isWritable());
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
    Files::makeFolder(daemonPath);
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
