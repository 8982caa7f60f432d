// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/modemfeaturereader.h"
#include "files.h"
#include "interfaceof.h"
#include "loggedtest.h"

#include <QtTest>

class TestModemFeatureReader : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void isOneConstantProperty();
    void readsTheVariant_data();
    void readsTheVariant();
    void readsOnEveryRead();
    void whatCannotBeReadIsEmpty();
    void doesNotWrite();
};

namespace {

const QString featuresPath = QStringLiteral("/usr/share/modem-software/features.ini");

} // namespace

void TestModemFeatureReader::init()
{
    Files::remove(featuresPath);
    LoggedTest::init();
}

void TestModemFeatureReader::isOneConstantProperty()
{
    const QStringList expected = {
        QStringLiteral("QString variant readonly constant"),
    };
    QCOMPARE(interfaceOf(ModemFeatureReader::staticMetaObject), expected);
}

void TestModemFeatureReader::readsTheVariant_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("variant");

    const QString name = QStringLiteral("global");
    QTest::newRow("first line") << QByteArray("variant=global\n") << name;
    QTest::newRow("blanks") << QByteArray("variant = global \n") << name;
    QTest::newRow("quotes") << QByteArray("variant=\"global\"\n") << name;
    QTest::newRow("before a section") << QByteArray("variant=global\n[modem]\na=b\n") << name;
    QTest::newRow("[General]") << QByteArray("[General]\nvariant=global\n") << name;
    QTest::newRow("[general]") << QByteArray("[general]\nvariant=global\n") << name;
    QTest::newRow("[General] last")
        << QByteArray("[modem]\nvariant=x\n[General]\nvariant=global\n") << name;
    QTest::newRow("another section") << QByteArray("[modem]\nvariant=global\n") << QString();
    QTest::newRow("other keys") << QByteArray("variants=a\nvarian=b\n") << QString();
    QTest::newRow("no value") << QByteArray("variant=\n") << QString();
    QTest::newRow("empty") << QByteArray() << QString();
    QTest::newRow("no INI file") << QByteArray("\xff\xfe\0[[]=\n", 9) << QString();
    QTest::newRow("comma") << QByteArray("variant=a,b\n") << QString();
    QTest::newRow("quoted comma") << QByteArray("variant=\"a,b\"\n") << QStringLiteral("a,b");
    QTest::newRow("number") << QByteArray("variant=7\n") << QStringLiteral("7");
    QTest::newRow("comment") << QByteArray("variant=a;b\n") << QStringLiteral("a");
    QTest::newRow("Latin-1") << QByteArray("variant=\xE4\n") << QStringLiteral("\u00E4");
    // QSettings would unpack whatever is in there, and the process might not survive it.
    QTest::newRow("packed value") << QByteArray(
        "variant=@Variant(\\0\\0\\0\\v\\0\\0\\0\\x1\\0\\0\\0"
        "\\x2\\0g)\n") << QString();
}

void TestModemFeatureReader::readsTheVariant()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, variant);
    Files::write(featuresPath, content);
    const ModemFeatureReader reader;
    QCOMPARE(reader.variant(), variant);
}

void TestModemFeatureReader::readsOnEveryRead()
{
    const ModemFeatureReader reader;
    QCOMPARE(reader.variant(), QString());
    Files::write(featuresPath, "variant=one\n");
    QCOMPARE(reader.variant(), QStringLiteral("one"));
    Files::write(featuresPath, "variant=another\n");
    QCOMPARE(reader.variant(), QStringLiteral("another"));
    Files::remove(featuresPath);
    QCOMPARE(reader.variant(), QString());
}

void TestModemFeatureReader::whatCannotBeReadIsEmpty()
{
    const ModemFeatureReader reader;
    Files::makeDirectory(featuresPath);
    QCOMPARE(reader.variant(), QString());
    Files::remove(featuresPath);
    Files::makePipe(featuresPath);
    QCOMPARE(reader.variant(), QString());
    Files::remove(featuresPath);
    Files::makeLink(QStringLiteral("/dev/zero"), featuresPath);
    QCOMPARE(reader.variant(), QString());
}

void TestModemFeatureReader::doesNotWrite()
{
    const ModemFeatureReader reader;
    QCOMPARE(reader.variant(), QString());
    const QDir directory(QFileInfo(featuresPath).path());
    QCOMPARE(directory.entryList(QDir::AllEntries | QDir::Hidden | QDir::NoDotAndDotDot),
             QStringList());
}

QTEST_GUILESS_MAIN(TestModemFeatureReader)

#include "tst_modemfeaturereader.moc"
