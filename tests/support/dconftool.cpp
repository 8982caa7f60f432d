// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"

#include "mgconfitem.h"
#include "patience.h"

#include <QProcess>
#include <QTest>

QByteArray DconfTool::run(const QStringList &arguments, const QByteArray &input)
{
    QProcess tool;
    tool.start(QStringLiteral("dconf"), arguments);
    tool.write(input);
    tool.closeWriteChannel();
    if (!tool.waitForFinished(patience) || tool.exitCode() != 0) {
        qWarning("dconf failed: %s", tool.readAllStandardError().constData());
    }
    return tool.readAllStandardOutput().trimmed();
}

QByteArray DconfTool::read(const QString &key)
{
    return run({QStringLiteral("read"), key});
}

void DconfTool::write(const QString &key, const QByteArray &value)
{
    run({QStringLiteral("write"), key, QString::fromUtf8(value)});
}

void DconfTool::write(const QString &key, const QStringList &value)
{
    const QString elements = value.join(QStringLiteral("', '"));
    write(key, value.isEmpty() ? QByteArray("@as []") : "['" + elements.toUtf8() + "']");
}

void DconfTool::reset(const QString &path)
{
    run({QStringLiteral("reset"), QStringLiteral("-f"), path});
}

void DconfTool::waitUntilStored()
{
    static int count = 0;
    const QString key = QStringLiteral("/test/stored");
    MGConfItem(key).set(++count);
    const auto stored = [&key] { return read(key).toInt() == count; };
    if (!QTest::qWaitFor(stored, patience)) {
        qFatal("what was set is not stored");
    }
}
