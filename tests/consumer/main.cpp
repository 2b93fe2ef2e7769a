// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include <VeyFM/VFS>

#include <QCoreApplication>

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    VeyFM::VFS::initialize();
    const VeyFM::Entry root = VeyFM::VFS::ptr()->entry(QStringLiteral("/"));
    return root.localPath() == QLatin1String("/") ? 0 : 1;
}
