// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "dconftool.h"

#include "mgconfitem.h"
#include "patience.h"
#include "texts.h"

#include <QProcess>
#include <QTest>

QByteArray DconfTool::run(const QStringList &arguments, const QByteArray &input)
{
    QProcess tool;
    tool.start("dconf"_s, arguments);
    tool.write(input);
    tool.closeWriteChannel();
    if (!tool.waitForFinished(patience) || tool.exitCode() != 0) {
        qWarning("dconf failed: %s", tool.readAllStandardError().constData());
    }
    return tool.readAllStandardOutput().trimmed();
}

QByteArray DconfTool::read(const QString &key)
{
    return run({"read"_s, key});
}

void DconfTool::write(const QString &key, const QByteArray &value)
{
    run({"write"_s, key, QString::fromUtf8(value)});
}

void DconfTool::write(const QString &key, const QStringList &value)
{
    const QString elements = value.join("', '"_s);
    write(key, value.isEmpty() ? QByteArray("@as []") : "['" + elements.toUtf8() + "']");
}

void DconfTool::reset(const QString &path)
{
    run({"reset"_s, "-f"_s, path});
}

void DconfTool::waitUntilStored()
{
    static int count = 0;
    const QString key = "/test/stored"_s;
    MGConfItem(key).set(++count);
    const auto stored = [&key] { return read(key).toInt() == count; };
    if (!becomesTrue(stored)) {
        qFatal("what was set is not stored");
    }
}
