// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// The input is a settings file. The target compares the check with QSettings, which it protects.

#include "files/inifile.h"
#include "fuzzing.h"

#include <QFile>
#include <QSettings>
#include <QVariant>

#include <algorithm>

namespace {

// Any other type in a file would mean that QSettings unpacked a value.
bool isPlain(const QVariant &value)
{
    switch (value.userType()) {
    case QMetaType::QVariantList: {
        const QVariantList list = value.toList();
        return std::all_of(list.cbegin(), list.cend(), isPlain);
    }
    case QMetaType::UnknownType:
    case QMetaType::QString:
    case QMetaType::QStringList:
    case QMetaType::QByteArray:
    case QMetaType::QRect:
    case QMetaType::QSize:
    case QMetaType::QPoint:
        return true;
    default:
        return false;
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    // Uses a new name each time, because QSettings caches what it has read of a file.
    static int number = 0;
    ++number;
    const QString path =
        Fuzzing::writeFile((QByteArray::number(number) + ".ini").constData(),
                           QByteArray(reinterpret_cast<const char *>(data), int(size)));
    const IniFault fault = findIniFault(path);
    const QSettings settings(path, QSettings::IniFormat);
    const bool isBroken = settings.status() == QSettings::FormatError;
    QFile::remove(path);
    if (fault == IniFault::PackedValue) {
        return 0;
    }
    Fuzzing::require(isBroken == (fault == IniFault::UnclosedSection), "broken files are known");
    const QStringList keys = settings.allKeys();
    for (const QString &key : keys) {
        Fuzzing::require(isPlain(settings.value(key)), "QSettings unpacks nothing");
    }
    return 0;
}
