// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "descendants.h"

#include "host/pidfd.h"

#include <QByteArray>
#include <QDir>
#include <QFile>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <set>

#include <signal.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>

namespace VeyFM {
namespace Mount {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::seconds askingTime(2);
constexpr std::chrono::seconds killingTime(1);
constexpr long pauseNanoseconds = 10'000'000;

QByteArray contents(const QString& path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

/// The children of all threads of a process.
std::vector<pid_t> childrenOf(pid_t pid)
{
    std::vector<pid_t> children;
    const QString tasks = QStringLiteral("/proc/%1/task/").arg(pid);
    const QStringList names = QDir(tasks).entryList(QDir::Dirs | QDir::NoDotAndDotDot);
    for (const QString& name : names) {
        const QList<QByteArray> numbers =
            contents(tasks + name + QStringLiteral("/children")).simplified().split(' ');
        for (const QByteArray& number : numbers) {
            const pid_t child = number.toInt();
            if (child > 0) {
                children.push_back(child);
            }
        }
    }
    return children;
}

/// The fields behind the name, which may hold anything: the state, the parent and so on.
QList<QByteArray> statFields(pid_t pid)
{
    const QByteArray line = contents(QStringLiteral("/proc/%1/stat").arg(pid));
    return line.mid(line.lastIndexOf(')') + 2).split(' ');
}

bool hasEnded(pid_t pid)
{
    const QByteArray state = statFields(pid).constFirst();
    return state.isEmpty() || state == "Z" || state == "X";
}

bool isUnmounting(pid_t pid)
{
    return contents(QStringLiteral("/proc/%1/comm").arg(pid)).startsWith("fusermount");
}

void waitForChange()
{
    sigset_t child;
    ::sigemptyset(&child);
    ::sigaddset(&child, SIGCHLD);
    const timespec pause = {0, pauseNanoseconds};
    ::sigtimedwait(&child, nullptr, &pause);
}

} // namespace

Descendants::Descendants()
{
    m_inherited = childrenOf(::getpid());
    for (size_t i = 0; i < m_inherited.size(); ++i) {
        const std::vector<pid_t> children = childrenOf(m_inherited[i]);
        m_inherited.insert(m_inherited.end(), children.begin(), children.end());
    }
    ::prctl(PR_SET_CHILD_SUBREAPER, 1);
}

/// Without those that have ended, whose children are another's.
std::vector<Descendants::Process> Descendants::running(pid_t spared) const
{
    std::vector<Process> all;
    const auto addChildrenOf = [&](pid_t parent) {
        for (const pid_t child : childrenOf(parent)) {
            const bool isInherited =
                std::find(m_inherited.begin(), m_inherited.end(), child) != m_inherited.end();
            if (!isInherited && !hasEnded(child)) {
                all.push_back({child, parent});
            }
        }
    };
    addChildrenOf(::getpid());
    for (size_t i = 0; i < all.size(); ++i) {
        addChildrenOf(all[i].pid);
    }
    const auto isSpared = [spared](const Process& process) {
        return process.pid == spared;
    };
    all.erase(std::remove_if(all.begin(), all.end(), isSpared), all.end());
    return all;
}

/// What lost its parent behind one look shows in the next.
bool Descendants::hasNone(pid_t spared) const
{
    if (spared != 0 || !m_inherited.empty()) {
        return running(spared).empty();
    }
    siginfo_t child;
    return ::waitid(P_ALL, 0, &child, WEXITED | WNOHANG | WNOWAIT) != 0 && errno == ECHILD;
}

void Descendants::end(pid_t spared)
{
    const Clock::time_point begin = Clock::now();
    std::set<pid_t> asked;
    std::set<pid_t> helpers;
    while (true) {
        if (spared == 0) {
            reap(0);
        }
        const std::vector<Process> all = running(spared);
        const auto time = Clock::now() - begin;
        if (time > askingTime + killingTime || (all.empty() && hasNone(spared))) {
            return;
        }
        std::set<pid_t> askedNow;
        for (const Process& process : all) {
            const bool isSeen = asked.count(process.pid) + helpers.count(process.pid) > 0;
            if (time > askingTime) {
                signal(process, SIGKILL);
            } else if (!isSeen && (asked.count(process.parent) > 0 || isUnmounting(process.pid))) {
                helpers.insert(process.pid);
            } else if (!isSeen && signal(process, SIGTERM)) {
                askedNow.insert(process.pid);
            }
        }
        asked.insert(askedNow.begin(), askedNow.end());
        waitForChange();
    }
}

/// False where it is not there any more. Another that gets the number meanwhile has another parent,
/// or is ours as well.
bool Descendants::signal(const Process& process, int number)
{
    const int handle = Host::openPidfd(process.pid);
    const bool isSame = handle >= 0 && statFields(process.pid).value(1).toInt() == process.parent;
    if (isSame) {
        Host::sendSignal(handle, number);
        Host::sendSignal(handle, SIGCONT); // One that is stopped would not see it.
    }
    if (handle >= 0) {
        ::close(handle);
    }
    return isSame;
}

bool Descendants::reap(pid_t child)
{
    bool isFound = false;
    pid_t pid = 0;
    while ((pid = ::waitpid(-1, nullptr, WNOHANG)) > 0) {
        isFound = isFound || pid == child;
    }
    return isFound;
}

} // namespace Mount
} // namespace VeyFM
