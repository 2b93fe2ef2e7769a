// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/unmountresourcejob.h"

#include "host/background.h"
#include "host/childprocess.h"
#include "host/fusedirectory.h"
#include "host/mountfinder.h"
#include "host/mountforgetter.h"
#include "host/mountholders.h"
#include "host/mountinfo.h"
#include "host/mountlock.h"
#include "host/mounturl.h"
#include "jobs/job_p.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "vfs/vfssettings.h"

#include <QFile>
#include <QTimer>
#include <QUrl>

#include <csignal>
#include <cstring>
#include <memory>

#include <sys/wait.h>
#include <unistd.h>

namespace VeyFM {

namespace {

const QLatin1Char slash('/');

constexpr int patience = 5000; // Milliseconds, with each of what may hang.
constexpr int lockInterval = 50;
constexpr int mostMounts = 16; // On one directory, all of which go.

constexpr int longestOutput = 4096;

/// The local path of a place of the branch, or of what lies below it: by its text alone, since the
/// mount is not to be looked at. Empty for any other.
QString localPathBelow(const Entry& branch, const QString& path)
{
    QString place = path;
    while (!branch.isNull() && place.startsWith(branch.path() + slash)) {
        const Entry found = VFS::ptr()->placeBase()->placeEntry(place);
        if (!found.isNull()) {
            return found.localPath() + path.mid(place.size());
        }
        place.truncate(place.lastIndexOf(slash));
    }
    return QString();
}

QString localPathOfPlace(const QString& path)
{
    const VFS* const vfs = VFS::ptr();
    QString text = path;
    const QString network = vfs->networkEntry().path() + slash;
    if (!vfs->networkEntry().isNull() && text.startsWith(network)) {
        text.remove(0, network.size());
    }
    const QString local = localPathBelow(vfs->sftpNetworkEntry(), text);
    return local.isEmpty() ? localPathBelow(vfs->ftpNetworkEntry(), text) : local;
}

} // namespace

class UnmountResourceJobPrivate : public JobPrivate
{
public:
    explicit UnmountResourceJobPrivate(const QString& text)
        : text(text)
        , m_mountRoot(VFS::ptr()->settings()->mountRootPath())
    {
        m_patience.setSingleShot(true);
        m_lockTimer.setInterval(lockInterval);
    }

    void start();

    QString text; ///< What is to be unmounted, as the user has it.
    bool isLazy = false;
    QString directory;
    QStringList holders;

private:
    /// A step that has to be done in time. What it waits for comes in vain after that.
    template <typename Late>
    void wait(int milliseconds, const Late& late)
    {
        m_patience.disconnect();
        QObject::connect(&m_patience, &QTimer::timeout, q_ptr, late);
        m_patience.start(milliseconds);
    }

    QString localPath() const;
    void find(const QString& path);
    void found(const Host::FoundMount& mount);
    void lock();
    void tryLock();
    void unmount(const QString& program);
    void read();
    void programEnded(int status);
    void lookForHolders();
    void unmounted();
    void fail(const QString& why);
    bool isMounted() const;

