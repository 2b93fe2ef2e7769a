// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolscene.h"

#include <QElapsedTimer>
#include <QRegularExpression>
#include <QTemporaryDir>

#include <memory>
#include <vector>

#include <signal.h>

namespace {

// Each call that nobody answers holds a program for 25 seconds.
constexpr qint64 muchLess = 15000;

const QByteArray silent = "the file manager service (org.veylabs.vey-fm.vfs) does not answer: "
                          "'veyfm-vfs status' shows how it stands\n";
const QByteArray askedFor = "asked for, but " + silent;
/// With the process, which is left out here.
const QByteArray silentAgain = "the file manager service (org.veylabs.vey-fm.vfs) does not answer: "
                               "end it with 'kill -KILL ', and it is started again when it is "
                               "needed\n";

/// Of a verb that needs it.
const QByteArray silentAndHint =
    silentAgain.chopped(1) + "; 'veyfm-vfs status' shows how it stands\n";

QByteArray error(const QByteArray& what, const QByteArray& why)
{
    return "veyfm-vfs: " + what + ": " + why;
}

QJsonObject filled()
{
    return {
        {QStringLiteral("values"),
         QJsonObject{
             {QStringLiteral("StoragePlacesManager.availableStoragePlaces"),
              QJsonArray{deviceRecord(QStringLiteral("sdb1"), 3, QStringLiteral("/udi/1"))}},
             {QStringLiteral("FavouritePlacesManager.favouritePlaces"),
              QJsonArray{QJsonArray{QStringLiteral("usr"), QStringLiteral("/usr")}}},
             {QStringLiteral("NetworkPlacesManager.networkPlaces"),
              QJsonArray{
                  QJsonArray{QStringLiteral("work"), QStringLiteral("sftp://host"), QString()}}},
             {QStringLiteral("NetworkPlacesManager.addNetworkPlace"), true},
             {QStringLiteral("SmbBrowser.workgroups"), QJsonArray{QStringLiteral("WG")}},
             {QStringLiteral("SmbBrowser.hosts"), QJsonArray{QStringLiteral("HOST")}}}}};
}

/// A run of the tool beside others, with a service of its own that stops at one call.
class Run
{
public:
    Run(const QByteArray& stopAt, const QByteArray& line)
        : m_scene(filled())
    {
        if (stopAt == "before") {
            m_scene.service().stop();
        } else {
            m_scene.service().setRules(
                QString::fromLatin1(stopAt), {QJsonObject{{QStringLiteral("stop"), true}}});
        }
        m_process.setProcessEnvironment(m_scene.environment());
        m_timer.start();
        m_process.start(toolPath(), ToolScene::words(line.constData()));
    }

    ~Run()
    {
        m_scene.service().kill();
    }

    /// Its milliseconds, or -1 when it does not end.
    qint64 waitForEnd()
    {
        return m_process.waitForFinished(60000) ? m_timer.elapsed() : -1;
    }

    int exitCode() const
    {
        return m_process.exitStatus() == QProcess::NormalExit ? m_process.exitCode() : -1;
    }

    QProcess& process()
    {
        return m_process;
    }

private:
    ToolScene m_scene;
    QProcess m_process;
    QElapsedTimer m_timer;
};

/// What a verb says of a service that stops at a call.
struct Case
{
    QByteArray stopAt;
    QByteArray line;
    int exitCode = 0;
    QByteArray out = {}; ///< A part; empty for no output at all.
    QByteArray err = {}; ///< All of it.
};

/// Runs some at once: most of their time they wait.
void check(const std::vector<Case>& cases)
{
    constexpr size_t together = 8;
    for (size_t begin = 0; begin < cases.size(); begin += together) {
        const size_t end = std::min(begin + together, cases.size());
        std::vector<std::unique_ptr<Run>> runs;
        for (size_t i = begin; i < end; ++i) {
            runs.push_back(std::make_unique<Run>(cases[i].stopAt, cases[i].line));
        }
        for (size_t i = begin; i < end; ++i) {
            const Case& expected = cases[i];
            Run& run = *runs[i - begin];
            const qint64 elapsed = run.waitForEnd();
            const QByteArray out = run.process().readAllStandardOutput();
            QString errors = QString::fromLocal8Bit(run.process().readAllStandardError());
            errors.replace(
                QRegularExpression(QStringLiteral("-KILL [1-9][0-9]*'")),
                QStringLiteral("-KILL '"));
            const QByteArray err = errors.toLocal8Bit();
            const QByteArray what = expected.line + ", stopped at " + expected.stopAt + ", after " +
                                    QByteArray::number(elapsed) + " ms: " + out + err;
            QVERIFY2(elapsed >= 0 && elapsed < muchLess, what.constData());
            QVERIFY2(run.exitCode() == expected.exitCode, what.constData());
            QVERIFY2(
                expected.out.isEmpty() ? out.isEmpty() : out.count(expected.out) == 1,
                what.constData());
            QVERIFY2(err == expected.err, what.constData());
        }
    }
}

} // namespace

