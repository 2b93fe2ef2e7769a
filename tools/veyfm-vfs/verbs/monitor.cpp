// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "interrupt.h"
#include "locate.h"
#include "report.h"
#include "service.h"
#include "shown.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "watch/entrywatcher.h"

#include <QCoreApplication>
#include <QSet>
#include <QSocketNotifier>

#include <cerrno>
#include <signal.h>
#include <sys/epoll.h>
#include <sys/inotify.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

/// The name in front of any child's own name; empty for what has no children.
QString childPrefix(const Entry& entry)
{
    const QString name = QStringLiteral("x");
    const Entry child = VFS::ptr()->child(entry, name);
    if (!child.isNull()) {
        return child.path().chopped(name.size());
    }
    return entry.isPlace() ? entry.path() + QLatin1Char('/') : QString();
}

/// Why the kernel would not watch the entry. The library does not tell, so it is tried out.
QString whyUnwatchable(const Entry& entry)
{
    const QString local = entry.localPath();
    if (local.isEmpty()) {
        return entry.isPlace() ? QString() : QStringLiteral("nothing on the disk to watch");
    }
    if (!VFS::ptr()->entryWatcher()->isRefreshable(local)) {
        return QStringLiteral("what lies below /proc, /dev, /sys and /var is never watched");
    }
    const int descriptor = ::inotify_init1(IN_CLOEXEC);
    int error = descriptor < 0 ? errno : 0;
    if (error == 0 &&
        ::inotify_add_watch(
            descriptor, local.toLocal8Bit().constData(), IN_CLOSE_WRITE | IN_DONT_FOLLOW) < 0) {
        error = errno;
    }
    if (descriptor >= 0) {
        ::close(descriptor);
    }
    if (error == ENOSPC) {
        return QStringLiteral("no more watches: see /proc/sys/fs/inotify/max_user_watches");
    }
    if (error == EMFILE) {
        return QStringLiteral("no more watchers: see /proc/sys/fs/inotify/max_user_instances");
    }
    return error == 0 ? QString() : systemReason(error);
}

/// Has a descriptor that can be read from as soon as the other side of an open one has gone, and
/// not because of what comes from there. Of a file it never can.
class HangUp
{
public:
    explicit HangUp(int watched)
        : m_descriptor(::epoll_create1(EPOLL_CLOEXEC))
    {
        epoll_event nothingElse = {};
        ::epoll_ctl(m_descriptor, EPOLL_CTL_ADD, watched, &nothingElse);
    }
    ~HangUp()
    {
        ::close(m_descriptor);
    }

    int descriptor() const
    {
        return m_descriptor;
    }

private:
    Q_DISABLE_COPY(HangUp)

    const int m_descriptor;
};

/// Whether all news of what is below the place come from the service.
bool livesFromService(const Entry& entry)
{
    return entry.isFavouritesPlace() || entry.isStorageDevicesPlace() || entry.isNetworkPlace() ||
           entry.isFtpNetworkPlace() || entry.isSFtpNetworkPlace() || entry.isSambaNetworkPlace() ||
           entry.isSambaWorkgroupPlace() || entry.isSambaServerPlace();
}

/// Why the service sends no news, or empty. The tree was made and has given it time to start.
QString whyNoNews()
{
    const ServiceState state = serviceState();
    const QString why = whyNoService(state);
    return why.isEmpty() && !state.running ? startService(probeMilliseconds) : why;
}

/**
 * Prints the news of the watched entries.
 *
 * The watcher tells of a place's directory twice, under the path of the place and under that of
 * the directory, and of the directory that holds a watched link. Only what bears the name of an
 * operand, or of a child of one, was asked for.
 */
class Monitor
{
public:
    explicit Monitor(Invocation& invocation)
        : m_invocation(invocation)
    {
        const EntryWatcher* watcher = VFS::ptr()->entryWatcher();
        const auto print = [this, watcher](void (EntryWatcher::*signal)(Entry), const char* event) {
            QObject::connect(watcher, signal, watcher, [this, event](const Entry& entry) {
                printEvent(QLatin1String(event), entry);
            });
        };
        print(&EntryWatcher::entryCreated, "created");
        print(&EntryWatcher::entryDeleted, "deleted");
        print(&EntryWatcher::entryChanged, "changed");
        print(&EntryWatcher::entryAttributesChanged, "attributes");
        print(&EntryWatcher::entryReset, "reset");
        followPlaces();
    }

