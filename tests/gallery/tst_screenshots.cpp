// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Takes the screenshots of the gallery as ./dev run does, and checks them.

#include "texts.h"

#include <QDir>
#include <QFile>
#include <QImage>
#include <QProcess>
#include <QRegularExpression>
#include <QSet>
#include <QTemporaryDir>
#include <QTest>

namespace {

const QLatin1String source(SOURCE_DIR);
// Below the header, a page without content has one colour. Smooth text and icons have many.
constexpr int headerHeight = 48;
constexpr int enoughColours = 20;
constexpr int patience = 240000; // ms; the gallery's own timeout is shorter

struct Result {
    int exitCode = -1;
    QString output;
};

Result takeScreenshots(const QString &tree, const QString &directory)
{
    QProcess process;
    process.setProcessChannelMode(QProcess::MergedChannels);
    process.start(QLatin1String(QML_PROGRAM),
                  {tree + "/gallery/Screenshots.qml"_s, "--"_s, directory});
    Result result;
    if (process.waitForFinished(patience) && process.exitStatus() == QProcess::NormalExit) {
        result.exitCode = process.exitCode();
    }
    result.output = QString::fromUtf8(process.readAll());
    return result;
}

// Counts the colours of a page, up to enoughColours.
int countColours(const QImage &image)
{
    QSet<QRgb> colours;
    for (int y = headerHeight; y < image.height() && colours.size() < enoughColours; ++y) {
        for (int x = 0; x < image.width(); ++x) {
            colours.insert(image.pixel(x, y));
        }
    }
    return colours.size();
}

} // namespace

class ScreenshotsTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void everyPageIsShown();
    void problemsAreReported_data();
    void problemsAreReported();
    void unwritableDirectoryIsReported();
};

void ScreenshotsTest::everyPageIsShown()
{
    const QTemporaryDir directory;
    const Result result = takeScreenshots(source, directory.path());
    // The problem is in the last line.
    QVERIFY2(result.exitCode == 0, qPrintable(result.output.right(800)));

    static const QRegularExpression line("^(?:qml: )?([\\w-]+) \\([\\w-]+\\): (.*\\.png)$"_s,
                                         QRegularExpression::MultilineOption);
    static const QRegularExpression size("-(\\d+)x(\\d+)-"_s);
    QSet<QString> pages;
    QRegularExpressionMatchIterator lines = line.globalMatch(result.output);
    while (lines.hasNext()) {
        const QRegularExpressionMatch state = lines.next();
        pages.insert(state.captured(1));
        const QStringList files = state.captured(2).split(QLatin1Char(' '));
        QVERIFY2(files.size() >= 2, qPrintable(result.output));
        for (const QString &file : files) {
            const QImage image(directory.filePath(file));
            const QRegularExpressionMatch expected = size.match(file);
            QCOMPARE(image.size(),
                     QSize(expected.captured(1).toInt(), expected.captured(2).toInt()));
            QVERIFY2(countColours(image) >= enoughColours, qPrintable(file));
        }
    }
    // The start page and every file in pages/.
    QCOMPARE(pages.size(), 1 + QDir(source + "/gallery/pages"_s).entryList({"*.qml"_s}).size());
}

void ScreenshotsTest::problemsAreReported_data()
{
    QTest::addColumn<QByteArray>("old");
    QTest::addColumn<QByteArray>("replacement");
    QTest::addColumn<QString>("report");

    const auto row = [](const char *name, const char *old, const char *replacement,
                        const char *report) {
        QTest::newRow(name) << QByteArray(old) << QByteArray(replacement) << report;
    };
    row("a page that does not load", "QuickActionsModel {", "NoSuchType {", "NoSuchType");
    row("a warning of a binding", "visible: actions.count === 0", "visible: nothing.count === 0",
        "ReferenceError: nothing is not defined");
    const char *const title = "qsTrId(\"gallery-quick-actions-home\")";
    row("a text without translation", title, "qsTrId(\"gallery-no-such-text\")",
        "no translation of gallery-no-such-text");
    row("a text that is cut off", title, "\"As long as that\".repeat(10)",
        "As long as that\" is cut off");
}

void ScreenshotsTest::problemsAreReported()
{
    QFETCH(const QByteArray, old);
    QFETCH(const QByteArray, replacement);
    QFETCH(const QString, report);

    const QTemporaryDir directory;
    const QString copy = directory.filePath("copy"_s);
    QVERIFY(QDir().mkpath(copy));
    QCOMPARE(QProcess::execute("cp"_s, {"-r"_s, source + "/gallery"_s, copy}), 0);
    QFile page(copy + "/gallery/pages/QuickActionsPage.qml"_s);
    QVERIFY(page.open(QIODevice::ReadWrite));
    QByteArray content = page.readAll();
    QVERIFY(content.contains(old));
    content.replace(old, replacement);
    page.resize(0);
    page.seek(0);
    page.write(content);
    page.close();

    const Result result = takeScreenshots(copy, directory.path());
    QVERIFY2(result.exitCode > 0, qPrintable(result.output));
    QVERIFY2(result.output.contains(report), qPrintable(result.output));
    QVERIFY2(result.output.contains("screenshots: quick-actions (en): "_s),
             qPrintable(result.output));
}

void ScreenshotsTest::unwritableDirectoryIsReported()
{
    const Result result = takeScreenshots(source, "/nonexistent"_s);
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.output.contains("cannot save /nonexistent/start-"_s),
             qPrintable(result.output));
}

QTEST_GUILESS_MAIN(ScreenshotsTest)
#include "tst_screenshots.moc"
