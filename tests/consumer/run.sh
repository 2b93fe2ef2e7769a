#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# run.sh <source tree> <build tree> <work folder>
#
# Installs the build tree and builds the consumer against what was installed, once by
# find_package and once by pkg-config. The tree is moved after the install, since neither road
# may lean on the place it was configured for.

set -euo pipefail

source=$1 build=$2 work=$3
CXX=${CXX:-c++}

fail() {
    echo "FAIL: $*" >&2
    exit 1
}

rm -rf "$work"
mkdir -p "$work"
cmake --install "$build" --prefix "$work/first" >"$work/install.log"
mv "$work/first" "$work/prefix"
prefix=$work/prefix

for name in libveyfmvfs libveyfmvfs-host; do
    library=$(find "$prefix" -name "$name.so")
    [[ -n $library ]] || fail "no $name.so was installed"
    libdir=$(dirname "$library")
    soname=$(objdump -p "$library" | awk '$1 == "SONAME" { print $2 }')
    [[ $soname =~ ^$name\.so\.[0-9]+$ ]] || fail "the soname '$soname' has no version"
    [[ -L $library && -L $libdir/$soname ]] || fail "$library and $soname are not links"
    [[ $(realpath "$library") == "$(realpath "$libdir/$soname")" ]] ||
        fail "$library and $soname are not the same library"
done

if ! grep -q '^VEYFM_INSTALL_CURLFTPFS_RCLONE:BOOL=ON' "$build/CMakeCache.txt"; then
    [[ ! -e $prefix/bin/curlftpfs ]] || fail "a curlftpfs was installed without being asked for"
fi

# A program of the installed tree finds the library of that tree.
if grep -q '^VEYFM_BUILD_TOOLS:BOOL=ON' "$build/CMakeCache.txt"; then
    "$prefix/bin/veyfm-vfs" --version >"$work/version" ||
        fail "the installed veyfm-vfs does not run"
fi

include=$prefix/include/veyfmvfs
# Every header whose symbols are exported is installed, and nothing that is private is.
exported=$(cd "$source/src" && grep -rl --include='*.h' --exclude='*_p.h' -E 'VEYFMVFS(HOST)?_EXPORT' . | sort)
installed=$(cd "$include" && find . -mindepth 2 -name '*.h' | sort)
missing=$(comm -23 <(echo "$exported") <(echo "$installed"))
[[ -z $missing ]] || fail "exported, but not declared by veyfm_public_classes: $missing"
if find "$include" -name '*_p.h' -o -path '*/platform/*' | grep .; then
    fail "private headers were installed"
fi

# Each forwarding header stands by itself, and for the class of its name.
export PKG_CONFIG_PATH=$libdir/pkgconfig
read -ra cflags < <(pkg-config --cflags libveyfmvfs)
read -ra libs < <(pkg-config --libs libveyfmvfs)
read -ra hostcflags < <(pkg-config --cflags libveyfmvfs-host)
read -ra hostlibs < <(pkg-config --libs libveyfmvfs-host)
[[ ${cflags[*]} == *"-I$prefix/"* ]] || fail "pkg-config names another tree: ${cflags[*]}"
mkdir "$work/headers"
for header in "$include"/VeyFM/*; do
    class=$(basename "$header")
    echo "#include <VeyFM/$class>" >"$work/headers/$class.cpp"
    target=$(sed -n 's/^#include "\(.*\)".*/\1/p' "$header")
    grep -Eq "\b(class|struct|namespace|using|typedef)\b.*\b$class\b" "$include/$target" ||
        fail "<VeyFM/$class> leads to $target, which does not declare it"