/// A service that stops, before the tool comes or at any call, holds no verb for long.
class ToolPatienceTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void inTheStart();
    void beforeTheStart();
    void later();
    void changes();
    void hangsAtItsStart();
    void monitor();
    void stoppedBus();
    void slowService();
};

void ToolPatienceTest::inTheStart()
{
    // What the start asks, and the end.
    std::vector<Case> cases;
    for (const char* call :
         {"Introspect /", "Service.incrementProcessRef", "Introspect /SmbBrowser",
          "FavouritePlacesManager.favouritePlaces", "NetworkMountsManager.mounts",
          "NetworkPlacesManager.networkPlaces", "Service.decrementProcessRef"}) {
        cases.push_back({call, "list /usr", 0, "share\n"});
    }
    const QByteArray again = "Introspect /FuseMountsManager";
    cases.push_back({again, "tree --json", 0, "\n]\n"});
    cases.push_back({again, "bookmark add /tmp", 1, {}, error("bookmark add", silentAndHint)});
    cases.push_back({again, "update Network/work", 1, {}, error("update", silentAndHint)});
    cases.push_back(
        {again, "mounts", 0, {}, error("mounts", "only what the kernel lists: " + silentAgain)});
    cases.push_back({again, "status", 1, "answers: no\n", error("status", silentAgain)});
    check(cases);
}

void ToolPatienceTest::beforeTheStart()
{
    check(
        {{"before", "list /usr", 0, "share\n"},
         {"before", "storage list", 1, {}, error("storage list", silentAndHint)},
         {"before", "network rescan", 1, {}, error("network rescan", silentAndHint)},
         {"before", "notify --timeout=0 /tmp", 1, {}, error("notify", silentAndHint)},
         {"before", "update Network/work", 1, {}, error("update", silentAndHint)},
         {"before", "status", 1, "answers: no\n", error("status", silentAgain)},
         {"before", "status --json", 1, "\"answers\":false", error("status", silentAgain)}});
}

void ToolPatienceTest::later()
{
    const QByteArray devices = "StoragePlacesManager.availableStoragePlaces";
    check(
        {{"before", "list Samba", 1, {}, error("list", silent)},
         {devices, "tree --expand", 1, "Storage devices", error("tree", silent)},
         {"SmbBrowser.workgroups", "list Samba", 1, {}, error("list", silent)},
         {"SmbBrowser.workgroups", "list --json Samba", 1, "[]\n", error("list", silent)},
         // What was printed is not printed again.
         {"SmbBrowser.workgroups", "list /usr Samba", 1, "share\n", error("list", silent)},
         {"SmbBrowser.workgroups", "list --json /usr Samba", 1, "\n]\n", error("list", silent)},
         {"StoragePlacesManager.availableStoragePlaces",
          "storage list",
          1,
          {},
          error("storage list", silentAndHint)},
         {"StoragePlacesManager.storageDeviceInfo",
          "storage info sdb1",
          1,
          {},
          error("storage info", silentAndHint)},
         {"SmbBrowser.hosts", "network hosts WG", 1, {}, error("network hosts", silentAndHint)},
         {"FuseMountsManager.mounts",
          "mounts",
          0,
          {},
          error("mounts", "only what the kernel lists: " + silentAgain)},
         {"NetworkMountsManager.mounts",
          "network list",
          1,
          {},
          error("network list", silentAndHint)},
         {"SmbBrowser.workgroups", "status", 1, "answers: no\n", error("status", silentAgain)},
         {"before", "complete -- list /usr/sha", 0, "/usr/share/"},
         {"Introspect /", "complete -- list /usr/sha", 0, "/usr/share/"},
         {devices, "complete -- storage mount s", 0},
         {"Service.decrementProcessRef", "complete -- list /usr/sha", 0, "/usr/share/"},
         {"Introspect /SmbBrowser",
          "mount smb://host/share",
          1,
          {},
          error(
              "smb://host/share",
              "Samba shares are reached through the service: " + silentAgain)}});
}

