// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "watch/inotifywatcher.h"

#include "core/copied.h"
#include "core/localbytes.h"
#include "watch/eventqueue.h"
#include "watch/kernelwatches.h"
#include "watch/linktable.h"
#include "watch/watchtable.h"

#include <QFileInfo>
#include <QPointer>
#include <QSet>
#include <QSocketNotifier>
#include <QStringBuilder>
#include <QStringList>
#include <QTimer>

#include <cerrno>

#include <sys/inotify.h>
#include <unistd.h>

namespace VeyFM {

namespace {

// IN_MODIFY is left out on purpose: a file that is being written is reported once, when closed.
constexpr uint32_t WatchMask = IN_ATTRIB | IN_CLOSE_WRITE | IN_MOVED_FROM | IN_MOVED_TO |
                               IN_CREATE | IN_DELETE | IN_DELETE_SELF | IN_MOVE_SELF |
                               IN_DONT_FOLLOW | IN_EXCL_UNLINK;

constexpr int DeletedLinkGraceMs = 500;

using PathSignal = void (InotifyWatcher::*)(const QString&, const QString&);

// Most watched paths are no links, which one readlink() tells more cheaply than any stat.
bool isSymLink(const QString& path, const LocalBytes& localPath)
{
    // QFileInfo takes what begins with a colon for a resource of the program, and no file.
    char firstByte;
    if (path.startsWith(QLatin1Char('/')) && readlink(localPath.data(), &firstByte, 1) == -1 &&
        errno == EINVAL) {
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

    int addWatch(const LocalBytes& localPath) const
    {
        // The system would end a path at its first NUL, and watch another one.
        return localPath.isUsable() ? inotify_add_watch(fd, localPath.data(), WatchMask) : -1;
    }

    /**
     * Tells all that there is to tell. A slot that runs an event loop may lead back here, and then
     * the inner call goes on where the outer one stands: news are told in the order in which they
     * came, and the outer call finds nothing left.
     *
     * False if a slot has deleted the watcher, and this object with it.
     */
    bool tellAll();

    void readEvents();
    void findLostWatches();

    InotifyWatcher* const q;
    const int fd; // negative if the kernel granted no instance; a read never blocks
    WatchTable watches;
    LinkTable links;
    QSet<QString> deletedSymlinks; // links that wait for the verdict, still among the watches
    bool isVerdictDue = false;
    bool isOverflowed = false;

private:
    // Each tells one thing at most, as the last that it does: a slot may delete this object.
    bool step();
    void beginEvent(const inotify_event& event);
    void tellEffect();
    void childAppeared(uint32_t bits);
    void childWentAway(uint32_t bits);
    void selfWentAway(uint32_t bits);
    void tellOfChild(PathSignal signal);
    void tell(PathSignal signal, PathSignal signalToLinks);
    void tellNextLink();
    void tellDeletedLink();
    void forgetDeletedLink();
    void dropLostWatch();

    uint32_t takeBits(uint32_t bits)
    {
        const uint32_t taken = effects & bits;
        effects &= ~bits;
        return taken;
    }

    EventQueue events;
    // What is being told, and which bits of it have not been looked at yet.
    QString path;
    QString fileName;
    uint32_t effects = 0;
    // What the links to that path are to be told, and which of them still are.
    PathSignal linkSignal = nullptr;
    bool areLinksDue = false;
    QStringList linksToTell;
    // The verdict at hand: which links are to be told deleted, and forgotten then.
    QStringList linksToDelete;
    QStringList linksToForget;
    QVector<WatchTable::Watch> lostWatches;
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

    const LocalBytes localPath(path);
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
        const int targetDescriptor = d->addWatch(LocalBytes(target));
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
    const char* signal, const QString& path, const QString& givenName)
{
    const QString fileName = copied(givenName);
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
    d->readEvents();
    if (!d->tellAll()) {
        return;
    }
    if (d->isOverflowed) {
        d->findLostWatches();
        if (!d->tellAll()) {
            return;
        }
    }
    // Not at once, since events that come faster than they are told would never let go of us.
    if (d->isOverflowed) {
        QTimer::singleShot(0, this, &InotifyWatcher::processInotifyMessages);
    }

    // Each run starts a timer of its own and the first to fire settles all links, so a link that
    // is deleted while a timer runs gets less than the full time.
    if (!d->deletedSymlinks.isEmpty()) {
        QTimer::singleShot(DeletedLinkGraceMs, this, &InotifyWatcher::notifyDeletedSymlinks);
    }
}

void InotifyWatcher::notifyDeletedSymlinks()
{
    d->isVerdictDue = true;
    d->tellAll();
}

void InotifyWatcherPrivate::readEvents()
{
    events.fill(fd);
}

// The kernel has dropped events, and the end of a watch may have been one of them. Its record
// would stand in the way of watching that path ever again.
void InotifyWatcherPrivate::findLostWatches()
{
    isOverflowed = false;
    if (const auto known = kernelWatches(fd)) {
        lostWatches = watches.without(*known);
    }
    // What the kernel reported before it was asked is told first: an end that is on its way yet
    // is not lost.
    readEvents();
}

bool InotifyWatcherPrivate::tellAll()
{
    const QPointer<InotifyWatcher> alive(q);
    while (step()) {
        if (!alive) {
            return false;
        }
    }
    return true;
}

// What has begun comes to its end before anything newer begins. False when nothing is left.
bool InotifyWatcherPrivate::step()
{
    if (areLinksDue) {
        // Only now, since the slots of the target may have added and removed links.
        areLinksDue = false;
        linksToTell = links.links(path).values();
    } else if (!linksToTell.isEmpty()) {
        tellNextLink();
    } else if (effects != 0) {
        tellEffect();
    } else if (!linksToDelete.isEmpty()) {
        tellDeletedLink();
    } else if (!linksToForget.isEmpty()) {
        forgetDeletedLink();
    } else if (const inotify_event* const event = events.take()) {
        beginEvent(*event);
    } else if (isVerdictDue) {
        isVerdictDue = false;
        linksToDelete = linksToForget = deletedSymlinks.values();
    } else if (!lostWatches.isEmpty()) {
        dropLostWatch();
    } else {
        return false;
    }
    return true;
}

void InotifyWatcherPrivate::beginEvent(const inotify_event& event)
{
    isOverflowed = isOverflowed || (event.mask & IN_Q_OVERFLOW);
    // No path: the watch was dropped since, maybe by a slot, or the queue overflowed.
    path = watches.firstPath(event.wd);
    if (!path.isEmpty()) {
        fileName = event.len == 0 ? QString() : QString::fromLocal8Bit(event.name);
        effects = event.mask;
    }
}

// One event may carry several bits, and the order in which they are looked at is fixed.
void InotifyWatcherPrivate::tellEffect()
{
    if (takeBits(IN_IGNORED)) {
        if (!deletedSymlinks.contains(path)) {
            const QString ended = path;
            q->removePath(ended, false);
            Q_EMIT q->pathUnregistered(ended);
        }
    } else if (const uint32_t appeared = takeBits(IN_CREATE | IN_MOVED_TO)) {
        childAppeared(appeared);
    } else if (const uint32_t gone = takeBits(IN_DELETE | IN_MOVED_FROM)) {
        childWentAway(gone);
    } else if (const uint32_t selfGone = takeBits(IN_DELETE_SELF | IN_MOVE_SELF)) {
        selfWentAway(selfGone);
    } else if (takeBits(IN_CLOSE_WRITE)) {
        tellOfChild(&InotifyWatcher::pathChanged);
    } else if (takeBits(IN_ATTRIB)) {
        tellOfChild(&InotifyWatcher::pathAttributesChanged);
    } else {
        effects = 0;
    }
}

void InotifyWatcherPrivate::childAppeared(uint32_t bits)
{
    // Only a link that is made anew ends the wait: one that is moved here is an ordinary arrival.
    if ((bits & IN_CREATE) && !deletedSymlinks.isEmpty()) {
        const QString full = childPath(path, fileName);
        if (deletedSymlinks.remove(full)) {
            q->removePath(full, false);
            if (QFileInfo(full).isSymLink()) {
                q->addPath(full);
                Q_EMIT q->pathChanged(full, QString());
                return;
            }
        }
    }
    tellOfChild(&InotifyWatcher::pathCreated);
}

void InotifyWatcherPrivate::childWentAway(uint32_t bits)
{
    // Only a deletion is held back: a link that is moved away is reported at once.
    if ((bits & IN_DELETE) && !links.isEmpty()) {
        const QString full = childPath(path, fileName);
        if (links.contains(full)) {
            deletedSymlinks.insert(full);
            return;
        }
    }
    tellOfChild(&InotifyWatcher::pathDeleted);
}

void InotifyWatcherPrivate::selfWentAway(uint32_t bits)
{
    if ((bits & IN_DELETE_SELF) && links.contains(path)) {
        deletedSymlinks.insert(path);
        return;
    }
    q->removePath(path, true);
    // The other way round than everywhere else: links are told of the loss of their target
    // itself, and for them that is a change.
    tell(&InotifyWatcher::pathDeleted, fileName.isEmpty() ? &InotifyWatcher::pathChanged : nullptr);
}

// Links are told of what happens to a child of their target, not of what happens to the target.
void InotifyWatcherPrivate::tellOfChild(PathSignal signal)
{
    tell(signal, fileName.isEmpty() ? nullptr : signal);
}

void InotifyWatcherPrivate::tell(PathSignal signal, PathSignal signalToLinks)
{
    linkSignal = signalToLinks;
    areLinksDue = signalToLinks != nullptr;
    // Copies, which stay while an event loop of the slot goes on with the next event.
    const QString toldPath = path;
    const QString toldName = fileName;
    Q_EMIT(q->*signal)(toldPath, toldName);
}

void InotifyWatcherPrivate::tellNextLink()
{
    const QString link = linksToTell.takeFirst();
    if (!deletedSymlinks.contains(link)) {
        const QString toldName = fileName;
        Q_EMIT(q->*linkSignal)(link, toldName);
    }
}

void InotifyWatcherPrivate::tellDeletedLink()
{
    path = linksToDelete.takeFirst();
    fileName.clear();
    tell(&InotifyWatcher::pathDeleted, &InotifyWatcher::pathChanged);
}

// Not before all are told of the deletions.
void InotifyWatcherPrivate::forgetDeletedLink()
{
    const QString link = linksToForget.takeFirst();
    q->removePath(link, false);
    deletedSymlinks.remove(link);
    Q_EMIT q->pathUnregistered(link);
}

// A target goes too: its links stay known, and are told again once it is watched anew.
void InotifyWatcherPrivate::dropLostWatch()
{
    const WatchTable::Watch lost = lostWatches.takeFirst();
    // Maybe its end was told after all, or a slot has begun a new watch.
    if (watches.descriptor(lost.path) == lost.descriptor && !deletedSymlinks.contains(lost.path)) {
        links.forget(lost.path);
        watches.remove(lost.path);
        Q_EMIT q->pathUnregistered(lost.path);
    }
}

} // namespace VeyFM
