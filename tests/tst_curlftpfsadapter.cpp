// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/curlftpfsscene.h"

#include <memory>

namespace {

QString operator""_s(const char16_t* text, size_t size)
{
    return QString::fromUtf16(text, int(size));
}

} // namespace

/// What the curlftpfs of tools/curlftpfs-rclone takes, asks, and hands to rclone.
class CurlftpfsAdapterTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void init();
    void cleanup();
    void helpAndVersion_data();
    void helpAndVersion();
    void manualPage();
    void refusedCommandLines_data();
    void refusedCommandLines();
    void hosts_data();
    void hosts();
    void users_data();
    void users();
    void anonymous();
    void passwords_data();
    void passwords();
    void refusedPasswords_data();
    void refusedPasswords();
    void passwordStaysHidden();
    void settingsOfTheUserAreLeftOut();
    void failures_data();
    void failures();
    void noAnswer();

private:
    std::unique_ptr<CurlftpfsScene> scene;
};

void CurlftpfsAdapterTest::initTestCase()
{
    SKIP_WITH_REAL_CURLFTPFS();
}

void CurlftpfsAdapterTest::init()
{
    scene = std::make_unique<CurlftpfsScene>();
}

void CurlftpfsAdapterTest::cleanup()
{
    QCOMPARE(scene->rclone.runs(), scene->rclone.expected());
    scene.reset();
}

void CurlftpfsAdapterTest::helpAndVersion_data()
{
    QTest::addColumn<QString>("option");
    QTest::addColumn<QByteArray>("text");
    QTest::newRow("help") << u"--help"_s << QByteArray("-o OPTION");
    QTest::newRow("version") << u"--version"_s << QByteArray(VEYFM_VERSION "\n");
}

void CurlftpfsAdapterTest::helpAndVersion()
{
    QFETCH(QString, option);
    QFETCH(QByteArray, text);
    Curlftpfs tool;
    tool.start({option});
    QCOMPARE(tool.waitForEnd(), 0);
    QVERIFY2(tool.output.contains(text), tool.output.constData());
    QCOMPARE(tool.errors, QByteArray());
}

void CurlftpfsAdapterTest::manualPage()
{
    if (QStandardPaths::findExecutable(u"groff"_s).isEmpty()) {
        QSKIP("groff is not installed");
    }
    QProcess groff;
    groff.start(
        u"groff"_s, {u"-man"_s, u"-Tutf8"_s, u"-ww"_s, u"-Kutf8"_s, u"-P-cbou"_s,
                     curlftpfsPath() + u"-rclone.1"_s});
    QVERIFY(groff.waitForFinished());
    QCOMPARE(groff.readAllStandardError(), QByteArray());
    const QByteArray page = groff.readAllStandardOutput();
    for (const char* word : {"CURLFTPFS-RCLONE", "user=", "connect_timeout=", "--help", "127"}) {
        QVERIFY2(page.contains(word), word);
    }
}

void CurlftpfsAdapterTest::refusedCommandLines_data()
{
    QTest::addColumn<QStringList>("arguments");
    const auto row = [](const char* name, const QStringList& arguments) {
        QTest::newRow(name) << arguments;
    };
    row("nothing", {});
    row("no mount point", {u"host"_s});
    row("three operands", {u"host"_s, u"/"_s, u"/"_s});
    row("unknown option", {u"--config=/x"_s, u"host"_s, u"/"_s});
    row("unknown mount option", {u"-o"_s, u"ssl"_s, u"host"_s, u"/"_s});
    row("one behind a user", {u"-o"_s, u"user=bob,allow_other"_s, u"host"_s, u"/"_s});
    row("empty mount point", {u"host"_s, u""_s});
    row("two users", {u"-o"_s, u"user=a"_s, u"-o"_s, u"user=b"_s, u"host"_s, u"/"_s});
    row("empty user", {u"-o"_s, u"user="_s, u"host"_s, u"/"_s});
    row("password", {u"-o"_s, u"user=bob:secret"_s, u"host"_s, u"/"_s});
    row("command behind a user", {u"-o"_s, u"user=bob\r\nDELE x"_s, u"host"_s, u"/"_s});
    row("escape in a user", {u"-o"_s, u"user=\033[2J"_s, u"host"_s, u"/"_s});
    row("no seconds", {u"-o"_s, u"connect_timeout=0"_s, u"host"_s, u"/"_s});
    row("dash", {u"-host"_s, u"/"_s});
    row("other dash", {u"-Vost"_s, u"/"_s});
    row("negative number", {u"-1"_s, u"/"_s});
    const QStringList hosts = {
        QString(), u"-host"_s,     u"--rc"_s,     u"a b"_s,       u"a,b"_s,  u"a=b"_s,
        u"a/b"_s,  u"ftp://a/b"_s, u"ftps://a"_s, u"bob@a"_s,     u"a:"_s,   u"a:x"_s,
        u"a:0"_s,  u"a:65536"_s,   u"a\nb"_s,     u"a\033b"_s,    u"a%b"_s,  u"$(a)"_s,
        u"[::1"_s, u"[::1]x"_s,    u"1:2:3"_s,    u"[1.2.3.4]"_s, u"a..b"_s, u":ftp"_s};
    for (const QString& host : hosts) {
        row(qPrintable(u"host "_s + host), {u"--"_s, host, u"/"_s});
    }
}

