# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# Options, language level and compiler flags that every target shares.

string(COMPARE EQUAL "${CMAKE_SOURCE_DIR}" "${PROJECT_SOURCE_DIR}" VEYFM_TOP_LEVEL)

option(VEYFM_BUILD_TESTS "Build the tests" ${VEYFM_TOP_LEVEL})
option(VEYFM_BUILD_TOOLS "Build the command-line tool" ${VEYFM_TOP_LEVEL})
option(VEYFM_BUILD_BENCHMARKS "Build the benchmarks" ${VEYFM_TOP_LEVEL})
option(VEYFM_BUILD_FUZZERS "Build the fuzz targets with Clang's libFuzzer, and no other test" OFF)
option(VEYFM_INSTALL_CURLFTPFS_RCLONE "Install a curlftpfs that does its work with rclone" OFF)
option(VEYFM_SYSTEM_PLATFORM "Link the system's veycore and veysu instead of the stand-ins" OFF)
option(VEYFM_PRECOMPILE "Precompile what tests, and where it is sanitized the library, include" OFF)
option(VEYFM_WERROR "Treat compiler warnings as errors" OFF)
set(VEYFM_SANITIZE "" CACHE STRING "Sanitizers: empty, 'address,undefined' or 'thread'")
set_property(CACHE VEYFM_SANITIZE PROPERTY STRINGS "" "address,undefined" "thread")

if(VEYFM_TOP_LEVEL AND NOT CMAKE_BUILD_TYPE AND NOT CMAKE_CONFIGURATION_TYPES)
    set(CMAKE_BUILD_TYPE RelWithDebInfo CACHE STRING "Type of build" FORCE)
endif()

if(CMAKE_CXX_COMPILER_LAUNCHER MATCHES ccache)
    # It keeps nothing that was compiled with precompiled headers.
    set(VEYFM_PRECOMPILE OFF)
endif()

set(CMAKE_CXX_STANDARD 17)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_AUTOMOC ON)
if(VEYFM_TOP_LEVEL AND NOT CMAKE_INSTALL_RPATH AND NOT CMAKE_INSTALL_PREFIX MATCHES "^/usr/?$")
    # Installed programs find the library of their own tree, also where the linker would not look.
    file(RELATIVE_PATH VEYFM_BIN_TO_LIB
        ${CMAKE_INSTALL_FULL_BINDIR} ${CMAKE_INSTALL_FULL_LIBDIR}
    )
    set(CMAKE_INSTALL_RPATH $ORIGIN/${VEYFM_BIN_TO_LIB})
    set(VEYFM_LIB_RPATH $ORIGIN) # A library that needs another of ours.
endif()
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)

add_compile_options(-Wall -Wextra -Wpedantic)
add_compile_definitions(
    QT_NO_CAST_FROM_ASCII
    QT_NO_CAST_TO_ASCII
    QT_NO_URL_CAST_FROM_STRING
    QT_NO_FOREACH
    QT_DEPRECATED_WARNINGS
)
if(VEYFM_WERROR)
    add_compile_options(-Werror)
endif()
if(VEYFM_SANITIZE)
    # Whole stacks, since findings are named, and suppressed, by their functions.
    add_compile_options(
        -fsanitize=${VEYFM_SANITIZE} -fno-omit-frame-pointer -fno-optimize-sibling-calls
    )
    add_link_options(-fsanitize=${VEYFM_SANITIZE})
    if(CMAKE_CXX_COMPILER_ID STREQUAL GNU)
        # The checks that are built in lead these warnings astray.
        add_compile_options(-Wno-maybe-uninitialized -Wno-stringop-overread)
    endif()
    if(VEYFM_SANITIZE MATCHES undefined)
        add_compile_options(-fno-sanitize-recover=undefined)
    endif()
endif()
if(VEYFM_BUILD_FUZZERS)
    add_compile_options(-fsanitize=fuzzer-no-link)
    add_link_options(-fsanitize=fuzzer-no-link)
endif()
