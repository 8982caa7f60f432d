// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/bluetoothinfo.h"
#include "files.h"
#include "files/regularfile.h"
#include "interfaceof.h"
#include "loggedtest.h"

#include <QFile>
#include <QtTest>

class TestBluetoothInfo : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void isOneConstantProperty();
    void readsTheFirstLine_data();
    void readsTheFirstLine();
    void readsTheFirstLineOfAHugeFile();
    void readsOnce();
    void warnsOfWhatCannotBeOpened_data();
    void warnsOfWhatCannotBeOpened();
};

using Make = void (*)();
Q_DECLARE_METATYPE(Make)

namespace {

const QString addressPath = QStringLiteral("/var/lib/bluetooth/board-address");

} // namespace

void TestBluetoothInfo::init()
{
    Files::remove(addressPath);
    LoggedTest::init();
}

void TestBluetoothInfo::isOneConstantProperty()
{
    const QStringList expected = {
        QStringLiteral("QString adapterAddress readonly constant"),
    };
    QCOMPARE(interfaceOf(BluetoothInfo::staticMetaObject), expected);
}

void TestBluetoothInfo::readsTheFirstLine_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("address");

    const QString address = QStringLiteral("00:1a:7d:da:71:13");
    QTest::newRow("line") << QByteArray("00:1A:7D:DA:71:13\n") << address;
    QTest::newRow("no line end") << QByteArray("00:1A:7D:DA:71:13") << address;
    QTest::newRow("blanks before") << QByteArray(" \t 00:1A:7D:DA:71:13\n") << address;
    QTest::newRow("blanks behind") << QByteArray("00:1A:7D:DA:71:13 \t \n") << address;
    QTest::newRow("carriage return") << QByteArray("00:1A:7D:DA:71:13\r\n") << address;
    QTest::newRow("more lines") << QByteArray("00:1A:7D:DA:71:13\n00:00:00:00:00:00\n") << address;
    QTest::newRow("an empty line first") << QByteArray("\n00:1A:7D:DA:71:13\n") << QString();
    QTest::newRow("empty") << QByteArray() << QString();
    QTest::newRow("NUL") << QByteArray("00:1A\0:7D:DA\n", 13) << QStringLiteral("00:1a");
    QTest::newRow("NUL first") << QByteArray("\0X\n", 3) << QString();
    QTest::newRow("blank before NUL") << QByteArray("X \0Y\n", 5) << QStringLiteral("x");
    QTest::newRow("no address") << QByteArray("Not SET\n") << QStringLiteral("not set");
    // As UTF-8 this would be no text at all. The last one is a blank that does not break.
    QTest::newRow("Latin-1") << QByteArray("\xC4\xD6\xA0\n") << QStringLiteral("\u00E4\u00F6");
    QTest::newRow("a long line") << QByteArray(100000, 'A') + '\n'
                                 << QString(100000, QLatin1Char('a'));
}

void TestBluetoothInfo::readsTheFirstLine()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, address);
    Files::write(addressPath, content);
    const BluetoothInfo info;
    QCOMPARE(info.adapterAddress(), address);
}

void TestBluetoothInfo::readsTheFirstLineOfAHugeFile()
{
    Files::write(addressPath, "AA\n");
    QVERIFY(QFile::resize(addressPath, qint64(1) << 40));
    QCOMPARE(BluetoothInfo().adapterAddress(), QStringLiteral("aa"));
    Files::write(addressPath, QByteArray(maximumTextSize, 'A'));
    QCOMPARE(BluetoothInfo().adapterAddress().size(), int(maximumTextSize));
}

void TestBluetoothInfo::readsOnce()
{
    Files::write(addressPath, "AA\n");
    const BluetoothInfo info;
    Files::write(addressPath, "BB\n");
    QCOMPARE(info.adapterAddress(), QStringLiteral("aa"));
    Files::remove(addressPath);
    QCOMPARE(info.adapterAddress(), QStringLiteral("aa"));
}

void TestBluetoothInfo::warnsOfWhatCannotBeOpened_data()
{
    QTest::addColumn<Make>("make");
    QTest::newRow("nothing") << Make([] {});
    QTest::newRow("directory") << Make([] { Files::makeDirectory(addressPath); });
    QTest::newRow("pipe") << Make([] { Files::makePipe(addressPath); });
    QTest::newRow("device") << Make(
        [] { Files::makeLink(QStringLiteral("/dev/zero"), addressPath); });
    QTest::newRow("a line above the limit")
        << Make([] { Files::write(addressPath, QByteArray(maximumTextSize + 1, 'A')); });
}

void TestBluetoothInfo::warnsOfWhatCannotBeOpened()
{
    QFETCH(Make, make);
    make();
    const BluetoothInfo info;
    QCOMPARE(m_log->takeReport(),
             QStringLiteral("warning [default] Unable to open file: "
                            "\"/var/lib/bluetooth/board-address\""));
    QCOMPARE(info.adapterAddress(), QString());

    Files::remove(addressPath);
    Files::write(addressPath, "AA\n");
    QCOMPARE(info.adapterAddress(), QString());
}

QTEST_GUILESS_MAIN(TestBluetoothInfo)

#include "tst_bluetoothinfo.moc"
