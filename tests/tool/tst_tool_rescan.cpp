// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/terminalsession.h"
#include "support/toolscene.h"

#include <QTemporaryDir>
#include <QTest>

#include <signal.h>

namespace {

QJsonObject network()
{
    return {
        {QStringLiteral("values"),
         QJsonObject{
             {QStringLiteral("SmbBrowser.workgroups"),
              QJsonArray{QStringLiteral("WG"), QStringLiteral("A\nB")}},
             {QStringLiteral("SmbBrowser.hosts WG"), QJsonArray{QStringLiteral("HOST")}},
             {QStringLiteral("SmbBrowser.shares HOST WG"),
              QJsonObject{{QStringLiteral("data"), QString()}}}}}};
}

} // namespace

/// "network rescan".
class ToolRescanTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void rescans_data();
    void rescans();
    void json();
    void nothingNew_data();
    void nothingNew();
    void waitsForItsOwnEnd();
    void endOfOthers_data();
    void endOfOthers();
    void fails_data();
    void fails();
    void interrupted();
    void networkSwitchedOff();
};

void ToolRescanTest::rescans_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QString>("request");
    QTest::addColumn<QJsonArray>("end");
    QTest::addColumn<QString>("level");
    QTest::addColumn<QJsonValue>("before");
    QTest::addColumn<QJsonValue>("behind");
    QTest::addColumn<QByteArray>("output");
    const auto names = [](const QStringList& all) {
        return QJsonValue(QJsonArray::fromStringList(all));
    };
    const QString wg = QStringLiteral("WG");
    const QString host = QStringLiteral("HOST");
    QTest::newRow("network")
        << QByteArray("network rescan") << QStringLiteral("SmbBrowser.rescan[]")
        << QJsonArray{QStringLiteral("rescanFinished"), QJsonArray{true}}
        << QStringLiteral("SmbBrowser.workgroups") << names({wg, QStringLiteral("OLD")})
        << names({QStringLiteral("NEW"), wg, QStringLiteral("X\nY")})
        << QByteArray("removed  Samba/OLD\nadded    Samba/NEW\nadded    Samba/X\\nY\n");
    QTest::newRow("workgroup")
        << QByteArray("network rescan WG") << QStringLiteral("SmbBrowser.rescanWorkgroup[\"WG\"]")
        << QJsonArray{QStringLiteral("rescanWorkgroupFinished"), QJsonArray{wg, true}}
        << QStringLiteral("SmbBrowser.hosts WG") << names({}) << names({host})
        << QByteArray("added  Samba/WG/HOST\n");
    QTest::newRow("host")
        << QByteArray("network rescan WG HOST")
        << QStringLiteral("SmbBrowser.rescanHost[\"HOST\",\"WG\"]")
        << QJsonArray{QStringLiteral("rescanHostFinished"), QJsonArray{host, wg, true}}
        << QStringLiteral("SmbBrowser.shares HOST WG")
        << QJsonValue(QJsonObject{
               {QStringLiteral("old"), QStringLiteral("/tmp")},
               {QStringLiteral("both"), QString()}})
        << QJsonValue(QJsonObject{
               {QStringLiteral("new"), QString()},
               {QStringLiteral("both"), QStringLiteral("/tmp")}})
        << QByteArray("removed  Samba/WG/HOST/old\nadded    Samba/WG/HOST/new\n");
}

