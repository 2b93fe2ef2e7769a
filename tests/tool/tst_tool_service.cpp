// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolscene.h"

#include <QTest>

namespace {

const QByteArray noBus = "no session bus: start the program under dbus-run-session or in a "
                         "desktop session; 'veyfm-vfs status' shows how it stands\n";
const QByteArray notInstalled =
    "the file manager service (org.veylabs.vey-fm.vfs) is not installed on this session bus: "
    "install the program that provides it; 'veyfm-vfs status' shows how it stands\n";

} // namespace

/// All verbs that need the service, where there is none.
class ToolServiceTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void missingService_data();
    void missingService();
    void groupsNeedACommand_data();
    void groupsNeedACommand();
    void operandsAreCounted();
};

void ToolServiceTest::missingService_data()
{
    QTest::addColumn<QString>("verb");
    QTest::addColumn<QString>("operands");
    const auto row = [](const char* verb, const char* operands) {
        QTest::newRow(verb) << QString::fromLatin1(verb) << QString::fromLatin1(operands);
    };
    row("storage list", "");
    row("storage info", "sdb1");
    row("storage mount", "sdb1");
    row("storage unmount", "sdb1");
    row("storage eject", "sdb1");
    row("bookmark list", "");
    row("bookmark add", "/tmp");
    row("bookmark remove", "tmp");
    row("network list", "");
    row("network add", "sftp://host");
    row("network remove", "host");
    row("network workgroups", "");
    row("network hosts", "WG");
    row("network shares", "WG HOST");
    row("network rescan", "WG");
    row("update", "Samba");
    row("notify", "/tmp");
}

void ToolServiceTest::missingService()
{
    QFETCH(const QString, verb);
    QFETCH(const QString, operands);
    const QByteArray line = (verb + QLatin1Char(' ') + operands).toLatin1();
    const QByteArray start = "veyfm-vfs: " + verb.toLatin1() + ": ";

    const ToolResult without = runTool(
        ToolScene::words(line.constData()), QString(),
        toolEnvironment(
            {{QStringLiteral("DBUS_SESSION_BUS_ADDRESS"),
              QStringLiteral("unix:path=/nonexistent/bus")}}));
    QCOMPARE(without.exitCode, 1);
    QCOMPARE(without.out, QByteArray());
    QCOMPARE(without.err, start + noBus);

    ToolScene missing({}, ToolScene::Missing);
    QVERIFY(missing.isReady());
    const ToolResult result = missing.run(line.constData());
    QCOMPARE(result.exitCode, 1);
    QCOMPARE(result.out, QByteArray());
    QCOMPARE(result.err, start + notInstalled);

    const std::unique_ptr<ToolScene> dying = ToolScene::withDyingService();
    QVERIFY(dying->isReady());
    const ToolResult dead = dying->run(line.constData());
    QCOMPARE(dead.exitCode, 1);
    QCOMPARE(dead.out, QByteArray());
    QVERIFY2(
        dead.err.startsWith(
            start + "the file manager service (org.veylabs.vey-fm.vfs) does not start: "),
        dead.err.constData());
    QVERIFY2(dead.err.contains("exited with status 3"), dead.err.constData());
    QCOMPARE(dead.err.count('\n'), 1);
}

void ToolServiceTest::groupsNeedACommand_data()
{
    QTest::addColumn<QString>("verb");
    for (const char* verb : {"storage", "bookmark", "network"}) {
        QTest::newRow(verb) << QString::fromLatin1(verb);
    }
}

void ToolServiceTest::groupsNeedACommand()
{
    QFETCH(const QString, verb);
    const QByteArray start = "veyfm-vfs: " + verb.toLatin1() + ": ";
    const QByteArray hint = "\nTry 'veyfm-vfs " + verb.toLatin1() + " --help'.\n";
    const ToolResult bare = runTool({verb});
    QCOMPARE(bare.exitCode, 2);
    QCOMPARE(bare.err, start + "a command is missing" + hint);
    const ToolResult wrong = runTool({verb, QStringLiteral("frobnicate")});
    QCOMPARE(wrong.exitCode, 2);
    QCOMPARE(wrong.err, start + "frobnicate: no such command" + hint);
    const ToolResult option = runTool({verb, QStringLiteral("--json")});
    QCOMPARE(option.exitCode, 2);
    QCOMPARE(option.err, start + "unknown option 'json'" + hint);
}

void ToolServiceTest::operandsAreCounted()
{
    const ToolResult more = runTool(ToolScene::words("network shares WG HOST SHARE"));
    QCOMPARE(more.exitCode, 2);
    QCOMPARE(
        more.err, QByteArray("veyfm-vfs: network shares: 'SHARE' is an operand too many\n"
                             "Try 'veyfm-vfs network shares --help'.\n"));
    const ToolResult less = runTool(ToolScene::words("network shares WG"));
    QCOMPARE(less.exitCode, 2);
    QVERIFY(less.err.startsWith("veyfm-vfs: network shares: an operand is missing\n"));
}

QTEST_GUILESS_MAIN(ToolServiceTest)
#include "tst_tool_service.moc"