    void add(Entry entry)
    {
        // Another notation of a plain path has children under that path, and so has it here.
        if (!entry.isPlace() && entry.isPlaceBased() &&
            childPrefix(entry).startsWith(QLatin1Char('/'))) {
            entry = VFS::ptr()->entry(entry.localPath());
        }
        // The news of devices and of the Samba network come to those only who have looked.
        if (opensOnFirstLook(entry)) {
            VFS::ptr()->childs(entry);
        }
        if (entry.isNetworkPlace() || entry.isFtpNetworkPlace() || entry.isSFtpNetworkPlace()) {
            m_mounts = true;
        }
        if (entry.isNetworkPlace()) {
            // They come with their first mount, and their paths do not begin with their parent's.
            m_paths.insert(VFS::ptr()->ftpNetworkEntry().path());
            m_paths.insert(VFS::ptr()->sftpNetworkEntry().path());
        }
        m_paths.insert(entry.path());
        m_prefixes.insert(childPrefix(entry));
        VFS::ptr()->entryWatcher()->addEntry(entry);
    }

private:
    /// What the watcher does not tell of places.
    void followPlaces()
    {
        const VFS* vfs = VFS::ptr();
        QObject::connect(
            vfs, &VFS::storagePlaceMountStateChanged, vfs, [this](const StoragePlace& place) {
                printDevice(place.isMounted() ? "mounted" : "unmounted", place);
            });
        QObject::connect(
            vfs, &VFS::storagePlaceMountabilityChanged, vfs, [this](const StoragePlace& place) {
                printDevice(place.isMountable() ? "mountable" : "unmountable", place);
            });
        const auto printUpdate = [this](const Entry& entry) {
            // The entry that comes along has the local path of before.
            printEvent(QLatin1String("updated"), knownPlace(entry.path()));
        };
        QObject::connect(vfs, &VFS::smbShareUpdated, vfs, printUpdate);
        QObject::connect(vfs, &VFS::networkPlaceUpdated, vfs, printUpdate);
        QObject::connect(
            vfs, &VFS::fuseMountAdded, vfs, [this](const QString& url, const Entry& entry) {
                // One that makes no place has its URL alone.
                const QString path = entry.isNull() ? shownLocation(url) : entry.path();
                if (m_mounts || wasAskedFor(path)) {
                    write(QLatin1String("mounted"), entry, path, entry.localPath());
                }
            });
    }

    /// The tree still has the place as it was, so the record tells.
    void printDevice(const char* event, const StoragePlace& place)
    {
        if (wasAskedFor(place.name())) {
            write(QLatin1String(event), knownPlace(place.name()), place.name(), place.mountPoint());
        }
    }

    static Entry knownPlace(const QString& path)
    {
        return VFS::ptr()->placeBase()->placeEntry(path);
    }

    bool wasAskedFor(const QString& path) const
    {
        const QString prefix = path.left(path.lastIndexOf(QLatin1Char('/')) + 1);
        return m_paths.contains(path) || (!prefix.isEmpty() && m_prefixes.contains(prefix));
    }

    void printEvent(QLatin1String event, const Entry& entry)
    {
        if (wasAskedFor(entry.path())) {
            write(event, entry, entry.path(), entry.localPath());
        }
    }

    void
    write(QLatin1String event, const Entry& entry, const QString& path, const QString& localPath)
    {
        Output& output = m_invocation.output();
        if (m_invocation.json()) {
            QJsonObject object = toJson(entry);
            if (entry.path() != path) {
                object.insert(QStringLiteral("name"), path.section(QLatin1Char('/'), -1));
            }
            object.insert(QStringLiteral("path"), path);
            object.insert(QStringLiteral("localPath"), textOrNull(localPath));
            object.insert(QStringLiteral("event"), event);
            output.write(shownJson(object) + '\n');
        } else {
            const QByteArray word = QString(event).leftJustified(10).toLocal8Bit();
            output.writeRecord(word + "  " + output.name(path, entry));
        }
        output.flush();
        if (output.hasFailed()) {
            QCoreApplication::quit();
        }
    }

    Invocation& m_invocation;
    QSet<QString> m_paths;
    QSet<QString> m_prefixes;
    bool m_mounts = false; // Whether mounts by any program are of interest.
};

int run(Invocation& invocation)
{
    const Interrupt interrupt({SIGINT, SIGTERM}, [] {
        QMetaObject::invokeMethod(qApp, &QCoreApplication::quit, Qt::QueuedConnection);
    });
    // A pipe or a socket without a reader tells so by itself, not only to who writes. The signal is
    // what writing would lead to.
    const HangUp hangUp(STDOUT_FILENO);
    QSocketNotifier reader(hangUp.descriptor(), QSocketNotifier::Read);
    QObject::connect(&reader, &QSocketNotifier::activated, &reader, [&invocation] {
        ::raise(SIGPIPE);
        invocation.output().setFailed(EPIPE);
        QCoreApplication::quit();
    });
    Monitor monitor(invocation);
    int watched = 0;
    int exitCode = Done;
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const Located located = locate(operand);
        QString why = located.why.isEmpty() ? whyUnwatchable(located.entry) : located.why;
        if (why.isEmpty() && livesFromService(located.entry)) {
            why = whyNoNews();
        }
        if (why.isEmpty()) {
            monitor.add(located.entry);
            ++watched;
        } else {
            report(operand, why);
            exitCode = Failed;
        }
    }
    if (watched > 0) {
        QCoreApplication::exec();
    }
    return exitCode;
}

} // namespace

Verb monitorVerb()
{
    Verb verb;
    verb.name = QStringLiteral("monitor");
    verb.operands = QStringLiteral("ENTRY...");
    verb.summary = QStringLiteral("Tell what happens to entries");
    verb.details = QStringLiteral(
        "One line an event, until Ctrl-C: created, deleted, changed, attributes, or reset, which\n"
        "means that everything may have changed. Devices are mounted, unmounted, mountable and\n"
        "unmountable as well, shares and network bookmarks updated. Storage devices and the\n"
        "places of Samba are opened first. With --json each line is an object.");
    verb.leastOperands = 1;
    verb.jsonLines = true;
    verb.options = {nullOption(), colorOption()};
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
