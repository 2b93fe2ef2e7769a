// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Mounts the server of an ftp or sftp URL and lists what is at the URL:
//
//     mount-example sftp://anna@host/~/Documents

#include "consoleauthenticator.h"

#include <VeyFM/MountFuseEntryJob>
#include <VeyFM/MountPaths>
#include <VeyFM/NetworkMountsManagerProxy>
#include <VeyFM/VFS>

#include <QCoreApplication>
#include <QMap>
#include <QTextStream>
#include <QTimer>
#include <QUrl>

#include <chrono>

namespace {

int fail(const QString& why)
{
    QTextStream(stderr) << "mount-example: " << why << '\n';
    return 1;
}

int list(const VeyFM::Entry& directory)
{
    VeyFM::EntryList entries = VeyFM::VFS::ptr()->childs(directory);
    entries.sort(true);
    QTextStream out(stdout);
    for (const VeyFM::Entry& entry : entries) {
        out << entry.path() << '\n';
    }
    return 0;
}

bool isOfOneServer(const QString& url, const QString& other)
{
    // The user may be another one than the URL began with.
    return QUrl(url).adjusted(QUrl::RemoveUserInfo) == QUrl(other).adjusted(QUrl::RemoveUserInfo);
}

// The mount that the path of a job leads into. Its user is the one that was taken in the end.
VeyFM::Entry mountOf(const QString& rootUrl, const QString& path)
{
    const QMap<QString, VeyFM::Entry> mounts = VeyFM::VFS::ptr()->networkMountsManager()->mounts();
    for (auto it = mounts.cbegin(); it != mounts.cend(); ++it) {
        if (isOfOneServer(it.key(), rootUrl) && path.startsWith(it->path() + QLatin1Char('/'))) {
            return *it;
        }
    }
    return VeyFM::Entry();
}

VeyFM::Entry entryBelow(const VeyFM::Entry& mount, const QString& relativePath)
{
    VeyFM::VFS* const vfs = VeyFM::VFS::ptr();
    // A server has one place, also where both its root and the user's home there are mounted. It
    // stands for the one that was first.
    const bool isPlace = vfs->entry(mount.path()).localPath() == mount.localPath();
    const QString root = isPlace ? mount.path() : mount.localPath();
    return vfs->entry(root + QLatin1Char('/') + relativePath);
}

} // namespace

int main(int argc, char** argv)
{
    using namespace std::chrono_literals;

    QCoreApplication app(argc, argv);
    if (app.arguments().size() != 2) {
        return fail(QStringLiteral("usage: mount-example URL"));
    }
    VeyFM::VFS::initialize();

    // The root, of which all folders of the server are part. A job for the URL of one folder makes
    // a place of it, and a job for the next folder finds that.
    const QUrl url(app.arguments().at(1));
    const QString rootUrl = VeyFM::MountPaths::mountRootUrl(url);

    // One authenticator a job: a job sets the resource that its questions are about.
    const auto authenticator = QSharedPointer<ConsoleAuthenticator>::create();
    VeyFM::MountFuseEntryJob job(authenticator, rootUrl);
    job.setDeleteOnFinish(false);

    // The job may end inside start(), where exit() of the loop would come too early.
    QObject::connect(&job, &VeyFM::Job::finished, &app, &QCoreApplication::quit);
    bool finished = false;
    QObject::connect(&job, &VeyFM::Job::finished, &app, [&finished] { finished = true; });
    job.start();

    if (!finished) {
        if (url.scheme() == QLatin1String("sftp") && authenticator->isAnswerOpen()) {
            return fail(QStringLiteral("the login was given up or failed"));
        }
        // Else a tool works, or the service has the word: neither has a bound of its own. A tool
        // that asks waits for a person, so that a desktop program would rather offer a button.
        QTimer::singleShot(5min, &app, &QCoreApplication::quit);
        app.exec();
    }
    if (!finished) {
        return fail(QStringLiteral("nothing came of it in five minutes"));
    }
    if (job.error() != 0) {
        return fail(job.errorString());
    }
    const VeyFM::Entry mount = mountOf(rootUrl, job.path());
    if (mount.isNull()) {
        return fail(QStringLiteral("the mount is gone"));
    }
    const VeyFM::Entry entry = entryBelow(mount, VeyFM::MountPaths::mountRootRelativePath(url));
    return entry.exists() ? list(entry) : fail(QStringLiteral("the server has no such folder"));
}
