// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_TEMPORARYTREE_H
#define VEYFM_TESTS_TEMPORARYTREE_H

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

#include <cstdio>

#include <unistd.h>

/// A folder of its own, by its real path, and what may happen in it.
class TemporaryTree
{
public:
    TemporaryTree()
        : m_root(QFileInfo(m_dir.path()).canonicalFilePath())
    {
    }

    QString path() const
    {
        return m_root;
    }

    QString path(const char* relative) const
    {
        return m_root + QLatin1Char('/') + QString::fromUtf8(relative);
    }

    QByteArray bytes(const char* relative) const
    {
        return QFile::encodeName(path(relative));
    }

    bool makeDir(const char* relative) const
    {
        return QDir().mkpath(path(relative));
    }

    /// Appends. An existing file is reported by the kernel as written, and as nothing else.
    bool write(const char* relative, const QByteArray& content = "x") const
    {
        QFile file(path(relative));
        return file.open(QIODevice::Append) && file.write(content) == content.size();
    }

    /// The target is taken as it is: relative to the link, or absolute.
    bool makeLink(const QByteArray& target, const char* relative) const
    {
        return ::symlink(target.constData(), bytes(relative).constData()) == 0;
    }

    bool rename(const char* from, const char* to) const
    {
        return std::rename(bytes(from).constData(), bytes(to).constData()) == 0;
    }

    /// A file, a link or an empty folder.
    bool remove(const char* relative) const
    {
        return std::remove(bytes(relative).constData()) == 0;
    }

private:
    QTemporaryDir m_dir;
    QString m_root;
};

#endif
