// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountinfo.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <algorithm>

namespace VeyFM {
namespace Host {

namespace {

const QLatin1Char slash('/');

bool isOctal(char c)
{
    return c >= '0' && c <= '7';
}

/// Blanks, tabs, line breaks and backslashes come as "\040" and so on.
QString unescaped(const QByteArray& field)
{
    QByteArray bytes;
    for (int i = 0; i < field.size(); ++i) {
        const bool isEscape = field.at(i) == '\\' && i + 3 < field.size() &&
                              isOctal(field.at(i + 1)) && isOctal(field.at(i + 2)) &&
                              isOctal(field.at(i + 3));
        if (isEscape) {
            bytes += char(field.mid(i + 1, 3).toInt(nullptr, 8));
            i += 3;
        } else {
            bytes += field.at(i);
        }
    }
    return QFile::decodeName(bytes);
}

} // namespace

bool KernelMount::isFuse() const
{
    return type == QLatin1String("fuse") || type.startsWith(QLatin1String("fuse."));
}

MountInfo MountInfo::read()
{
    QFile file(QStringLiteral("/proc/self/mountinfo"));
    if (file.open(QIODevice::ReadOnly)) {
        return MountInfo(file.readAll());
    }
    MountInfo nothing{QByteArray()};
    nothing.m_why = QStringLiteral("%1: %2").arg(file.fileName(), file.errorString());
    return nothing;
}

MountInfo::MountInfo(const QByteArray& text)
{
    // "36 35 98:0 /root /directory options [optional]... - type source super-options"
    const QList<QByteArray> lines = text.split('\n');
    for (const QByteArray& line : lines) {
        const QList<QByteArray> fields = line.split(' ');
        const int separator = fields.indexOf(QByteArrayLiteral("-"), 6);
        if (separator < 0 || separator + 2 >= fields.size()) {
            continue;
        }
        m_mounts.append(
            {unescaped(fields.at(4)), unescaped(fields.at(separator + 1)),
             unescaped(fields.at(separator + 2)), fields.at(0).toInt()});
    }
}

QString MountInfo::why() const
{
    return m_why;
}

QVector<KernelMount> MountInfo::mounts() const
{
    return m_mounts;
}

bool MountInfo::isMountPoint(const QString& directory) const
{
    return std::any_of(m_mounts.begin(), m_mounts.end(), [&](const KernelMount& mount) {
        return mount.directory == directory;
    });
}

QString kernelPath(const QString& directory, const QString& root)
{
    const QString path = QDir::cleanPath(directory);
    if (!(path + slash).startsWith(root + slash)) {
        return path;
    }
    // Above a directory that is not there yet the links are the same as they will be.
    const int schemeEnd = path.indexOf(slash, root.size() + 1);
    int end = schemeEnd < 0 ? root.size() : schemeEnd;
    while (end > 0) {
        const QString canonical = QFileInfo(path.left(end)).canonicalFilePath();
        if (!canonical.isEmpty()) {
            return canonical + path.mid(end);
        }
        end = path.lastIndexOf(slash, end - 1);
    }
    return path;
}

} // namespace Host
} // namespace VeyFM
