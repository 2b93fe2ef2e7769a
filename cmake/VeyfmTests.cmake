# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# veyfm_add_test(<topic> [LABELS <label>...] [LIBRARIES <target>...] [SOURCES <file>...])
#
# Builds tst_<topic> from tst_<topic>.cpp and registers it with ctest. Each test gets a home,
# XDG folders and a session bus address of its own, so that tests may run side by side and a
# user's settings never reach them.
function(veyfm_add_test topic)
    cmake_parse_arguments(ARG "" "" "LABELS;LIBRARIES;SOURCES" ${ARGN})
    set(name tst_${topic})
    set(home ${CMAKE_CURRENT_BINARY_DIR}/home/${topic})
    add_executable(${name} ${name}.cpp ${ARG_SOURCES})
    target_link_libraries(${name} PRIVATE VeyFM::vfs Qt5::Test ${ARG_LIBRARIES})
    target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR}/tests)
    file(MAKE_DIRECTORY ${home}/run)
    file(CHMOD ${home}/run PERMISSIONS OWNER_READ OWNER_WRITE OWNER_EXECUTE)
    add_test(NAME ${topic} COMMAND ${name})
    set_tests_properties(${topic} PROPERTIES
        ENVIRONMENT "${VEYFM_TEST_ENVIRONMENT};HOME=${home};XDG_CONFIG_HOME=${home}/.config;XDG_DATA_HOME=${home}/.local/share;XDG_CACHE_HOME=${home}/.cache;XDG_RUNTIME_DIR=${home}/run;DBUS_SESSION_BUS_ADDRESS=unix:path=/nonexistent/bus;LC_ALL=C.UTF-8"
        TIMEOUT 120
        LABELS "${ARG_LABELS}"
    )
endfunction()
