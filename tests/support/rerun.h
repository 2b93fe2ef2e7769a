// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_RERUN_H
#define VEYFM_TESTS_RERUN_H

#include <QCoreApplication>
#include <QProcess>
#include <QStringList>
#include <QTest>

#include <cstdio>
#include <cstring>

/**
 * There is one VFS in a process. Tests that need another one, with another environment or other
 * settings, run this program again with an argument, on which main() picks another set of tests.
 *
 * Returns whether all of them passed; if not, what they printed goes to the log. What they skip is
 * told as if this run did, so that it is counted.
 */
inline bool rerunPasses(const char* argument)
{
    QProcess process;
    process.setProcessChannelMode(QProcess::MergedChannels);
    process.start(QCoreApplication::applicationFilePath(), {QString::fromLatin1(argument)});
    if (!process.waitForFinished(60000)) {
        process.kill();
        process.waitForFinished();
        qWarning("%s did not end", argument);
        return false;
    }
    const QByteArray output = process.readAll();
    if (process.exitStatus() != QProcess::NormalExit || process.exitCode() != 0) {
        qWarning("%s", output.constData());
        return false;
    }
    for (const QByteArray& line : output.split('\n')) {
        if (line.startsWith("SKIP   :")) {
            std::printf("%s\n", line.constData());
        }
    }
    return true;
}

/// Whether main() was started by rerunPasses() with this argument.
inline bool isRerun(int argc, char** argv, const char* argument)
{
    return argc > 1 && std::strcmp(argv[1], argument) == 0;
}

/// Runs the other set of tests, without the argument, which QtTest would not know.
template <typename Tests>
int runTests(char** argv)
{
    Tests tests;
    return QTest::qExec(&tests, QStringList{QString::fromLocal8Bit(argv[0])});
}

#endif
