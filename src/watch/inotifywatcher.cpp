// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/inotifywatcher.h"

#include "watch/linktable.h"
#include "watch/watchtable.h"

#include <QFileInfo>
#include <QPointer>
#include <QSet>
#include <QSocketNotifier>
#include <QStringBuilder>
#include <QTimer>

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>

#include <sys/inotify.h>
#include <sys/ioctl.h>
#include <unistd.h>

namespace VeyFM {

namespace {

// IN_MODIFY is left out on purpose: a file that is being written is reported once, when closed.
constexpr uint32_t WatchMask = IN_ATTRIB | IN_CLOSE_WRITE | IN_MOVED_FROM | IN_MOVED_TO |
                               IN_CREATE | IN_DELETE | IN_DELETE_SELF | IN_MOVE_SELF |
                               IN_DONT_FOLLOW | IN_EXCL_UNLINK;

constexpr int DeletedLinkGraceMs = 500;

struct PathSignal
{
    void (InotifyWatcher::*emitter)(const QString&, const QString&);
    const char* name;
};

constexpr PathSignal Created{&InotifyWatcher::pathCreated, "pathCreated"};
constexpr PathSignal Deleted{&InotifyWatcher::pathDeleted, "pathDeleted"};
constexpr PathSignal Changed{&InotifyWatcher::pathChanged, "pathChanged"};
constexpr PathSignal AttributesChanged{
    &InotifyWatcher::pathAttributesChanged, "pathAttributesChanged"};

// The events that wait, taken whole. The usual batch takes one read and fits on the stack.
class EventBatch
{
public:
    explicit EventBatch(int fd)
        : m_size(read(fd, m_stack, sizeof(m_stack)))
    {
        // A read gives as many whole events as fit. Where one more would have fitted, none waits.
        if (m_size > ssize_t(sizeof(m_stack) - LargestEvent)) {
            readRest(fd);
        }
    }

    const char* data() const
    {
        return m_heap ? m_heap.get() : m_stack;
    }

    /// In bytes, negative if nothing waited.
    ssize_t size() const
    {
        return m_size;
    }

private:
    struct Free
    {
        void operator()(char* memory) const
        {
            std::free(memory);
        }
    };

    static constexpr size_t LargestEvent = sizeof(inotify_event) + NAME_MAX + 1;

    void readRest(int fd)
    {
        int waiting = 0;
        ioctl(fd, FIONREAD, &waiting);
        if (waiting <= 0) {
            return;
        }
        m_heap.reset(static_cast<char*>(std::malloc(size_t(m_size + waiting))));
        if (!m_heap) {
            qBadAlloc();
        }
        std::memcpy(m_heap.get(), m_stack, size_t(m_size));
        m_size += std::max(ssize_t(0), read(fd, m_heap.get() + m_size, size_t(waiting)));
    }

    alignas(inotify_event) char m_stack[4096];
    std::unique_ptr<char, Free> m_heap;
    ssize_t m_size;
};

// Most watched paths are no links, which one readlink() tells more cheaply than any stat.
bool isSymLink(const QString& path, const QByteArray& localPath)
{
    char firstByte;
    const bool sameFile = path.startsWith(QLatin1Char('/')) &&
                          std::strlen(localPath.constData()) == size_t(localPath.size());
    if (sameFile && readlink(localPath.constData(), &firstByte, 1) == -1 && errno == EINVAL) {
        return false;
    }
    return QFileInfo(path).isSymLink();
}

QString childPath(const QString& path, const QString& fileName)
{
    return path % QLatin1Char('/') % fileName;
}

} // namespace

class InotifyWatcherPrivate
{
public:
    explicit InotifyWatcherPrivate(InotifyWatcher* watcher)
        : q(watcher)
        , fd(inotify_init1(IN_CLOEXEC | IN_NONBLOCK))
    {
    }

    ~InotifyWatcherPrivate()
    {
        if (fd >= 0) {
            close(fd);
        }
    }

    Q_DISABLE_COPY(InotifyWatcherPrivate)

    int addWatch(const QByteArray& localPath) const
    {
        return inotify_add_watch(fd, localPath.constData(), WatchMask);
    }

    // These return false if a slot has deleted the watcher, and this object with it.
    bool processEvents(const char* events, ssize_t size);
    bool processEvent(const inotify_event& event);
    bool childAppeared(uint32_t mask, const QString& path, const QString& fileName);
    bool childWentAway(uint32_t mask, const QString& path, const QString& fileName);
    bool selfWentAway(uint32_t mask, const QString& path, const QString& fileName);
    bool notify(const PathSignal& signal, const QString& path, const QString& fileName);

