// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_STARTUPPROBE_H
#define VEYFM_TESTS_STARTUPPROBE_H

#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"
#include "watch/entrywatcher.h"

#include <QCoreApplication>
#include <QEvent>
#include <QThread>
#include <QTranslator>

#include <atomic>
#include <cstdio>
#include <set>
#include <thread>
#include <vector>

#include <unistd.h>

// A process that starts one VFS and tells what it looks like, one "topic=answer" a line.

inline void say(const QString& topic, const QString& answer)
{
    std::printf("%s=%s\n", topic.toUtf8().constData(), answer.toUtf8().constData());
}

inline void say(const char* topic, bool answer)
{
    say(QString::fromUtf8(topic), answer ? QStringLiteral("yes") : QStringLiteral("no"));
}

inline QString pathOrNull(const VeyFM::Entry& entry)
{
    return entry.isNull() ? QStringLiteral("null") : entry.path();
}

inline void sayTree()
{
    using namespace VeyFM;
    VFS* const vfs = VFS::ptr();
    const VFSPlaceBase* const tree = vfs->placeBase();
    const std::vector<std::pair<const char*, Entry>> entries{
        {"root", vfs->rootEntry()},
        {"places", vfs->placesEntry()},
        {"computer", vfs->computerEntry()},
        {"favourites", vfs->favouritesEntry()},
        {"storageDevices", vfs->storageDevicesEntry()},
        {"desktop", vfs->desktopEntry()},
        {"trash", vfs->trashEntry()},
        {"home", vfs->homeEntry()},
        {"fileSystem", vfs->fileSystemEntry()},
        {"network", vfs->networkEntry()},
        {"sambaNetwork", vfs->sambaNetworkEntry()},
        {"ftpNetwork", vfs->ftpNetworkEntry()},
        {"sftpNetwork", vfs->sftpNetworkEntry()},
        {"documents", vfs->documentsEntry()},
    };
    for (const auto& named : entries) {
        const QString name = QString::fromUtf8(named.first);
        const Entry& entry = named.second;
        say(name, entry.isNull() ? QStringLiteral("null")
                                 : QStringLiteral("%1|%2|%3")
                                       .arg(entry.path())
                                       .arg(entry.type())
                                       .arg(entry.localPath()));
        say(qPrintable(name + QStringLiteral(" has children")), tree->hasChilds(entry));
        say(QStringLiteral("parent of ") + name, pathOrNull(vfs->parent(entry)));
        // To look at these two would fill them.
        if (name != QLatin1String("storageDevices") && name != QLatin1String("sambaNetwork")) {
            say(QStringLiteral("children of ") + name,
                tree->childEntries(entry).paths().join(QLatin1Char(',')));
        }
    }
    QStringList network;
    for (const char* name : {"Network", "Samba", "FTP", "SFTP"}) {
        if (tree->hasPlace(QString::fromUtf8(name))) {
            network.append(QString::fromUtf8(name));
        }
    }
    say(QStringLiteral("network places in the tree"), network.join(QLatin1Char(',')));
    say("documents is a place", tree->hasPlace(vfs->documentsEntry()));
    for (const char* url :
         {"vey-fm:Home", "vey-fm:Favourites",
          "vey-fm:\xC3\xBC"
          "Favourites"}) {
        say(QString::fromUtf8(url), pathOrNull(vfs->entry(QString::fromUtf8(url))));
    }
}

/// Puts a letter of its own before each text of VFS, and touches no other.
class MarkingTranslator : public QTranslator
{
public:
    QString translate(const char* context, const char* source, const char*, int) const override
    {
        return qstrcmp(context, "VeyFM::VFS") == 0 ? QChar(0xFC) + QString::fromUtf8(source)
                                                   : QString();
    }
    bool isEmpty() const override
    {
        return false;
    }
};

class LanguageChanges : public QObject
{
public:
    int count = 0;

