// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_VFSSCENE_H
#define VEYFM_TESTS_VFSSCENE_H

#include "core/entry.h"
#include "support/makeentry.h"

#include <QByteArray>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QList>
#include <QTemporaryDir>

#include <filesystem>
#include <system_error>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

inline QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

/**
 * A folder of its own with a user's home in it. To be constructed before the first VFS::ptr(),
 * since the tree takes Home, Desktop and Trash from the environment.
 */
class VfsScene
{
public:
    VfsScene()
        : m_root(QFileInfo(m_dir.path()).canonicalFilePath())
    {
        // Also for tests that go on without privileges.
        ::chmod(QFile::encodeName(m_root).constData(), 0755);
        for (const char* name : {"home/Desktop", "home/Documents", "home/.config", "work"}) {
            QDir(m_root).mkpath(QString::fromUtf8(name));
        }
        qputenv("HOME", QFile::encodeName(home()));
        qputenv("XDG_CONFIG_HOME", QFile::encodeName(home() + text("/.config")));
        qputenv("XDG_DATA_HOME", QFile::encodeName(home() + text("/.local/share")));
    }
    ~VfsScene()
    {
        for (const QByteArray& path : m_closed) {
            ::chmod(path.constData(), 0755);
        }
        // QTemporaryDir can't remove names that are no text.
        std::error_code error;
        std::filesystem::remove_all(QFile::encodeName(m_root).toStdString(), error);
    }
    VfsScene(const VfsScene&) = delete;
    VfsScene& operator=(const VfsScene&) = delete;

    QString root() const
    {
        return m_root;
    }

    QString home() const
    {
        return m_root + text("/home");
    }

    /// The absolute path of something in the folder.
    QString path(const QString& relative) const
    {
        return m_root + QLatin1Char('/') + relative;
    }
    QString path(const char* relative) const
    {
        return path(QString::fromUtf8(relative));
    }

    /// A path as the system takes it, for names that are no text.
    QByteArray bytes(const QByteArray& relative) const
    {
        return QFile::encodeName(m_root) + '/' + relative;
    }

    bool makeDir(const QByteArray& relative) const
    {
        return ::mkdir(bytes(relative).constData(), 0755) == 0;
    }

    bool makeFile(const QByteArray& relative) const
    {
        const int fd = ::open(bytes(relative).constData(), O_CREAT | O_EXCL | O_WRONLY, 0644);
        return fd >= 0 && ::close(fd) == 0;
    }

    bool makeFifo(const QByteArray& relative) const
    {
        return ::mkfifo(bytes(relative).constData(), 0644) == 0;
    }

    /// The target is taken as it is: relative to the link, or absolute.
    bool makeLink(const QByteArray& target, const QByteArray& relative) const
    {
        return ::symlink(target.constData(), bytes(relative).constData()) == 0;
    }

    /// Takes rights from a directory until the end of the test.
    bool closeDir(const QByteArray& relative, mode_t mode = 0000)
    {
        m_closed.append(bytes(relative));
        return ::chmod(bytes(relative).constData(), mode) == 0;
    }

    /// A chain of links "<name>1" to "<name><count>", the last of which leads to the target.
    bool makeChain(const QByteArray& target, const QByteArray& name, int count) const
    {
        const QByteArray last = name.mid(name.lastIndexOf('/') + 1);
        bool ok = makeLink(target, name + QByteArray::number(count));
        for (int i = count - 1; i >= 1; --i) {
            ok = ok && makeLink(last + QByteArray::number(i + 1), name + QByteArray::number(i));
        }
        return ok;
    }

private:
    QTemporaryDir m_dir;
    QString m_root;
    QList<QByteArray> m_closed;
};

/// Goes on as a user who may not read what others closed, where the test runs as root.
class Unprivileged
{
public:
    Unprivileged()
        : m_wasRoot(::geteuid() == 0)
    {
        m_isDropped = !m_wasRoot || ::seteuid(65534) == 0;
    }
    ~Unprivileged()
    {
        if (m_wasRoot && ::seteuid(0) != 0) {
            ::_exit(99);
        }
    }
    Unprivileged(const Unprivileged&) = delete;
    Unprivileged& operator=(const Unprivileged&) = delete;

    bool isDropped() const
    {
        return m_isDropped;
    }

private:
    const bool m_wasRoot;
    bool m_isDropped = false;
};

#endif