    InotifyWatcher* const q;
    const int fd; // negative if the kernel granted no instance; a read never blocks
    WatchTable watches;
    LinkTable links;
    QSet<QString> deletedSymlinks; // links that wait for the verdict, still among the watches
};

InotifyWatcher::InotifyWatcher(QObject* parent)
    : QObject(parent)
    , d(std::make_unique<InotifyWatcherPrivate>(this))
{
    if (d->fd < 0) {
        return;
    }
    auto* notifier = new QSocketNotifier(d->fd, QSocketNotifier::Read, this);
    connect(notifier, &QSocketNotifier::activated, this, &InotifyWatcher::processInotifyMessages);
}

InotifyWatcher::~InotifyWatcher() = default;

bool InotifyWatcher::addPath(const QString& path)
{
    if (d->fd < 0 || path.isEmpty()) {
        return false;
    }
    if (d->watches.contains(path)) {
        d->links.request(path);
        return false;
    }

    const QByteArray localPath = path.toLocal8Bit();
    const int descriptor = d->addWatch(localPath);
    if (descriptor == -1) {
        return false;
    }
    d->watches.insert(path, descriptor);
    if (!isSymLink(path, localPath)) {
        return true;
    }

    const QString target = QFileInfo(path).symLinkTarget();
    if (!d->links.isTarget(target)) {
        const int targetDescriptor = d->addWatch(target.toLocal8Bit());
        // The link stays watched, although the caller is told of a failure.
        if (targetDescriptor == -1) {
            return false;
        }
        // A client may have asked for the target before. That request is not carried over to
        // the links: from here on the target counts as watched for their sake alone.
        d->watches.insert(target, targetDescriptor);
    }
    d->links.addLink(path, target);
    return true;
}

bool InotifyWatcher::removePath(const QString& path)
{
    return removePath(path, true);
}

bool InotifyWatcher::removePath(const QString& path, bool removeWatch)
{
    if (d->fd < 0) {
        return false;
    }
    const int descriptor = d->watches.descriptor(path);
    if (descriptor == -1) {
        return true;
    }

    // The target of the last link stays watched: a later addPath() of the link finds it there.
    d->links.forget(path);
    if (d->links.isTarget(path)) {
        return true;
    }
    if (removeWatch && inotify_rm_watch(d->fd, descriptor) == -1) {
        return false;
    }
    d->watches.remove(path);
    return true;
}

bool InotifyWatcher::clear()
{
    if (d->fd < 0) {
        return true;
    }
    bool allRemoved = true;
    const QList<int> descriptors = d->watches.descriptors();
    for (const int descriptor : descriptors) {
        // The kernel ends a watch once. If several paths share it, only the first of them goes.
        if (inotify_rm_watch(d->fd, descriptor) == 0) {
            d->watches.remove(d->watches.firstPath(descriptor));
        }
        if (!d->watches.firstPath(descriptor).isEmpty()) {
            allRemoved = false;
        }
    }
    d->links.clear();
    return allRemoved;
}

bool InotifyWatcher::isPathRegistered(const QString& path) const
{
    return d->watches.contains(path);
}

bool InotifyWatcher::isSymlinkRegistered(const QString& path) const
{
    return d->links.contains(path);
}

void InotifyWatcher::notifySymlinks(
    const char* signal, const QString& path, const QString& fileName)
{
    const QSet<QString> links = d->links.links(path);
    const QPointer<InotifyWatcher> alive(links.isEmpty() ? nullptr : this);
    for (const QString& link : links) {
        if (d->deletedSymlinks.contains(link)) {
            continue;
        }
        QMetaObject::invokeMethod(
            this, signal, Qt::AutoConnection, Q_ARG(QString, link), Q_ARG(QString, fileName));
        if (!alive) {
            return;
        }
    }
}

void InotifyWatcher::processInotifyMessages()
{
    {
        const EventBatch events(d->fd);
        if (!d->processEvents(events.data(), events.size())) {
            return;
        }
    }

    // Each run starts a timer of its own and the first to fire settles all links, so a link that
    // is deleted while a timer runs gets less than the full time.
    if (!d->deletedSymlinks.isEmpty()) {
        QTimer::singleShot(DeletedLinkGraceMs, this, &InotifyWatcher::notifyDeletedSymlinks);
    }
}

void InotifyWatcher::notifyDeletedSymlinks()
{
    const QPointer<InotifyWatcher> alive(this);

    // All are told of the deletions before anything is forgotten.
    const QSet<QString> deleted = d->deletedSymlinks;
    for (const QString& link : deleted) {
        Q_EMIT pathDeleted(link, QString());
        if (alive) {
            notifySymlinks(Changed.name, link, QString());
        }
        if (!alive) {
            return;
        }
    }
    const QSet<QString> forgotten = d->deletedSymlinks;
    for (const QString& link : forgotten) {
        removePath(link, false);
        Q_EMIT pathUnregistered(link);
        if (!alive) {
            return;
        }
    }
    d->deletedSymlinks.clear();
}

bool InotifyWatcherPrivate::processEvents(const char* events, ssize_t size)
{
    ssize_t offset = 0;
    while (offset < size) {
        const auto* event = reinterpret_cast<const inotify_event*>(events + offset);
        if (!processEvent(*event)) {
            return false;
        }
        offset += ssize_t(sizeof(inotify_event) + event->len);
    }
    return true;
}

// One event may carry several bits, and the order in which they are looked at is fixed.
bool InotifyWatcherPrivate::processEvent(const inotify_event& event)
{
    // No path: the watch was dropped since, maybe by a slot, or the queue overflowed.
    const QString path = watches.firstPath(event.wd);
    if (path.isEmpty()) {
        return true;
    }
    const QString fileName = event.len == 0 ? QString() : QString::fromLocal8Bit(event.name);
    const uint32_t mask = event.mask;

    if ((mask & IN_IGNORED) && !deletedSymlinks.contains(path)) {
        const QPointer<InotifyWatcher> alive(q);
        q->removePath(path, false);
        Q_EMIT q->pathUnregistered(path);
        if (!alive) {
            return false;
        }
    }
    if ((mask & (IN_CREATE | IN_MOVED_TO)) && !childAppeared(mask, path, fileName)) {
        return false;
    }
    if ((mask & (IN_DELETE | IN_MOVED_FROM)) && !childWentAway(mask, path, fileName)) {
        return false;
    }
    if ((mask & (IN_DELETE_SELF | IN_MOVE_SELF)) && !selfWentAway(mask, path, fileName)) {
        return false;
    }
    if ((mask & IN_CLOSE_WRITE) && !notify(Changed, path, fileName)) {
        return false;
    }
    if ((mask & IN_ATTRIB) && !notify(AttributesChanged, path, fileName)) {
        return false;
    }
    return true;
}

bool InotifyWatcherPrivate::childAppeared(
    uint32_t mask, const QString& path, const QString& fileName)
{
    // Only a link that is made anew ends the wait: one that is moved here is an ordinary arrival.
    if ((mask & IN_CREATE) && !deletedSymlinks.isEmpty()) {
        const QString full = childPath(path, fileName);
        if (deletedSymlinks.remove(full)) {
            q->removePath(full, false);
            if (QFileInfo(full).isSymLink()) {
                const QPointer<InotifyWatcher> alive(q);
                q->addPath(full);
                Q_EMIT q->pathChanged(full, QString());
                return alive;
            }
        }
    }
    return notify(Created, path, fileName);
}

bool InotifyWatcherPrivate::childWentAway(
    uint32_t mask, const QString& path, const QString& fileName)
{
    // Only a deletion is held back: a link that is moved away is reported at once.
    if ((mask & IN_DELETE) && !links.isEmpty()) {
        const QString full = childPath(path, fileName);
        if (links.contains(full)) {
            deletedSymlinks.insert(full);
            return true;
        }
    }
    return notify(Deleted, path, fileName);
}

bool InotifyWatcherPrivate::selfWentAway(
    uint32_t mask, const QString& path, const QString& fileName)
{
    if ((mask & IN_DELETE_SELF) && links.contains(path)) {
        deletedSymlinks.insert(path);
        return true;
    }
    const QPointer<InotifyWatcher> alive(q);
    q->removePath(path, true);
    Q_EMIT q->pathDeleted(path, fileName);
    // The other way round than everywhere else: links are told of the loss of their target
    // itself, and for them that is a change.
    if (alive && fileName.isEmpty()) {
        q->notifySymlinks(Changed.name, path, fileName);
    }
    return alive;
}

// Links are told of what happens to a child of their target, not of what happens to the target.
bool InotifyWatcherPrivate::notify(
    const PathSignal& signal, const QString& path, const QString& fileName)
{
    const QPointer<InotifyWatcher> alive(q);
    Q_EMIT(q->*signal.emitter)(path, fileName);
    if (alive && !fileName.isEmpty()) {
        q->notifySymlinks(signal.name, path, fileName);
    }
    return alive;
}

} // namespace VeyFM
