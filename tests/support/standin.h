// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_STANDIN_H
#define VEYFM_TESTS_STANDIN_H

#include <QByteArray>
#include <QByteArrayList>
#include <QDir>
#include <QFile>
#include <QTemporaryDir>

/**
 * A tool that plays what the test says, first on PATH for as long as the object lives.
 *
 * Each expect() is one run, as lines:
 *
 *   out TEXT, err TEXT   prints; \n, \\ and \0 stand for what they do in C
 *   read                 takes a line from standard input
 *   echo on, echo off    switches the echo of the terminal
 *   drained              waits until all that it printed on standard error has been read
 *   block N              keeps a signal from ending it
 *   unblock N            no more
 *   await N              waits for a signal that it blocks
 *   hang                 waits for a signal that ends it
 *   fork                 starts a process that waits for a signal that ends it
 *   finish               runs a process that needs a third of a second; see hasFinished()
 *   mount                mounts a dead file system on the directory among its arguments
 *   serve PROGRAM ARGS   starts a program with that directory before its arguments, in the
 *                        background, and waits for the first that it prints
 *   kill N, exit N       ends
 *   interrupt            ends by a SIGINT, which veyfm-vfs gets first, as Ctrl-C is for both
 *
 * At the end of the lines it exits with 0. A run that nobody expects exits with 93, and shows in
 * runs() like any other.
 */
class StandIn
{
public:
    explicit StandIn(const QByteArray& tool)
        : m_tool(tool)
        , m_path(qgetenv("PATH"))
    {
        QDir(m_directory.path()).mkdir(QStringLiteral("bin"));
        QFile::link(
            QStringLiteral(VEYFM_STANDIN_PROGRAM),
            m_directory.filePath(QStringLiteral("bin/") + QString::fromLatin1(tool)));
        qputenv("PATH", m_directory.filePath(QStringLiteral("bin")).toLocal8Bit() + ':' + m_path);
        qputenv("VEYFM_STANDIN", m_directory.path().toLocal8Bit());
    }
    ~StandIn()
    {
        qputenv("PATH", m_path);
        qunsetenv("VEYFM_STANDIN");
    }
    StandIn(const StandIn&) = delete;
    StandIn& operator=(const StandIn&) = delete;

    /// Stands in for another tool too, which nobody expects to run.
    void alsoStandFor(const QByteArray& tool)
    {
        QFile::link(
            QStringLiteral(VEYFM_STANDIN_PROGRAM),
            m_directory.filePath(QStringLiteral("bin/") + QString::fromLatin1(tool)));
    }

    void expect(const QByteArrayList& lines)
    {
        QFile file(path(++m_expected, "play"));
        if (!file.open(QIODevice::WriteOnly)) {
            qFatal("%s", qPrintable(file.errorString()));
        }
        file.write(lines.join('\n') + '\n');
    }

    /// How often the tool was started.
    int runs() const
    {
        int run = 0;
        while (QFile::exists(path(run + 1, "args"))) {
            ++run;
        }
        return run;
    }

    /// The runs of all tools that this object stands for, as "tool.run".
    QStringList allRuns() const
    {
        QStringList all;
        const QStringList files =
            QDir(m_directory.path()).entryList({QStringLiteral("*.args")}, QDir::Files, QDir::Name);
        for (const QString& file : files) {
            all.append(file.chopped(5));
        }
        return all;
    }

    int expected() const
    {
        return m_expected;
    }

    /// The arguments of a run, counted from 1.
    QByteArrayList arguments(int run) const
    {
        return zeroTerminated(read(run, "args"));
    }

    QByteArrayList environment(int run) const
    {
        return zeroTerminated(read(run, "env"));
    }

    /// The process of a run; 0 before it has begun.
    qint64 processId(int run) const
    {
        return read(run, "pid").toLongLong();
    }

    /// What a run has read.
    QByteArray input(int run) const
    {
        return read(run, "input");
    }

    /// The signals that a run has awaited and got, a line each.
    QByteArray receivedSignals(int run) const
    {
        return read(run, "signals");
    }

    /// The command line as every user of the system could see it.
    QByteArray commandLine(int run) const
    {
        return read(run, "cmdline");
    }

    /// Whether the process that a run has started by "finish" got to its end.
    bool hasFinished(int run) const
    {
        return QFile::exists(path(run, "finished"));
    }

    /// The process that has started a run.
    qint64 parentId(int run) const
    {
        return status(run, "PPid:").toLongLong();
    }

    /// The process that a run has started by "fork"; 0 before it has.
    qint64 childId(int run) const
    {
        return read(run, "child").toLongLong();
    }

    /// The numbers of the open files that a run was given, its standard streams aside.
    QByteArrayList descriptors(int run) const
    {
        return zeroTerminated(read(run, "descriptors"));
    }

    /// A line of the status that the kernel gave of a run at its beginning, as in proc(5).
    QByteArray status(int run, const QByteArray& key) const
    {
        const QByteArrayList lines = read(run, "status").split('\n');
        for (const QByteArray& line : lines) {
            if (line.startsWith(key)) {
                return line.mid(key.size()).trimmed();
            }
        }
        return QByteArray();
    }

private:
    static QByteArrayList zeroTerminated(QByteArray bytes)
    {
        if (bytes.isEmpty()) {
            return {};
        }
        bytes.chop(1);
        return bytes.split('\0');
    }

    QString path(int run, const char* suffix) const
    {
        return m_directory.filePath(QStringLiteral("%1.%2.%3")
                                        .arg(
                                            QString::fromLatin1(m_tool), QString::number(run),
                                            QString::fromLatin1(suffix)));
    }

    QByteArray read(int run, const char* suffix) const
    {
        QFile file(path(run, suffix));
        return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
    }

    QTemporaryDir m_directory;
    const QByteArray m_tool;
    const QByteArray m_path;
    int m_expected = 0;
};

#endif
