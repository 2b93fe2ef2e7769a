// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/mountscene.h"
#include "support/mounturls.h"

#include <QTest>

namespace {

/// All that a mount might start.
const char* const tools[] = {"smbclient", "curlftpfs",   "sshfs",      "ssh",
                             "sh",        "fusermount3", "fusermount", "umount"};

QByteArrayList sshfsArguments(const QString& directory, const char* target)
{
    return {target, QFile::encodeName(directory), "-o", "NumberOfPasswordPrompts=1"};
}

QByteArrayList curlftpfsArguments(const QString& directory, const char* user)
{
    QByteArrayList arguments = {"host", QFile::encodeName(directory)};
    if (user) {
        arguments = QByteArrayList({"-o", QByteArray("user=") + user}) + arguments;
    }
    return arguments;
}

} // namespace

/// Whatever stands in a URL, no other program is started than the one tool, with no other
/// arguments than its own, and nothing is made outside of its directory.
class ToolMountHostileTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void refused_data();
    void refused();
    void sftp_data();
    void sftp();
    void ftp_data();
    void ftp();
    void samba_data();
    void samba();
    void sambaUser();

private:
    static void standForAll(MountScene& scene);
    QString m_problem;
};

void ToolMountHostileTest::initTestCase()
{
    m_problem = keepMountsPrivate();
}

void ToolMountHostileTest::standForAll(MountScene& scene)
{
    for (const char* tool : tools) {
        scene.tool.alsoStandFor(tool);
    }
}

void ToolMountHostileTest::refused_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("reason");
    const QVector<MountUrls::Refused> all = MountUrls::refused();
    int number = 0;
    for (const MountUrls::Refused& each : all) {
        // What no command line can hold.
        const bool fits = !each.text.contains(QChar(QChar::Null)) &&
                          QString::fromLocal8Bit(each.text.toLocal8Bit()) == each.text;
        if (fits) {
            QTest::newRow(QByteArray::number(++number) + ' ' + each.reason.toUtf8())
                << each.text << each.reason;
        }
    }
}

void ToolMountHostileTest::refused()
{
    QFETCH(const QString, text);
    QFETCH(QString, reason);
    MountScene scene("sshfs");
    standForAll(scene);
    const ToolResult result = runTool(
        {QStringLiteral("mount"), QStringLiteral("--no-input"), QStringLiteral("--"), text},
        QString(), scene.environment());
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    reason.replace(QLatin1Char('\\'), QLatin1String("\\\\"));
    QVERIFY2(result.err.startsWith("veyfm-vfs: "), result.err.constData());
    QVERIFY2(result.err.endsWith(": " + reason.toUtf8() + '\n'), result.err.constData());
    QCOMPARE(result.err.count('\n'), 1);
    QVERIFY2(!result.err.contains("sec"), result.err.constData());
    QCOMPARE(scene.tool.allRuns(), QStringList());
    QVERIFY(scene.isClean());
}

void ToolMountHostileTest::sftp_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QByteArray>("target");
    QTest::addColumn<QString>("directory");
    QTest::addColumn<QString>("path");
    const auto row = [](const char* url, const char* target, const char* directory,
                        const char* path) {
        QTest::newRow(url) << QString::fromUtf8(url) << QByteArray(target)
                           << QString::fromUtf8(directory) << QString::fromUtf8(path);
    };
    row("sftp://host", "host:/", "host", "host");
    row("sftp://me@host/dir", "me@host:/", "me@host", "me@host/dir");
    row("sftp://host/~", "host:", "host~", "host~");
    row("sftp://host/~/~bob", "host:", "host~", "host~/~bob");
    row("sftp://a,b@host/", "a,b@host:/", "a,b@host", "a,b@host");
    row("sftp://CORP%5cjane@host/", "CORP\\jane@host:/", "CORP\\jane@host", "CORP\\jane@host");
    row("sftp://50%25@host/", "50%@host:/", "50%@host", "50%@host");
    row("sftp://me%40x.org@host/", "me@x.org@host:/", "me@x.org@host", "me@x.org@host");
    row("sftp://h\u00e4st/", "xn--hst-qla:/", "xn--hst-qla", "xn--hst-qla");
    row("sftp://HOST_1./", "host_1.:/", "host_1.", "host_1.");
    row("sftp://host/$(id);'\"`id`", "host:/", "host", "host/$(id);'\"`id`");
    row("sftp://host/-x/a:b@c", "host:/", "host", "host/-x/a:b@c");
    row("sftp://host/a..b/...", "host:/", "host", "host/a..b/...");
    row("sftp://host/a%3Fb%23c d", "host:/", "host", "host/a?b#c d");
    row("sftp://host//etc/./x", "host:/", "host", "host/etc/x");
}

void ToolMountHostileTest::sftp()
{
    QFETCH(const QString, url);
    QFETCH(const QByteArray, target);
    QFETCH(const QString, directory);
    QFETCH(const QString, path);
    if (!m_problem.isEmpty()) {
        QSKIP(qPrintable(m_problem));
    }
    MountScene scene("sshfs");
    standForAll(scene);
    scene.tool.expect(Said::success());
    const ToolResult result = runTool(
        {QStringLiteral("mount"), QStringLiteral("--no-input"), url}, QString(),
        scene.environment());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, scene.line(QStringLiteral("sftp/") + path));
    const QString relative = QStringLiteral("sftp/") + directory;
    QCOMPARE(
        scene.tool.arguments(1), sshfsArguments(scene.directory(relative), target.constData()));
    QCOMPARE(scene.tool.allRuns(), QStringList(QStringLiteral("sshfs.1")));
    QCOMPARE(
        QDir(scene.directory(QStringLiteral("sftp")))
            .entryList(QDir::AllEntries | QDir::NoDotAndDotDot | QDir::Hidden),
        QStringList(directory));
}

