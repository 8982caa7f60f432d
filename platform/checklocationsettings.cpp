// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

// Compiles if a device's LocationSettings has what the module needs. docs/devices.md lists the same
// members.
#include "requiremember.h"

#if __has_include(<locationsettings.h>)
#include <locationsettings.h>
#else
#error "the package lacks the header locationsettings.h"
#endif

#include <QObject>

template<typename Reference> using StateOf = typename Of<Reference>::OnlineAGpsState;

REQUIRE_MEMBER(LocationSettings, "the base class QObject", static_cast<QObject &>(object));
REQUIRE_MEMBER(LocationSettings, "the constructor LocationSettings(QObject *parent)",
               Of<decltype(object)>(static_cast<QObject *>(nullptr)));
REQUIRE_MEMBER(LocationSettings, "the enumeration OnlineAGpsState",
               static_cast<StateOf<decltype(object)>>(2));
REQUIRE_MEMBER(LocationSettings, "bool gpsEnabled() const", bool(object.gpsEnabled()));
REQUIRE_MEMBER(LocationSettings, "void setGpsEnabled(bool)", object.setGpsEnabled(true));
REQUIRE_MEMBER(LocationSettings, "the signal gpsEnabledChanged()",
               QObject::connect(&object, &Of<decltype(object)>::gpsEnabledChanged, &object,
                                &QObject::deleteLater));
REQUIRE_MEMBER(LocationSettings, "bool mlsEnabled() const", bool(object.mlsEnabled()));
REQUIRE_MEMBER(LocationSettings, "void setMlsEnabled(bool)", object.setMlsEnabled(true));
REQUIRE_MEMBER(LocationSettings, "the signal mlsEnabledChanged()",
               QObject::connect(&object, &Of<decltype(object)>::mlsEnabledChanged, &object,
                                &QObject::deleteLater));
REQUIRE_MEMBER(LocationSettings, "OnlineAGpsState mlsOnlineState() const",
               StateOf<decltype(object)>(object.mlsOnlineState()));
REQUIRE_MEMBER(LocationSettings, "void setMlsOnlineState(OnlineAGpsState)",
               object.setMlsOnlineState(StateOf<decltype(object)>()));
REQUIRE_MEMBER(LocationSettings, "the signal mlsOnlineStateChanged()",
               QObject::connect(&object, &Of<decltype(object)>::mlsOnlineStateChanged, &object,
                                &QObject::deleteLater));
REQUIRE_MEMBER(LocationSettings, "OnlineAGpsState hereState() const",
               StateOf<decltype(object)>(object.hereState()));
REQUIRE_MEMBER(LocationSettings, "void setHereState(OnlineAGpsState)",
               object.setHereState(StateOf<decltype(object)>()));
REQUIRE_MEMBER(LocationSettings, "the signal hereStateChanged()",
               QObject::connect(&object, &Of<decltype(object)>::hereStateChanged, &object,
                                &QObject::deleteLater));
