// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/watchtree.h"

#include "support/options.h"

#include <QDir>

#include <cstdio>
#include <cstdlib>

#include <sys/stat.h>
#include <unistd.h>

namespace Benchmarks {

namespace {

void require(bool done, const char* what)
{
    if (!done) {
        std::perror(what);
        std::exit(1);
    }
}

} // namespace

WatchTree::WatchTree(int directories)
{
    static int trees = 0;
    const QString top = QStringLiteral("%1/watched-%2").arg(scratchDirectory()).arg(++trees);
    require(QDir().mkpath(top), "mkpath");
    m_file = top.toLocal8Bit() + "/file.txt";
    require(mknod(m_file.constData(), S_IFREG | 0644, 0) == 0, "mknod");
    for (int i = 0; i < directories; ++i) {
        m_paths.append(QStringLiteral("%1/dir-%2").arg(top).arg(i).toLocal8Bit());
        require(mkdir(m_paths.last().constData(), 0755) == 0, "mkdir");
    }
}

int WatchTree::size() const
{
    return m_paths.size();
}

const QByteArray& WatchTree::path(int index) const
{
    return m_paths.at(index);
}

QStringList WatchTree::paths() const
{
    QStringList result;
    for (const QByteArray& path : m_paths) {
        result.append(QString::fromLocal8Bit(path));
    }
    return result;
}

void WatchTree::makeEvent()
{
    const QByteArray file = m_paths.at(m_current) + "/file.txt";
    if (m_fileExists) {
        require(unlink(file.constData()) == 0, "unlink");
        // A stride that shares no factor with the usual sizes reaches all, far apart.
        m_current = (m_current + 7919) % m_paths.size();
    } else {
        // A link costs a file system far less than a new file does.
        require(link(m_file.constData(), file.constData()) == 0, "link");
    }
    m_fileExists = !m_fileExists;
}

} // namespace Benchmarks
