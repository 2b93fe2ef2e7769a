// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "ptylaunch.h"

#include <QFile>
#include <QStandardPaths>

#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <sys/ioctl.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <termios.h>
#include <vector>

namespace VeySu {

namespace {

QByteArray executablePath(const QByteArray& command)
{
    if (command.contains('/')) {
        return command;
    }
    return QFile::encodeName(QStandardPaths::findExecutable(QFile::decodeName(command)));
}

bool openTerminal(UniqueFd& master, UniqueFd& slave)
{
    master = UniqueFd(posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC));
    char name[64];
    if (!master.isValid() || grantpt(master.get()) != 0 || unlockpt(master.get()) != 0 ||
        ptsname_r(master.get(), name, sizeof name) != 0) {
        return false;
    }
    slave = UniqueFd(open(name, O_RDWR | O_NOCTTY | O_CLOEXEC));
    termios mode;
    if (!slave.isValid() || tcgetattr(slave.get(), &mode) != 0) {
        return false;
    }
    // Questions are recognised and shown as the tool wrote them, without \r before each \n.
    mode.c_oflag &= ~tcflag_t(OPOST);
    return tcsetattr(slave.get(), TCSANOW, &mode) == 0;
}

// From here to the exec only what is safe in a signal handler: another thread of the host may have
// held any lock when the process was forked.
void resetSignals()
{
    struct sigaction action = {};
    action.sa_handler = SIG_DFL;
    // Two numbers belong to the C library, which refuses them.
    for (int number = 1; number < NSIG; ++number) {
        sigaction(number, &action, nullptr);
    }

    // At the end of a session leader the kernel sends SIGHUP to its helpers, also when the leader
    // ended only to go on in the background. They inherit this.
    action.sa_handler = SIG_IGN;
    sigaction(SIGHUP, &action, nullptr);

    sigset_t none;
    sigemptyset(&none);
    sigprocmask(SIG_SETMASK, &none, nullptr);
}

bool takeTerminal(int slave)
{
    if (setsid() < 0 || ioctl(slave, TIOCSCTTY, 0) != 0) {
        return false;
    }
    for (int fd = STDIN_FILENO; fd <= STDERR_FILENO; ++fd) {
        // A host without standard streams may get the terminal as one of them, and then dup2()
        // does not clear the flag.
        if (dup2(slave, fd) < 0 || fcntl(fd, F_SETFD, 0) != 0) {
            return false;
        }
    }
    return true;
}

/// What the child waits at until the parent has its handle. In a host that ignores SIGCHLD one that
/// has ended is gone at once, and its number may be another's.
struct Gate
{
    UniqueFd child;
    UniqueFd parent;

    bool make()
    {
        int ends[2];
        if (pipe2(ends, O_CLOEXEC) != 0) {
            return false;
        }
        child = UniqueFd(ends[0]);
        parent = UniqueFd(ends[1]);
        return true;
    }
    /// False when the parent has died.
    bool waitInChild() const
    {
        char byte = 0;
        close(parent.get());
        return read(child.get(), &byte, 1) == 1;
    }
    bool letPass() const
    {
        return write(parent.get(), "", 1) == 1;
    }
};

[[noreturn]] void becomeTool(const Gate& gate, int slave, const char* path, char* const* argv)
{
    resetSignals();
    if (gate.waitInChild() && takeTerminal(slave)) {
        closefrom(STDERR_FILENO + 1);
        execv(path, argv);
    }
    _exit(NotStartedStatus);
}

pid_t forkWithoutSignals()
{
    // A handler of the host must not run in the child.
    sigset_t all;
    sigset_t before;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    const pid_t pid = fork();
    if (pid != 0) {
        pthread_sigmask(SIG_SETMASK, &before, nullptr);
    }
    return pid;
}

} // namespace

PtyChild launchOnPty(const QByteArray& command, const QList<QByteArray>& args)
{
    const QByteArray path = executablePath(command);
    PtyChild child;
    UniqueFd slave;
    Gate gate;
    if (path.isEmpty() || !openTerminal(child.master, slave) || !gate.make()) {
        return {};
    }

    std::vector<char*> argv;
    argv.reserve(size_t(args.size()) + 2);
    argv.push_back(const_cast<char*>(command.constData()));
    for (const QByteArray& arg : args) {
        argv.push_back(const_cast<char*>(arg.constData()));
    }
    argv.push_back(nullptr);

    child.pid = forkWithoutSignals();
    if (child.pid == 0) {
        becomeTool(gate, slave.get(), path.constData(), argv.data());
    }
    if (child.pid < 0) {
        return {};
    }

    // By number: glibc 2.36 declares pidfd_open() without C linkage. The flag that closes it on
    // exec is always set.
    child.handle = UniqueFd(int(syscall(SYS_pidfd_open, child.pid, 0)));
    if (!child.handle.isValid() || !gate.letPass()) {
        kill(child.pid, SIGKILL);
        waitpid(child.pid, nullptr, 0);
        return {};
    }
    return child;
}

} // namespace VeySu
