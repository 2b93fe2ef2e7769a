# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# Installs the libraries and what others find them by: the CMake package and the pkg-config file.
# Public headers are installed where they are declared; see veyfm_public_classes().

include(CMakePackageConfigHelpers)

set(VEYFM_PACKAGE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/veyfmvfs)

# veyfm_install_library(<target> <export header>): the library, its export header, and the targets
# file of the CMake package, which has one for each library.
function(veyfm_install_library target export_header)
    install(TARGETS ${target}
        EXPORT ${target}Targets
        LIBRARY
            DESTINATION ${CMAKE_INSTALL_LIBDIR}
            COMPONENT Runtime
            NAMELINK_COMPONENT Development
    )
    install(FILES ${export_header}
        DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/veyfmvfs
        COMPONENT Development
    )
    install(EXPORT ${target}Targets
        NAMESPACE VeyFM::
        DESTINATION ${VEYFM_PACKAGE_DIR}
        COMPONENT Development
    )
endfunction()

veyfm_install_library(veyfmvfs ${PROJECT_BINARY_DIR}/src/veyfmvfs_export.h)
veyfm_install_library(veyfmvfshost ${PROJECT_BINARY_DIR}/src/host/veyfmvfshost_export.h)

# find_package(veyfmvfs), with COMPONENTS host for the second library.
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/veyfmvfsConfig.cmake.in
    ${PROJECT_BINARY_DIR}/veyfmvfsConfig.cmake
    INSTALL_DESTINATION ${VEYFM_PACKAGE_DIR}
    NO_SET_AND_CHECK_MACRO
)
# As long as the major version is 0, each minor version may break what was built for another.
write_basic_package_version_file(${PROJECT_BINARY_DIR}/veyfmvfsConfigVersion.cmake
    COMPATIBILITY SameMinorVersion
)
install(
    FILES
        ${PROJECT_BINARY_DIR}/veyfmvfsConfig.cmake
        ${PROJECT_BINARY_DIR}/veyfmvfsConfigVersion.cmake
    DESTINATION ${VEYFM_PACKAGE_DIR}
    COMPONENT Development
)

# pkg-config libveyfmvfs and libveyfmvfs-host. The prefix follows from where the file lies, so an
# installed tree may be moved; that takes directories that are relative to the prefix.
set(VEYFM_PC_LIBDIR "\${prefix}/${CMAKE_INSTALL_LIBDIR}")
set(VEYFM_PC_INCLUDEDIR "\${prefix}/${CMAKE_INSTALL_INCLUDEDIR}")
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}" OR IS_ABSOLUTE "${CMAKE_INSTALL_INCLUDEDIR}")
    set(VEYFM_PC_PREFIX ${CMAKE_INSTALL_PREFIX})
    set(VEYFM_PC_LIBDIR ${CMAKE_INSTALL_FULL_LIBDIR})
    set(VEYFM_PC_INCLUDEDIR ${CMAKE_INSTALL_FULL_INCLUDEDIR})
else()
    file(RELATIVE_PATH up /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
    string(REGEX REPLACE "/$" "" up "${up}")
    set(VEYFM_PC_PREFIX "\${pcfiledir}/${up}")
endif()
foreach(name IN ITEMS libveyfmvfs libveyfmvfs-host)
    configure_file(${CMAKE_CURRENT_LIST_DIR}/${name}.pc.in ${PROJECT_BINARY_DIR}/${name}.pc @ONLY)
    install(FILES ${PROJECT_BINARY_DIR}/${name}.pc
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig
        COMPONENT Development
    )
endforeach()
