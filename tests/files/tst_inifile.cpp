// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compares the check of settings files with QSettings, which it protects.

#include "files.h"
#include "files/characters.h"
#include "files/inifile.h"
#include "texts.h"

#include <QSettings>
#include <QTemporaryDir>
#include <QtTest>

#include <algorithm>
#include <random>

Q_DECLARE_METATYPE(IniFault)

class TestIniFile : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void findsFaults_data();
    void findsFaults();
    void acceptsNothingThatQSettingsUnpacks();
};

namespace {

// QSettings unpacks none of these. A packed value of the test is a number.
bool isUnpacked(const QVariant &value)
{
    if (value.userType() == QMetaType::QVariantList) {
        const QVariantList list = value.toList();
        return std::any_of(list.cbegin(), list.cend(), isUnpacked);
    }
    return value.userType() != QMetaType::QString && value.userType() != QMetaType::QStringList;
}

// The values that QSettings returns. QSettings lists some keys that it then does not find.
QVector<QVariant> valuesOf(const QSettings &settings)
{
    QVector<QVariant> values;
    const QStringList keys = settings.allKeys();
    for (const QString &key : keys) {
        if (!key.isEmpty() && settings.contains(key)) {
            values.append(settings.value(key));
        }
    }
    return values;
}

// Pieces of text that have a special meaning, or look like it. Their packed values are harmless in
// any combination, because QSettings unpacks them here.
QByteArray randomFile(std::mt19937 *random)
{
    static const QByteArrayList pieces =
        QByteArray("@Variant(\\0\\0\\0\\x2\\0\\0\\0\\x7) @DateTime(\\0\\0\\0\\x2\\0\\0\\0\\x7) "
                   "@Variant( @DateTime( @Va riant( @ @@ \\x40 \\x10040 \\x00000000000040 \\100 "
                   "\\200100 Variant( \\x56 ( ) \\x29 \\51 x \\x \\q \\8 \\t \\? \\ \\\\ \\\" "
                   "\\\n \\\r\n \\\n\n \" \"\" \" , , ; = [ ] \r \n \n[s]\n \xef\xbb\xbf "
                   "\xc3\xa4 \xff %")
            .split(' ')
        + QByteArrayList{" ", "\t"};
    const auto below = [random](int end) { return int((*random)() % uint(end)); };
    QByteArray text = below(4) == 0 ? byteOrderMark : "";
    for (int key = 1 + below(3); key > 0; --key) {
        text += below(8) == 0 ? "" : 'k' + QByteArray::number(key) + '=';
        for (int count = below(7); count > 0; --count) {
            text += pieces.at(below(pieces.size()));
        }
        text += '\n';
    }
    return text;
}

} // namespace

