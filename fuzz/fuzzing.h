// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FUZZING_H
#define FUZZING_H

#include <QByteArray>
#include <QString>

#include <cstddef>
#include <cstdint>

/*
    Shared by the fuzz targets. Each target is this one function: it splits an input, passes it to the
    code under test, and ends the process when a condition does not hold. A fuzzer calls it with
    generated inputs, replay.cpp with the committed ones.
*/
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size);

namespace Fuzzing {

// Ends the process with a message unless the condition holds.
void require(bool holds, const char *what);

// Writes a file in the throw-away home directory with one call, and returns its path.
QString writeFile(const char *name, const QByteArray &content);

} // namespace Fuzzing

/*
    Splits an input from the front. At the end it returns zeros and empty texts.
*/
class Bytes
{
public:
    Bytes(const std::uint8_t *data, std::size_t size)
        : m_rest(reinterpret_cast<const char *>(data), int(size))
    {
    }

    bool atEnd() const { return m_rest.isEmpty(); }
    std::uint8_t takeByte();
    // Up to the separator, which is skipped, or to the end.
    QByteArray takeUntil(char separator);
    QByteArray rest() const { return m_rest; }

private:
    QByteArray m_rest;
};

#endif
