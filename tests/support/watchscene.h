// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_WATCHSCENE_H
#define VEYFM_TESTS_WATCHSCENE_H

#include "watch/inotifywatcher.h"

#include <QDir>
#include <QFile>
#include <QStringList>
#include <QTemporaryDir>

#include <cstdio>
#include <memory>

#include <unistd.h>

/**
 * A folder of its own and a watcher whose signals are written down in order, one text each:
 * "created dir|name", with paths relative to the folder. Kernel events are waiting as soon as the
 * call that caused them has returned, so process() makes a test independent of time.
 */
class WatchScene
{
public:
    WatchScene()
    {
        using VeyFM::InotifyWatcher;
        InotifyWatcher* w = watcher.get();
        QObject::connect(w, &InotifyWatcher::pathUnregistered, w, [this](const QString& path) {
            note("unregistered", path);
        });
        connectPair(&InotifyWatcher::pathCreated, "created");
        connectPair(&InotifyWatcher::pathDeleted, "deleted");
        connectPair(&InotifyWatcher::pathChanged, "changed");
        connectPair(&InotifyWatcher::pathAttributesChanged, "attributes");
    }

    QString path(const char* relative) const
    {
        return m_dir.path() + QLatin1Char('/') + QLatin1String(relative);
    }

    bool add(const char* relative)
    {
        return watcher->addPath(path(relative));
    }

    bool remove(const char* relative)
    {
        return watcher->removePath(path(relative));
    }

    bool isRegistered(const char* relative) const
    {
        return watcher->isPathRegistered(path(relative));
    }

    bool isLinkRegistered(const char* relative) const
    {
        return watcher->isSymlinkRegistered(path(relative));
    }

    // Changes on the disk. @{
    bool makeDir(const char* relative) const
    {
        return QDir().mkdir(path(relative));
    }

    bool removeDir(const char* relative) const
    {
        return QDir().rmdir(path(relative));
    }

    bool makeLink(const char* target, const char* relative) const
    {
        return symlink(
                   QFile::encodeName(path(target)).constData(),
                   QFile::encodeName(path(relative)).constData()) == 0;
    }

    /// Creates the file if need be. An existing file gets IN_CLOSE_WRITE alone.
    bool write(const char* relative) const
    {
        QFile file(path(relative));
        return file.open(QIODevice::Append) && file.write("x") == 1;
    }

    bool unlink(const char* relative) const
    {
        return ::unlink(QFile::encodeName(path(relative)).constData()) == 0;
    }

    bool rename(const char* from, const char* to) const
    {
        return ::rename(
                   QFile::encodeName(path(from)).constData(),
                   QFile::encodeName(path(to)).constData()) == 0;
    }

    bool changeMode(const char* relative, QFile::Permissions permissions) const
    {
        return QFile::setPermissions(path(relative), permissions);
    }
    // @}

    /// Calls a private slot by its name.
    bool call(const char* slot)
    {
        return QMetaObject::invokeMethod(watcher.get(), slot, Qt::DirectConnection);
    }

    bool process()
    {
        return call("processInotifyMessages");
    }

    /// What was reported since the last time.
    QStringList takeLog()
    {
        QStringList result;
        result.swap(log);
        return result;
    }

    /// Processes what is waiting, then takes the log.
    QStringList processedLog()
    {
        return process() ? takeLog() : QStringList{QStringLiteral("no such slot")};
    }

    /// Leaves out the metadata news: unlinking a watched link changes its link count first.
    QStringList processedLogWithoutAttributes()
    {
        QStringList result;
        const QStringList all = processedLog();
        for (const QString& line : all) {
            if (!line.startsWith(QLatin1String("attributes"))) {
                result.append(line);
            }
        }
        return result;
    }

    /// The masks of all watches that the kernel holds for this process.
    static QStringList kernelWatches()
    {
        QStringList masks;
        const QDir infos(QStringLiteral("/proc/self/fdinfo"));
        const QStringList names = infos.entryList(QDir::Files);
        for (const QString& name : names) {
            QFile info(infos.filePath(name));
            if (!info.open(QIODevice::ReadOnly)) {
                continue;
            }
            const QList<QByteArray> lines = info.readAll().split('\n');
            for (const QByteArray& line : lines) {
                const int mask = line.indexOf(" mask:");
                if (line.startsWith("inotify ") && mask != -1) {
                    const QByteArray rest = line.mid(mask + 6);
                    masks.append(QString::fromLatin1(rest.left(rest.indexOf(' '))));
                }
            }
        }
        return masks;
    }

    static int kernelWatchCount()
    {
        return kernelWatches().size();
    }

    QStringList log;

private:
    using Signal = void (VeyFM::InotifyWatcher::*)(const QString&, const QString&);

    void connectPair(Signal signal, const char* name)
    {
        QObject::connect(
            watcher.get(), signal, watcher.get(),
            [this, name](const QString& path, const QString& fileName) {
                note(name, path + QLatin1Char('|') + fileName);
            });
    }

    void note(const char* name, QString path)
    {
        if (path.startsWith(m_dir.path() + QLatin1Char('/'))) {
            path.remove(0, m_dir.path().size() + 1);
        }
        log.append(QLatin1String(name) + QLatin1Char(' ') + path);
    }

    QTemporaryDir m_dir;

public:
    // Behind what its signals are written to, so that it goes first.
    std::unique_ptr<VeyFM::InotifyWatcher> watcher = std::make_unique<VeyFM::InotifyWatcher>();
};

/// A list of expected texts.
inline QStringList lines(std::initializer_list<const char*> texts)
{
    QStringList result;
    for (const char* text : texts) {
        result.append(QString::fromUtf8(text));
    }
    return result;
}

#endif
