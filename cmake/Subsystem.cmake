# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause

# add_subsystem(<name> SOURCES <file>... LINK <target>...)
#
# A folder of the module: a static library whose header folder and dependencies its users inherit.
# A static library resolves no symbols, so what a folder takes from another without declaring it
# would go unnoticed in the plugin, which links them all. <name>-links is the same objects linked
# with nothing but the declared dependencies: it fails there and then.
function(add_subsystem name)
    cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LINK")
    add_library(${name} STATIC ${arg_SOURCES})
    target_include_directories(${name} PUBLIC ${CMAKE_CURRENT_SOURCE_DIR})
    target_link_libraries(${name} PUBLIC ${arg_LINK})

    add_library(${name}-links MODULE $<TARGET_OBJECTS:${name}>)
    set_target_properties(${name}-links PROPERTIES AUTOMOC OFF)
    target_link_libraries(${name}-links PRIVATE ${arg_LINK})
    target_link_options(${name}-links PRIVATE LINKER:-z,defs)
endfunction()
