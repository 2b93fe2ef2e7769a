// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_REALFUSETEST_H
#define VEYFM_TESTS_REALFUSETEST_H

#include "real/knownhosts.h"
#include "real/realftptest.h"
#include "support/fusemountjob.h"

/// What sets FTP and SFTP apart in the tests that they have in common.
struct RealProtocol
{
    QString scheme;
    QString place; ///< The place above those of the mounts.
    int mountType = 0;
    bool endsInStart = false; ///< Whether a job ends before start() returns.
    QString home;             ///< The path of a URL that means the home of its user.
    QString homeMark;         ///< Behind the name of the directory on which a home is mounted.
    bool rootIsHome = false;  ///< Of what is mounted.
    QByteArrayList tools;     ///< What serves a mount.

    /// The URL of what is in a user's home.
    QString urlOfHome(const QString& account, const QString& relative = QString()) const
    {
        return scheme + u"://"_s + account + home + relative;
    }

    QList<int> processes() const
    {
        QList<int> result;
        for (const QByteArray& tool : tools) {
            result += processesNamed(tool.constData());
        }
        return result;
    }

    static RealProtocol ftp()
    {
        RealProtocol ftp;
        ftp.scheme = u"ftp"_s;
        ftp.place = u"FTP"_s;
        ftp.mountType = VeyFM::TypeFtpSharePlace;
        ftp.home = u"/"_s;
        ftp.rootIsHome = true;
        ftp.tools = {"rclone"};
        return ftp;
    }
    static RealProtocol sftp()
    {
        RealProtocol sftp;
        sftp.scheme = u"sftp"_s;
        sftp.place = u"SFTP"_s;
        sftp.mountType = VeyFM::TypeSFtpSharePlace;
        sftp.endsInStart = true;
        sftp.home = u"/~/"_s;
        sftp.homeMark = u"~"_s;
        sftp.tools = {"sshfs", "ssh"};
        return sftp;
    }
};
Q_DECLARE_METATYPE(RealProtocol)

/// The data of a test that is the same for both.
inline void addProtocols()
{
    QTest::addColumn<RealProtocol>("protocol");
    QTest::newRow("ftp") << RealProtocol::ftp();
    QTest::newRow("sftp") << RealProtocol::sftp();
}

/// The base of tests of both protocols, in a sandbox where server.test serves both.
class RealFuseTest : public RealMountTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase()
    {
        if (!Sandbox::isEntered()) {
            return;
        }
        useCurlftpfsAdapter();
        QVERIFY2(startVfs(R"({"remember": true})"), qPrintable(service.errorString()));
        KnownHosts::add(Sandbox::serverHost);
    }
    void init()
    {
        SKIP_WITHOUT_SANDBOX();
        startScene();
    }
    void cleanup()
    {
        if (!Sandbox::isEntered()) {
            return;
        }
        endScene();
        verifyNoRclone();
        QTRY_VERIFY(processesNamed("ssh").isEmpty());
        QTRY_VERIFY(processesNamed("sshfs").isEmpty());
    }
};

/// A sandbox where server.test serves both, and no other host anything.
class FuseSandbox : public Sandbox
{
public:
    FuseSandbox()
        : Sandbox({"/usr/bin/rclone", "/usr/bin/sshfs", "/usr/bin/fusermount3"})
    {
        addServer(std::make_unique<SecretWatch>());
        addServer(std::make_unique<FtpServer>(serverHost));
        addServer(std::make_unique<SshServer>(serverHost));
    }
};

#endif
