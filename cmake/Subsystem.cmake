# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause

# add_subsystem(<name> SOURCES <file>... LINK <target>...)
#
# Builds a directory of the module as a static library whose users inherit its dependencies. A
# static library resolves no symbols, and the plugin links all of them. An undeclared dependency
# would therefore go unnoticed. <name>-links links the same objects with the declared dependencies
# only, and fails to link if one is missing.
function(add_subsystem name)
    cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LINK")
    add_library(${name} STATIC ${arg_SOURCES})
    target_include_directories(${name} PUBLIC ${PROJECT_SOURCE_DIR})
    target_link_libraries(${name} PUBLIC ${arg_LINK})

    add_library(${name}-links MODULE $<TARGET_OBJECTS:${name}>)
    set_target_properties(${name}-links PROPERTIES AUTOMOC OFF)
    target_link_libraries(${name}-links PRIVATE ${arg_LINK})
    target_link_options(${name}-links PRIVATE LINKER:-z,defs)
endfunction()
