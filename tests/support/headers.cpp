// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Headers are precompiled for a source of their target. This is it, and has nothing in it.
