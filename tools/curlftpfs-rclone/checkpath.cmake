# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# Stops the installation where PATH leads to another curlftpfs: nobody needs the adapter there.

string(REPLACE ":" ";" folders "$ENV{PATH}")
foreach(folder IN LISTS folders)
    set(program "${folder}/curlftpfs")
    if(EXISTS "${program}" AND NOT IS_DIRECTORY "${program}")
        file(STRINGS "${program}" mark LIMIT_COUNT 1 REGEX "This is curlftpfs-rclone")
        if(NOT mark)
            message(FATAL_ERROR
                "There is a curlftpfs already: ${program}. The one that does its work with rclone "
                "is only for systems without it. Configure with "
                "-DVEYFM_INSTALL_CURLFTPFS_RCLONE=OFF."
            )
        endif()
    endif()
endforeach()
