// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef FUZZING_H
#define FUZZING_H

#include <QByteArray>
#include <QString>

#include <cstddef>
#include <cstdint>

/*
    What the fuzz targets share. Each of them is this one function, which takes an input apart,
    gives it to what it tests, and ends the process when something does not hold. A fuzzer calls it
    with inputs that it makes up, replay.cpp with those that are kept in files.
*/
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size);

namespace Fuzzing {

// Ends the process, with a line on what should have held, unless it does.
void require(bool holds, const char *what);

// Writes to a file below the throw-away home folder, in one go, and returns its path.
QString writeFile(const char *name, const QByteArray &content);

} // namespace Fuzzing

/*
    Takes an input apart from the front. At the end it gives zeros and empty texts.
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
    // Up to the separator, which is passed, or to the end.
    QByteArray takeUntil(char separator);
    QByteArray rest() const { return m_rest; }

private:
    QByteArray m_rest;
};

#endif
