// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Mounts what an sftp, ftp or smb URL names, and lists what is there:
//
//     mount-example sftp://anna@host/~/Documents
//
// Nothing in here waits in a function: there is one event loop, in which the terminal counts the
// seconds, asks, and takes a Ctrl-C. A window would have its dialogs and its button in those
// places.

#include "questions.h"
#include "terminal.h"

#include <VeyFM/MountResourceJob>
#include <VeyFM/VFS>

#include <QCoreApplication>
#include <QTextStream>

namespace {

int fail(const QString& why)
{
    QTextStream(stderr) << "mount-example: " << why << '\n';
    return 1;
}

// This one waits for the server; a program with a window would list in a thread.
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
    QCoreApplication app(argc, argv);
    if (app.arguments().size() != 2) {
        return fail(QStringLiteral("usage: mount-example URL"));
    }
    Terminal terminal;
    VeyFM::VFS::initialize();
    VeyFM::VFS::setServiceProbe(1000);
    VeyFM::VFS* const vfs = VeyFM::VFS::ptr();

    VeyFM::MountResourceJob job(app.arguments().at(1));
    job.setDeleteOnFinish(false);
    Questions questions(&job, &terminal);
    QObject::connect(&job, &VeyFM::MountResourceJob::waitingForOther, &terminal, &Terminal::say);
    QObject::connect(&terminal, &Terminal::interrupted, &job, &VeyFM::MountResourceJob::cancel);
    QObject::connect(&job, &VeyFM::Job::finished, &app, &QCoreApplication::quit);
    job.start();
    app.exec();

    terminal.leave();
    if (job.error() != 0) {
        return fail(job.errorString());
    }
    // The tree has no place for a mount that the service does not know.
    return list(job.entry().isNull() ? vfs->entry(job.localPath()) : job.entry());
}
