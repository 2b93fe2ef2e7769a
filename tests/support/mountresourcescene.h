// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_MOUNTRESOURCESCENE_H
#define VEYFM_TESTS_MOUNTRESOURCESCENE_H

#include "host/mountresourcejob.h"
#include "support/loopgap.h"
#include "support/scriptedauthenticator.h"
#include "support/standin.h"
#include "support/vfsscene.h"
#include "support/vfstest.h"

#include <QSignalSpy>
#include <QTest>

#include <cerrno>
#include <csignal>
#include <memory>

#include <sys/wait.h>

/// What veyfm-mount says, as a stand-in for it plays it.
namespace Helper {

const QByteArray begin = R"(out {"say":"ready","version":1,"program":"standin 1"}\n)";

inline QByteArray line(const QByteArray& json)
{
    return "out " + json + "\\n";
}

inline QByteArray askPassword(int id = 1, const QByteArray& user = "anna", bool isRetry = false)
{
    return line(
        R"({"say":"question","id":)" + QByteArray::number(id) +
        R"(,"kind":"password","title":"T","message":"M","user":")" + user +
        R"(","protocol":"sftp","host":"server","domain":"","object":"","retry":)" +
        (isRetry ? "true}" : "false}"));
}

inline QByteArray askConfirmation(int id = 1)
{
    return line(
        R"({"say":"question","id":)" + QByteArray::number(id) +
        R"(,"kind":"confirm","title":"T","message":"fingerprint"})");
}

inline QByteArray fail(int code, const QByteArray& text)
{
    return line(
        R"({"say":"end","code":)" + QByteArray::number(code) + R"(,"text":")" + text + R"("})");
}

inline QByteArray succeed(
    const QByteArray& directory = "/mnt/server", const QByteArray& below = "/papers",
    bool isShared = false)
{
    return line(
        R"({"say":"end","code":0,"text":"","url":"sftp://anna@server/papers","path":"SFTP/anna@server)" +
        below + R"(","localPath":")" + directory + below + R"(","mounted":"new","directory":")" +
        directory + R"(","shared":)" + (isShared ? "true}" : R"(false,"why":"no service"})"));
}

const QByteArray mountRequest = R"({"do":"mount","url":"sftp://anna@server/papers","version":1})";

} // namespace Helper

/// The base of tests of MountResourceJob with a stand-in for the program that mounts.
class MountResourceTest : public VfsTest
{
protected:
    using Job = VeyFM::MountResourceJob;
    using Auth = ScriptedAuthenticator;

    /// For init() and cleanup() of each test. @{
    void startScene()
    {
        tool.reset();
        tool = std::make_unique<StandIn>("veyfm-mount");
        auth = QSharedPointer<ScriptedAuthenticator>::create();
        gap = std::make_unique<LoopGap>();
    }
    void endScene()
    {
        QVERIFY2(gap->largest() <= 50, qPrintable(QString::number(gap->largest())));
        QVERIFY(auth->answers.isEmpty());
        QVERIFY(auth->questionAnswers.isEmpty());
        // Nobody has to wait for what the job has started, or left alone.
        QTRY_COMPARE(tool->runs(), tool->expected());
        QTRY_VERIFY(hasNoChildren());
        tool.reset();
    }
    /// @}

    /// Whether this process has no child of its own but the service's bus, ended or not.
    bool hasNoChildren() const
    {
        for (int run = 1; run <= tool->runs(); ++run) {
            const qint64 id = tool->processId(run);
            if (id == 0 || ::kill(pid_t(id), 0) == 0) {
                return false;
            }
        }
        return true;
    }

    std::unique_ptr<Job> makeJob(bool withAuthenticator = false)
    {
        const QString url = u"sftp://anna@server/papers"_s;
        auto job =
            withAuthenticator ? std::make_unique<Job>(auth, url) : std::make_unique<Job>(url);
        job->setDeleteOnFinish(false);
        job->setHelperProgram(u"veyfm-mount"_s);
        return job;
    }

    /// Runs a job to its end, which comes once and not inside start().
    static void finish(VeyFM::Job* job)
    {
        QSignalSpy finished(job, &VeyFM::Job::finished);
        job->start();
        QCOMPARE(finished.count(), 0);
        QVERIFY(finished.wait(20000));
        QCoreApplication::processEvents();
        QCOMPARE(finished.count(), 1);
    }

    /// What the program has read, line by line.
    QByteArrayList said(int run = 1) const
    {
        QByteArrayList lines = tool->input(run).split('\n');
        lines.removeLast();
        return lines;
    }

    VfsScene scene;
    std::unique_ptr<StandIn> tool;
    QSharedPointer<ScriptedAuthenticator> auth;
    std::unique_ptr<LoopGap> gap;
};

#endif
