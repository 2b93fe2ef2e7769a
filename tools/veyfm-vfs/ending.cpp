// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "ending.h"

#include <atomic>
#include <cstdlib>

#include <signal.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

std::atomic<int> caughtSignal{0};
static_assert(std::atomic<int>::is_always_lock_free);

void dieOfCaughtSignal()
{
    const int number = caughtSignal;
    if (number == 0) {
        return;
    }
    ::signal(number, SIG_DFL);
    sigset_t set;
    ::sigemptyset(&set);
    ::sigaddset(&set, number);
    ::pthread_sigmask(SIG_UNBLOCK, &set, nullptr);
    ::raise(number);
}

} // namespace

void dieOfCaughtSignals()
{
    // What is registered first is done last.
    std::atexit(dieOfCaughtSignal);
}

void noteCaughtSignal(int number)
{
    int none = 0;
    caughtSignal.compare_exchange_strong(none, number);
}

void endAtOnce(int exitCode)
{
    dieOfCaughtSignal();
    ::_exit(exitCode);
}

} // namespace Tool
} // namespace VeyFM
