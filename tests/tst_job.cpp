// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/authenticator.h"
#include "jobs/job.h"
#include "jobs/job_p.h"

#include <QCoreApplication>
#include <QPointer>
#include <QSignalSpy>
#include <QTest>
#include <QTimer>

#include <functional>

using namespace VeyFM;

namespace {

/// Does what the test says.
class ScriptedJob : public Job
{
public:
    explicit ScriptedJob(std::function<void(ScriptedJob*)> work, QObject* parent = nullptr)
        : Job(parent)
        , m_work(std::move(work))
    {
    }

    void start() override
    {
        m_work(this);
    }

private:
    const std::function<void(ScriptedJob*)> m_work;
};

class LongerPrivate : public JobPrivate
{
public:
    explicit LongerPrivate(bool* destroyed)
        : destroyed(destroyed)
    {
    }

    ~LongerPrivate() override
    {
        *destroyed = true;
    }

    bool* const destroyed;
};

class DerivedJob : public Job
{
public:
    explicit DerivedJob(LongerPrivate* dd)
        : Job(*dd, nullptr)
    {
    }

    void start() override {}
};

class SilentAuthenticator : public Authenticator
{
public:
    QString requestPassword(bool, const QString&, const QString&, QString&, bool*, bool*) override
    {
        return QString();
    }

    void credentialsRejected(const QString&) override {}

    void credentialsAccepted() override {}

    bool askQuestion(const QString&, const QString&) override
    {
        return false;
    }
};

void deliverDeferredDeletes()
{
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
}

void finishOk(ScriptedJob* job)
{
    job->finishedOk();
}

void finishSoon(ScriptedJob* job)
{
    job->finishedOkLater();
}

} // namespace

/// The base of all jobs: how a job ends, and how it runs under exec().
class JobTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void startsEmpty();
    void okClearsAnEarlierError();
    void errorIsPassedAsItComes();
    void slotsSeeALiveJob();
    void deletionIsRequestedBeforeTheSignal();
    void staysWithoutDeleteOnFinish();
    void laterComesFromTheLoop();
    void secondEndEmitsAgain();
    void execOfAJobThatEndsInStart();
    void execWaits();
    void execKeepsTheJobAlive();
    void execEndsWithADeletedJob();
    void execRestoresDeleteOnFinish();
    void execLeavesAFailure();
    void setErrorEndsNothing();
    void privatePartIsTakenOver();
    void authenticatorHoldsTheResource();
};

void JobTest::startsEmpty()
{
    ScriptedJob job(finishOk);
    QCOMPARE(job.error(), 0);
    QVERIFY(job.errorString().isNull());
    QVERIFY(job.isDeleteOnFinish());
    QVERIFY(!job.data().isValid());
    job.setData(42);
    QCOMPARE(job.data().toInt(), 42);
}

void JobTest::okClearsAnEarlierError()
{
    ScriptedJob job(finishOk);
    job.setDeleteOnFinish(false);
    job.setError(5, QStringLiteral("left over"));
    job.start();
    QCOMPARE(job.error(), 0);
    QVERIFY(job.errorString().isNull());
}

void JobTest::errorIsPassedAsItComes()
{
    for (const int code : {1, 3, -7, 0}) {
        ScriptedJob job(
            [code](ScriptedJob* self) { self->finishedWithError(code, QStringLiteral("why")); });
        job.setDeleteOnFinish(false);
        QSignalSpy finished(&job, &Job::finished);
        job.start();
        QCOMPARE(finished.count(), 1);
        QCOMPARE(finished.first().first().value<Job*>(), &job);
        // With the code 0 that reads as success, in spite of the text.
        QCOMPARE(job.error(), code);
        QCOMPARE(job.errorString(), QStringLiteral("why"));
    }
}

void JobTest::slotsSeeALiveJob()
{
    QPointer<ScriptedJob> job(new ScriptedJob(
        [](ScriptedJob* self) { self->finishedWithError(2, QStringLiteral("refused")); }));
    int code = 0;
    QString text;
    connect(job, &Job::finished, this, [&](Job* ended) {
        code = ended->error();
        text = ended->errorString();
    });
    job->start();
    QCOMPARE(code, 2);
    QCOMPARE(text, QStringLiteral("refused"));
    QVERIFY(job);
    deliverDeferredDeletes();
    QVERIFY(!job);
}

void JobTest::deletionIsRequestedBeforeTheSignal()
{
    // A slot that takes the wish back is too late: the deletion is on its way.
    QPointer<ScriptedJob> job(new ScriptedJob(finishOk));
    connect(job, &Job::finished, this, [](Job* ended) { ended->setDeleteOnFinish(false); });
    job->start();
    deliverDeferredDeletes();
    QVERIFY(!job);
}

void JobTest::staysWithoutDeleteOnFinish()
{
    QPointer<ScriptedJob> job(new ScriptedJob(finishOk, this));
    job->setDeleteOnFinish(false);
    job->start();
    deliverDeferredDeletes();
    QVERIFY(job);
    delete job;
}

