// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#include <locationsettings.h>

#include <cstring>

namespace {

constexpr char filler = 0x5a;

} // namespace

LocationSettings::LocationSettings(QObject *parent) : QObject(parent)
{
    std::memset(m_cache, filler, sizeof(m_cache));
}

LocationSettings::~LocationSettings()
{
    for (const char byte : m_cache) {
        if (byte != filler) {
            qFatal("the device's LocationSettings was overwritten");
        }
    }
}
