// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// veyfm-vfs-client: a process that uses the library, for tests that need more than one, or the end
// of one. It says "ready" when the tree stands, then "reset PATH" for each reset that its watcher
// tells of, and takes commands, a line each:
//   notify PATH   tells all processes of the entry; answers "notified"
//   childs PATH   answers "childs" and the paths of the children behind blanks
//   quit          returns from main
// The end of the input is "quit" as well. A number as argument is for VFS::setServiceProbe().

#include "vfs/vfs.h"
#include "watch/entrywatcher.h"

#include <QCoreApplication>
#include <QSocketNotifier>

#include <cstdio>
#include <cstdlib>

#include <unistd.h>

using namespace VeyFM;

namespace {

void say(const QString& line)
{
    std::fputs(qPrintable(line + QLatin1Char('\n')), stdout);
    std::fflush(stdout);
}

void obey(const QString& line)
{
    const QString command = line.section(QLatin1Char(' '), 0, 0);
    const QString path = line.section(QLatin1Char(' '), 1);
    VFS* const vfs = VFS::ptr();
    if (command == QLatin1String("notify")) {
        vfs->notifyAllWatchers(EntryList(vfs->entry(path)));
        say(QStringLiteral("notified"));
    } else if (command == QLatin1String("childs")) {
        const QStringList paths = vfs->childs(vfs->entry(path)).paths();
        say(QStringLiteral("childs ") + paths.join(QLatin1Char(' ')));
    } else if (command == QLatin1String("quit")) {
        QCoreApplication::quit();
    }
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    VFS::initialize();
    if (argc > 1) {
        VFS::setServiceProbe(std::atoi(argv[1]));
    }
    QObject::connect(VFS::ptr()->entryWatcher(), &EntryWatcher::entryReset, [](const Entry& entry) {
        say(QStringLiteral("reset ") + entry.path());
    });

    QSocketNotifier input(STDIN_FILENO, QSocketNotifier::Read);
    QByteArray pending;
    QObject::connect(&input, &QSocketNotifier::activated, [&] {
        char buffer[4096];
        const ssize_t size = ::read(STDIN_FILENO, buffer, sizeof(buffer));
        if (size <= 0) {
            QCoreApplication::quit();
            return;
        }
        pending.append(buffer, int(size));
        for (int end = pending.indexOf('\n'); end >= 0; end = pending.indexOf('\n')) {
            const QString line = QString::fromLocal8Bit(pending.left(end));
            pending.remove(0, end + 1);
            obey(line);
        }
    });
    say(QStringLiteral("ready"));
    return app.exec();
}