void JobTest::laterComesFromTheLoop()
{
    ScriptedJob job(finishSoon);
    job.setDeleteOnFinish(false);
    QSignalSpy finished(&job, &Job::finished);
    job.start();
    QVERIFY(finished.isEmpty());
    QVERIFY(finished.wait());
    QCOMPARE(finished.count(), 1);
}

void JobTest::secondEndEmitsAgain()
{
    // Nothing stops it; jobs keep to one end a path.
    ScriptedJob job([](ScriptedJob* self) {
        self->finishedOk();
        self->finishedWithError(5, QStringLiteral("again"));
    });
    job.setDeleteOnFinish(false);
    QSignalSpy finished(&job, &Job::finished);
    job.start();
    QCOMPARE(finished.count(), 2);
    QCOMPARE(job.error(), 5);
}

void JobTest::execOfAJobThatEndsInStart()
{
    QPointer<ScriptedJob> job(new ScriptedJob(finishOk));
    // A loop would have run this.
    bool loopRan = false;
    QTimer::singleShot(0, this, [&loopRan] { loopRan = true; });
    job->exec();
    QVERIFY(!loopRan);
    QVERIFY(job);
    deliverDeferredDeletes();
    QVERIFY(!job);
    QTRY_VERIFY(loopRan);
}

void JobTest::execWaits()
{
    ScriptedJob job(finishSoon);
    job.setDeleteOnFinish(false);
    QSignalSpy finished(&job, &Job::finished);
    job.exec();
    QCOMPARE(finished.count(), 1);
    QVERIFY(!job.isDeleteOnFinish());
}

void JobTest::execKeepsTheJobAlive()
{
    QPointer<ScriptedJob> job(new ScriptedJob(finishSoon));
    job->exec();
    QVERIFY(job);
    QCOMPARE(job->error(), 0);
    deliverDeferredDeletes();
    QVERIFY(!job);
}

void JobTest::execRestoresDeleteOnFinish()
{
    QPointer<ScriptedJob> job(new ScriptedJob(finishSoon));
    bool whileRunning = true;
    connect(
        job, &Job::finished, this, [&](Job* ended) { whileRunning = ended->isDeleteOnFinish(); });
    job->exec();
    QVERIFY(!whileRunning);
    QVERIFY(job->isDeleteOnFinish());
    deliverDeferredDeletes();
    QVERIFY(!job);
}

void JobTest::execLeavesAFailure()
{
    ScriptedJob job([](ScriptedJob* self) {
        QTimer::singleShot(0, self, [self] { self->finishedWithError(4, QStringLiteral("no")); });
    });
    job.setDeleteOnFinish(false);
    job.exec();
    QCOMPARE(job.error(), 4);
    QCOMPARE(job.errorString(), QStringLiteral("no"));
}

void JobTest::setErrorEndsNothing()
{
    ScriptedJob job(finishOk);
    QSignalSpy finished(&job, &Job::finished);
    job.setError(1, QStringLiteral("text"));
    QCOMPARE(job.error(), 1);
    QCOMPARE(job.errorString(), QStringLiteral("text"));
    QVERIFY(finished.isEmpty());
}

void JobTest::privatePartIsTakenOver()
{
    bool destroyed = false;
    auto* const dd = new LongerPrivate(&destroyed);
    {
        DerivedJob job(dd);
        QCOMPARE(dd->q_ptr, &job);
        job.setError(3, QString());
        QCOMPARE(dd->error, 3);
    }
    QVERIFY(destroyed);
}

void JobTest::authenticatorHoldsTheResource()
{
    SilentAuthenticator authenticator;
    QVERIFY(authenticator.protocol().isNull());
    QVERIFY(authenticator.domain().isNull());
    QVERIFY(authenticator.server().isNull());
    QVERIFY(authenticator.object().isNull());
    authenticator.setResource(
        QStringLiteral("smb"), QStringLiteral("WG"), QStringLiteral("HOST"),
        QStringLiteral("share"));
    QCOMPARE(authenticator.protocol(), QStringLiteral("smb"));
    QCOMPARE(authenticator.domain(), QStringLiteral("WG"));
    QCOMPARE(authenticator.server(), QStringLiteral("HOST"));
    QCOMPARE(authenticator.object(), QStringLiteral("share"));
}

// As when the window that owns the job is closed.
void JobTest::execEndsWithADeletedJob()
{
    auto* const owner = new QObject;
    QTimer::singleShot(0, owner, &QObject::deleteLater);
    (new ScriptedJob([](ScriptedJob*) {}, owner))->exec();

    auto* const other = new QObject;
    (new ScriptedJob([other](ScriptedJob*) { delete other; }, other))->exec();
}

QTEST_GUILESS_MAIN(JobTest)
#include "tst_job.moc"
