// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountholders.h"

#include <QByteArray>
#include <QFile>

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <vector>

#include <dirent.h>
#include <unistd.h>

namespace VeyFM {
namespace Host {

namespace {

/// The names in a directory, in any order.
std::vector<QByteArray> namesIn(const QByteArray& directory)
{
    std::vector<QByteArray> names;
    DIR* const stream = ::opendir(directory.constData());
    if (!stream) {
        return names; // Of another user, or ended.
    }
    while (const dirent* const entry = ::readdir(stream)) {
        if (entry->d_name[0] != '.') {
            names.emplace_back(entry->d_name);
        }
    }
    ::closedir(stream);
    return names;
}

class Search
{
public:
    explicit Search(const QString& directory)
        : m_directory(QFile::encodeName(directory))
        , m_below(m_directory + '/')
    {
    }

    /// The kernel tells the names of what is open without a look at it.
    bool isHeldBy(const QByteArray& process) const
    {
        for (const char* link : {"/cwd", "/root", "/exe"}) {
            if (leadsIn(process + link)) {
                return true;
            }
        }
        const QByteArray files = process + "/fd";
        for (const QByteArray& name : namesIn(files)) {
            if (leadsIn(files + '/' + name)) {
                return true;
            }
        }
        return maps(process);
    }

private:
    bool isIn(const QByteArray& path) const
    {
        return path == m_directory || path.startsWith(m_below);
    }

    bool leadsIn(const QByteArray& link) const
    {
        char target[PATH_MAX];
        const ssize_t size = ::readlink(link.constData(), target, sizeof(target));
        return size > 0 && isIn(QByteArray::fromRawData(target, int(size)));
    }

    /// "7f00-7f01 r-xp 00000000 08:01 42    /path/of/the/file"
    bool maps(const QByteArray& process) const
    {
        QFile file(QFile::decodeName(process + "/maps"));
        if (!file.open(QIODevice::ReadOnly)) {
            return false;
        }
        const QList<QByteArray> lines = file.readAll().split('\n');
        return std::any_of(lines.begin(), lines.end(), [this](const QByteArray& line) {
            const int path = line.indexOf('/');
            return path >= 0 && isIn(line.mid(path));
        });
    }

    const QByteArray m_directory;
    const QByteArray m_below;
};

/// A process may call itself anything.
QString nameOf(const QByteArray& process)
{
    QFile file(QFile::decodeName(process + "/comm"));
    QString name;
    if (file.open(QIODevice::ReadOnly)) {
        name = QString::fromUtf8(file.readAll()).trimmed();
    }
    for (QChar& c : name) {
        if (!c.isPrint()) {
            c = QLatin1Char('?');
        }
    }
    return name;
}

} // namespace

QStringList mountHolders(const QString& directory)
{
    const Search search(directory);
    std::vector<int> found;
    for (const QByteArray& name : namesIn("/proc")) {
        const int id = std::atoi(name.constData());
        if (id > 0 && search.isHeldBy("/proc/" + name)) {
            found.push_back(id);
        }
    }
    std::sort(found.begin(), found.end());
    QStringList holders;
    for (const int id : found) {
        const QString name = nameOf("/proc/" + QByteArray::number(id));
        holders.append(QStringLiteral("%1 (%2)").arg(name).arg(id));
    }
    return holders;
}

} // namespace Host
} // namespace VeyFM
