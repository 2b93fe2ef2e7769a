// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/realhelpertest.h"

#include <QElapsedTimer>
#include <QTemporaryDir>

#include <algorithm>
#include <vector>

/// That nothing is left of a mount, whenever it ends, and that many at once make one.
class RealMountHelperEndsTest : public RealHelperTest
{
    Q_OBJECT

private Q_SLOTS:
    void cancelledAtAnyMoment();
    void hostKilledAtAnyMoment();
    void threeAtOnce();
};

void RealMountHelperEndsTest::cancelledAtAnyMoment()
{
    constexpr int moments = 100;
    QElapsedTimer time;
    time.start();
    {
        HelperSession session;
        session.mount(aliceUrl());
        QCOMPARE(numberOf(answerAll(session, passwordOf(Sandbox::alice)), "code"), 0);
        session.cancel();
        QCOMPARE(session.waitForEnd(), 1);
    }
    const qint64 whole = time.nsecsElapsed();
    int cancelled = 0;
    for (int moment = 0; moment < moments; ++moment) {
        const qint64 due = whole * moment / moments;
        time.start();
        HelperSession session;
        session.mount(aliceUrl());
        while (time.nsecsElapsed() < due) {
            const int left = int((due - time.nsecsElapsed()) / 1000000);
            if (!session.saysMore(left)) {
                continue;
            }
            const QJsonObject said = session.next();
            if (textOf(said, "say") == u"question"_s) {
                session.answerPassword(numberOf(said, "id"), passwordOf(Sandbox::alice));
            }
        }
        session.cancel();
        QJsonObject last;
        for (QJsonObject said = session.next(); !said.isEmpty(); said = session.next()) {
            last = said;
        }
        QCOMPARE(textOf(last, "say"), u"end"_s);
        QCOMPARE(numberOf(last, "code"), 2);
        QCOMPARE(session.waitForEnd(), 1);
        ++cancelled;
        QVERIFY2(
            leftovers().isEmpty(), qPrintable(u"at %1 %: "_s.arg(moment) + leftovers().join(u' ')));
    }
    QCOMPARE(cancelled, moments);
}

void RealMountHelperEndsTest::hostKilledAtAnyMoment()
{
    // The shell is the host, and holds the ends of both pipes.
    const QString script = QStringLiteral(
        "rm -f in out; mkfifo in out; \"$0\" <in >out & exec 3>in 4<out\n"
        "echo '{\"do\":\"mount\",\"version\":1,\"url\":\"%1\"}' >&3\n"
        "while read line <&4; do case $line in *'\"question\"'*)\n"
        "echo '{\"do\":\"answer\",\"id\":1,\"password\":true}' >&3; read password; echo "
        "\"$password\" >&3;;\n"
        "*) echo \"$line\";; esac; done");
    constexpr int moments = 20;
    qint64 whole = 0;
    for (int moment = 0; moment <= moments; ++moment) {
        QElapsedTimer time;
        time.start();
        QProcess host;
        host.setWorkingDirectory(QDir::homePath());
        host.start(
            u"/bin/sh"_s, {u"-c"_s, script.arg(QString::fromLatin1(aliceUrl())),
                           QStringLiteral(VEYFM_MOUNT_HELPER)});
        QVERIFY(host.waitForStarted());
        host.write('"' + passwordOf(Sandbox::alice) + "\"\n");
        const qint64 due = whole * moment / moments;
        QByteArray said;
        // The first time up to the end.
        while (whole == 0 ? !said.contains("\"code\":0") : time.elapsed() < due) {
            host.waitForReadyRead(int(std::max<qint64>(1, due - time.elapsed())));
            said += host.readAll();
            QVERIFY(time.elapsed() < HelperSession::patience);
        }
        whole = whole == 0 ? std::max<qint64>(1, time.elapsed()) : whole;
        host.kill();
        QVERIFY(host.waitForFinished());
        QTRY_COMPARE_WITH_TIMEOUT(leftovers(), QStringList(), 10000);
    }
    QFile::remove(QDir::homePath() + u"/in"_s);
    QFile::remove(QDir::homePath() + u"/out"_s);
}

void RealMountHelperEndsTest::threeAtOnce()
{
    constexpr int rounds = 200;
    // The server without the way there, so that it takes no time to log in.
    QTemporaryDir programs;
    QFile ssh(programs.filePath(u"ssh"_s));
    QVERIFY(ssh.open(QIODevice::WriteOnly));
    ssh.write("#!/bin/sh\nexec /usr/lib/openssh/sftp-server\n");
    ssh.setPermissions(ssh.permissions() | QFile::ExeOwner);
    ssh.close();
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(u"PATH"_s, programs.path() + u':' + environment.value(u"PATH"_s));
    for (int round = 0; round < rounds; ++round) {
        std::vector<std::unique_ptr<HelperSession>> sessions;
        for (int i = 0; i < 3; ++i) {
            sessions.push_back(std::make_unique<HelperSession>(environment));
        }
        for (const auto& session : sessions) {
            session->mount("sftp://alice@server.test/~");
        }
        int made = 0;
        int present = 0;
        std::vector<bool> ended(sessions.size(), false);
        while (std::find(ended.begin(), ended.end(), false) != ended.end()) {
            for (size_t i = 0; i < sessions.size(); ++i) {
                if (ended[i] || !sessions[i]->saysMore(5)) {
                    continue;
                }
                const QJsonObject said = sessions[i]->next();
                if (textOf(said, "say") == u"question"_s) {
                    sessions[i]->answerPassword(numberOf(said, "id"), passwordOf(Sandbox::alice));
                } else if (textOf(said, "say") == u"end"_s) {
                    QVERIFY2(numberOf(said, "code") == 0, qPrintable(textOf(said, "text")));
                    made += textOf(said, "mounted") == u"new"_s;
                    present += textOf(said, "mounted") == u"present"_s;
                    ended[i] = true;
                    sessions[i]->take();
                }
            }
        }
        QCOMPARE(made, 1);
        QCOMPARE(present, 2);
        const QString directory = mountDir(u"/sftp/alice@server.test~"_s);
        QCOMPARE(mountDirs(), QStringList(directory));
        sessions.clear();
        QCOMPARE(QProcess::execute(u"fusermount3"_s, {u"-u"_s, directory}), 0);
    }
}

int main(int argc, char** argv)
{
    return runHelperTests<RealMountHelperEndsTest>(argc, argv);
}

#include "tst_real_mounthelper_ends.moc"
