// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/terminalsession.h"
#include "support/toolscene.h"

#include <QJsonDocument>
#include <QTest>

#include <signal.h>

namespace {

const QString listMethod = QStringLiteral("StoragePlacesManager.availableStoragePlaces");
const QString mountMethod = QStringLiteral("StoragePlacesManager.mountStoragePlace");

QJsonObject twoDevices()
{
    return scriptOf(
        listMethod, QJsonArray{
                        deviceRecord(
                            QStringLiteral("sdb1"), 3, QStringLiteral("/udi/1"),
                            QStringLiteral("/tmp"), QStringLiteral("STICK")),
                        deviceRecord(QStringLiteral("sr0"), 2, QStringLiteral("/udi/2"))});
}

QStringList callsOf(FakeServiceControl& service, const QString& method)
{
    QStringList found;
    const QStringList calls = service.calls();
    for (const QString& call : calls) {
        if (call.startsWith(method + QLatin1Char('['))) {
            found.append(call);
        }
    }
    return found;
}

} // namespace

class ToolStorageTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void lists();
    void listsJson();
    void listsNothing();
    void tellsWhyNothingIsListed_data();
    void tellsWhyNothingIsListed();
    void escapesHostileNames();
    void infoShowsAll();
    void infoOfMissingDevice();
    void findsDevices_data();
    void findsDevices();
    void jobs_data();
    void jobs();
    void failingDeviceDoesNotStopOthers();
    void serviceDiesDuringJob();
    void spinnerShowsOnTerminal();
    void noSpinnerInPipes();
    void controlCDuringJob();
    void controlCDuringBlockingRead();
    void completion();
};

void ToolStorageTest::lists()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage list");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(
        result.out, QByteArray("sr0   cdrom-drive  mountable  -     sr0\n"
                               "sdb1  usb-disk     mounted    /tmp  STICK\n"));
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolStorageTest::listsJson()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage list --json");
    QCOMPARE(result.exitCode, 0);
    const QJsonArray devices = result.json();
    QCOMPARE(devices.size(), 2);
    const QJsonObject expected = {
        {QStringLiteral("name"), QStringLiteral("sdb1")},
        {QStringLiteral("path"), QStringLiteral("Storage devices/sdb1")},
        {QStringLiteral("label"), QStringLiteral("STICK")},
        {QStringLiteral("type"), 3},
        {QStringLiteral("typeName"), QStringLiteral("usb-disk")},
        {QStringLiteral("udi"), QStringLiteral("/udi/1")},
        {QStringLiteral("mounted"), true},
        {QStringLiteral("mountable"), true},
        {QStringLiteral("ejectable"), true},
        {QStringLiteral("mountPoint"), QStringLiteral("/tmp")},
        {QStringLiteral("icon"), QJsonValue::Null}};
    QCOMPARE(devices.at(1).toObject(), expected);
}

void ToolStorageTest::listsNothing()
{
    // The service is started for it.
    ToolScene scene({}, ToolScene::Installed);
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage list");
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(result.err, QByteArray());
    QVERIFY(scene.service().isRunning());
    QCOMPARE(scene.run("storage list --json").out, QByteArray("[]\n"));
}

void ToolStorageTest::tellsWhyNothingIsListed_data()
{
    QTest::addColumn<QJsonObject>("rule");
    QTest::addColumn<QByteArray>("message");
    QTest::newRow("error") << QJsonObject{{QStringLiteral("error"), QStringLiteral("bad\ndisk")}}
                           << QByteArray("bad\\ndisk");
    QTest::newRow("wrong type") << QJsonObject{{QStringLiteral("wrong"), true}}
                                << QByteArray("the service gave an answer of the form \"o\", not "
                                              "\"a(sbbbssssi)\"");
}

void ToolStorageTest::tellsWhyNothingIsListed()
{
    QFETCH(QJsonObject, rule);
    QFETCH(const QByteArray, message);
    rule.insert(QStringLiteral("keep"), true);
    ToolScene scene(ruleOf(listMethod, rule));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage list");
    QCOMPARE(result.err, "veyfm-vfs: storage list: " + message + '\n');
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    const ToolResult mount = scene.run("storage mount sdb1");
    QCOMPARE(mount.err, "veyfm-vfs: sdb1: " + message + '\n');
    QCOMPARE(mount.exitCode, 1);
}

void ToolStorageTest::escapesHostileNames()
{
    const QString name = QStringLiteral("a/../b\n\033[31m") + QChar(0x202e);
    ToolScene scene(scriptOf(
        listMethod,
        QJsonArray{deviceRecord(
            name, 4, QStringLiteral("\r1"), QString(), QStringLiteral("l\033]0;x\a"))}));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage list");
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(
        result.out, QByteArray("a/../b\\n\\033[31m\\342\\200\\256  hard-disk  mountable  -  "
                               "l\\033]0;x\\a\n"));
    const ToolResult info = scene.run("storage info", {QStringLiteral("\r1")});
    QCOMPARE(info.exitCode, 0);
    QVERIFY(info.out.contains("\nudi: \\r1\n"));
    QVERIFY(!info.out.contains('\033'));
    // JSON has it as it is.
    QCOMPARE(scene.run("storage list --json").json().at(0)[QLatin1String("name")].toString(), name);
    // The device of such a name can be used.
    const ToolResult mount = scene.run("storage mount", {name});
    QCOMPARE(mount.err, QByteArray());
    QCOMPARE(mount.exitCode, 0);
    QCOMPARE(callsOf(scene.service(), mountMethod).size(), 1);
}

