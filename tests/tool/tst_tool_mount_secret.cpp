// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"

#include <QUuid>

#include <signal.h>

namespace {

constexpr int patience = 30000;

QByteArray contents(const QString& path)
{
    QFile file(path);
    return file.open(QIODevice::ReadOnly) ? file.readAll() : QByteArray();
}

/// The processes whose command line or environment shows the text to others.
QStringList processesThatShow(const QByteArray& text)
{
    QStringList all;
    const QStringList names = QDir(QStringLiteral("/proc")).entryList(QDir::Dirs);
    for (const QString& name : names) {
        for (const char* file : {"cmdline", "environ"}) {
            const QString path = QStringLiteral("/proc/%1/%2").arg(name, QLatin1String(file));
            if (name.at(0).isDigit() && contents(path).contains(text)) {
                all.append(path);
            }
        }
    }
    return all;
}

} // namespace

/// The passwords of "mount", which nobody else may see.
class ToolMountSecretTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void noCoreFile();
    void passwordIsSeenNowhere_data();
    void passwordIsSeenNowhere();
};

void ToolMountSecretTest::initTestCase()
{
    const QString problem = keepMountsPrivate();
    if (!problem.isEmpty()) {
        QSKIP(qPrintable(problem));
    }
}

void ToolMountSecretTest::noCoreFile()
{
    MountScene scene("sshfs");
    scene.tool.expect(Said::sshPassword() + QByteArrayList{"fork", "hang"});
    const auto session = scene.onTerminal("mount sftp://me@host/");
    QVERIFY(session->waitFor("Password for me on sftp://host: "));
    const QByteArray none = "Max core file size        0                    0 ";
    const QByteArray limits = contents(QStringLiteral("/proc/%1/limits").arg(session->processId()));
    QVERIFY2(limits.contains(none), limits.constData());
    session->type("geheim\n");
    QTRY_VERIFY_WITH_TIMEOUT(scene.tool.childId(1) > 0, patience);
    QVERIFY(
        contents(QStringLiteral("/proc/%1/limits").arg(scene.tool.processId(1))).contains(none));
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
}

void ToolMountSecretTest::passwordIsSeenNowhere_data()
{
    QTest::addColumn<QByteArray>("tool");
    QTest::addColumn<QByteArray>("url");
    QTest::addColumn<QByteArrayList>("run");
    QTest::newRow("sftp") << QByteArray("sshfs") << QByteArray("sftp://me@host/")
                          << Said::sshPassword() + QByteArrayList{"fork", "hang"};
    QTest::newRow("ftp") << QByteArray("curlftpfs") << QByteArray("ftp://me@host/")
                         << Said::ftpPassword() + QByteArrayList{"fork", "hang"};
}

void ToolMountSecretTest::passwordIsSeenNowhere()
{
    QFETCH(const QByteArray, tool);
    QFETCH(const QByteArray, url);
    QFETCH(const QByteArrayList, run);
    const QByteArray password = QUuid::createUuid().toByteArray(QUuid::Id128);
    MountScene scene(tool);
    scene.tool.expect(run);
    const auto session = scene.onTerminal("mount --verbose --timeout 0 " + url);
    QVERIFY(session->waitFor("Password for me on "));
    session->type(password + '\n');
    QTRY_VERIFY_WITH_TIMEOUT(scene.tool.childId(1) > 0, patience);
    QCOMPARE(scene.tool.input(1), password + '\n');
    QCOMPARE(processesThatShow(password), QStringList());
    session->type("\003");
    QCOMPARE(session->waitForEnd(), 128 + SIGINT);
    QVERIFY(!session->output().contains(password));
}

QTEST_GUILESS_MAIN(ToolMountSecretTest)
#include "tst_tool_mount_secret.moc"