    bool eventFilter(QObject*, QEvent* event) override
    {
        count += event->type() == QEvent::LanguageChange;
        return false;
    }
};

inline void sayInitialize()
{
    using namespace VeyFM;
    const auto translators = [] {
        return QString::number(QCoreApplication::instance()->findChildren<QTranslator*>().size());
    };
    say("Entry is known by its short name", QMetaType::type("Entry") == qMetaTypeId<Entry>());
    say(QStringLiteral("translators after the first call"), translators());
    LanguageChanges changes;
    QCoreApplication::instance()->installEventFilter(&changes);
    VFS::initialize();
    VFS::initialize();
    say(QStringLiteral("translators after the third call"), translators());
    say(QStringLiteral("language changes of the later calls"), QString::number(changes.count));
}

inline void sayObjects()
{
    using namespace VeyFM;
    VFS* const vfs = VFS::ptr();
    say("vfs has a parent", static_cast<QObject*>(vfs)->parent() != nullptr);
    say("watcher belongs to vfs", vfs->entryWatcher()->parent() == vfs);
    say("vfs lives in the main thread", vfs->thread() == QThread::currentThread());
    say("const and plain access meet",
        qAsConst(*vfs).settings() == vfs->settings() && vfs->settings() &&
            qAsConst(*vfs).placeBase() == vfs->placeBase() && vfs->placeBase());
    vfs->placeBase()->setPlaceLocalPath(vfs->homeEntry(), QStringLiteral("/elsewhere"));
    say("home entry follows the tree", vfs->homeEntry().localPath() == QLatin1String("/elsewhere"));
}

inline void sayThreads(bool mainIsFirst)
{
    using namespace VeyFM;
    if (mainIsFirst) {
        VFS::ptr();
    }
    constexpr int count = 8;
    std::vector<VFS*> seen(count);
    std::atomic<int> waiting{count};
    std::vector<std::thread> threads;
    for (int i = 0; i < count; ++i) {
        threads.emplace_back([&seen, &waiting, i] {
            --waiting;
            while (waiting > 0) {
                std::this_thread::yield();
            }
            seen[size_t(i)] = VFS::ptr();
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    const std::set<VFS*> objects(seen.begin(), seen.end());
    say(QStringLiteral("objects"), QString::number(objects.size()));
    say("vfs lives in the main thread", VFS::ptr()->thread() == QThread::currentThread());
    say(QStringLiteral("root"), QStringLiteral("%1|%2|")
                                    .arg(VFS::ptr()->rootEntry().path())
                                    .arg(VFS::ptr()->rootEntry().type()));
}

inline int startupProbe(int argc, char** argv, const char* modeName)
{
    using namespace VeyFM;
    // A start that hangs ends, and is told from one that is slow.
    ::alarm(20);
    std::setvbuf(stdout, nullptr, _IOLBF, 0);
    const QByteArray mode(modeName);
    {
        QCoreApplication application(argc, argv);
        MarkingTranslator translator;
        if (mode == "translated") {
            QCoreApplication::installTranslator(&translator);
        }
        VFS::initialize();
        if (mode == "tree" || mode == "translated") {
            sayTree();
        } else if (mode == "translated too late") {
            VFS::ptr();
            QCoreApplication::installTranslator(&translator);
            sayTree();
        } else if (mode == "initialize") {
            sayInitialize();
        } else if (mode == "objects") {
            sayObjects();
        } else if (mode == "threads") {
            sayThreads(true);
        } else if (mode == "first call by many threads") {
            sayThreads(false);
        } else if (mode == "exit") {
            QObject::connect(
                VFS::ptr(), &QObject::destroyed, [] { std::printf("vfs destroyed\n"); });
            VFS::ptr()->entryWatcher()->addEntry(VFS::ptr()->homeEntry());
        } else {
            return 2;
        }
    }
    std::printf("application ended\n");
    return 0;
}

#endif