void TestIniFile::findsFaults_data()
{
    QTest::addColumn<QByteArray>("content");
    QTest::addColumn<IniFault>("fault");
    const auto row = [](const char *name, const QByteArray &content, IniFault fault) {
        QTest::newRow(name) << content << fault;
    };
    row("keys and sections", "a=b\n[s]\nc=\"@\", x\n[t]", IniFault::None);
    row("comment", "; a=@Variant(b)\nc=d ; @DateTime(\n", IniFault::None);
    row("no value", "@Variant(\n[@DateTime(]\n@Variant(a)=b\n", IniFault::None);
    row("other at signs", "a=@Vari@ant(, @variant(, @ByteArray(b), @DateTime, Variant(\n",
        IniFault::None);
    row("escaped blank", "a=@Va\\x20riant(\n", IniFault::None);
    row("other character", "a=\\x140Variant(\n", IniFault::None);
    row("in a text", "a=such as @Variant(b)\n", IniFault::PackedValue);
    row("escaped at sign", "a=\\x40Variant(b)\n", IniFault::PackedValue);
    row("octal, with upper bits", "a=\\200100Variant(b)\n", IniFault::PackedValue);
    row("quotes and escapes", "a=@V\"a\"\\qriant\\x28 \\\n(b)\n", IniFault::PackedValue);
    row("byte-order marks", "\xef\xbb\xbf\na=@Date\"\xef\xbb\xbfTime(b)\"\n",
        IniFault::PackedValue);
    row("not closed", "a=@DateTime(\n", IniFault::PackedValue);
    row("behind an unclosed section", "[s\na=@Variant(b)\n", IniFault::PackedValue);
    row("unclosed section", "a=b\n[s\n[t]\n", IniFault::UnclosedSection);
    row("section closed in the next line", "[s\n]\n", IniFault::UnclosedSection);
    row("unclosed at the end", "a=b\n[s", IniFault::UnclosedSection);
    row("unclosed behind a byte-order mark", "\xef\xbb\xbf[s\na=b\n", IniFault::UnclosedSection);
    row("unclosed behind a comment", "a=b\n;c\n \t[s\n", IniFault::UnclosedSection);
    row("unclosed behind a semicolon", "a=b;[s\n[t\n", IniFault::UnclosedSection);
    row("closed in a comment", "[s;]\n", IniFault::UnclosedSection);
    row("text behind a section", "[s]t\n", IniFault::None);
    row("section in a comment", ";[s\n", IniFault::None);
    row("section in quotes", "a=\"\n[s\n\"\n", IniFault::None);
    row("section in a continued line", "a=\\\n[s\nb=\\\r\n[s\n", IniFault::None);
    row("section closed behind quotes", "[\"s\n\"]\n", IniFault::None);
    row("backslash at the end", "a=\\", IniFault::None);
    row("largest", QByteArray(int(maximumIniSize), 'x'), IniFault::None);
    row("too large", QByteArray(int(maximumIniSize) + 1, 'x'), IniFault::Unreadable);
}

void TestIniFile::findsFaults()
{
    QFETCH(QByteArray, content);
    const QTemporaryDir directory("/run/ini-XXXXXX"_s);
    const QString path = directory.filePath("file"_s);
    QCOMPARE(findIniFault(path), IniFault::None); // QSettings cannot open it, either.
    QCOMPARE(findIniFault(directory.path()), IniFault::Unreadable);
    Files::write(path, content);
    QTEST(findIniFault(path), "fault");
}

void TestIniFile::acceptsNothingThatQSettingsUnpacks()
{
    bool isNumber = false;
    const int requested = qEnvironmentVariableIntValue("INI_FILES", &isNumber);
    const int files = isNumber ? requested : 20000;
    bool hasSeed = false;
    const int seed = qEnvironmentVariableIntValue("INI_SEED", &hasSeed);
    std::mt19937 random(hasSeed ? uint(seed) : 1U);
    // QSettings warns about values that are not packed correctly.
    qInstallMessageHandler([](QtMsgType, const QMessageLogContext &, const QString &) {});
    // In memory, because there are many files.
    const QTemporaryDir directory(qEnvironmentVariable("XDG_RUNTIME_DIR") + "/XXXXXX"_s);
    int unpacked = 0;
    int accepted = 0;
    for (int i = 0; i < files; ++i) {
        const QByteArray text = randomFile(&random);
        // QSettings does not reread a file if its name is the same and it looks unchanged.
        const QString path = directory.filePath(QString::number(i));
        Files::write(path, text);
        const bool isAccepted = findIniFault(path) != IniFault::PackedValue;
        const QVector<QVariant> values = valuesOf(QSettings(path, QSettings::IniFormat));
        const bool unpacks = std::any_of(values.cbegin(), values.cend(), isUnpacked);
        Files::remove(path);
        QVERIFY2(!isAccepted || !unpacks, "accepted: " + text.toPercentEncoding(" =@()\"\\,;[]\n"));
        accepted += isAccepted ? 1 : 0;
        unpacked += unpacks ? 1 : 0;
    }
    QVERIFY2(unpacked > files / 50, qPrintable(QString::number(unpacked)));
    // Few files are refused without need.
    QVERIFY2(accepted > files * 6 / 10, qPrintable(QString::number(accepted)));
    qInstallMessageHandler(nullptr);
    qInfo("%d files, of which %d are accepted and QSettings unpacks %d", files, accepted, unpacked);
}

QTEST_GUILESS_MAIN(TestIniFile)

#include "tst_inifile.moc"
