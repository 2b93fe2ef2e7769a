// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_REALMOUNTTEST_H
#define VEYFM_TESTS_REALMOUNTTEST_H

#include "jobs/job.h"
#include "real/sandbox.h"
#include "real/secretwatch.h"
#include "support/scriptedauthenticator.h"
#include "support/vfstest.h"

#include <QDir>
#include <QProcess>
#include <QSignalSpy>
#include <QTest>

#include <memory>

/// Processes of the sandbox by the name of their program.
inline QList<int> processesNamed(const char* name)
{
    QList<int> result;
    const QDir processes(u"/proc"_s);
    const QStringList ids = processes.entryList({u"[0-9]*"_s}, QDir::Dirs);
    for (const QString& id : ids) {
        QFile file(processes.filePath(id + u"/comm"_s));
        if (file.open(QIODevice::ReadOnly) && file.readAll().trimmed() == name) {
            result.append(id.toInt());
        }
    }
    return result;
}

/// The words of a process, each with a NUL behind it.
inline QByteArray commandLine(int process)
{
    QFile file(u"/proc/%1/cmdline"_s.arg(process));
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

inline QByteArray fileContents(const QString& path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray("unreadable");
}

/// The base of tests of jobs in a sandbox, with real tools and a scripted service that remembers
/// what is mounted.
class RealMountTest : public VfsTest
{
protected:
    using Auth = ScriptedAuthenticator;

    static Auth::Answer password(const SandboxAccount& account)
    {
        return Auth::password(QString::fromLatin1(account.password));
    }
    static Auth::Answer wrongPassword()
    {
        return Auth::password(QString::fromLatin1(Sandbox::wrongPassword));
    }

    /// For init() of each test.
    void startScene()
    {
        auth = QSharedPointer<ScriptedAuthenticator>::create();
        service->setValue(u"FuseMountsManager.mounts"_s, QJsonObject());
        service->setValue(u"NetworkMountsManager.mounts"_s, QJsonObject());
        service->takeCalls();
    }

    /// For cleanup() of each test: every answer was asked for, no password was seen, and all
    /// mounts can be taken away and leave nothing.
    void endScene()
    {
        const QStringList mounted = mountDirs();
        for (const QString& directory : mounted) {
            QCOMPARE(QProcess::execute(u"fusermount3"_s, {u"-u"_s, directory}), 0);
            QVERIFY(QDir().rmdir(directory));
        }
        QCOMPARE(mountDirs(), QStringList());
        QCOMPARE(SecretWatch::takeFindings(), QStringList());
        QCOMPARE(SecretWatch::findFiles(), QStringList());
        QVERIFY(auth->answers.isEmpty());
        QVERIFY(auth->questionAnswers.isEmpty());
        QCOMPARE(service->violations(), QStringList());
    }

    template <typename MadeJob>
    std::unique_ptr<MadeJob> makeJob(const QString& url)
    {
        auto job = std::make_unique<MadeJob>(auth, url);
        job->setDeleteOnFinish(false);
        return job;
    }

    /// What was recorded as mounted since the last call.
    QStringList recordedMounts()
    {
        return service->takeCalls().filter(u"FuseMountsManager.addMount"_s);
    }

    static QString recordedMount(const QString& url, const QString& path)
    {
        return u"FuseMountsManager.addMount[\"%1\",\"%2\"]"_s.arg(url, path);
    }

    /// Something below the root of all mounts; it begins with a slash.
    static QString mountDir(const QString& relative)
    {
        return QDir::homePath() + u"/.vey-fm-vfs"_s + relative;
    }

    /// Where something is mounted below that root, as the kernel has it.
    static QStringList mountDirs()
    {
        QStringList result;
        const QList<QByteArray> lines = fileContents(u"/proc/self/mounts"_s).split('\n');
        for (const QByteArray& line : lines) {
            const QString directory = QFile::decodeName(line.split(' ').value(1));
            if (directory.startsWith(mountDir(u"/"_s))) {
                result.append(directory);
            }
        }
        result.sort();
        return result;
    }

    QSharedPointer<ScriptedAuthenticator> auth;
};

#endif
