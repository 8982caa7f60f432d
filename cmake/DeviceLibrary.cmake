# SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
# SPDX-License-Identifier: BSD-3-Clause

# use_device_library(<class> <variable> [<property>...])
#
# Makes the pkg-config package that a cache variable names available as Platform::<class>, and checks
# that its header declares what the module needs. check<class>.cpp has a static assertion for each
# member. moc finds the properties, which the compiler does not see.
#
# A device's header may use what this project switches off in Qt: its keywords, implicit conversions
# of text, and deprecated functions. On the compiler's command line, options come after definitions,
# so -U undoes them.
function(use_device_library class variable)
    set(package ${${variable}})
    pkg_check_modules(${class} QUIET IMPORTED_TARGET GLOBAL ${package})
    if(NOT ${class}_FOUND)
        message(FATAL_ERROR "${variable}: pkg-config finds no package \"${package}\", or not all that it requires; "
            "PKG_CONFIG_PATH names further directories to search")
    endif()
    target_compile_options(PkgConfig::${class} INTERFACE
        -UQT_NO_KEYWORDS -UQT_NO_CAST_FROM_ASCII -UQT_NO_CAST_TO_ASCII
        -UQT_DISABLE_DEPRECATED_BEFORE)
    add_library(Platform::${class} ALIAS PkgConfig::${class})

    string(TOLOWER ${class} name)
    set(CMAKE_TRY_COMPILE_TARGET_TYPE STATIC_LIBRARY)
    try_compile(compiles ${CMAKE_CURRENT_BINARY_DIR}/check${name}
        SOURCES ${CMAKE_CURRENT_SOURCE_DIR}/check${name}.cpp
        LINK_LIBRARIES PkgConfig::${class} Qt::Core
        CXX_STANDARD 17 CXX_STANDARD_REQUIRED ON
        OUTPUT_VARIABLE output)
    set(missing)
    if(NOT compiles)
        string(REGEX MATCHALL "[^\n\"]* lacks [^\n\"]*" found "${output}")
        foreach(text IN LISTS found)
            string(REGEX REPLACE ".*: " "" text "${text}")
            list(APPEND missing ${text})
        endforeach()
        if(NOT missing)
            message(FATAL_ERROR "${variable}: the header of ${package} does not compile\n${output}")
        endif()
    endif()
    find_missing_properties(missing ${class} ${ARGN})
    if(missing)
        list(REMOVE_DUPLICATES missing)
        list(JOIN missing "\n  " missing)
        message(FATAL_ERROR "${variable}: the package ${package} cannot be used:\n  ${missing}")
    endif()
endfunction()

# Appends what moc does not find: writable properties of these names whose change signals are named
# after them. A class that inherits another than QObject may have them from there.
function(find_missing_properties variable class)
    string(TOLOWER ${class} name)
    find_file(header ${name}.h PATHS ${${class}_INCLUDE_DIRS} NO_DEFAULT_PATH NO_CACHE)
    if(NOT ARGN OR NOT header)
        return()
    endif()
    get_target_property(moc Qt::moc IMPORTED_LOCATION)
    set(output ${CMAKE_CURRENT_BINARY_DIR}/moc_${name}.cpp)
    list(TRANSFORM ${class}_INCLUDE_DIRS PREPEND -I OUTPUT_VARIABLE includes)
    file(WRITE ${output}.json "{}")
    execute_process(COMMAND ${moc} --output-json ${includes} -o ${output} ${header} COMMAND_ERROR_IS_FATAL ANY)
    file(READ ${output}.json json)

    set(found)
    string(JSON count ERROR_VARIABLE none LENGTH ${json} classes)
    set(i 0)
    while(i LESS count)
        string(JSON className GET ${json} classes ${i} className)
        if(className STREQUAL class)
            string(JSON base GET ${json} classes ${i} superClasses 0 name)
            if(NOT base STREQUAL QObject)
                return()
            endif()
            string(JSON properties ERROR_VARIABLE none LENGTH ${json} classes ${i} properties)
            set(j 0)
            while(j LESS properties)
                foreach(key IN ITEMS name notify write)
                    string(JSON ${key} ERROR_VARIABLE none GET ${json} classes ${i} properties ${j} ${key})
                endforeach()
                if(notify STREQUAL "${name}Changed" AND NOT write MATCHES NOTFOUND)
                    list(APPEND found ${name})
                endif()
                math(EXPR j "${j} + 1")
            endwhile()
        endif()
        math(EXPR i "${i} + 1")
    endwhile()
    foreach(property IN LISTS ARGN)
        if(NOT property IN_LIST found)
            list(APPEND ${variable}
                "${class} lacks a writable property ${property} with the signal ${property}Changed()")
        endif()
    endforeach()
    set(${variable} ${${variable}} PARENT_SCOPE)
endfunction()
