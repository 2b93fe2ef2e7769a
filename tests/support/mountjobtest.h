// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_MOUNTJOBTEST_H
#define VEYFM_TESTS_MOUNTJOBTEST_H

#include "core/fuse.h"
#include "jobs/job.h"
#include "support/scriptedauthenticator.h"
#include "support/standin.h"
#include "support/vfsscene.h"
#include "support/vfstest.h"

#include <QSignalSpy>
#include <QTest>

#include <memory>

/// The base of tests of jobs that run a tool and talk to the service, in a home of their own.
class MountJobTest : public VfsTest
{
protected:
    using Auth = ScriptedAuthenticator;

    /// For initTestCase(), as its last act: without the group "fuse" all tests are skipped.
    void startVfsInGroup(const QByteArray& script)
    {
        if (!VeyFM::Fuse::isInFuseGroup()) {
            QSKIP("needs root, or a user in the group \"fuse\"");
        }
        QVERIFY2(startVfs(script), qPrintable(service.errorString()));
    }

    /// For init() of each test.
    void startScene(const QByteArray& toolName)
    {
        tool.reset(); // The next one builds on the PATH that this one puts back.
        tool = std::make_unique<StandIn>(toolName);
        auth = QSharedPointer<ScriptedAuthenticator>::create();
        setFuseMounts({});
        service->setValue(u"NetworkMountsManager.mounts"_s, QJsonObject());
        service->takeCalls();
    }

    /// For cleanup() of each test: every run that was expected came, and no other, and every
    /// answer was asked for. What was made below the root of all mounts goes.
    void endScene()
    {
        QDir(mountDir(QString())).removeRecursively();
        QCOMPARE(tool->runs(), tool->expected());
        QVERIFY(auth->answers.isEmpty());
        QVERIFY(auth->questionAnswers.isEmpty());
        tool.reset();
    }

    template <typename MadeJob>
    std::unique_ptr<MadeJob> makeJob(const QString& url)
    {
        auto job = std::make_unique<MadeJob>(auth, url);
        job->setDeleteOnFinish(false);
        return job;
    }

    /// Runs a job to its end, which comes once.
    static void finish(VeyFM::Job* job)
    {
        QSignalSpy finished(job, &VeyFM::Job::finished);
        job->start();
        QVERIFY(finished.count() == 1 || finished.wait(20000));
        QCOMPARE(finished.count(), 1);
    }

    /// The same for a job that ends inside start().
    static void startToEnd(VeyFM::Job* job)
    {
        QSignalSpy finished(job, &VeyFM::Job::finished);
        job->start();
        QCOMPARE(finished.count(), 1);
    }

    void setFuseMounts(const QJsonObject& mounts)
    {
        service->setValue(u"FuseMountsManager.mounts"_s, mounts);
    }

    /// What was asked of an interface since the last call.
    QStringList calls(const QString& interface)
    {
        return service->takeCalls().filter(interface + QLatin1Char('.'));
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
    QString mountDir(const QString& relative) const
    {
        return scene.home() + u"/.vey-fm-vfs"_s + relative;
    }

    bool isMountDir(const QString& relative) const
    {
        return QFileInfo(mountDir(relative)).isDir();
    }

    /// Makes a directory as mounts have them, with a file in it, whose path it returns.
    QString makeFileInMountDir(const QString& relative) const
    {
        QFile file(mountDir(relative) + u"/file"_s);
        if (!QDir().mkpath(mountDir(relative)) || !file.open(QIODevice::WriteOnly)) {
            qFatal("can't write %s", qPrintable(file.fileName()));
        }
        return file.fileName();
    }

    VfsScene scene;
    std::unique_ptr<StandIn> tool;
    QSharedPointer<ScriptedAuthenticator> auth;
};

#endif