void ToolStorageTest::infoShowsAll()
{
    QJsonObject script = twoDevices();
    QJsonObject values = script[QStringLiteral("values")].toObject();
    values.insert(
        QStringLiteral("StoragePlacesManager.storageDeviceInfo"),
        QJsonArray{
            QStringLiteral("vendor\t"), QString(), QString(), QString(), true, QString(), QString(),
            QString(), QString(), QString(), QString(), 4096, 0, false, 0, 0, 7});
    script[QStringLiteral("values")] = values;
    ToolScene scene(script);
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage info sdb1 sr0");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.out.startsWith("name: sdb1\npath: Storage devices/sdb1\nlabel: STICK\n"));
    QVERIFY(result.out.contains("\nmount point: /tmp\n"));
    QVERIFY(result.out.contains("\ntext 1: vendor\\t\nflag 1: yes\nflag 2: no\nnumber 1: 4096\n"));
    QVERIFY(result.out.contains("\nnumber 5: 7\n\nname: sr0\n"));
    const QJsonArray json = scene.run("storage info --json sdb1").json();
    QCOMPARE(json.size(), 1);
    const QJsonObject details = json.at(0)[QLatin1String("details")].toObject();
    QCOMPARE(details[QLatin1String("text1")].toString(), QStringLiteral("vendor\t"));
    QCOMPARE(details[QLatin1String("number1")].toString(), QStringLiteral("4096"));
    QCOMPARE(details.size(), 17);
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolStorageTest::infoOfMissingDevice()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage info sdz sr0");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.err, QByteArray("veyfm-vfs: sdz: no such storage device\n"));
    QVERIFY(result.out.startsWith("name: sr0\n"));

    // The list is there, the details are not.
    scene.service().setRules(
        QStringLiteral("StoragePlacesManager.storageDeviceInfo"),
        {QJsonObject{
            {QStringLiteral("error"), QStringLiteral("gone")}, {QStringLiteral("keep"), true}}});
    const ToolResult partly = scene.run("storage info sr0");
    QCOMPARE(partly.exitCode, 1);
    QCOMPARE(partly.err, QByteArray("veyfm-vfs: sr0: gone\n"));
    QVERIFY(partly.out.startsWith("name: sr0\n"));
}

void ToolStorageTest::findsDevices_data()
{
    QTest::addColumn<QString>("operand");
    QTest::newRow("name") << QStringLiteral("sdb1");
    QTest::newRow("path") << QStringLiteral("Storage devices/sdb1");
    QTest::newRow("untidy path") << QStringLiteral("Storage devices/./sdb1/");
    QTest::newRow("udi") << QStringLiteral("/udi/1");
}

void ToolStorageTest::findsDevices()
{
    QFETCH(const QString, operand);
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("storage info", {operand});
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QVERIFY(result.out.startsWith("name: sdb1\n"));
}

void ToolStorageTest::jobs_data()
{
    QTest::addColumn<QString>("verb");
    QTest::addColumn<QString>("method");
    QTest::newRow("mount") << QStringLiteral("mount") << QStringLiteral("mountStoragePlace");
    QTest::newRow("unmount") << QStringLiteral("unmount") << QStringLiteral("unmountStoragePlace");
    QTest::newRow("eject") << QStringLiteral("eject") << QStringLiteral("ejectStoragePlaceDevice");
}

void ToolStorageTest::jobs()
{
    QFETCH(const QString, verb);
    QFETCH(const QString, method);
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    const QString whole = QStringLiteral("StoragePlacesManager.") + method;
    const ToolResult result = scene.run("storage", {verb, QStringLiteral("sr0")});
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out + result.err, QByteArray());
    QCOMPARE(callsOf(scene.service(), whole).size(), 1);
    QVERIFY(callsOf(scene.service(), whole).constFirst().contains(QLatin1String("/udi/2")));

    scene.service().setRules(
        whole, {QJsonObject{{QStringLiteral("error"), QStringLiteral("busy\033[2J")}}});
    const ToolResult refused = scene.run("storage", {verb, QStringLiteral("sr0")});
    QCOMPARE(refused.exitCode, 1);
    QCOMPARE(refused.err, QByteArray("veyfm-vfs: sr0: busy\\033[2J\n"));
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolStorageTest::failingDeviceDoesNotStopOthers()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    scene.service().setRules(
        mountMethod, {QJsonObject{{QStringLiteral("error"), QStringLiteral("busy")}}});
    const ToolResult result = scene.run("storage mount sdz sdb1 sr0");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, QByteArray("veyfm-vfs: sdz: no such storage device\nveyfm-vfs: sdb1: busy\n"));
    QCOMPARE(callsOf(scene.service(), mountMethod).size(), 2);
}

