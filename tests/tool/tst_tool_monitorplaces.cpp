// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolscene.h"

#include <QJsonDocument>
#include <QTest>

#include <signal.h>

namespace {

const QString storage = QStringLiteral("StoragePlacesManager");

/// A monitor on a bus, its output line by line.
class Monitor
{
public:
    Monitor(ToolScene& scene, const QStringList& arguments)
        : m_scene(scene)
    {
        m_process.setProcessEnvironment(scene.environment());
        m_process.start(toolPath(), QStringList(QStringLiteral("monitor")) + arguments);
    }

    ~Monitor()
    {
        m_process.kill();
        m_process.waitForFinished();
    }

    /// Whether the service is asked something. The place is opened so; from then on there are news.
    bool hasAsked(const char* call)
    {
        return QTest::qWaitFor(
            [&] { return m_scene.service().calls().contains(QLatin1String(call)); }, 20000);
    }

    QByteArray nextLine()
    {
        const bool come = QTest::qWaitFor([this] { return m_process.canReadLine(); }, 20000);
        return come ? m_process.readLine() : QByteArray("nothing came");
    }

    int end()
    {
        ::kill(pid_t(m_process.processId()), SIGINT);
        const bool ended = m_process.waitForFinished(20000);
        return ended && m_process.exitStatus() == QProcess::CrashExit ? m_process.exitCode() : -1;
    }

    QByteArray rest()
    {
        return m_process.readAllStandardOutput();
    }
    QByteArray errors()
    {
        return m_process.readAllStandardError();
    }

private:
    ToolScene& m_scene;
    QProcess m_process;
};

} // namespace

class ToolMonitorPlacesTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void devices();
    void devicesJson();
    void favourites();
    void networkBookmarks();
    void mounts();
    void samba();
    void onlyWhatWasAskedFor();
    void missingService();
};

