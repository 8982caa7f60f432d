// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "deviceinfo/modemfeaturereader.h"
#include "files.h"
#include "loggedtest.h"
#include "texts.h"

#include <QtTest>

class TestModemFeatureReader : public LoggedTest
{
    Q_OBJECT

private Q_SLOTS:
    void init();

    void readsTheVariant_data();
    void readsTheVariant();
    void readsOnEveryRead();
    void isEmptyIfTheFileCannotBeRead();
    void doesNotWrite();
};

namespace {

const QString featuresPath = "/usr/share/modem-software/features.ini"_s;

} // namespace

void TestModemFeatureReader::init()
{
    Files::remove(featuresPath);
    LoggedTest::init();
}

void TestModemFeatureReader::readsTheVariant_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<QString>("variant");

    const auto row = [](const char *name, const QByteArray &content, const char *variant) {
        QTest::newRow(name) << content << variant;
    };
    row("first line", "variant=global\n", "global");
    row("blanks", "variant = global \n", "global");
    row("quotes", "variant=\"global\"\n", "global");
    row("before a section", "variant=global\n[modem]\na=b\n", "global");
    row("[General]", "[General]\nvariant=global\n", "global");
    row("[general]", "[general]\nvariant=global\n", "global");
    row("[General] last", "[modem]\nvariant=x\n[General]\nvariant=global\n", "global");
    row("another section", "[modem]\nvariant=global\n", "");
    row("before a section that is not closed", "variant=global\n[modem\na=b\n", "global");
    row("other keys", "variants=a\nvarian=b\n", "");
    row("no value", "variant=\n", "");
    row("empty", "", "");
    row("no INI file", QByteArray("\xff\xfe\0[[]=\n", 9), "");
    row("comma", "variant=a,b\n", "");
    row("quoted comma", "variant=\"a,b\"\n", "a,b");
    row("number", "variant=7\n", "7");
    row("comment", "variant=a;b\n", "a");
    row("Latin-1", "variant=\xE4\n", "ä");
    // QSettings would unpack the value, which might crash the process.
    row("packed value", "variant=@Variant(\\0\\0\\0\\v\\0\\0\\0\\x1\\0\\0\\0\\x2\\0g)\n", "");
}

void TestModemFeatureReader::readsTheVariant()
{
    QFETCH(QByteArray, content);
    QFETCH(QString, variant);
    Files::write(featuresPath, content);
    QCOMPARE(ModemFeatureReader().variant(), variant);
}

void TestModemFeatureReader::readsOnEveryRead()
{
    const ModemFeatureReader reader;
    QCOMPARE(reader.variant(), QString());
    Files::write(featuresPath, "variant=one\n");
    QCOMPARE(reader.variant(), "one"_s);
    Files::write(featuresPath, "variant=another\n");
    QCOMPARE(reader.variant(), "another"_s);
    Files::remove(featuresPath);
    QCOMPARE(reader.variant(), QString());
}

void TestModemFeatureReader::isEmptyIfTheFileCannotBeRead()
{
    const ModemFeatureReader reader;
    Files::makeDirectory(featuresPath);
    QCOMPARE(reader.variant(), QString());
    Files::remove(featuresPath);
    Files::makePipe(featuresPath);
    QCOMPARE(reader.variant(), QString());
    Files::remove(featuresPath);
    Files::makeLink("/dev/zero"_s, featuresPath);
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
