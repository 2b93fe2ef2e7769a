#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# curlftpfsinstall.sh <source tree> <work folder>
#
# Whether the curlftpfs of tools/curlftpfs-rclone is installed on request alone, and never where
# there is another one. Exits with 77 where the system has a real one.

set -euo pipefail

source=$1 work=$2

fail() {
    echo "FAIL: $*" >&2
    exit 1
}

# install_adapter <on or off> <prefix>, with what it says in $work/log
install_adapter() {
    cmake -S "$source" -B "$work/build" -DVEYFM_INSTALL_CURLFTPFS_RCLONE="$1" \
        -DVEYFM_BUILD_TESTS=OFF -DVEYFM_BUILD_BENCHMARKS=OFF >"$work/log" 2>&1 || return
    cmake --install "$work/build" --component curlftpfs-rclone --prefix "$2" >"$work/log" 2>&1
}

if command -v curlftpfs >/dev/null; then
    echo "there is a curlftpfs: $(command -v curlftpfs)"
    exit 77
fi
rm -rf "$work"
mkdir -p "$work/other"

# By default it is not, and it does nothing for the tools.
cmake -S "$source" -B "$work/build" -DVEYFM_BUILD_TESTS=OFF -DVEYFM_BUILD_BENCHMARKS=OFF \
    >"$work/log" 2>&1 || fail "no build tree: see $work/log"
grep -q '^VEYFM_INSTALL_CURLFTPFS_RCLONE:BOOL=OFF' "$work/build/CMakeCache.txt" ||
    fail "it is installed by default"
install_adapter OFF "$work/off" || fail "installing nothing failed: see $work/log"
[[ ! -e $work/off ]] || fail "installed without being asked for: $(find "$work/off")"

install_adapter ON "$work/on" || fail "it can't be installed: see $work/log"
installed=$(cd "$work/on" && find . -type f | sort)
[[ $installed == $'./bin/curlftpfs\n./share/man/man1/curlftpfs-rclone.1' ]] ||
    fail "something else was installed: $installed"
"$work/on/bin/curlftpfs" --version >/dev/null || fail "the installed one does not run"

# It is no obstacle for itself.
PATH=$work/on/bin:$PATH install_adapter ON "$work/again" || fail "it can't be installed again"

printf '#!/bin/false\n' >"$work/other/curlftpfs"
chmod +x "$work/other/curlftpfs"
if PATH=$work/other:$PATH install_adapter ON "$work/second"; then
    fail "it was installed beside another curlftpfs"
fi
grep -qF "$work/other/curlftpfs" "$work/log" ||
    fail "it was not installed for another reason: see $work/log"
[[ ! -e $work/second ]] || fail "installed in spite of another one: $(find "$work/second")"
