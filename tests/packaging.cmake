# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# Tests of what surrounds the code: installation, translations, licences, documents.

# Compiling the catalogues takes a tool that not everybody has.
if(TARGET translations)
    veyfm_add_test(translations)
    if(TARGET tst_translations)
        target_compile_definitions(tst_translations PRIVATE
            VEYFM_CATALOGUES="${PROJECT_BINARY_DIR}/translations"
            VEYFM_LUPDATE="${VEYFM_LUPDATE}"
            VEYFM_SOURCES="${PROJECT_SOURCE_DIR}/src"
            VEYFM_TRANSLATIONS="${PROJECT_SOURCE_DIR}/translations"
        )
    endif()
endif()

# The forwarding headers in the build tree; the installed ones follow.
add_executable(consumer_in_tree consumer/main.cpp)
target_link_libraries(consumer_in_tree PRIVATE VeyFM::vfs)
add_executable(host_in_tree consumer/host/main.cpp)
target_link_libraries(host_in_tree PRIVATE VeyFM::host)

# What looks at the tree and its packaging, not at running code, has nothing to gain from
# sanitizers.
if(NOT VEYFM_SANITIZE)
    add_test(NAME consumer
        COMMAND ${CMAKE_CURRENT_SOURCE_DIR}/consumer/run.sh
            ${PROJECT_SOURCE_DIR} ${PROJECT_BINARY_DIR} ${CMAKE_CURRENT_BINARY_DIR}/consumer
    )
    set_tests_properties(consumer PROPERTIES
        ENVIRONMENT "CXX=${CMAKE_CXX_COMPILER};CMAKE_GENERATOR=${CMAKE_GENERATOR}"
        TIMEOUT 600
        COST 30
    )

    add_test(NAME curlftpfsinstall
        COMMAND ${CMAKE_CURRENT_SOURCE_DIR}/support/curlftpfsinstall.sh
            ${PROJECT_SOURCE_DIR} ${CMAKE_CURRENT_BINARY_DIR}/curlftpfsinstall
    )
    set_tests_properties(curlftpfsinstall PROPERTIES
        ENVIRONMENT "CXX=${CMAKE_CXX_COMPILER};CMAKE_GENERATOR=${CMAKE_GENERATOR}"
        SKIP_RETURN_CODE 77
        TIMEOUT 300
    )

    find_package(Git QUIET)
    find_program(VEYFM_REUSE reuse)
    if(VEYFM_REUSE AND GIT_FOUND AND EXISTS ${PROJECT_SOURCE_DIR}/.git)
        add_test(NAME licences
            COMMAND ${CMAKE_CURRENT_SOURCE_DIR}/support/licences.sh
                ${PROJECT_SOURCE_DIR} ${CMAKE_CURRENT_BINARY_DIR}/licences
        )
    endif()

    find_package(Doxygen QUIET)
    if(DOXYGEN_FOUND AND VEYFM_TOP_LEVEL)
        add_test(NAME docs
            COMMAND ${CMAKE_COMMAND} --build ${PROJECT_BINARY_DIR} --target docs
        )
    endif()
endif()
