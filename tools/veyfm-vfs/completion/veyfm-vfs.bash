# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later
#
# bash completion for veyfm-vfs. The program itself reads the line, and quotes what goes into it.

_veyfm_vfs()
{
    local -a reply=()
    mapfile -d '' -t reply < <(
        COMP_LINE=${COMP_LINE:0:COMP_POINT} COMP_WORDBREAKS=$COMP_WORDBREAKS COMP_TYPE=$COMP_TYPE \
            "${1/#\~\//$HOME/}" complete --shell=bash 2>/dev/null
    )
    COMPREPLY=("${reply[@]:1}")
    if [[ ${reply[0]-} != space ]]; then
        compopt -o nospace
    fi
    return 0
}

complete -F _veyfm_vfs veyfm-vfs
