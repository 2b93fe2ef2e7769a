// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolscene.h"

#include <QTest>

namespace {

QJsonObject filled()
{
    return {
        {QStringLiteral("values"),
         QJsonObject{
             {QStringLiteral("StoragePlacesManager.availableStoragePlaces"),
              QJsonArray{deviceRecord(QStringLiteral("sdb1"), 3, QStringLiteral("/udi/1"))}},
             {QStringLiteral("FavouritePlacesManager.favouritePlaces"),
              QJsonArray{
                  QJsonArray{QStringLiteral("a"), QStringLiteral("/usr")},
                  QJsonArray{QStringLiteral("b"), QStringLiteral("/tmp")}}},
             {QStringLiteral("NetworkPlacesManager.networkPlaces"),
              QJsonArray{
                  QJsonArray{QStringLiteral("work"), QStringLiteral("sftp://host"), QString()}}},
             {QStringLiteral("SmbBrowser.workgroups"),
              QJsonArray{QStringLiteral("A"), QStringLiteral("B"), QStringLiteral("C")}},
             {QStringLiteral("FuseMountsManager.mounts"),
              QJsonObject{{QStringLiteral("sftp://host"), QStringLiteral("/tmp")}}}}}};
}

} // namespace

class ToolStatusTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void running();
    void runningJson();
    void installed();
    void missing();
    void runningButNotInstalled();
    void noBus();
    void failedReads();
};

void ToolStatusTest::running()
{
    ToolScene scene(filled());
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("status");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(
        result.out, QByteArray("session bus: yes\n"
                               "service: org.veylabs.vey-fm.vfs\n"
                               "installed: yes\n"
                               "running: yes\n"
                               "storage devices: 1\n"
                               "favourites: 2\n"
                               "network bookmarks: 1\n"
                               "network mounts: 0\n"
                               "FUSE mounts: 1\n"
                               "Samba workgroups: 3\n"));
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolStatusTest::runningJson()
{
    ToolScene scene(filled());
    QVERIFY(scene.isReady());
    const QJsonArray json = scene.run("status --json").json();
    QCOMPARE(json.size(), 1);
    QCOMPARE(json.at(0)[QLatin1String("running")], QJsonValue(true));
    const QJsonObject holds = {
        {QStringLiteral("storageDevices"), 1},   {QStringLiteral("favourites"), 2},
        {QStringLiteral("networkBookmarks"), 1}, {QStringLiteral("networkMounts"), 0},
        {QStringLiteral("fuseMounts"), 1},       {QStringLiteral("workgroups"), 3}};
    QCOMPARE(json.at(0)[QLatin1String("holds")].toObject(), holds);
}

void ToolStatusTest::installed()
{
    ToolScene scene({}, ToolScene::Installed);
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("status");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.out.endsWith("installed: yes\nrunning: no\n"));
    QVERIFY(!scene.service().isRunning());
}

void ToolStatusTest::missing()
{
    ToolScene scene({}, ToolScene::Missing);
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("status");
    QCOMPARE(result.exitCode, 1);
    QVERIFY(result.out.startsWith("session bus: yes\n"));
    QVERIFY(result.out.endsWith("installed: no\nrunning: no\n"));
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: status: the file manager service "
                               "(org.veylabs.vey-fm.vfs) is not installed on this session bus: "
                               "install the program that provides it\n"));
}

void ToolStatusTest::runningButNotInstalled()
{
    // Started by hand, it counts as missing for every program.
    PrivateBus bus;
    QVERIFY(bus.start());
    FakeServiceControl control(bus.address());
    QStringList command = bus.fakeServiceCommand();
    QProcess service;
    const QString program = command.takeFirst();
    service.start(program, command);
    QVERIFY(control.waitForService());
    const ToolResult result = runTool({QStringLiteral("status")});
    QCOMPARE(result.exitCode, 1);
    QVERIFY(result.out.endsWith("installed: no\nrunning: yes\n"));
    QVERIFY(result.err.contains("is not installed"));
    control.exit();
    QTRY_COMPARE(service.state(), QProcess::NotRunning);
}

void ToolStatusTest::noBus()
{
    const ToolResult result = runTool(
        {QStringLiteral("status"), QStringLiteral("--json")}, QString(),
        toolEnvironment(
            {{QStringLiteral("DBUS_SESSION_BUS_ADDRESS"),
              QStringLiteral("unix:path=/nonexistent/bus")}}));
    QCOMPARE(result.exitCode, 1);
    const QJsonObject expected = {
        {QStringLiteral("bus"), false},
        {QStringLiteral("service"), QStringLiteral("org.veylabs.vey-fm.vfs")},
        {QStringLiteral("installed"), false},
        {QStringLiteral("running"), false}};
    QCOMPARE(result.json(), QJsonArray{expected});
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: status: no session bus: start the program under "
                               "dbus-run-session or in a desktop session\n"));
}

void ToolStatusTest::failedReads()
{
    ToolScene scene(filled());
    QVERIFY(scene.isReady());
    scene.service().setRules(
        QStringLiteral("SmbBrowser.workgroups"),
        {QJsonObject{
            {QStringLiteral("error"), QStringLiteral("no net\a")},
            {QStringLiteral("keep"), true}}});
    const ToolResult result = scene.run("status");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: Samba workgroups: no net\\a\n"));
    QVERIFY(result.out.endsWith("FUSE mounts: 1\nSamba workgroups: unknown\n"));
    const QJsonObject holds =
        scene.run("status --json").json().at(0)[QLatin1String("holds")].toObject();
    QCOMPARE(holds[QLatin1String("workgroups")], QJsonValue(QJsonValue::Null));
}

QTEST_GUILESS_MAIN(ToolStatusTest)
#include "tst_tool_status.moc"
