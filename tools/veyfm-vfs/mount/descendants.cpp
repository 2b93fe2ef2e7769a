// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/descendants.h"

#include "host/pidfd.h"

#include <QByteArray>
#include <QDir>
#include <QFile>

#include <algorithm>
#include <cerrno>
#include <vector>

#include <signal.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

using Host::openPidfd;
using Host::sendSignal;

namespace {

constexpr std::chrono::seconds patience(1);

struct Process
{
    pid_t pid = 0;
    pid_t parent = 0;
    QByteArray begin; ///< When it began. Another that gets the number later began later.

    bool operator==(const Process& other) const
    {
        return pid == other.pid && begin == other.begin;
    }
};

// Written before there is a second thread.
std::vector<Process> inherited;

/// All processes that run.
std::vector<Process> runningProcesses()
{
    std::vector<Process> all;
    const QStringList names = QDir(QStringLiteral("/proc")).entryList(QDir::Dirs);
    for (const QString& name : names) {
        bool isNumber = false;
        const pid_t pid = name.toInt(&isNumber);
        QFile file(QStringLiteral("/proc/%1/stat").arg(name));
        if (!isNumber || !file.open(QIODevice::ReadOnly)) {
            continue;
        }
        // "PID (NAME) STATE PPID ... BEGIN ...", where the name may hold anything.
        const QByteArray line = file.readAll();
        const QList<QByteArray> fields = line.mid(line.lastIndexOf(')') + 2).split(' ');
        if (fields.size() > 19 && fields.at(0) != "Z" && fields.at(0) != "X") {
            all.push_back({pid, pid_t(fields.at(1).toInt()), fields.at(19)});
        }
    }
    return all;
}

/// Below this process, parents first.
std::vector<Process> runningDescendants()
{
    const std::vector<Process> all = runningProcesses();
    std::vector<Process> found;
    const auto addChildrenOf = [&](pid_t parent) {
        for (const Process& process : all) {
            const bool isOurs =
                std::find(inherited.begin(), inherited.end(), process) == inherited.end();
            if (process.parent == parent && isOurs) {
                found.push_back(process);
            }
        }
    };
    addChildrenOf(::getpid());
    for (size_t i = 0; i < found.size(); ++i) {
        addChildrenOf(found[i].pid);
    }
    return found;
}

} // namespace

void leaveInheritedChildren()
{
    siginfo_t child;
    const bool hasNone =
        ::waitid(P_ALL, 0, &child, WEXITED | WNOHANG | WNOWAIT) != 0 && errno == ECHILD;
    if (hasNone) {
        return;
    }
    for (const Process& process : runningProcesses()) {
        if (process.parent == ::getpid()) {
            inherited.push_back(process);
        }
    }
}

bool hasRunningDescendants()
{
    return !runningDescendants().empty();
}

long usageOfEndedChildren()
{
    rusage usage = {};
    ::getrusage(RUSAGE_CHILDREN, &usage);
    return usage.ru_minflt; // There is no process without page faults.
}

Descendants::~Descendants()
{
    for (const auto& [pid, seen] : m_seen) {
        ::close(seen.handle);
    }
}

void Descendants::add(pid_t pid, bool isHelper)
{
    const int handle = openPidfd(pid);
    if (handle >= 0) {
        m_seen.insert({pid, {handle, isHelper, Clock::time_point()}});
    }
}

bool Descendants::wasAsked(pid_t pid) const
{
    const auto seen = m_seen.find(pid);
    return seen != m_seen.end() && seen->second.asked != Clock::time_point();
}

void Descendants::end()
{
    for (const Process& process : runningDescendants()) {
        if (m_seen.count(process.pid) == 0) {
            add(process.pid, wasAsked(process.parent));
        }
    }
    // What is below us behind the opening, too, is what was opened.
    const std::vector<Process> behind = runningDescendants();
    const Clock::time_point now = Clock::now();
    for (auto it = m_seen.begin(); it != m_seen.end();) {
        Seen& seen = it->second;
        const bool isNew = seen.asked == Clock::time_point();
        bool isThere = true;
        if (isNew) {
            const auto isSame = [pid = it->first](const Process& other) {
                return other.pid == pid;
            };
            isThere = std::any_of(behind.begin(), behind.end(), isSame) &&
                      sendSignal(seen.handle, seen.isHelper ? 0 : SIGTERM);
            seen.asked = now;
        } else if (now - seen.asked >= patience) {
            isThere = sendSignal(seen.handle, SIGKILL);
        } else {
            isThere = sendSignal(seen.handle, 0);
        }
        if (isThere) {
            ++it;
        } else {
            ::close(seen.handle);
            it = m_seen.erase(it);
        }
    }
}

} // namespace Tool
} // namespace VeyFM