void ToolMountHostileTest::ftp_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QByteArray>("user");
    QTest::addColumn<QString>("directory");
    QTest::addColumn<QString>("path");
    const auto row = [](const char* url, const char* user, const char* directory,
                        const char* path) {
        QTest::newRow(url) << QString::fromUtf8(url) << QByteArray(user)
                           << QString::fromUtf8(directory) << QString::fromUtf8(path);
    };
    row("ftp://host", nullptr, "host", "host");
    row("ftp://me@host/a b", "me", "me@host", "me@host/a b");
    row("ftp://me%40x.org@host/", "me@x.org", "me@x.org@host", "me@x.org@host");
    row("ftp://a=b@host/", "a=b", "a=b@host", "a=b@host");
    row("ftp://50%25@host/", "50%", "50%@host", "50%@host");
    row("ftp://\u00fcser@host/", "\u00fcser", "\u00fcser@host", "\u00fcser@host");
    row("ftp://host/100%25;type=i,x", nullptr, "host", "host/100%;type=i,x");
}

void ToolMountHostileTest::ftp()
{
    QFETCH(const QString, url);
    QFETCH(const QByteArray, user);
    QFETCH(const QString, directory);
    QFETCH(const QString, path);
    if (!m_problem.isEmpty()) {
        QSKIP(qPrintable(m_problem));
    }
    MountScene scene("curlftpfs");
    standForAll(scene);
    scene.tool.expect(Said::success());
    const ToolResult result = runTool(
        {QStringLiteral("mount"), QStringLiteral("--no-input"), url}, QString(),
        scene.environment());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, scene.line(QStringLiteral("ftp/") + path));
    QCOMPARE(
        scene.tool.arguments(1), curlftpfsArguments(
                                     scene.directory(QStringLiteral("ftp/") + directory),
                                     user.isNull() ? nullptr : user.constData()));
    QCOMPARE(scene.tool.allRuns(), QStringList(QStringLiteral("curlftpfs.1")));
}

void ToolMountHostileTest::samba_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("service");
    QTest::addColumn<QString>("path");
    const auto row = [](const char* url, const char* service, const char* path) {
        QTest::newRow(url) << QString::fromUtf8(url) << QString::fromUtf8(service)
                           << QString::fromUtf8(path);
    };
    row("smb://host/share", "//host/share", "host/share");
    row("smb://host/share/a b/50%/C#/what?", "//host/share", "host/share/a b/50%/C#/what?");
    row("smb://host/share/$(id);\"'`id`", "//host/share", "host/share/$(id);\"'`id`");
    row("smb://WG;me@host/share/-x", "//host/share", "host/share/-x");
    row("smb://MY GROUP;host/share", "//host/share", "host/share");
    row("smb://host/C$", "//host/C$", "host/C$");
    row("smb://host/R&D(old)", "//host/R&D(old)", "host/R&D(old)");
    row("smb://host/a@b", "//host/a@b", "host/a@b");
    row("smb://h\u00e4st/sch\u00f6n", "//h\u00e4st/sch\u00f6n", "h\u00e4st/sch\u00f6n");
}

void ToolMountHostileTest::samba()
{
    QFETCH(const QString, url);
    QFETCH(const QString, service);
    QFETCH(const QString, path);
    QTemporaryDir network;
    QVERIFY(QDir(network.path()).mkpath(path));
    ToolScene scripted(scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), network.path()));
    QVERIFY(scripted.isReady());
    MountScene scene("smbclient", &scripted);
    standForAll(scene);
    scene.tool.expect({"exit 1"});
    scene.tool.expect({});
    const ToolResult result = runTool(
        {QStringLiteral("mount"), QStringLiteral("--no-input"), url}, QString(),
        scene.environment());
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, network.filePath(path).toUtf8() + '\n');
    QCOMPARE(scene.tool.arguments(1), QByteArrayList({service.toUtf8(), "-k", "-c", "du"}));
    QCOMPARE(scene.tool.arguments(2), QByteArrayList({service.toUtf8(), "-U", "%", "-c", "du"}));
    QCOMPARE(
        scene.tool.allRuns(),
        QStringList({QStringLiteral("smbclient.1"), QStringLiteral("smbclient.2")}));
    QVERIFY(scene.isClean());
}

void ToolMountHostileTest::sambaUser()
{
    QTemporaryDir network;
    QVERIFY(QDir(network.path()).mkpath(QStringLiteral("host/share")));
    ToolScene scripted(scriptOf(QStringLiteral("SmbBrowser.smbNetworkLocalPath"), network.path()));
    QVERIFY(scripted.isReady());
    MountScene scene("smbclient", &scripted);
    scene.tool.expect({"exit 1"});
    scene.tool.expect({"out NT_STATUS_ACCESS_DENIED\\n", "exit 1"});
    scene.tool.expect({});
    const QString password = QStringLiteral("a\"b;$(id) -c x%");
    const ToolResult result = runProgram(
        QStringLiteral("/bin/sh"),
        {QStringLiteral("-c"),
         QStringLiteral("printf '%s\\n' \"$1\" | \"$0\" mount --password-fd=0 "
                        "'smb://CORP\\jane@host/share'"),
         toolPath(), password},
        QString(), scene.environment());
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(
        scene.tool.arguments(3), QByteArrayList({"//host/share", "-U", "CORP\\jane", "-c", "du"}));
    QVERIFY(scene.tool.environment(3).contains("PASSWD=" + password.toUtf8()));
}

QTEST_GUILESS_MAIN(ToolMountHostileTest)
#include "tst_tool_mount_hostile.moc"