void ToolStorageTest::serviceDiesDuringJob()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    scene.service().setRules(mountMethod, {QJsonObject{{QStringLiteral("exit"), 1}}});
    const ToolResult result = scene.run("storage mount sdb1");
    QCOMPARE(result.exitCode, 1);
    QVERIFY2(result.err.startsWith("veyfm-vfs: sdb1: "), result.err.constData());
    QCOMPARE(result.err.count('\n'), 1);
}

void ToolStorageTest::spinnerShowsOnTerminal()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    scene.service().setRules(mountMethod, {QJsonObject{{QStringLiteral("delay"), 2500}}});
    TerminalSession session(
        toolPath(), ToolScene::words("storage mount sdb1"), QDir::tempPath(), scene.environment());
    QVERIFY2(session.waitFor(" Mounting (0 s)"), session.output().constData());
    QVERIFY2(session.waitFor(" Mounting (2 s)"), session.output().constData());
    QCOMPARE(session.waitForEnd(), 0);
    // Nothing stays.
    QVERIFY2(session.output().endsWith("\r\033[K"), session.output().constData());
    QVERIFY(!session.output().contains('\n'));

    // A blocking read, in a verb that knows nothing of services.
    scene.service().setRules(listMethod, {QJsonObject{{QStringLiteral("delay"), 1500}}});
    TerminalSession list(
        toolPath(), {QStringLiteral("list"), QStringLiteral("Storage devices")}, QDir::tempPath(),
        scene.environment());
    QVERIFY2(
        list.waitFor(" Waiting for the file manager service (1 s)"), list.output().constData());
    QCOMPARE(list.waitForEnd(), 0);
    QVERIFY2(list.output().contains("\r\033[K"), list.output().constData());
    QVERIFY2(
        list.output().mid(list.output().lastIndexOf("\033[K")).contains("sdb1"),
        list.output().constData());
}

void ToolStorageTest::noSpinnerInPipes()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    scene.service().setRules(mountMethod, {QJsonObject{{QStringLiteral("delay"), 1000}}});
    const ToolResult result = scene.run("storage mount sdb1");
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out + result.err, QByteArray());
}

void ToolStorageTest::controlCDuringJob()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    scene.service().takeCalls();
    scene.service().setRules(mountMethod, {QJsonObject{{QStringLiteral("silent"), true}}});
    TerminalSession session(
        toolPath(), ToolScene::words("storage mount sdb1"), QDir::tempPath(), scene.environment());
    QVERIFY(session.waitFor(" Mounting ("));
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session.output().endsWith("\r\033[Kveyfm-vfs: storage mount: interrupted\n"),
        session.output().constData());
    // In good order: the service knows that the process has gone.
    QTRY_COMPARE(
        scene.service().calls().constLast(), QStringLiteral("Service.decrementProcessRef[]"));
}

void ToolStorageTest::controlCDuringBlockingRead()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    scene.service().setRules(listMethod, {QJsonObject{{QStringLiteral("silent"), true}}});
    TerminalSession session(
        toolPath(), ToolScene::words("storage list"), QDir::tempPath(), scene.environment());
    QVERIFY(session.waitFor(" Reading the storage devices ("));
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session.output().endsWith("\r\033[Kveyfm-vfs: storage list: interrupted\n"),
        session.output().constData());

    // A service that hangs altogether, from the first call on.
    const pid_t service = pid_t(scene.service().processId());
    QVERIFY(service > 0);
    ::kill(service, SIGSTOP);
    TerminalSession stuck(
        toolPath(), ToolScene::words("bookmark list"), QDir::tempPath(), scene.environment());
    const bool shown = stuck.waitFor(" Waiting for the file manager service (");
    stuck.type("\003");
    const int exitCode = stuck.waitForEnd();
    ::kill(service, SIGCONT);
    QVERIFY(shown);
    QCOMPARE(exitCode, 128 + SIGINT);
    QVERIFY2(
        stuck.output().endsWith("\r\033[Kveyfm-vfs: bookmark list: interrupted\n"),
        stuck.output().constData());
}

void ToolStorageTest::completion()
{
    ToolScene scene(twoDevices());
    QVERIFY(scene.isReady());
    QCOMPARE(scene.run("complete -- storage mount s").out, QByteArray("sr0\0sdb1\0", 9));
    QCOMPARE(scene.run("complete -- storage mount sd").out, QByteArray("sdb1\0", 5));
    QCOMPARE(scene.run("complete -- storage un").out, QByteArray("unmount\0", 8));
    QCOMPARE(scene.run("complete -- storage list --j").out, QByteArray("--json\0", 7));
    QCOMPARE(scene.run("complete -- help storage ej").out, QByteArray("eject\0", 6));
    QCOMPARE(scene.run("complete -- storage frobnicate s").out, QByteArray());
}

QTEST_GUILESS_MAIN(ToolStorageTest)
#include "tst_tool_storage.moc"