void ToolRescanTest::rescans()
{
    QFETCH(const QByteArray, line);
    QFETCH(const QString, request);
    QFETCH(const QJsonArray, end);
    QFETCH(const QString, level);
    QFETCH(const QJsonValue, before);
    QFETCH(const QJsonValue, behind);
    QFETCH(const QByteArray, output);
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    // What is read first is what was known.
    const QString method = level.section(QLatin1Char(' '), 0, 0);
    scene.service().setRules(method, {QJsonObject{{QStringLiteral("value"), before}}});
    scene.service().setValue(level, behind);
    const QJsonArray signal = {
        QStringLiteral("SmbBrowser"), end.at(0).toString(), end.at(1).toArray()};
    scene.service().setRules(
        request.section(QLatin1Char('['), 0, 0),
        {QJsonObject{{QStringLiteral("signals"), oneArgument(signal)}}});
    const ToolResult result = scene.run(line.constData());
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, output);
    QCOMPARE(scene.service().calls().count(request), 1);
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolRescanTest::json()
{
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    const QJsonArray signal = {
        QStringLiteral("SmbBrowser"), QStringLiteral("rescanWorkgroupFinished"),
        QJsonArray{QStringLiteral("WG"), true}};
    scene.service().setRules(
        QStringLiteral("SmbBrowser.rescanWorkgroup"),
        {QJsonObject{
            {QStringLiteral("signals"), oneArgument(signal)}, {QStringLiteral("keep"), true}}});
    scene.service().setRules(
        QStringLiteral("SmbBrowser.hosts"),
        {QJsonObject{{QStringLiteral("value"), QJsonArray{QStringLiteral("OLD")}}}});
    const QJsonObject removed = {
        {QStringLiteral("change"), QStringLiteral("removed")},
        {QStringLiteral("name"), QStringLiteral("OLD")},
        {QStringLiteral("path"), QStringLiteral("Samba/WG/OLD")}};
    const QJsonObject added = {
        {QStringLiteral("change"), QStringLiteral("added")},
        {QStringLiteral("name"), QStringLiteral("HOST")},
        {QStringLiteral("path"), QStringLiteral("Samba/WG/HOST")}};
    QCOMPARE(scene.run("network rescan --json WG").json(), (QJsonArray{removed, added}));
    const ToolResult again = scene.run("network rescan --json WG");
    QCOMPARE(again.exitCode, 0);
    QCOMPARE(again.out, QByteArray("[]\n"));
}

void ToolRescanTest::nothingNew_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QString>("method");
    QTest::addColumn<QJsonArray>("end");
    QTest::newRow("network") << QByteArray("network rescan") << QStringLiteral("rescan")
                             << QJsonArray{QStringLiteral("rescanFinished"), QJsonArray{false}};
    QTest::newRow("workgroup") << QByteArray("network rescan WG")
                               << QStringLiteral("rescanWorkgroup")
                               << QJsonArray{
                                      QStringLiteral("rescanWorkgroupFinished"),
                                      QJsonArray{QStringLiteral("WG"), false}};
    QTest::newRow("host") << QByteArray("network rescan WG HOST") << QStringLiteral("rescanHost")
                          << QJsonArray{
                                 QStringLiteral("rescanHostFinished"),
                                 QJsonArray{QStringLiteral("HOST"), QStringLiteral("WG"), false}};
}

void ToolRescanTest::nothingNew()
{
    QFETCH(const QByteArray, line);
    QFETCH(const QString, method);
    QFETCH(const QJsonArray, end);
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    const QJsonArray signal = {
        QStringLiteral("SmbBrowser"), end.at(0).toString(), end.at(1).toArray()};
    scene.service().setRules(
        QStringLiteral("SmbBrowser.") + method,
        {QJsonObject{{QStringLiteral("signals"), oneArgument(signal)}}});
    const ToolResult result = scene.run(line.constData());
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray());
}

void ToolRescanTest::waitsForItsOwnEnd()
{
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    const QString wg = QStringLiteral("WG");
    const auto end = [](const QJsonArray& arguments) {
        return QJsonArray{
            QStringLiteral("SmbBrowser"), QStringLiteral("rescanHostFinished"), arguments};
    };
    scene.service().setValue(
        QStringLiteral("SmbBrowser.hosts WG"),
        QJsonArray{QStringLiteral("HOST"), QStringLiteral("OTHER")});
    // The job ends on the news of the other host.
    const QJsonArray ends = {
        end({QStringLiteral("OTHER"), wg, true}), end({QStringLiteral("OTHER"), wg, false}),
        end({QStringLiteral("HOST"), QStringLiteral("A\nB"), true}),
        end({QStringLiteral("HOST"), wg, true})};
    scene.service().setRules(
        QStringLiteral("SmbBrowser.rescanHost"), {QJsonObject{{QStringLiteral("signals"), ends}}});
    scene.service().setRules(
        QStringLiteral("SmbBrowser.shares"),
        {QJsonObject{{QStringLiteral("value"), QJsonObject{{QStringLiteral("old"), QString()}}}}});
    const ToolResult result = scene.run("network rescan WG HOST");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QVERIFY2(result.out.contains("removed  Samba/WG/HOST/old\n"), result.out.constData());
    QVERIFY2(result.out.contains("added    Samba/WG/HOST/data\n"), result.out.constData());
}

