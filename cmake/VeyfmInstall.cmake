# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# Installs the library and what others find it by: the CMake package and the pkg-config file.
# Public headers are installed where they are declared; see veyfm_public_classes().

include(CMakePackageConfigHelpers)

set(VEYFM_PACKAGE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/veyfmvfs)

install(TARGETS veyfmvfs
    EXPORT veyfmvfsTargets
    LIBRARY
        DESTINATION ${CMAKE_INSTALL_LIBDIR}
        COMPONENT Runtime
        NAMELINK_COMPONENT Development
)
install(FILES ${PROJECT_BINARY_DIR}/src/veyfmvfs_export.h
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/veyfmvfs
    COMPONENT Development
)

# find_package(veyfmvfs)
install(EXPORT veyfmvfsTargets
    NAMESPACE VeyFM::
    DESTINATION ${VEYFM_PACKAGE_DIR}
    COMPONENT Development
)
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

# pkg-config libveyfmvfs. Its prefix follows from where the file lies, so an installed tree may be
# moved; that takes directories that are relative to the prefix.
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
configure_file(${CMAKE_CURRENT_LIST_DIR}/libveyfmvfs.pc.in
    ${PROJECT_BINARY_DIR}/libveyfmvfs.pc @ONLY
)
install(FILES ${PROJECT_BINARY_DIR}/libveyfmvfs.pc
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig
    COMPONENT Development
)
