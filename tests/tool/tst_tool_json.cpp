// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/toolscene.h"

#include <QJsonDocument>

/// What prints JSON prints valid JSON also when it fails.
class ToolJsonTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void everyVerbIsHere();
    void failures_data();
    void failures();

private:
    static QByteArrayList failingLines()
    {
        return {
            "list /nowhere",
            "list / /nowhere",
            "tree /nowhere",
            "info /nowhere",
            "info / /nowhere",
            "parent /nowhere",
            "parent --root=/nowhere /",
            "resolve x:y",
            "storage list",
            "storage info sdb1",
            "bookmark list",
            "network list",
            "network workgroups",
            "network hosts WG",
            "network shares WG HOST",
            "network rescan",
            "mount sftp://",
            "mount --no-input smb://host/share",
            "mounts",
            "unmount /nowhere",
            "update Network/x",
            "status",
            "monitor /nowhere",
        };
    }
};

void ToolJsonTest::everyVerbIsHere()
{
    QByteArrayList verbs;
    const QList<QByteArray> lines = runTool({QStringLiteral("--help")}).lines();
    for (const QByteArray& line : lines) {
        if (line.startsWith("  ") && !line.startsWith("  veyfm-vfs")) {
            verbs.append(line.trimmed().split(' ').constFirst());
        }
    }
    QVERIFY(verbs.size() > 10);
    for (int i = 0; i < verbs.size(); ++i) {
        const QByteArray verb = verbs.at(i);
        const ToolResult help =
            runTool(ToolScene::words(verb.constData()) + QStringList(QStringLiteral("--help")));
        const int start = help.out.indexOf("\nCommands:\n");
        if (start >= 0) {
            const QByteArrayList inner = help.out.mid(start + 11).split('\n');
            for (int j = 0; inner.at(j).startsWith("  "); ++j) {
                verbs.append(verb + ' ' + inner.at(j).trimmed().split(' ').constFirst());
            }
        }
        if (!help.out.contains("--json ")) {
            continue;
        }
        const QByteArrayList failing = failingLines();
        const bool isThere =
            std::any_of(failing.begin(), failing.end(), [&verb](const QByteArray& line) {
                return (line + ' ').startsWith(verb + ' ');
            });
        QVERIFY2(isThere, verb.constData());
    }
}

void ToolJsonTest::failures_data()
{
    QTest::addColumn<QByteArray>("line");
    const QByteArrayList failing = failingLines();
    for (const QByteArray& line : failing) {
        QTest::newRow(line.constData()) << line;
    }
}

void ToolJsonTest::failures()
{
    QFETCH(const QByteArray, line);
    // There is no session bus in the tests, let alone a service.
    const ToolResult result =
        runTool(ToolScene::words(line.constData()) + QStringList(QStringLiteral("--json")));
    QVERIFY(!result.err.isEmpty());
    QCOMPARE(result.exitCode, line == "mounts" ? 0 : 1);
    if (line.startsWith("monitor")) {
        // An object a line, of which there is none.
        QCOMPARE(result.out, QByteArray());
        return;
    }
    QJsonParseError error = {};
    const QJsonDocument document = QJsonDocument::fromJson(result.out, &error);
    QVERIFY2(error.error == QJsonParseError::NoError, result.out.constData());
    QVERIFY(document.isArray());
}

QTEST_GUILESS_MAIN(ToolJsonTest)
#include "tst_tool_json.moc"
