// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "restart.h"

#include <cstdlib>
#include <vector>

#include <signal.h>
#include <sys/prctl.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

constexpr char variable[] = "VEYFM_VFS_WITHOUT_SERVICE";
char assignment[] = "VEYFM_VFS_WITHOUT_SERVICE=1";

bool isSecond = false;
std::vector<char*> arguments;
sigset_t signalMask = {};

} // namespace

void Restart::prepare(char* argv[])
{
    isSecond = ::getenv(variable) != nullptr;
    if (isSecond) {
        // No concern of the tools, and the kernel calls the program by the link below.
        ::unsetenv(variable);
        ::prctl(PR_SET_NAME, "veyfm-vfs");
    }
    for (char** argument = argv; *argument; ++argument) {
        arguments.push_back(*argument);
    }
    arguments.push_back(nullptr);
    ::pthread_sigmask(SIG_SETMASK, nullptr, &signalMask);
}

void Restart::withoutService()
{
    std::vector<char*> environment;
    for (char** entry = ::environ; *entry; ++entry) {
        environment.push_back(*entry);
    }
    environment.push_back(assignment);
    environment.push_back(nullptr);
    sigset_t before;
    ::pthread_sigmask(SIG_SETMASK, &signalMask, &before);
    ::execve("/proc/self/exe", arguments.data(), environment.data());
    ::pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

bool Restart::wasDone()
{
    return isSecond;
}

} // namespace Tool
} // namespace VeyFM
