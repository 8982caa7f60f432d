// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef RULES_H
#define RULES_H

#include "files/literals.h"

// The kinds of findings. marlo-definitions(1) explains each.
namespace Rule {

inline constexpr auto argumentType = "argument-type"_L1;
inline constexpr auto arguments = "arguments"_L1;
inline constexpr auto blank = "blank"_L1;
inline constexpr auto call = "call"_L1;
inline constexpr auto catalog = "catalog"_L1;
inline constexpr auto comma = "comma"_L1;
inline constexpr auto duplicatePath = "duplicate-path"_L1;
inline constexpr auto encoding = "encoding"_L1;
inline constexpr auto fileName = "file-name"_L1;
inline constexpr auto json = "json"_L1;
inline constexpr auto missingFile = "missing-file"_L1;
inline constexpr auto noKey = "no-key"_L1;
inline constexpr auto noWidget = "no-widget"_L1;
inline constexpr auto order = "order"_L1;
inline constexpr auto package = "package"_L1;
inline constexpr auto path = "path"_L1;
inline constexpr auto permissions = "permissions"_L1;
inline constexpr auto place = "place"_L1;
inline constexpr auto priority = "priority"_L1;
inline constexpr auto relativePath = "relative-path"_L1;
inline constexpr auto remoteUrl = "remote-url"_L1;
inline constexpr auto repeatedKey = "repeated-key"_L1;
inline constexpr auto scheme = "scheme"_L1;
inline constexpr auto semicolon = "semicolon"_L1;
inline constexpr auto systemService = "system-service"_L1;
inline constexpr auto textId = "text-id"_L1;
inline constexpr auto title = "title"_L1;
inline constexpr auto tooMany = "too-many"_L1;
inline constexpr auto translation = "translation"_L1;
inline constexpr auto type = "type"_L1;
inline constexpr auto unknownKey = "unknown-key"_L1;
inline constexpr auto unreadable = "unreadable"_L1;
inline constexpr auto widget = "widget"_L1;

} // namespace Rule

#endif
