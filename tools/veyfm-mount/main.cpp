// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "descendants.h"
#include "supervisor.h"
#include "worker.h"

#include <cstdio>
#include <cstring>

#include <fcntl.h>
#include <signal.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/signalfd.h>
#include <sys/socket.h>
#include <sys/syscall.h>
#include <unistd.h>

using namespace VeyFM::Mount;

namespace {

constexpr char usage[] =
    "Usage: veyfm-mount\n"
    "Mounts a network resource for a program that talks with it on standard input and output.\n"
    "See veyfm-mount(1). To mount something by hand: veyfm-vfs mount URL\n";

/// Neither this process nor its tools leave a core file with a password, and no other process of
/// the user looks into this one.
void keepSecrets()
{
    const rlimit none = {0, 0};
    ::setrlimit(RLIMIT_CORE, &none);
    ::prctl(PR_SET_DUMPABLE, 0);
}

/// What the program was started with is none of the tools' business, which may live for days.
void closeInheritedOnExec()
{
    constexpr unsigned closeOnExec = 1U << 2; // CLOSE_RANGE_CLOEXEC
    ::syscall(SYS_close_range, unsigned(STDERR_FILENO + 1), ~0U, closeOnExec);
}

/// Opens standard streams that are closed, or something else would get their numbers.
void openStandardStreams()
{
    int descriptor = 0;
    while (descriptor >= 0 && descriptor <= STDERR_FILENO) {
        descriptor = ::open("/dev/null", O_RDWR | O_CLOEXEC);
    }
    ::close(descriptor);
}

sigset_t supervisedSignals()
{
    sigset_t set;
    ::sigemptyset(&set);
    for (const int number : {SIGTERM, SIGINT, SIGHUP, SIGCHLD}) {
        ::sigaddset(&set, number);
    }
    return set;
}

void resetSignals()
{
    for (const int number : {SIGTERM, SIGINT, SIGHUP, SIGCHLD, SIGPIPE}) {
        ::signal(number, SIG_DFL);
    }
    sigset_t none;
    ::sigemptyset(&none);
    ::sigprocmask(SIG_SETMASK, &none, nullptr);
}

[[noreturn]] void becomeWorker(int socket, pid_t supervisor, int& argc, char** argv)
{
    resetSignals();
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (::getppid() != supervisor) {
        ::_exit(1);
    }
    // Without a terminal: a tool would ask on it, and not the job. (This fails where the process
    // group has one by now; then there is none.)
    ::setsid();
    // A tool that lives on must not keep the pipes of the host open.
    const int null = ::open("/dev/null", O_RDWR | O_CLOEXEC);
    ::dup2(null, STDIN_FILENO);
    ::dup2(null, STDOUT_FILENO);
    ::close(null);
    runWorker(socket, argc, argv);
}

} // namespace

int main(int argc, char* argv[])
{
    if (argc == 2 && std::strcmp(argv[1], "--version") == 0) {
        std::puts("veyfm-mount " VEYFM_VERSION);
        return 0;
    }
    if (argc != 1) {
        const bool isHelp = argc == 2 && std::strcmp(argv[1], "--help") == 0;
        std::fputs(usage, isHelp ? stdout : stderr);
        return isHelp ? 0 : 2;
    }
    keepSecrets();
    closeInheritedOnExec();
    openStandardStreams();
    resetSignals();
    ::setpgid(0, 0);
    const sigset_t set = supervisedSignals();
    ::sigprocmask(SIG_SETMASK, &set, nullptr);
    ::signal(SIGPIPE, SIG_IGN);

    Descendants descendants;
    int ends[2];
    const int signals = ::signalfd(-1, &set, SFD_CLOEXEC | SFD_NONBLOCK);
    if (signals < 0 || ::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends) != 0) {
        std::perror("veyfm-mount");
        return 1;
    }
    const pid_t supervisor = ::getpid();
    const pid_t worker = ::fork();
    if (worker == 0) {
        ::close(ends[0]);
        ::close(signals);
        becomeWorker(ends[1], supervisor, argc, argv);
    }
    ::close(ends[1]);
    if (worker < 0) {
        std::perror("veyfm-mount");
        return 1;
    }
    return Supervisor(descendants, ends[0], worker, signals).run();
}
