// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// One event from the kernel to the signal of EntryWatcher, beside a bare reader of inotify,
// QFileSystemWatcher and GFileMonitor.

#include "support/contest.h"
#include "support/gio.h"
#include "support/options.h"
#include "support/watchtree.h"

#include "vfs/vfs.h"
#include "watch/entrywatcher.h"

#include <QCoreApplication>
#include <QFileSystemWatcher>

#include <sys/inotify.h>
#include <unistd.h>

namespace Benchmarks {

namespace {

constexpr int eventsPerTurn = 200;

// The cost of a turn of single events, each waited for: what the whole process takes, without what
// it takes this thread to make the events. A monitor may work in a thread of its own, and begin
// before anybody waits.
template <typename MakeEvent, typename Wait>
double costOfTurn(MakeEvent makeEvent, Wait wait)
{
    double making = 0;
    const double start = cpuNow();
    for (int i = 0; i < eventsPerTurn; ++i) {
        const double before = threadCpuNow();
        makeEvent();
        making += threadCpuNow() - before;
        wait();
    }
    return cpuNow() - start - making;
}

template <typename Wait>
double costOfEvents(WatchTree& tree, Wait wait)
{
    const double clock = costOfTurn([] {}, [] {});
    return costOfTurn([&tree] { tree.makeEvent(); }, wait) - clock;
}

// Each watches a tree of its own, so that an event wakes nobody else.
class BareReader
{
public:
    explicit BareReader(int directories)
        : m_tree(directories)
        , m_fd(inotify_init1(IN_CLOEXEC))
    {
        for (int i = 0; i < m_tree.size(); ++i) {
            inotify_add_watch(m_fd, m_tree.path(i).constData(), IN_CREATE | IN_DELETE);
        }
    }

    ~BareReader()
    {
        close(m_fd);
    }

    double turn()
    {
        return costOfEvents(m_tree, [this] {
            alignas(inotify_event) char buffer[4096];
            const ssize_t size = read(m_fd, buffer, sizeof(buffer));
            for (ssize_t offset = 0; offset < size;) {
                const auto* event = reinterpret_cast<const inotify_event*>(buffer + offset);
                benchmark::DoNotOptimize(event->wd + event->mask);
                offset += ssize_t(sizeof(inotify_event) + event->len);
            }
        });
    }

private:
    WatchTree m_tree;
    const int m_fd;
};

void waitInQt(const bool& arrived)
{
    while (!arrived) {
        QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
    }
}

class OurWatcher
{
public:
    explicit OurWatcher(int directories)
        : m_tree(directories)
    {
        const auto arrived = [this] {
            m_arrived = true;
        };
        QObject::connect(&m_watcher, &VeyFM::EntryWatcher::entryCreated, arrived);
        QObject::connect(&m_watcher, &VeyFM::EntryWatcher::entryDeleted, arrived);
        for (const QString& path : m_tree.paths()) {
            m_watcher.addEntry(VeyFM::VFS::ptr()->entry(path));
        }
    }

    double turn()
    {
        return costOfEvents(m_tree, [this] {
            m_arrived = false;
            waitInQt(m_arrived);
        });
    }

private:
    WatchTree m_tree;
    VeyFM::EntryWatcher m_watcher;
    bool m_arrived = false;
};

class QtWatcher
{
public:
    explicit QtWatcher(int directories)
        : m_tree(directories)
        , m_watcher(m_tree.paths())
    {
        QObject::connect(
            &m_watcher, &QFileSystemWatcher::directoryChanged, [this] { m_arrived = true; });
    }

    double turn()
    {
        return costOfEvents(m_tree, [this] {
            m_arrived = false;
            waitInQt(m_arrived);
        });
    }

private:
    WatchTree m_tree;
    QFileSystemWatcher m_watcher;
    bool m_arrived = false;
};

#ifdef VEYFM_HAVE_GIO
class GioWatcher
{
public:
    explicit GioWatcher(int directories)
        : m_tree(directories)
        , m_context(g_main_context_new())
    {
        // Monitors report to the context of their thread. Not the one of Qt, whose sources
        // would have to be looked at for each event.
        g_main_context_push_thread_default(m_context);
        for (int i = 0; i < m_tree.size(); ++i) {
            m_monitors.push_back(gioMonitor(m_tree.path(i)));
            g_signal_connect(m_monitors.back().get(), "changed", G_CALLBACK(&changed), &m_arrived);
        }
        g_main_context_pop_thread_default(m_context);
    }

    ~GioWatcher()
    {
        m_monitors.clear();
        g_main_context_unref(m_context);
    }

    double turn()
    {
        return costOfEvents(m_tree, [this] {
            m_arrived = false;
            while (!m_arrived) {
                g_main_context_iteration(m_context, TRUE);
            }
        });
    }

private:
    static void changed(GFileMonitor*, GFile*, GFile*, GFileMonitorEvent event, gpointer arrived)
    {
        if (event == G_FILE_MONITOR_EVENT_CREATED || event == G_FILE_MONITOR_EVENT_DELETED) {
            *static_cast<bool*>(arrived) = true;
        }
    }

    WatchTree m_tree;
    GMainContext* const m_context;
    std::vector<GioObject<GFileMonitor>> m_monitors;
    bool m_arrived = false;
};
#endif

} // namespace

void registerRows(const Options& options)
{
    const int rounds = options.rounds(61);
    for (const int full : {10, 1000, 20000}) {
        const int directories = options.size(full);
        const std::string name = "event, " + std::to_string(full) + " directories";
        addRow(name, rounds, [=](benchmark::State& state) {
            OurWatcher ours(directories);
            BareReader bare(directories);
            Contest contest([&] { return ours.turn(); });
            contest.operations(eventsPerTurn);
            contest.floor("inotify", 4.3, [&] { return bare.turn(); }).run(state);
        });
        addRow(name + ", peers", rounds, [=](benchmark::State& state) {
            OurWatcher ours(directories);
            Contest contest([&] { return ours.turn(); });
            contest.operations(eventsPerTurn);
#ifdef VEYFM_HAVE_GIO
            GioWatcher gio(directories);
            contest.peer("GFileMonitor", full == 20000 ? 0.4 : 0.7, [&] { return gio.turn(); });
#endif
            QtWatcher qt(directories);
            contest.peer("QFileSystemWatcher", 1, [&] { return qt.turn(); });
            contest.run(state);
        });
    }
    addRow("event, growth from 10 to 20000", rounds, [=](benchmark::State& state) {
        OurWatcher ours(options.size(20000));
        OurWatcher few(10);
        Contest contest([&] { return ours.turn(); });
        contest.operations(eventsPerTurn);
        contest.floor("10 directories", 1.1, [&] { return few.turn(); }).run(state);
    });
}

} // namespace Benchmarks