done
printf '%s\0' "$work"/headers/*.cpp |
    xargs -0 -n 1 -P "$(nproc)" "$CXX" -std=c++17 -Wall -Wextra -Wpedantic -Werror \
        "${cflags[@]}" -fsyntax-only || fail "a forwarding header can't be included by itself"

export HOME=$work/home XDG_CONFIG_HOME=$work/home/.config XDG_DATA_HOME=$work/home/.local/share
mkdir -p "$HOME"

"$CXX" -std=c++17 "${cflags[@]}" "$source/tests/consumer/main.cpp" "${libs[@]}" \
    -o "$work/by-pkg-config"
LD_LIBRARY_PATH=$libdir "$work/by-pkg-config" || fail "the consumer by pkg-config failed"

# The second library finds the first, and its program, in the tree that it lies in.
check_host() {
    LD_LIBRARY_PATH=$2 "$1" >"$work/host.out" || fail "the host by $3 failed: $(<"$work/host.out")"
    if grep -q '^VEYFM_BUILD_TOOLS:BOOL=ON' "$build/CMakeCache.txt"; then
        [[ $(sed -n 1p "$work/host.out") == "$prefix"/* ]] ||
            fail "the host by $3 found another program: $(<"$work/host.out")"
        [[ -x $(sed -n 1p "$work/host.out") ]] || fail "no program: $(<"$work/host.out")"
        [[ $(sed -n 2p "$work/host.out") != "Can't start"* ]] ||
            fail "the program does not run: $(<"$work/host.out")"
    fi
}
"$CXX" -std=c++17 "${hostcflags[@]}" "$source/tests/consumer/host/main.cpp" "${hostlibs[@]}" \
    -o "$work/host-by-pkg-config" || fail "the host does not build by pkg-config"
check_host "$work/host-by-pkg-config" "$libdir" pkg-config

cmake -S "$source/tests/consumer" -B "$work/cmake" -DCMAKE_CXX_COMPILER="$CXX" \
    -DCMAKE_PREFIX_PATH="$prefix" >"$work/configure.log" || fail "find_package: see $work"
grep -q "veyfmvfs_DIR:PATH=$prefix/" "$work/cmake/CMakeCache.txt" ||
    fail "find_package found another libveyfmvfs than $prefix"
cmake --build "$work/cmake" >"$work/build.log" || fail "the build by find_package failed: see $work"
"$work/cmake/consumer" || fail "the consumer by find_package failed"

cmake -S "$source/tests/consumer/host" -B "$work/host" -DCMAKE_CXX_COMPILER="$CXX" \
    -DCMAKE_PREFIX_PATH="$prefix" >"$work/host.log" || fail "find_package of the host: see $work"
cmake --build "$work/host" >>"$work/host.log" || fail "the host by find_package: see $work"
check_host "$work/host/host-consumer" "" find_package
# Asked for by nobody, and unknown.
mkdir "$work/unknown"
sed 's/COMPONENTS host/COMPONENTS nothing/' "$source/tests/consumer/host/CMakeLists.txt" \
    >"$work/unknown/CMakeLists.txt"
if cmake -S "$work/unknown" -B "$work/unknown/build" -DCMAKE_CXX_COMPILER="$CXX" \
    -DCMAKE_PREFIX_PATH="$prefix" >"$work/unknown.log" 2>&1; then
    fail "find_package takes an unknown component"
fi

cmake -S "$source/examples/mount" -B "$work/example" -DCMAKE_CXX_COMPILER="$CXX" \
    -DCMAKE_PREFIX_PATH="$prefix" >"$work/example.log" || fail "the example: see $work/example.log"
cmake --build "$work/example" >>"$work/example.log" || fail "the example: see $work/example.log"
[[ $("$work/example/mount-example" 2>&1) == *usage* ]] || fail "the example does not run"

# In the 0.x series another minor version is another interface.
sed 's/find_package(veyfmvfs [0-9.]*/find_package(veyfmvfs 0.0/' \
    "$source/tests/consumer/CMakeLists.txt" >"$work/older.txt"
mkdir "$work/older"
mv "$work/older.txt" "$work/older/CMakeLists.txt"
if cmake -S "$work/older" -B "$work/older/build" -DCMAKE_CXX_COMPILER="$CXX" \
    -DCMAKE_PREFIX_PATH="$prefix" >"$work/older.log" 2>&1; then
    fail "find_package takes this version for 0.0"
fi
grep -q "not compatible\|not accepted\|compatible with requested" "$work/older.log" ||
    fail "find_package of 0.0 failed for another reason: see $work/older.log"
