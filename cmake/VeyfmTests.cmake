# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# What the sanitizers are told in every test. Each ends a test at its first finding.
set(VEYFM_TEST_ENVIRONMENT)
set(support ${PROJECT_SOURCE_DIR}/tests/support)
if(VEYFM_SANITIZE MATCHES address)
    set(asan_options detect_stack_use_after_return=1:strict_string_checks=1)
    list(APPEND VEYFM_TEST_ENVIRONMENT
        "ASAN_OPTIONS=${asan_options}"
        "LSAN_OPTIONS=suppressions=${support}/lsan.supp:print_suppressions=0"
    )
endif()
if(VEYFM_SANITIZE MATCHES undefined)
    list(APPEND VEYFM_TEST_ENVIRONMENT "UBSAN_OPTIONS=print_stacktrace=1")
endif()
if(VEYFM_SANITIZE MATCHES thread)
    # Qt and GLib are not instrumented: their locks stay unseen, and memory that they hand from
    # the thread of the bus to ours would look like a race in every test that has a VFS.
    list(APPEND VEYFM_TEST_ENVIRONMENT
        "TSAN_OPTIONS=suppressions=${support}/tsan.supp:ignore_noninstrumented_modules=1:halt_on_error=1:second_deadlock_stack=1"
    )
endif()

# Most of a build are tests, and what a test does itself need not be fast. Every test has the same
# options, or it could not use the headers that were precompiled with them.
function(veyfm_test_options target)
    target_compile_options(${target} PRIVATE -U_FORTIFY_SOURCE -O0)
    if(VEYFM_TEST_LINKER)
        target_link_options(${target} PRIVATE -fuse-ld=${VEYFM_TEST_LINKER})
    endif()
endfunction()

# Any linker will do for a test, so it is one that takes a quarter of the usual one's time, if
# there is one.
set(VEYFM_TEST_LINKER)
foreach(linker IN ITEMS gold lld)
    find_program(VEYFM_LINKER_${linker} ld.${linker})
    mark_as_advanced(VEYFM_LINKER_${linker})
    if(VEYFM_LINKER_${linker} AND NOT VEYFM_TEST_LINKER)
        set(VEYFM_TEST_LINKER ${linker})
    endif()
endforeach()

# veyfm_test_moc(<target> <source>...)
#
# Runs moc on the target's first source, which includes the result, <name>.moc, and on each header
# of the others. AUTOMOC would do it too, but takes ten times as long for so little.
function(veyfm_test_moc target source)
    set_target_properties(${target} PROPERTIES AUTOMOC OFF)
    set(folder ${CMAKE_CURRENT_BINARY_DIR}/moc/${target})
    file(MAKE_DIRECTORY ${folder})
    target_include_directories(${target} PRIVATE ${folder})
    get_filename_component(stem ${source} NAME_WE)
    qt5_generate_moc(${source} ${folder}/${stem}.moc TARGET ${target})
    target_sources(${target} PRIVATE ${folder}/${stem}.moc)
    foreach(header IN LISTS ARGN)
        get_filename_component(stem ${header} NAME_WE)
        if(header MATCHES "\\.h$")
            qt5_generate_moc(${header} ${folder}/moc_${stem}.cpp TARGET ${target})
            target_sources(${target} PRIVATE ${folder}/moc_${stem}.cpp)
        endif()
    endforeach()
endfunction()

# veyfm_add_test(<topic> [CANCELS_LISTINGS] [LABELS <label>...] [LIBRARIES <target>...]
#     [SOURCES <file>...])
#
# Builds tst_<topic> from tst_<topic>.cpp, which includes tst_<topic>.moc, and from what is named as
# a source: other files, and headers with a Q_OBJECT. Registers it with ctest. Each test gets a home,
# XDG folders and a session bus address of its own, so that tests may run side by side and a
# user's settings never reach them. A test that uses threads has the label "threads": the thread
# sanitizer builds and runs only those. One that takes its time has the label "slow", and begins
# before the others, so that the round does not end with nothing else to do.
#
# A cancelled listing leaks its directory stream, which is meant. The leak checker passes over it,
# but only where it unwinds slowly: the quick way ends at the first frame of libc, and who opened
# the stream is not seen.
function(veyfm_add_test topic)
    cmake_parse_arguments(ARG "CANCELS_LISTINGS" "" "LABELS;LIBRARIES;SOURCES" ${ARGN})
    if(VEYFM_SANITIZE MATCHES thread AND NOT "threads" IN_LIST ARG_LABELS)
        return()
    endif()
    set(name tst_${topic})
    set(home ${CMAKE_CURRENT_BINARY_DIR}/home/${topic})
    add_executable(${name} ${name}.cpp ${ARG_SOURCES})
    target_link_libraries(${name} PRIVATE VeyFM::vfs Qt5::Test ${ARG_LIBRARIES})
    target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR}/tests)
    veyfm_test_options(${name})
    veyfm_test_moc(${name} ${name}.cpp ${ARG_SOURCES})
    if(VEYFM_PRECOMPILE)
        target_precompile_headers(${name} REUSE_FROM veyfmtestheaders)
    endif()
    file(MAKE_DIRECTORY ${home}/run)
    file(CHMOD ${home}/run PERMISSIONS OWNER_READ OWNER_WRITE OWNER_EXECUTE)
    add_test(NAME ${topic} COMMAND ${name})
    set(environment
        ${VEYFM_TEST_ENVIRONMENT}
        HOME=${home}
        XDG_CONFIG_HOME=${home}/.config
        XDG_DATA_HOME=${home}/.local/share
        XDG_CACHE_HOME=${home}/.cache
        XDG_RUNTIME_DIR=${home}/run
        DBUS_SESSION_BUS_ADDRESS=unix:path=/nonexistent/bus
        LC_ALL=C.UTF-8
    )
    if(ARG_CANCELS_LISTINGS AND VEYFM_SANITIZE MATCHES address)
        list(APPEND environment "ASAN_OPTIONS=${asan_options}:fast_unwind_on_malloc=0")
    endif()
    set_tests_properties(${topic} PROPERTIES
        ENVIRONMENT "${environment}"
        TIMEOUT 120
        LABELS "${ARG_LABELS}"
    )
    if("slow" IN_LIST ARG_LABELS)
        set_tests_properties(${topic} PROPERTIES COST 30)
    endif()
endfunction()
