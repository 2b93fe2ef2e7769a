// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_FUSEMOUNTJOBTEST_H
#define VEYFM_TESTS_FUSEMOUNTJOBTEST_H

#include "support/fusemountjob.h"
#include "support/mountjobtest.h"

/// What sets the two protocols apart in the tests that they have in common.
struct FuseProtocol
{
    QString scheme;
    QString otherScheme;
    QByteArray tool;
    bool endsInStart = false; ///< Whether a job ends before start() returns.

    QByteArray refusal;   ///< A line of a play.
    QByteArrayList asks;  ///< Asks for a password, and goes on with one.
    QByteArrayList waits; ///< Asks, and does not go on where the user gives up or changes the name.

    /// Asks, and refuses what it gets.
    QByteArrayList refuses() const
    {
        return asks + refusesAtOnce();
    }
    QByteArrayList refusesAtOnce() const
    {
        return {refusal, "exit 1"};
    }

    static FuseProtocol ftp()
    {
        const QByteArray prompt = "err Enter host password for user 'x': ";
        FuseProtocol ftp;
        ftp.scheme = u"ftp"_s;
        ftp.otherScheme = u"sftp"_s;
        ftp.tool = "curlftpfs";
        ftp.refusal = "err Error connecting to ftp: Access denied: 530\\n";
        ftp.asks = {prompt, "read"};
        ftp.waits = {prompt, "hang"};
        return ftp;
    }
    static FuseProtocol sftp()
    {
        FuseProtocol sftp;
        sftp.scheme = u"sftp"_s;
        sftp.otherScheme = u"ftp"_s;
        sftp.tool = "sshfs";
        sftp.endsInStart = true;
        // The end of sshfs as users know it after any failed login.
        sftp.refusal = "out read: Connection reset by peer\\n";
        sftp.asks = {"echo off", "out x@host's password: ", "read", "echo on"};
        sftp.waits = sftp.asks + QByteArrayList({"exit 1"});
        return sftp;
    }
};

/// The base of tests of the two jobs that run a FUSE tool, with a scripted one and a scripted
/// service.
class FuseMountJobTest : public MountJobTest
{
    Q_OBJECT

protected:
    explicit FuseMountJobTest(const FuseProtocol& protocol)
        : protocol(protocol)
    {
    }

    FuseMountJob makeMountJob(const QString& url) const
    {
        return FuseMountJob::make(protocol.scheme, auth, url);
    }

    /// Runs a job to its end, which comes once and where the protocol has it.
    void finish(VeyFM::Job* job) const
    {
        if (protocol.endsInStart) {
            startToEnd(job);
        } else {
            MountJobTest::finish(job);
        }
    }
    void finish(const FuseMountJob& job) const
    {
        finish(job.job.get());
    }

    QString url(const QString& rest) const
    {
        return protocol.scheme + u"://"_s + rest;
    }

    /// Below the directory of the protocol's mounts.
    QString directory(const QString& name) const
    {
        return u"/%1/%2"_s.arg(protocol.scheme, name);
    }

    /// A question for a password, as the authenticator writes it down.
    QString question(const QString& user) const
    {
        return u"retry [%1  host ] Access denied|Enter host password for user:|%2"_s.arg(
            protocol.scheme, user);
    }

    QString failure() const
    {
        return u"Mounting %1 resource failed"_s.arg(protocol.scheme);
    }
    QString cancellation() const
    {
        return u"Accessing %1 resource was cancelled"_s.arg(protocol.scheme);
    }

    const FuseProtocol protocol;

private Q_SLOTS:
    void initTestCase()
    {
        QVERIFY2(startVfs("{}"), qPrintable(service.errorString()));
    }
    void init()
    {
        QVERIFY(!QFileInfo::exists(mountDir(QString())));
        startScene(protocol.tool);
    }
    void cleanup()
    {
        endScene();
    }
    void cleanupTestCase()
    {
        QCOMPARE(service->violations(), QStringList());
    }
};

#endif
