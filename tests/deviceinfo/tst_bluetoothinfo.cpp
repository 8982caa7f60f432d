// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/bluetoothinfo.h"
#include "files.h"
#include "files/regularfile.h"
#include "loggedtest.h"
#include "texts.h"

#include <QFile>
#include <QtTest>

class TestBluetoothInfo : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void readsTheFirstLine_data();
    void readsTheFirstLine();
    void readsTheFirstLineOfAHugeFile();
    void readsOnce();
    void warnsIfTheFileCannotBeOpened_data();
    void warnsIfTheFileCannotBeOpened();
};

using Make = void (*)();
Q_DECLARE_METATYPE(Make)

namespace {

const QString addressPath = "/var/lib/bluetooth/board-address"_s;

} // namespace

void TestBluetoothInfo::init()
{
    Files::remove(addressPath);
    LoggedTest::init();
}

void TestBluetoothInfo::readsTheFirstLine_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("address");

    const auto row = [](const char *name, const QByteArray &content, const char *address) {
        QTest::newRow(name) << content << address;
    };
    row("line", "00:1A:7D:DA:71:13\n", "00:1a:7d:da:71:13");
    row("no line end", "00:1A", "00:1a");
    row("blanks before", " \t 00:1A\n", "00:1a");
    row("blanks behind", "00:1A \t \n", "00:1a");
    row("carriage return", "00:1A\r\n", "00:1a");
    row("more lines", "00:1A\n00:00\n", "00:1a");
    row("an empty line first", "\n00:1A\n", "");
    row("empty", "", "");
    row("NUL", QByteArray("00:1A\0:7D:DA\n", 13), "00:1a");
    row("NUL first", QByteArray("\0X\n", 3), "");
    row("blank before NUL", QByteArray("X \0Y\n", 5), "x");
    row("no address", "Not SET\n", "not set");
    // This is not UTF-8. The last character is a no-break space.
    row("Latin-1", "\xC4\xD6\xA0\n", "äö");
    row("a long line", QByteArray(100000, 'A') + '\n', QByteArray(100000, 'a').constData());
}

void TestBluetoothInfo::readsTheFirstLine()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, address);
    Files::write(addressPath, content);
    QCOMPARE(BluetoothInfo().adapterAddress(), address);
}

void TestBluetoothInfo::readsTheFirstLineOfAHugeFile()
{
    Files::write(addressPath, "AA\n");
    QVERIFY(QFile::resize(addressPath, qint64(1) << 40));
    QCOMPARE(BluetoothInfo().adapterAddress(), "aa"_s);
    Files::write(addressPath, QByteArray(maximumTextSize, 'A'));
    QCOMPARE(BluetoothInfo().adapterAddress().size(), int(maximumTextSize));
}

void TestBluetoothInfo::readsOnce()
{
    Files::write(addressPath, "AA\n");
    const BluetoothInfo info;
    Files::write(addressPath, "BB\n");
    QCOMPARE(info.adapterAddress(), "aa"_s);
    Files::remove(addressPath);
    QCOMPARE(info.adapterAddress(), "aa"_s);
}

void TestBluetoothInfo::warnsIfTheFileCannotBeOpened_data()
{
    QTest::addColumn<Make>("make");
    QTest::newRow("nothing") << Make([] {});
    QTest::newRow("directory") << Make([] { Files::makeDirectory(addressPath); });
    QTest::newRow("pipe") << Make([] { Files::makePipe(addressPath); });
    QTest::newRow("device") << Make([] { Files::makeLink("/dev/zero"_s, addressPath); });
    QTest::newRow("a line above the limit")
        << Make([] { Files::write(addressPath, QByteArray(maximumTextSize + 1, 'A')); });
}

void TestBluetoothInfo::warnsIfTheFileCannotBeOpened()
{
    QFETCH(Make, make);
    make();
    const BluetoothInfo info;
    QCOMPARE(m_log->takeReport(),
             "warning [default] Unable to open file: "
             "\"/var/lib/bluetooth/board-address\""_s);
    QCOMPARE(info.adapterAddress(), QString());

    Files::remove(addressPath);
    Files::write(addressPath, "AA\n");
    QCOMPARE(info.adapterAddress(), QString());
}

QTEST_GUILESS_MAIN(TestBluetoothInfo)

#include "tst_bluetoothinfo.moc"
