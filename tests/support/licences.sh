#!/usr/bin/env bash
# SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
# SPDX-License-Identifier: LGPL-2.1-or-later

# licences.sh <source tree> <work folder>
#
# Whether every file of the repository says who holds its copyright and under which licence. A
# copy of what git knows is examined, so that files which lie about don't matter.

set -euo pipefail

rm -rf "$2"
mkdir -p "$2"
git -C "$1" checkout-index --all --prefix="$(realpath "$2")/"
reuse --root "$2" lint
