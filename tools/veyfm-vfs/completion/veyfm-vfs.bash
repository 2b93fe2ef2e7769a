# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later
#
# bash completion for veyfm-vfs. The program itself knows the candidates.

_veyfm_vfs()
{
    # "--color=never" comes in three words; the program wants it in one.
    local -a words=()
    local i word glued=
    for ((i = 1; i <= COMP_CWORD; i++)); do
        word=${COMP_WORDS[i]}
        # shellcheck disable=SC2162
        case $word in
            \"*) word=${word#\"} word=${word%\"} ;;
            \'*) word=${word#\'} word=${word%\'} ;;
            # Without -r, read takes the backslashes away.
            *\\*) IFS= read word <<<"$word" ;;
        esac
        if ((${#words[@]})) && [[ $word == = && ${words[-1]} == --* ]]; then
            words[-1]+='='
            glued=${words[-1]}
        elif [[ -n $glued && ${words[-1]} == "$glued" && ${COMP_WORDS[i - 1]} == = ]]; then
            words[-1]+=$word
        else
            words+=("$word")
        fi
    done

    local -a candidates=()
    mapfile -d '' -t candidates < <("${COMP_WORDS[0]}" complete -- "${words[@]}" 2>/dev/null)

    # bash replaces only what stands behind the "=".
    local strip=
    [[ ${words[-1]-} == --*=* ]] && strip=${words[-1]%%=*}=
    COMPREPLY=("${candidates[@]#"$strip"}")
    compopt -o filenames
    if ((${#COMPREPLY[@]} == 1)) && [[ ${COMPREPLY[0]} == */ || ${COMPREPLY[0]} == --*= ]]; then
        compopt -o nospace
    fi
    [[ ${words[-1]-} == -* ]] && compopt +o filenames
    return 0
}

complete -F _veyfm_vfs veyfm-vfs
