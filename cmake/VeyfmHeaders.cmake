# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# veyfm_public_classes(<folder> <Class>... [HEADER <file>])
#
# Declares the public classes of a folder of src/. A class lives in the header of its name in
# lower case, or in HEADER. Each header is installed below include/veyfmvfs/<folder>, handed to
# Doxygen, and gets a forwarding header <VeyFM/Class> for each of its classes, in the build tree
# as well as installed. A header of no declared class is private.
#
# The headers are collected in the global property VEYFM_PUBLIC_HEADERS, as paths below src/.
function(veyfm_public_classes folder)
    cmake_parse_arguments(ARG "" "HEADER" "" ${ARGN})
    set(installdir ${CMAKE_INSTALL_INCLUDEDIR}/veyfmvfs)
    foreach(class IN LISTS ARG_UNPARSED_ARGUMENTS)
        set(header ${ARG_HEADER})
        if(NOT header)
            string(TOLOWER ${class}.h header)
        endif()
        set(header ${folder}/${header})
        if(NOT EXISTS ${PROJECT_SOURCE_DIR}/src/${header})
            message(FATAL_ERROR "There is no src/${header} for the public class ${class}")
        endif()
        set_property(GLOBAL APPEND PROPERTY VEYFM_PUBLIC_HEADERS ${header})
        install(FILES ${PROJECT_SOURCE_DIR}/src/${header}
            DESTINATION ${installdir}/${folder}
            COMPONENT Development
        )

        set(forward ${PROJECT_BINARY_DIR}/include/VeyFM/${class})
        configure_file(${PROJECT_SOURCE_DIR}/cmake/ForwardingHeader.in ${forward} @ONLY)
        install(FILES ${forward} DESTINATION ${installdir}/VeyFM COMPONENT Development)
    endforeach()
endfunction()
