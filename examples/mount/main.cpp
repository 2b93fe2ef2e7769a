// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Mounts a URL of a network resource and lists what is there:
//
//     mount-example sftp://anna@host/~/Documents

#include "consoleauthenticator.h"

#include <VeyFM/MountFuseEntryJob>
#include <VeyFM/VFS>

#include <QCoreApplication>
#include <QTextStream>
#include <QTimer>

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

} // namespace

int main(int argc, char** argv)
{
    using namespace std::chrono_literals;

    QCoreApplication app(argc, argv);
    if (app.arguments().size() != 2) {
        return fail(QStringLiteral("usage: mount-example URL"));
    }
    VeyFM::VFS::initialize();

    // One authenticator a job: a job sets the resource that its questions are about.
    const auto authenticator = QSharedPointer<ConsoleAuthenticator>::create();
    VeyFM::MountFuseEntryJob job(authenticator, app.arguments().at(1));
    job.setDeleteOnFinish(false);

    // The job may end inside start(), where exit() of the loop would come too early.
    QObject::connect(&job, &VeyFM::Job::finished, &app, &QCoreApplication::quit);
    bool finished = false;
    QObject::connect(&job, &VeyFM::Job::finished, &app, [&finished] { finished = true; });
    // A new mount gets a place that stands for the whole URL. For a mount that was there already
    // nothing is announced, and path() leads on from its place.
    VeyFM::VFS* const vfs = VeyFM::VFS::ptr();
    VeyFM::Entry made;
    QObject::connect(
        vfs, &VeyFM::VFS::fuseMountAdded, &app,
        [&made](const QString&, const VeyFM::Entry& entry) { made = entry; });
    job.start();

    if (!finished) {
        const bool isSftp = app.arguments().at(1).startsWith(QLatin1String("sftp:"));
        if (isSftp && authenticator->isAnswerOpen()) {
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
    return list(made.isNull() ? vfs->entry(job.path()) : made);
}
