// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/directories.h"

#include <QString>

#include <cstdio>
#include <cstdlib>

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/vfs.h>
#include <unistd.h>

namespace Benchmarks {

namespace {

constexpr int entriesPerLink = 20;

void require(bool done, const char* what)
{
    if (!done) {
        std::perror(what);
        std::exit(1);
    }
}

} // namespace

QByteArray fileSystemOf(const QByteArray& path)
{
    struct statfs status
    {
    };
    require(statfs(path.constData(), &status) == 0, "statfs");
    switch (status.f_type) {
    case 0x01021994:
        return "tmpfs";
    case 0xEF53:
        return "ext4";
    case 0x9123683E:
        return "btrfs";
    case 0x58465342:
        return "xfs";
    case 0x794C7630:
        return "overlayfs";
    }
    return QByteArray::number(qulonglong(status.f_type), 16);
}

FlatDirectory::FlatDirectory(const QByteArray& parent, int entries, int padding)
    : m_parent(std::make_unique<QTemporaryDir>(
          QString::fromLocal8Bit(parent) + QStringLiteral("/veyfm-XXXXXX")))
    , m_path(m_parent->path().toLocal8Bit() + "/flat")
    , m_entries(entries)
{
    require(mkdir(m_path.constData(), 0755) == 0, "mkdir");
    const int directory = open(m_path.constData(), O_RDONLY | O_DIRECTORY);
    require(directory >= 0, "open");
    const QByteArray suffix(padding, 'x');
    for (int i = 0; i < entries; ++i) {
        char name[256];
        std::snprintf(name, sizeof(name), "file-%07d%s.txt", i, suffix.constData());
        if (i % entriesPerLink == entriesPerLink - 1) {
            const char* target = i / entriesPerLink % 2 ? ".." : "file-0000000.txt";
            require(symlinkat(target, directory, name) == 0, "symlinkat");
        } else {
            require(mknodat(directory, name, S_IFREG | 0644, 0) == 0, "mknodat");
        }
    }
    close(directory);
}

FlatDirectory::~FlatDirectory() = default;

QByteArray FlatDirectory::path() const
{
    return m_path;
}

QByteArray FlatDirectory::parent() const
{
    return m_parent->path().toLocal8Bit();
}

int FlatDirectory::entries() const
{
    return m_entries;
}

int FlatDirectory::links() const
{
    return m_entries / entriesPerLink;
}

} // namespace Benchmarks