void CurlftpfsAdapterTest::refusedCommandLines()
{
    QFETCH(QStringList, arguments);
    Curlftpfs tool;
    tool.start(arguments);
    QCOMPARE(tool.waitForEnd(), 2);
    QCOMPARE(tool.output, QByteArray());
    QVERIFY2(tool.errors.contains("\ncurlftpfs: error: "), tool.errors.constData());
    QVERIFY(!tool.errors.contains("Enter host password"));
    QVERIFY(!tool.errors.contains('\033'));
}

void CurlftpfsAdapterTest::hosts_data()
{
    QTest::addColumn<QString>("operand");
    QTest::addColumn<QByteArray>("host");
    QTest::addColumn<QByteArray>("port");
    QTest::addColumn<QByteArray>("name");
    const auto row = [](const QString& operand, const char* host, const char* port,
                        const char* name) {
        QTest::newRow(qPrintable(operand))
            << operand << QByteArray(host) << QByteArray(port) << QByteArray(name);
    };
    row(u"host.test"_s, "host.test", "21", "ftp://host.test/");
    row(u"host_1:2121"_s, "host_1", "2121", "ftp://host_1:2121/");
    row(u"ftp://host"_s, "host", "21", "ftp://host/");
    row(u"ftp://host:21/"_s, "host", "21", "ftp://host/");
    row(u"1.2.3.4"_s, "1.2.3.4", "21", "ftp://1.2.3.4/");
    row(u"::1"_s, "[::1]", "21", "ftp://[::1]/");
    row(u"[::1]:2121"_s, "[::1]", "2121", "ftp://[::1]:2121/");
    row(u"b\u00fccher.test"_s, "xn--bcher-kva.test", "21", "ftp://xn--bcher-kva.test/");
}

void CurlftpfsAdapterTest::hosts()
{
    QFETCH(QString, operand);
    QFETCH(QByteArray, host);
    QFETCH(QByteArray, port);
    QFETCH(QByteArray, name);
    scene->expectMount({"exit 1"});
    Curlftpfs tool;
    tool.start(scene->arguments(operand));
    QCOMPARE(tool.waitForEnd(), 1);
    const QByteArrayList arguments = scene->rclone.arguments(2);
    QCOMPARE(
        arguments.mid(0, 3), QByteArrayList({"mount", "ftp:", scene->mountPoint().toLocal8Bit()}));
    QVERIFY(arguments.contains("--ftp-host=" + host));
    QVERIFY(arguments.contains("--ftp-port=" + port));
    QVERIFY(arguments.contains("--devname=" + name));
}

void CurlftpfsAdapterTest::users_data()
{
    QTest::addColumn<QString>("option");
    QTest::addColumn<QByteArray>("user");
    QTest::addColumn<QByteArray>("name");
    const auto row = [](const QString& option, const char* user, const char* name) {
        QTest::newRow(qPrintable(option)) << option << QByteArray(user) << QByteArray(name);
    };
    row(u"bob"_s, "bob", "bob");
    row(u"bob@home"_s, "bob@home", "bob%40home");
    row(u"-bob"_s, "-bob", "-bob");
    row(u"--rc=true"_s, "--rc=true", "--rc%3Dtrue");
    row(u" %(pass)s ; # \"\"\"` "_s, " %(pass)s ; # \"\"\"` ",
        "%20%25%28pass%29s%20%3B%20%23%20%22%22%22%60%20");
    row(u"$(touch x)"_s, "$(touch x)", "%24%28touch%20x%29");
    row(u"[ftp]/../x"_s, "[ftp]/../x", "%5Bftp%5D%2F..%2Fx");
    row(u"HOME\\bob"_s, "HOME\\bob", "HOME%5Cbob");
    row(u"a\\,b\\\\c"_s, "a,b\\c", "a%2Cb%5Cc");
    row(u"j\u00f6rg"_s, "j\303\266rg", "j%C3%B6rg");
}

