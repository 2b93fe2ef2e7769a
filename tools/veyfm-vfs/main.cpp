// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "mount/descendants.h"
#include "report.h"

#include <QCoreApplication>

int main(int argc, char* argv[])
{
    VeyFM::Tool::leaveInheritedChildren();
    VeyFM::Tool::installLogging();
    QCoreApplication application(argc, argv);
    QCoreApplication::setApplicationName(QStringLiteral("veyfm-vfs"));
    return VeyFM::Tool::runCommandLine(QCoreApplication::arguments().mid(1));
}
