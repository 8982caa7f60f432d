// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FORMATTEREVENTS_H
#define FORMATTEREVENTS_H

#include "memorycard/memorycardformatter.h"

#include <QByteArrayList>
#include <QMetaEnum>

/*
    The signals of a formatter as one line, in the order in which they are emitted, with the value of
    the property at that time: the key of a status, "busy" or "not busy", "name N", "path P", "type T",
    "mount K" or "unmount K" with the key of an error.
*/
class FormatterEvents
{
public:
    explicit FormatterEvents(MemoryCardFormatter *formatter)
    {
        using Formatter = MemoryCardFormatter;
        const auto note = [this, formatter](auto signal, auto describe) {
            QObject::connect(formatter, signal, formatter,
                             [this, describe] { m_events.append(describe()); });
        };
        note(&Formatter::statusChanged, [formatter] { return key(formatter->status()); });
        note(&Formatter::busyChanged,
             [formatter] { return QByteArray(formatter->busy() ? "busy" : "not busy"); });
        note(&Formatter::deviceNameChanged,
             [formatter] { return "name " + formatter->deviceName().toUtf8(); });
        note(&Formatter::devicePathChanged,
             [formatter] { return "path " + formatter->devicePath().toUtf8(); });
        note(&Formatter::filesystemTypeChanged,
             [formatter] { return "type " + formatter->filesystemType().toUtf8(); });
        QObject::connect(
            formatter, &Formatter::mountError, formatter,
            [this](Formatter::MountError error) { m_events.append("mount " + key(error)); });
        QObject::connect(
            formatter, &Formatter::unmountError, formatter,
            [this](Formatter::MountError error) { m_events.append("unmount " + key(error)); });
    }

    QByteArray line() const { return m_events.join(", "); }
    void clear() { m_events.clear(); }

    template<typename Enum> static QByteArray key(Enum value)
    {
        return QMetaEnum::fromType<Enum>().valueToKey(value);
    }

private:
    QByteArrayList m_events;
};

#endif