void ToolMonitorPlacesTest::devices()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    scene.service().takeCalls();
    Monitor monitor(scene, {QStringLiteral("Storage devices")});
    QVERIFY(monitor.hasAsked("StoragePlacesManager.availableStoragePlaces[]"));
    const QString udi = QStringLiteral("/udi/1");
    const QString name = QStringLiteral("sdb1");
    scene.service().emitSignal(
        storage, QStringLiteral("storagePlaceAdded"), oneArgument(deviceRecord(name, 3, udi)));
    QCOMPARE(monitor.nextLine(), QByteArray("created     Storage devices/sdb1\n"));
    scene.service().emitSignal(
        storage, QStringLiteral("storagePlaceUpdated"),
        oneArgument(deviceRecord(name, 3, udi, QStringLiteral("/tmp"))));
    QCOMPARE(monitor.nextLine(), QByteArray("mounted     Storage devices/sdb1\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("reset       Storage devices/sdb1\n"));
    scene.service().emitSignal(
        storage, QStringLiteral("storagePlaceUpdated"),
        oneArgument(deviceRecord(name, 3, udi, QString(), QString(), false)));
    QCOMPARE(monitor.nextLine(), QByteArray("unmounted   Storage devices/sdb1\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("unmountable  Storage devices/sdb1\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("reset       Storage devices/sdb1\n"));
    scene.service().emitSignal(
        storage, QStringLiteral("storagePlaceUpdated"), oneArgument(deviceRecord(name, 3, udi)));
    QCOMPARE(monitor.nextLine(), QByteArray("mountable   Storage devices/sdb1\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("reset       Storage devices/sdb1\n"));
    scene.service().emitSignal(
        storage, QStringLiteral("storagePlaceRemoved"), oneArgument(deviceRecord(name, 3, udi)));
    QCOMPARE(monitor.nextLine(), QByteArray("deleted     Storage devices/sdb1\n"));
    QCOMPARE(monitor.end(), SIGINT);
    QCOMPARE(monitor.errors(), QByteArray());
}

void ToolMonitorPlacesTest::devicesJson()
{
    const QString udi = QStringLiteral("/udi/1");
    const QString name = QStringLiteral("sdb\n1");
    ToolScene scene(scriptOf(
        QStringLiteral("StoragePlacesManager.availableStoragePlaces"),
        QJsonArray{deviceRecord(name, 3, udi)}));
    QVERIFY(scene.isReady());
    Monitor monitor(scene, {QStringLiteral("--json"), QStringLiteral("Storage devices")});
    QVERIFY(monitor.hasAsked("StoragePlacesManager.availableStoragePlaces[]"));
    scene.service().emitSignal(
        storage, QStringLiteral("storagePlaceUpdated"),
        oneArgument(deviceRecord(name, 3, udi, QStringLiteral("/tmp"))));
    const QJsonObject expected = {
        {QStringLiteral("event"), QStringLiteral("mounted")},
        {QStringLiteral("name"), name},
        {QStringLiteral("path"), QStringLiteral("Storage devices/sdb\n1")},
        {QStringLiteral("localPath"), QStringLiteral("/tmp")},
        {QStringLiteral("type"), 3500},
        {QStringLiteral("typeName"), QStringLiteral("usb-disk")}};
    QCOMPARE(QJsonDocument::fromJson(monitor.nextLine()).object(), expected);
}

void ToolMonitorPlacesTest::favourites()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    scene.service().takeCalls();
    Monitor monitor(scene, {QStringLiteral("Favourites")});
    QVERIFY(monitor.hasAsked("NetworkPlacesManager.networkPlaces[]"));
    QCOMPARE(scene.run("bookmark add /usr").exitCode, 0);
    QCOMPARE(monitor.nextLine(), QByteArray("created     Favourites/usr\n"));
    scene.service().setValue(
        QStringLiteral("FavouritePlacesManager.favouritePlaces"),
        oneArgument(QJsonArray{QStringLiteral("usr"), QStringLiteral("/usr")}));
    QCOMPARE(scene.run("bookmark remove usr").exitCode, 0);
    QCOMPARE(monitor.nextLine(), QByteArray("deleted     Favourites/usr\n"));
    QCOMPARE(monitor.end(), SIGINT);
}

void ToolMonitorPlacesTest::networkBookmarks()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    scene.service().takeCalls();
    Monitor monitor(scene, {QStringLiteral("Network")});
    QVERIFY(monitor.hasAsked("NetworkPlacesManager.networkPlaces[]"));
    const QString manager = QStringLiteral("NetworkPlacesManager");
    const QString name = QStringLiteral("work");
    const QString url = QStringLiteral("sftp://host");
    scene.service().emitSignal(
        manager, QStringLiteral("networkPlaceAdded"),
        oneArgument(QJsonArray{name, url, QString()}));
    QCOMPARE(monitor.nextLine(), QByteArray("created     Network/work\n"));
    scene.service().emitSignal(
        manager, QStringLiteral("networkPlaceUpdated"),
        oneArgument(QJsonArray{name, url, QStringLiteral("/tmp")}));
    QCOMPARE(monitor.nextLine(), QByteArray("reset       Network/work\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("updated     Network/work\n"));
    scene.service().emitSignal(
        manager, QStringLiteral("networkPlaceRemoved"),
        oneArgument(QJsonArray{name, url, QString()}));
    QCOMPARE(monitor.nextLine(), QByteArray("deleted     Network/work\n"));
    QCOMPARE(monitor.end(), SIGINT);
}

void ToolMonitorPlacesTest::mounts()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    scene.service().takeCalls();
    Monitor monitor(scene, {QStringLiteral("Network")});
    QVERIFY(monitor.hasAsked("NetworkPlacesManager.networkPlaces[]"));
    const QString manager = QStringLiteral("NetworkMountsManager");
    scene.service().emitSignal(
        manager, QStringLiteral("mountAdded"),
        {QStringLiteral("sftp://host/"),
         QJsonArray{QStringLiteral("SFTP/host"), QStringLiteral("/tmp"), 1010}});
    QCOMPARE(monitor.nextLine(), QByteArray("created     SFTP\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("mounted     SFTP/host\n"));
    // One that makes no place.
    scene.service().emitSignal(
        manager, QStringLiteral("mountAdded"),
        {QStringLiteral("ftp://other/"), QJsonArray{QString(), QString(), 0}});
    QCOMPARE(monitor.nextLine(), QByteArray("mounted     ftp://other/\n"));
    QCOMPARE(monitor.end(), SIGINT);
}

void ToolMonitorPlacesTest::samba()
{
    ToolScene scene(QJsonObject{
        {QStringLiteral("values"),
         QJsonObject{
             {QStringLiteral("SmbBrowser.workgroups"), QJsonArray{QStringLiteral("WG")}},
             {QStringLiteral("SmbBrowser.hosts"), QJsonArray{QStringLiteral("HOST")}},
             {QStringLiteral("SmbBrowser.shares"),
              QJsonObject{{QStringLiteral("pub"), QString()}}}}}});
    QVERIFY(scene.isReady());
    Monitor monitor(
        scene,
        {QStringLiteral("Samba"), QStringLiteral("Samba/WG"), QStringLiteral("Samba/WG/HOST")});
    QVERIFY(monitor.hasAsked("SmbBrowser.shares[\"HOST\",\"WG\"]"));
    const QString smb = QStringLiteral("SmbBrowser");
    scene.service().setValue(
        QStringLiteral("SmbBrowser.workgroups"),
        QJsonArray{QStringLiteral("NEW"), QStringLiteral("WG")});
    scene.service().emitSignal(smb, QStringLiteral("rescanFinished"), {true});
    QCOMPARE(monitor.nextLine(), QByteArray("created     Samba/NEW\n"));
    scene.service().setValue(
        QStringLiteral("SmbBrowser.hosts"),
        QJsonArray{QStringLiteral("HOST"), QStringLiteral("OTHER")});
    scene.service().emitSignal(
        smb, QStringLiteral("rescanWorkgroupFinished"), {QStringLiteral("WG"), true});
    QCOMPARE(monitor.nextLine(), QByteArray("created     Samba/WG/OTHER\n"));
    scene.service().emitSignal(
        smb, QStringLiteral("shareUpdated"),
        {QStringLiteral("pub"), QStringLiteral("HOST"), QStringLiteral("WG"),
         QStringLiteral("/tmp")});
    QCOMPARE(monitor.nextLine(), QByteArray("reset       Samba/WG/HOST/pub\n"));
    QCOMPARE(monitor.nextLine(), QByteArray("updated     Samba/WG/HOST/pub\n"));
    scene.service().setValue(
        QStringLiteral("SmbBrowser.workgroups"), QJsonArray{QStringLiteral("WG")});
    scene.service().emitSignal(smb, QStringLiteral("rescanFinished"), {true});
    QCOMPARE(monitor.nextLine(), QByteArray("deleted     Samba/NEW\n"));
    QCOMPARE(monitor.end(), SIGINT);
}

void ToolMonitorPlacesTest::onlyWhatWasAskedFor()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    scene.service().takeCalls();
    Monitor monitor(scene, {QStringLiteral("Network")});
    QVERIFY(monitor.hasAsked("NetworkPlacesManager.networkPlaces[]"));
    scene.service().emitSignal(
        QStringLiteral("FavouritePlacesManager"), QStringLiteral("favouritePlaceAdded"),
        oneArgument(QJsonArray{QStringLiteral("usr"), QStringLiteral("/usr")}));
    scene.service().emitSignal(
        QStringLiteral("NetworkPlacesManager"), QStringLiteral("networkPlaceAdded"),
        oneArgument(QJsonArray{QStringLiteral("work"), QString(), QString()}));
    QCOMPARE(monitor.nextLine(), QByteArray("created     Network/work\n"));
    QCOMPARE(monitor.end(), SIGINT);
    QCOMPARE(monitor.rest(), QByteArray());
}

void ToolMonitorPlacesTest::missingService()
{
    ToolScene scene({}, ToolScene::Missing);
    QVERIFY(scene.isReady());
    for (const char* place : {"Favourites", "Network", "Samba", "Storage devices"}) {
        const ToolResult result = scene.run("monitor", {QString::fromLatin1(place)});
        QCOMPARE(result.exitCode, 1);
        QCOMPARE(
            result.err, QByteArray("veyfm-vfs: ") + place +
                            ": the file manager service (org.veylabs.vey-fm.vfs) is not installed "
                            "on this session bus: install the program that provides it\n");
    }
}

QTEST_GUILESS_MAIN(ToolMonitorPlacesTest)
#include "tst_tool_monitorplaces.moc"
