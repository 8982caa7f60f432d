// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compares the scanner of settings files with QSettings, which it protects.

#include "files.h"
#include "files/inifile.h"

#include <QSettings>
#include <QTemporaryDir>
#include <QtTest>

#include <algorithm>
#include <random>

class TestIniFile : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void acceptsExactlyWhatQSettingsDoesNotUnpack();
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

int countKeys(const QByteArray &text)
{
    int keys = 0;
    for (IniLine line = nextIniLine(text, 0); line.kind != IniLine::Kind::None;
         line = nextIniLine(text, line.end)) {
        keys += line.kind == IniLine::Kind::Key ? 1 : 0;
    }
    return keys;
}

// Pieces of text that have a special meaning, or look like it. Their packed values are harmless in
// any combination, because QSettings unpacks them here.
QByteArray randomFile(std::mt19937 *random)
{
    static const std::vector<QByteArray> pieces = {
        "@Variant(\\0\\0\\0\\x2\\0\\0\\0\\x7)",
        "@DateTime(\\0\\0\\0\\x2\\0\\0\\0\\x7)",
        "@Variant(",
        "@DateTime(",
        "@Va",
        "riant(",
        "@",
        "@@",
        "\\x40",
        "\\x10040",
        "\\x00000000000040",
        "\\100",
        "\\200100",
        "Variant(",
        "\\x56",
        "(",
        ")",
        "\\x29",
        "\\51",
        "x",
        "\\x",
        "\\q",
        "\\8",
        "\\t",
        "\\?",
        "\\",
        "\\\\",
        "\\\"",
        "\\\n",
        "\\\r\n",
        "\\\n\n",
        "\"",
        "\"\"",
        "\"",
        ",",
        ",",
        " ",
        "\t",
        ";",
        "=",
        "[",
        "]",
        "\r",
        "\n",
        "\n[s]\n",
        "\xef\xbb\xbf",
        "\xc3\xa4",
        "\xff",
        "%",
    };
    const auto below = [random](int end) { return int((*random)() % uint(end)); };
    QByteArray text = below(4) == 0 ? iniByteOrderMark : "";
    for (int key = 1 + below(3); key > 0; --key) {
        text += below(8) == 0 ? "" : 'k' + QByteArray::number(key) + '=';
        for (int count = below(7); count > 0; --count) {
            text += pieces.at(size_t(below(int(pieces.size()))));
        }
        text += '\n';
    }
    return text;
}

} // namespace

void TestIniFile::acceptsExactlyWhatQSettingsDoesNotUnpack()
{
    bool isNumber = false;
    const int requested = qEnvironmentVariableIntValue("INI_FILES", &isNumber);
    const int files = isNumber ? requested : 20000;
    bool hasSeed = false;
    const int seed = qEnvironmentVariableIntValue("INI_SEED", &hasSeed);
    std::mt19937 random(hasSeed ? uint(seed) : 1U);
    // QSettings warns about values that are not packed correctly.
    qInstallMessageHandler([](QtMsgType, const QMessageLogContext &, const QString &) {});
    const QTemporaryDir directory(QStringLiteral("/run/ini-XXXXXX"));
    int unpacked = 0;
    for (int i = 0; i < files; ++i) {
        const QByteArray text = randomFile(&random);
        // QSettings does not reread a file if its name is the same and it looks unchanged.
        const QString path = directory.filePath(QString::number(i));
        Files::write(path, text);
        const bool isPlain = isPlainIni(path);
        const QVector<QVariant> values = valuesOf(QSettings(path, QSettings::IniFormat));
        const bool unpacks = std::any_of(values.cbegin(), values.cend(), isUnpacked);
        Files::remove(path);
        QVERIFY2(!isPlain || !unpacks, "accepted: " + text.toPercentEncoding(" =@()\"\\,;[]\n"));
        // If a key occurs twice, QSettings returns only the last value.
        if (countKeys(text) == values.size()) {
            QVERIFY2(isPlain || unpacks, "refused: " + text.toPercentEncoding(" =@()\"\\,;[]\n"));
        }
        unpacked += unpacks ? 1 : 0;
    }
    QVERIFY2(unpacked > files / 50, qPrintable(QString::number(unpacked)));
    QVERIFY(unpacked < files / 2);
    qInstallMessageHandler(nullptr);
    qInfo("%d files, of which QSettings unpacks %d", files, unpacked);
}

QTEST_GUILESS_MAIN(TestIniFile)

#include "tst_inifile.moc"