void CurlftpfsAdapterTest::users()
{
    QFETCH(QString, option);
    QFETCH(QByteArray, user);
    QFETCH(QByteArray, name);
    scene->expectMount({"exit 1"});
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s, {u"-o"_s, u"user="_s + option}));
    QVERIFY(tool.waitForPrompt(user));
    tool.answer("x\n");
    QCOMPARE(tool.waitForEnd(), 1);
    QVERIFY(scene->rclone.arguments(2).contains("--ftp-user=" + user));
    QVERIFY(scene->rclone.arguments(2).contains("--devname=ftp://" + name + "@host/"));
}

void CurlftpfsAdapterTest::anonymous()
{
    scene->expectMount({"exit 1"});
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s));
    QCOMPARE(tool.waitForEnd(), 1);
    QVERIFY(!tool.errors.contains("Enter host password"));
    QVERIFY(scene->rclone.arguments(2).contains("--ftp-user=anonymous"));
    QCOMPARE(scene->rclone.input(1), QByteArray("anonymous@\n"));
}

void CurlftpfsAdapterTest::passwords_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QByteArray>("password");
    QTest::newRow("plain") << QByteArray("secret\n") << QByteArray("secret\n");
    QTest::newRow("empty") << QByteArray("\n") << QByteArray("\n");
    QTest::newRow("blanks") << QByteArray(" se cret \n") << QByteArray(" se cret \n");
    QTest::newRow("other encoding") << QByteArray("p\344ss\n") << QByteArray("p\344ss\n");
    QTest::newRow("end of the input") << QByteArray("secret") << QByteArray("secret\n");
    QTest::newRow("two lines") << QByteArray("secret\nmore\n") << QByteArray("secret\n");
}

void CurlftpfsAdapterTest::passwords()
{
    QFETCH(QByteArray, line);
    QFETCH(QByteArray, password);
    scene->expectMount({"exit 1"});
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s, {u"-o"_s, u"user=bob"_s}));
    QVERIFY(tool.waitForPrompt("bob"));
    tool.answer(line);
    QCOMPARE(tool.waitForEnd(), 1);
    QCOMPARE(scene->rclone.input(1), password);
}

void CurlftpfsAdapterTest::refusedPasswords_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::newRow("none") << QByteArray();
    QTest::newRow("return") << QByteArray("a\rDELE x\n");
    QTest::newRow("NUL") << QByteArray("a\0b\n", 4);
}

void CurlftpfsAdapterTest::refusedPasswords()
{
    QFETCH(QByteArray, line);
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s, {u"-o"_s, u"user=bob"_s}));
    QVERIFY(tool.waitForPrompt("bob"));
    tool.answer(line);
    QCOMPARE(tool.waitForEnd(), 1);
    QVERIFY2(tool.errors.contains("password"), tool.errors.constData());
}

void CurlftpfsAdapterTest::passwordStaysHidden()
{
    scene->expectMount({"hang"});
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s, {u"-o"_s, u"user=bob"_s}));
    QVERIFY(tool.waitForPrompt("bob"));
    tool.answer("secret\n");
    const qint64 rclone = scene->waitForRclone();
    QVERIFY(rclone > 0);

    // Where rclone takes it from has no name that others could open, and only its hidden form.
    const QByteArray argument = scene->rclone.arguments(2).value(3);
    const QByteArray inMemory = "--config=/proc/self/fd/";
    QVERIFY2(argument.startsWith(inMemory), argument.constData());
    const QString path =
        u"/proc/%1/fd/%2"_s.arg(rclone).arg(QString::fromLatin1(argument.mid(inMemory.size())));
    QVERIFY(QFile::symLinkTarget(path).startsWith(u"/memfd:"_s));
    QFile config(path);
    QVERIFY(config.open(QIODevice::ReadOnly));
    QCOMPARE(config.readAll(), QByteArray("[ftp]\ntype = ftp\npass = OBSCURED\n"));

    QFile limits(u"/proc/%1/limits"_s.arg(rclone));
    QVERIFY(limits.open(QIODevice::ReadOnly));
    QVERIFY(limits.readAll().simplified().contains("Max core file size 0 0 bytes"));

    tool.process.terminate();
    QCOMPARE(tool.waitForEnd(), 143);
    for (const int run : {1, 2}) {
        for (const char* secret : {"secret", "OBSCURED"}) {
            QVERIFY(!scene->rclone.commandLine(run).contains(secret));
            QVERIFY(!scene->rclone.environment(run).join('\n').contains(secret));
        }
    }
}

