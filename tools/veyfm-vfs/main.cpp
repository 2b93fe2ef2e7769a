// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "descriptors.h"
#include "ending.h"
#include "report.h"
#include "restart.h"
#include "service.h"
#include "vfs/vfs.h"

#include <QCoreApplication>
#include <QEvent>

#include <signal.h>

int main(int argc, char* argv[])
{
    VeyFM::Tool::openStandardDescriptors();
    VeyFM::Tool::dieOfCaughtSignals();
    VeyFM::Tool::Restart::prepare(argv);
    // Where the caller ignores it, nobody learns how the tools end.
    ::signal(SIGCHLD, SIG_DFL);
    VeyFM::Tool::installLogging();
    QCoreApplication application(argc, argv);
    QCoreApplication::setApplicationName(QStringLiteral("veyfm-vfs"));
    if (VeyFM::Tool::Restart::wasDone()) {
        VeyFM::Tool::leaveService();
    }
    VeyFM::VFS::setServiceProbe(VeyFM::Tool::probeMilliseconds);
    const int exitCode = VeyFM::Tool::runCommandLine(VeyFM::Tool::wordsOf(argv + 1));
    // What was left to the event loop to delete, which ran for as long as a verb waited at most.
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    return exitCode;
}
