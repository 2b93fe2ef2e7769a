// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolscene.h"

#include <QTest>

class ToolNotifyTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void sendsEntries();
    void failingOperandDoesNotStopOthers();
    void noEcho();
    void withoutABound();
    void serviceDies();
};

void ToolNotifyTest::sendsEntries()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("notify Favourites /nothing/here");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
    QCOMPARE(result.out, QByteArray());
    const QStringList calls = scene.service().calls().filter(QStringLiteral("notifyWatchers"));
    QCOMPARE(calls.size(), 1);
    QVERIFY2(
        calls.constFirst().startsWith(
            QLatin1String("FileSystem.notifyWatchers[[[\"Favourites\",\"\",")),
        qPrintable(calls.constFirst()));
    QVERIFY(calls.constFirst().contains(QLatin1String("[\"/nothing/here\",\"/nothing/here\",")));
    QCOMPARE(scene.service().violations(), QStringList());
}

void ToolNotifyTest::failingOperandDoesNotStopOthers()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("notify gopher:x /tmp");
    QCOMPARE(result.exitCode, 1);
    QVERIFY(result.err.startsWith("veyfm-vfs: gopher:x: "));
    QCOMPARE(result.err.count('\n'), 1);
    QCOMPARE(scene.service().calls().filter(QStringLiteral("notifyWatchers")).size(), 1);
    QCOMPARE(scene.run("notify gopher:x").exitCode, 1);
    QCOMPARE(scene.service().calls().filter(QStringLiteral("notifyWatchers")).size(), 1);
}

void ToolNotifyTest::noEcho()
{
    ToolScene scene({{QStringLiteral("echo"), false}});
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("notify --timeout=1 /tmp");
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(
        result.err,
        QByteArray("veyfm-vfs: /tmp: asked for, but the service told of no change within 1 s\n"));
}

void ToolNotifyTest::withoutABound()
{
    // 0 is as long as it takes, not at once.
    ToolScene scene(
        ruleOf(QStringLiteral("FileSystem.notifyWatchers"), {{QStringLiteral("delay"), 500}}));
    QVERIFY(scene.isReady());
    const ToolResult result = scene.run("notify --timeout=0 /tmp");
    QCOMPARE(result.err, QByteArray());
    QCOMPARE(result.exitCode, 0);
}

void ToolNotifyTest::serviceDies()
{
    ToolScene scene;
    QVERIFY(scene.isReady());
    scene.service().setRules(
        QStringLiteral("FileSystem.notifyWatchers"), {QJsonObject{{QStringLiteral("exit"), 1}}});
    const ToolResult result = scene.run("notify --timeout=1 /tmp");
    QCOMPARE(result.exitCode, 1);
    QVERIFY(!result.err.isEmpty());
}

QTEST_GUILESS_MAIN(ToolNotifyTest)
#include "tst_tool_notify.moc"