void ToolPatienceTest::changes()
{
    // Nobody knows whether it comes about, so it is not asked for again.
    check(
        {{"FavouritePlacesManager.addFavouritePlace",
          "bookmark add /tmp",
          1,
          {},
          error("bookmark add", askedFor)},
         {"FavouritePlacesManager.removeFavouritePlace",
          "bookmark remove usr",
          1,
          {},
          error("bookmark remove", askedFor)},
         {"NetworkPlacesManager.addNetworkPlace",
          "network add sftp://other",
          1,
          {},
          error("network add", askedFor)},
         {"NetworkPlacesManager.removeNetworkPlace",
          "network remove work",
          1,
          {},
          error("network remove", askedFor)},
         {"StoragePlacesManager.mountStoragePlace",
          "storage mount sdb1",
          1,
          {},
          error("sdb1", askedFor)},
         {"SmbBrowser.rescan",
          "network rescan --timeout=0",
          1,
          {},
          error("network rescan", askedFor)},
         {"SmbBrowser.rescan", "network rescan --json", 1, "[]\n",
          error("network rescan", askedFor)},
         {"FileSystem.notifyWatchers",
          "notify --timeout=60 /tmp",
          1,
          {},
          error("/tmp", askedFor)}});
}

void ToolPatienceTest::hangsAtItsStart()
{
    const std::unique_ptr<ToolScene> scene = ToolScene::withHangingService();
    QVERIFY(scene->isReady());
    QElapsedTimer timer;
    timer.start();
    const ToolResult list = scene->run("list /usr");
    QCOMPARE(list.exitCode, 0);
    QCOMPARE(list.err, QByteArray());
    QVERIFY(list.out.contains("share\n"));
    QVERIFY2(timer.elapsed() < muchLess, qPrintable(QString::number(timer.elapsed())));
    timer.start();
    const ToolResult storage = scene->run("storage list");
    QCOMPARE(storage.exitCode, 1);
    QVERIFY2(storage.err.contains(" does not start: it did not come within 3 s"), storage.err);
    QVERIFY2(timer.elapsed() < muchLess, qPrintable(QString::number(timer.elapsed())));
}

void ToolPatienceTest::monitor()
{
    // A service that stops later does not hold its end.
    ToolScene scene(filled());
    QVERIFY(scene.isReady());
    QTemporaryDir directory;
    QProcess process;
    process.setProcessEnvironment(scene.environment());
    process.start(
        toolPath(), {QStringLiteral("monitor"), QStringLiteral("Favourites"), directory.path()});
    QTRY_VERIFY(
        createFile(directory.path(), "x") &&
        QFile::remove(directory.filePath(QStringLiteral("x"))) && process.bytesAvailable() > 0);
    scene.service().stop();
    QVERIFY(createFile(directory.path(), "seen"));
    QByteArray out;
    QTRY_VERIFY((out += process.readAllStandardOutput()).contains("seen"));
    QElapsedTimer timer;
    timer.start();
    ::kill(pid_t(process.processId()), SIGINT);
    QVERIFY(process.waitForFinished(60000));
    QVERIFY2(timer.elapsed() < muchLess, qPrintable(QString::number(timer.elapsed())));
    QCOMPARE(process.exitStatus(), QProcess::CrashExit);
    QCOMPARE(process.exitCode(), SIGINT);
    scene.service().kill();
}

void ToolPatienceTest::stoppedBus()
{
    PrivateBus bus;
    bus.installFakeService();
    QVERIFY(bus.start());
    ::kill(pid_t(bus.processId()), SIGSTOP);
    QElapsedTimer timer;
    timer.start();
    const ToolResult list = runTool({QStringLiteral("list"), QStringLiteral("/usr")});
    const qint64 forList = timer.restart();
    const ToolResult status = runTool({QStringLiteral("status")});
    const qint64 forStatus = timer.elapsed();
    ::kill(pid_t(bus.processId()), SIGCONT);
    QCOMPARE(list.exitCode, 0);
    QVERIFY(list.out.contains("share\n"));
    QCOMPARE(status.exitCode, 1);
    QVERIFY2(forList < muchLess, qPrintable(QString::number(forList)));
    QVERIFY2(forStatus < muchLess, qPrintable(QString::number(forStatus)));
}

void ToolPatienceTest::slowService()
{
    // One that answers late, but does, is waited for.
    QJsonObject script = filled();
    const QJsonObject late = {{QStringLiteral("delay"), 1500}};
    script.insert(
        QStringLiteral("rules"),
        QJsonObject{
            {QStringLiteral("StoragePlacesManager.availableStoragePlaces"), QJsonArray{late}},
            {QStringLiteral("StoragePlacesManager.mountStoragePlace"),
             QJsonArray{QJsonObject{{QStringLiteral("delay"), 5000}}}}});
    const ToolScene scene(script);
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage mount sdb1");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
}

QTEST_GUILESS_MAIN(ToolPatienceTest)
#include "tst_tool_patience.moc"
