// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include "formattertest.h"

void FormatterTest::makeFormatter()
{
    m_formatter = std::make_unique<Formatter>();
    m_events.clear();
    const Formatter *formatter = m_formatter.get();
    const auto record = [this, formatter](auto signal, auto describe) {
        connect(formatter, signal, formatter, [this, describe] { m_events.append(describe()); });
    };
    record(&Formatter::statusChanged, [formatter] {
        const auto status = formatter->status();
        const bool isBusy = status != Formatter::Idle && status != Formatter::Error;
        return key(status) + (formatter->busy() == isBusy ? "" : " with the wrong busy");
    });
    record(&Formatter::busyChanged,
           [formatter] { return QByteArray(formatter->busy() ? "busy" : "not busy"); });
    record(&Formatter::deviceNameChanged,
           [formatter] { return "name " + formatter->deviceName().toUtf8(); });
    record(&Formatter::devicePathChanged,
           [formatter] { return "path " + formatter->devicePath().toUtf8(); });
    record(&Formatter::filesystemTypeChanged,
           [formatter] { return "type " + formatter->filesystemType().toUtf8(); });
    connect(formatter, &Formatter::mountError, formatter,
            [this](Formatter::MountError error) { m_events.append("mount " + key(error)); });
    connect(formatter, &Formatter::unmountError, formatter,
            [this](Formatter::MountError error) { m_events.append("unmount " + key(error)); });
}

void FormatterTest::setCard(const QString &name, const QString &path)
{
    m_formatter->setDeviceName(name);
    m_formatter->setDevicePath(path);
    TRY_COMPARE(m_formatter->status(), Formatter::Idle);
    m_events.clear();
}

FormatterTest::Formatter *FormatterTest::forgetEvents()
{
    m_events.clear();
    return m_formatter.get();
}

QByteArray FormatterTest::warning(const QByteArray &text)
{
    return "warning [org.tarnwickos.settings.memorycard] " + text;
}

QByteArray FormatterTest::notEmptied(const QByteArray &path, const QByteArray &reason)
{
    return "warning [com.marlo.settings.system.memorycard] Cannot empty \"" + path + "\" " + reason;
}

QByteArray FormatterTest::helperEnded(const QByteArray &command, const QByteArray &partition,
                                      const QByteArray &end)
{
    return "warning [com.marlo.settings.system.memorycard] \"/usr/libexec/sdcardhelper\" (\""
        + command + "\", \"" + partition + "\") " + end;
}

QByteArray FormatterTest::diskServiceError(const QByteArray &method, const QByteArray &name)
{
    return warning('"' + method + "\" error: org.freedesktop.UDisks2.Error." + name);
}