    const QString m_mountRoot;
    bool m_isStarted = false;
    int m_rounds = 0;
    QByteArray m_output;
    Host::MountLock m_lock;
    QTimer m_lockTimer;
    QTimer m_patience;
    std::unique_ptr<Host::Background> m_background;
    std::unique_ptr<Host::ChildProcess> m_program;
    std::unique_ptr<Host::MountForgetter> m_forgetter;
};

void UnmountResourceJobPrivate::start()
{
    if (m_isStarted) {
        return;
    }
    m_isStarted = true;
    QObject::connect(&m_lockTimer, &QTimer::timeout, q_ptr, [this] { tryLock(); });
    const QString path = localPath();
    if (path.startsWith(slash)) {
        find(path);
        return;
    }
    QTimer::singleShot(0, q_ptr, [this] {
        fail(UnmountResourceJob::tr("%1 is no mount of a network resource")
                 .arg(Host::shownUrl(text)));
    });
}

// Something absolute, or nothing of use.
QString UnmountResourceJobPrivate::localPath() const
{
    const int schemeEnd = text.indexOf(QLatin1String("://"));
    const QString scheme = text.left(std::max(schemeEnd, 0));
    if (scheme == QLatin1String("sftp") || scheme == QLatin1String("ftp")) {
        const QUrl url(text);
        return url.host().isEmpty() ? QString() : Host::fuseDirectory(url, m_mountRoot);
    }
    return text.startsWith(slash) ? text : localPathOfPlace(text);
}

// Links may lead over file systems that hang.
void UnmountResourceJobPrivate::find(const QString& path)
{
    wait(patience, [this] {
        m_background.reset();
        fail(UnmountResourceJob::tr("The file system of %1 does not answer")
                 .arg(Host::shownUrl(text)));
    });
    m_background = std::make_unique<Host::Background>();
    m_background->run(
        [path, root = m_mountRoot] { return Host::findMount(path, root, Host::MountInfo::read()); },
        [this](const Host::FoundMount& mount) { found(mount); });
}

void UnmountResourceJobPrivate::found(const Host::FoundMount& mount)
{
    directory = mount.directory;
    if (mount.why == Host::FoundMount::Elsewhere) {
        directory.clear();
        fail(UnmountResourceJob::tr("%1 is no mount of a network resource")
                 .arg(Host::shownUrl(text)));
    } else if (mount.why == Host::FoundMount::NotMounted) {
        fail(UnmountResourceJob::tr("Nothing is mounted on %1").arg(directory));
    } else {
        lock();
    }
}

void UnmountResourceJobPrivate::lock()
{
    if (!m_lock.open(directory, m_mountRoot)) {
        fail(m_lock.why());
        return;
    }
    wait(patience, [this] {
        fail(UnmountResourceJob::tr("%1 is being mounted by another program").arg(directory));
    });
    tryLock();
}

void UnmountResourceJobPrivate::tryLock()
{
    if (!m_lock.tryLock()) {
        m_lockTimer.start();
        return;
    }
    m_lockTimer.stop();
    if (isMounted()) {
        unmount(QStringLiteral("fusermount3"));
    } else {
        unmounted(); // By whoever had the lock.
    }
}

bool UnmountResourceJobPrivate::isMounted() const
{
    return Host::MountInfo::read().isMountPoint(directory);
}

void UnmountResourceJobPrivate::unmount(const QString& program)
{
    m_output.clear();
    m_program = std::make_unique<Host::ChildProcess>();
    QObject::connect(m_program.get(), &Host::ChildProcess::readyRead, q_ptr, [this] { read(); });
    QObject::connect(m_program.get(), &Host::ChildProcess::ended, q_ptr, [this](int status) {
        programEnded(status);
    });
    const QString option = isLazy ? QStringLiteral("-uz") : QStringLiteral("-u");
    QObject::connect(
        m_program.get(), &Host::ChildProcess::failed, q_ptr, [this, program](int error) {
            if (error == ENOENT && program == QLatin1String("fusermount3")) {
                unmount(QStringLiteral("fusermount"));
            } else {
                fail(UnmountResourceJob::tr("Can't start %1: %2")
                         .arg(program, QString::fromLocal8Bit(std::strerror(error))));
            }
        });
    wait(patience, [this, program] {
        m_program->kill(SIGKILL);
        fail(UnmountResourceJob::tr("%1 does not come to an end").arg(program));
    });
    m_program->start(program, {option, directory}, Host::ChildProcess::Output);
}

void UnmountResourceJobPrivate::read()
{
    char bytes[longestOutput];
    const ssize_t size = ::read(m_program->descriptor(), bytes, sizeof(bytes));
    if (size > 0) {
        m_output.append(bytes, std::min(int(size), longestOutput - m_output.size()));
    } else if (size == 0 || (errno != EAGAIN && errno != EINTR)) {
        m_program->stopReading();
    }
}

void UnmountResourceJobPrivate::programEnded(int status)
{
    read();
    m_program.reset();
    if (!isMounted()) {
        unmounted();
    } else if (status == 0 && ++m_rounds < mostMounts) {
        unmount(QStringLiteral("fusermount3")); // One lay on top of another.
    } else {
        lookForHolders();
    }
}

void UnmountResourceJobPrivate::lookForHolders()
{
    const auto failWithHolders = [this] {
        m_background.reset();
        const QString output = QString::fromLocal8Bit(m_output).trimmed();
        if (!holders.isEmpty()) {
            fail(UnmountResourceJob::tr("%1 is in use by: %2")
                     .arg(directory, holders.join(QLatin1String(", "))));
        } else if (output.contains(QLatin1String("busy"))) {
            fail(UnmountResourceJob::tr("%1 is in use").arg(directory));
        } else {
            fail(
                output.isEmpty() ? UnmountResourceJob::tr("Can't unmount %1").arg(directory)
                                 : output);
        }
    };
    wait(patience, failWithHolders);
    m_background = std::make_unique<Host::Background>();
    m_background->run(
        [directory = directory] { return Host::mountHolders(directory); },
        [this, failWithHolders](const QStringList& found) {
            holders = found;
            failWithHolders();
        });
}

// Under the lock: a directory that somebody mounts on is not to be taken away.
void UnmountResourceJobPrivate::unmounted()
{
    ::rmdir(QFile::encodeName(directory).constData());
    m_lock.close();
    m_patience.stop();
    m_forgetter = std::make_unique<Host::MountForgetter>(directory, m_mountRoot);
    QObject::connect(
        m_forgetter.get(), &Host::MountForgetter::done, q_ptr, [this] { q_ptr->finishedOk(); });
    m_forgetter->start();
}

void UnmountResourceJobPrivate::fail(const QString& why)
{
    m_patience.stop();
    m_lockTimer.stop();
    m_lock.close();
    q_ptr->finishedWithError(5, why);
}

UnmountResourceJob::UnmountResourceJob(const Entry& entry, QObject* parent)
    : UnmountResourceJob(
          entry.isFuseUrl() || entry.localPath().isEmpty() ? entry.path() : entry.localPath(),
          parent)
{
}

UnmountResourceJob::UnmountResourceJob(const QString& text, QObject* parent)
    : Job(*new UnmountResourceJobPrivate(text), parent)
{
}

UnmountResourceJob::~UnmountResourceJob() = default;

void UnmountResourceJob::setLazy(bool lazy)
{
    d_func()->isLazy = lazy;
}

bool UnmountResourceJob::isLazy() const
{
    return d_func()->isLazy;
}

void UnmountResourceJob::start()
{
    d_func()->start();
}

QString UnmountResourceJob::directory() const
{
    return d_func()->directory;
}

QStringList UnmountResourceJob::holders() const
{
    return d_func()->holders;
}

} // namespace VeyFM
