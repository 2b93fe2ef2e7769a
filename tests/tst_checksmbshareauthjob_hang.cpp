// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/fuse.h"
#include "jobs/checksmbshareauthjob.h"
#include "support/scriptedauthenticator.h"
#include "support/standin.h"

#include <QElapsedTimer>
#include <QTest>

#include <cerrno>

#include <sys/wait.h>

using namespace VeyFM;

/// A tool that never answers costs half a minute, and reads as a ticket that does not work.
class CheckSmbShareAuthJobHangTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void hungToolIsGivenUp();
};

void CheckSmbShareAuthJobHangTest::hungToolIsGivenUp()
{
    if (!Fuse::isInFuseGroup()) {
        QSKIP("needs root, or a user in the group \"fuse\"");
    }
    StandIn smbclient("smbclient");
    smbclient.expect({"out Domain=[X]\\n", "hang"});
    smbclient.expect({});
    const auto authenticator = QSharedPointer<ScriptedAuthenticator>::create();
    CheckSmbShareAuthJob job(
        authenticator, QStringLiteral("share"), QStringLiteral("localhost"), QString());
    job.setDeleteOnFinish(false);

    QElapsedTimer timer;
    timer.start();
    job.start();
    QVERIFY(timer.elapsed() >= 30000);
    QVERIFY(timer.elapsed() < 60000);

    QCOMPARE(smbclient.runs(), 2);
    QCOMPARE(job.error(), 0);
    QCOMPARE(authenticator->calls, QStringList());
    // Nothing of it is left.
    QCOMPARE(waitpid(-1, nullptr, WNOHANG), -1);
    QCOMPARE(errno, ECHILD);
}

QTEST_GUILESS_MAIN(CheckSmbShareAuthJobHangTest)
#include "tst_checksmbshareauthjob_hang.moc"
