// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include <VeyFM/MountResourceJob>
#include <VeyFM/UnmountResourceJob>
#include <VeyFM/VFS>

#include <QCoreApplication>
#include <QFileInfo>
#include <QTextStream>

// Whether the library works, and the program that it starts is the one that lies in the same tree.
int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    VeyFM::VFS::initialize();
    VeyFM::UnmountResourceJob unmount(VeyFM::VFS::ptr()->homeEntry());
    unmount.setDeleteOnFinish(false);
    unmount.exec();
    VeyFM::MountResourceJob mount(QStringLiteral("http://server/"));
    mount.setDeleteOnFinish(false);
    mount.exec();
    QTextStream(stdout) << mount.helperProgram() << '\n' << mount.errorString() << '\n';
    return unmount.error() == 5 && mount.error() == 5 ? 0 : 1;
}