void CurlftpfsAdapterTest::settingsOfTheUserAreLeftOut()
{
    qputenv("RCLONE_RC", "true");
    qputenv("RCLONE_LOG_FILE", "/nonexistent/log");
    scene->expectMount({"exit 1"});
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s));
    QCOMPARE(tool.waitForEnd(), 1);
    qunsetenv("RCLONE_RC");
    qunsetenv("RCLONE_LOG_FILE");
    for (const int run : {1, 2}) {
        QVERIFY(!scene->rclone.environment(run).join('\n').contains("RCLONE_"));
    }
    QVERIFY(scene->rclone.arguments(1).contains("--config="));
}

void CurlftpfsAdapterTest::failures_data()
{
    QTest::addColumn<QByteArray>("words");
    QTest::addColumn<QByteArray>("message");
    const auto row = [](const char* name, const QByteArray& words, const QByteArray& message) {
        QTest::newRow(name) << words << "curlftpfs: " + message + '\n';
    };
    const QByteArray date = "2026/11/21 20:44:54 ";
    const QByteArray connecting =
        date + "Failed to create file system for \"ftp:\": NewFs: failed to make FTP connection "
               "to \"host:21\": ";
    row("wrong password", connecting + "530 Login incorrect.\\n",
        "Access denied: 530 Login incorrect.");
    row("other code", connecting + "430 Invalid.\\n", "Access denied: 430 Invalid.");
    row("several lines", connecting + "530 Sorry.\\nTry later.\\n",
        "Access denied: 530 Sorry. Try later.");
    row("escape of the server", connecting + "530 \033[2Jx\\n", "Access denied: 530 [2Jx");
    row("no connection", connecting + "dial tcp 1.2.3.4:21: connect: connection refused\\n",
        "can't mount ftp://host/: dial tcp 1.2.3.4:21: connect: connection refused");
    row("number in a text", connecting + "dial tcp: lookup 530 on 1.2.3.4:53: no such host\\n",
        "can't mount ftp://host/: dial tcp: lookup 530 on 1.2.3.4:53: no such host");
    row("not allowed",
        date + "mount helper error: fusermount: failed to open /dev/fuse: Permission denied\\n" +
            date + "Fatal error: failed to mount FUSE fs: fusermount: exit status 1\\n",
        "can't mount ftp://host/: fusermount: failed to open /dev/fuse: Permission denied");
    row("something else", "panic: x\\n", "can't mount ftp://host/: panic: x");
    row("no words", "", "can't mount ftp://host/: rclone ended without a word");
}

void CurlftpfsAdapterTest::failures()
{
    QFETCH(QByteArray, words);
    QFETCH(QByteArray, message);
    scene->expectMount({"err " + words, "exit 1"});
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s));
    QCOMPARE(tool.waitForEnd(), 1);
    QCOMPARE(tool.errors, message);
    QCOMPARE(tool.output, QByteArray());
}

void CurlftpfsAdapterTest::noAnswer()
{
    scene->expectMount({"hang"});
    Curlftpfs tool;
    tool.start(scene->arguments(u"host"_s, {u"-o"_s, u"connect_timeout=1"_s}));
    QCOMPARE(tool.waitForEnd(), 1);
    QCOMPARE(tool.errors, QByteArray("curlftpfs: can't mount ftp://host/: no answer for 1 s\n"));
}

QTEST_GUILESS_MAIN(CurlftpfsAdapterTest)

#include "tst_curlftpfsadapter.moc"