void ToolRescanTest::endOfOthers_data()
{
    QTest::addColumn<QByteArray>("operands");
    QTest::addColumn<QString>("request");
    QTest::addColumn<QJsonArray>("end");
    const QString workgroup = QStringLiteral("rescanWorkgroup");
    const QString host = QStringLiteral("rescanHost");
    for (const bool isNew : {false, true}) {
        QTest::addRow("workgroup, %d", isNew)
            << QByteArray("WG") << workgroup << QJsonArray{QStringLiteral("A\nB"), isNew};
        QTest::addRow("host, %d", isNew)
            << QByteArray("WG HOST") << host
            << QJsonArray{QStringLiteral("OTHER"), QStringLiteral("WG"), isNew};
    }
}

void ToolRescanTest::endOfOthers()
{
    QFETCH(QByteArray, operands);
    QFETCH(const QString, request);
    QFETCH(const QJsonArray, end);
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    scene.service().setValue(
        QStringLiteral("SmbBrowser.hosts WG"),
        QJsonArray{QStringLiteral("HOST"), QStringLiteral("OTHER")});
    const QJsonArray signal = {
        QStringLiteral("SmbBrowser"), request + QStringLiteral("Finished"), end};
    scene.service().setRules(
        QStringLiteral("SmbBrowser.") + request,
        {QJsonObject{{QStringLiteral("signals"), oneArgument(signal)}}});
    const ToolResult result = scene.run("network rescan --timeout=1 " + operands);
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err, "veyfm-vfs: " + operands.replace(' ', '/') +
                        ": asked for, but the service told of no end of the scan within 1 s\n");
}

void ToolRescanTest::fails_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QByteArray>("message");
    const auto row = [](const char* line, const char* message) {
        QTest::newRow(line) << QByteArray(line) << QByteArray(message);
    };
    row("network rescan NONE", "NONE: no such workgroup");
    row("network rescan WG NONE", "WG/NONE: no such host or workgroup");
    row("network rescan WG/HOST", "WG/HOST: no such workgroup");
    row("network rescan --timeout=1",
        "network rescan: asked for, but the service told of no end of the scan within 1 s");
    row("network rescan --timeout=1 WG",
        "WG: asked for, but the service told of no end of the scan within 1 s");
    row("network rescan --timeout=1 WG HOST",
        "WG/HOST: asked for, but the service told of no end of the scan within 1 s");
}

void ToolRescanTest::fails()
{
    QFETCH(const QByteArray, line);
    QFETCH(const QByteArray, message);
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run(line.constData());
    QCOMPARE(result.err, "veyfm-vfs: " + message + '\n');
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
}

void ToolRescanTest::interrupted()
{
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    TerminalSession session(
        toolPath(), ToolScene::words("network rescan WG"), QDir::tempPath(), scene.environment());
    QVERIFY(session.waitFor(" Scanning the Samba network ("));
    session.type("\003");
    QCOMPARE(session.waitForEnd(), 128 + SIGINT);
    QVERIFY2(
        session.output().endsWith("\r\033[Kveyfm-vfs: network rescan: interrupted\n"),
        session.output().constData());
}

void ToolRescanTest::networkSwitchedOff()
{
    ToolScene scene(network());
    QVERIFY(scene.isReady());
    QTemporaryDir configuration;
    QVERIFY(QDir(configuration.path()).mkdir(QStringLiteral("veylabs")));
    QVERIFY(createFile(
        configuration.filePath(QStringLiteral("veylabs")), "vey-fm-vfs.conf",
        "[Network]\nEnabled=false\n"));
    QProcessEnvironment environment = scene.environment();
    environment.insert(QStringLiteral("XDG_CONFIG_HOME"), configuration.path());
    const ToolResult result =
        runTool(ToolScene::words("network rescan WG"), QString(), environment);
    QCOMPARE(
        result.err,
        QByteArray("veyfm-vfs: WG: there is no such place: is the network switched off?\n"));
    QCOMPARE(result.exitCode, 1);
}

QTEST_GUILESS_MAIN(ToolRescanTest)
#include "tst_tool_rescan.moc"
