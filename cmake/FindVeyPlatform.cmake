# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# Finds the system's platform libraries, libveycore and libveysu, and defines the targets
# VeyPlatform::veycore and VeyPlatform::veysu. Where they lie outside the usual folders, add their
# prefix to CMAKE_PREFIX_PATH.

include(FindPackageHandleStandardArgs)

set(VeyPlatform_REQUIRED_VARS)
foreach(name IN ITEMS veycore veysu)
    find_path(VeyPlatform_${name}_INCLUDE_DIR ${name}.h)
    find_library(VeyPlatform_${name}_LIBRARY ${name})
    mark_as_advanced(VeyPlatform_${name}_INCLUDE_DIR VeyPlatform_${name}_LIBRARY)
    list(APPEND VeyPlatform_REQUIRED_VARS
        VeyPlatform_${name}_LIBRARY VeyPlatform_${name}_INCLUDE_DIR
    )
endforeach()

find_package_handle_standard_args(VeyPlatform
    REQUIRED_VARS ${VeyPlatform_REQUIRED_VARS}
    REASON_FAILURE_MESSAGE
        "VEYFM_SYSTEM_PLATFORM=ON needs libveycore with veycore.h and libveysu with veysu.h. Add \
their prefix to CMAKE_PREFIX_PATH, or switch the option off to build the stand-ins"
)

if(VeyPlatform_FOUND)
    foreach(name IN ITEMS veycore veysu)
        if(NOT TARGET VeyPlatform::${name})
            # Global, since the library that links them is defined in another folder.
            add_library(VeyPlatform::${name} UNKNOWN IMPORTED GLOBAL)
            set_target_properties(VeyPlatform::${name} PROPERTIES
                IMPORTED_LOCATION ${VeyPlatform_${name}_LIBRARY}
                INTERFACE_INCLUDE_DIRECTORIES ${VeyPlatform_${name}_INCLUDE_DIR}
            )
        endif()
    endforeach()
endif()
