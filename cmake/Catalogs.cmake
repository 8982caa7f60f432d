# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause

# The lrelease of Qt 6 compiles the same catalogs, and on Debian it does not require Qt Designer and
# WebKit.
find_program(LRELEASE lrelease HINTS ${QT_BINARY_DIR} /usr/lib/qt6/bin REQUIRED)

# compile_catalogs(<variable> <file.ts>...)
#
# Compiles catalogs of text identifiers and sets the variable to the list of the compiled files.
function(compile_catalogs variable)
    set(catalogs)
    foreach(source IN LISTS ARGN)
        cmake_path(GET source STEM LAST_ONLY name)
        set(catalog ${CMAKE_CURRENT_BINARY_DIR}/${name}.qm)
        add_custom_command(OUTPUT ${catalog}
            COMMAND ${LRELEASE} -idbased -silent ${source} -qm ${catalog}
            DEPENDS ${source} VERBATIM)
        list(APPEND catalogs ${catalog})
    endforeach()
    set(${variable} ${catalogs} PARENT_SCOPE)
endfunction()
