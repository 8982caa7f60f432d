// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FORMATTERTEST_H
#define FORMATTERTEST_H

#include "loggedtest.h"
#include "memorycard/memorycardformatter.h"
#include "patience.h"

#include <QByteArrayList>
#include <QMetaEnum>

#include <memory>

/*
    A test with a formatter, whose signals it records as words: the key of a status, "busy" or
    "not busy", "name N", "path P", "type T", "mount K" or "unmount K" with the key of an error.
*/
class FormatterTest : public LoggedTest
{
    Q_OBJECT

protected:
    using Formatter = MemoryCardFormatter;

    // The signals of operations that succeed. The first one says that the request was accepted.
    static constexpr char mounted[] = "not busy, Mounting, busy, Idle, not busy";
    static constexpr char unmounted[] = "not busy, Unmounting, busy, Idle, not busy";

    void makeFormatter();
    // Sets the card, waits until it has been probed, and forgets the signals so far.
    void setCard(const QString &name, const QString &path);

    // The signals in their order, with the values of the properties at that time.
    QByteArray events() const { return m_events.join(", "); }
    // Forgets the signals so far, before the next request to the formatter.
    Formatter *forgetEvents();

    QByteArray takeLog() { return m_log->takeReport().toUtf8(); }
    static QByteArray warning(const QByteArray &text);
    // What is logged when the files of the card cannot be removed.
    static QByteArray notEmptied(const QByteArray &path, const QByteArray &reason);
    // What is logged when a helper that was started for the partition with "probe" or another
    // command has ended badly.
    static QByteArray helperEnded(const QByteArray &command, const QByteArray &partition,
                                  const QByteArray &end);
    // What the formatter logs when the disk service replies with its own error of this name.
    static QByteArray diskServiceError(const QByteArray &method, const QByteArray &name);

    template<typename Enum> static QByteArray key(Enum value)
    {
        return QMetaEnum::fromType<Enum>().valueToKey(value);
    }

    std::unique_ptr<Formatter> m_formatter;

private:
    QByteArrayList m_events;
};

#define TRY_EVENTS(expected) TRY_COMPARE(events(), QByteArray(expected))

#endif
