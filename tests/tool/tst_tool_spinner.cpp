// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "spinner.h"
#include "terminal.h"

#include <QTest>

#include <poll.h>
#include <pty.h>
#include <sys/ioctl.h>
#include <unistd.h>

using namespace VeyFM::Tool;

/// The line that shows that something takes its time, on a terminal in place of standard error.
class ToolSpinnerTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void textIsHarmless();
    void passwordsAreLeftOut();
    void lineFits_data();
    void lineFits();
    void terminalBecomesNarrow();
    void cleanupTestCase();

private:
    void setColumns(int columns)
    {
        winsize size = {};
        size.ws_row = 24;
        size.ws_col = ushort(columns);
        QCOMPARE(::ioctl(m_master, TIOCSWINSZ, &size), 0);
    }

    /// What is drawn up to the next end of a line.
    QByteArray nextLine()
    {
        while (m_output.indexOf("\033[K") < 0) {
            pollfd poll = {m_master, POLLIN, 0};
            char buffer[1024];
            if (::poll(&poll, 1, 10000) != 1) {
                return "nothing came";
            }
            const ssize_t size = ::read(m_master, buffer, sizeof buffer);
            m_output.append(buffer, int(size));
        }
        const int end = m_output.indexOf("\033[K");
        const QByteArray line = m_output.left(end);
        m_output.remove(0, end + 3);
        return line;
    }

    /// Draws once, and takes it away.
    QByteArray shown(const QString& text)
    {
        const Waiting waiting(text);
        return nextLine();
    }

    int m_master = -1;
    int m_stderr = -1;
    QByteArray m_output;
};

void ToolSpinnerTest::initTestCase()
{
    int slave = -1;
    QCOMPARE(::openpty(&m_master, &slave, nullptr, nullptr, nullptr), 0);
    m_stderr = ::dup(STDERR_FILENO);
    QVERIFY(::dup2(slave, STDERR_FILENO) >= 0);
    ::close(slave);
    QVERIFY(qputenv("TERM", "xterm"));
}

void ToolSpinnerTest::cleanupTestCase()
{
    ::dup2(m_stderr, STDERR_FILENO);
}

void ToolSpinnerTest::textIsHarmless()
{
    setColumns(80);
    const QByteArray line = shown(QStringLiteral("Looking at \033]0;x\a\n\r"));
    QVERIFY2(line.endsWith(" Looking at \\033]0;x\\a\\n\\r (0 s)"), line.constData());
    QCOMPARE(line.count('\033'), 0);
    QCOMPARE(nextLine(), QByteArray("\r"));
}

void ToolSpinnerTest::passwordsAreLeftOut()
{
    setColumns(80);
    const QByteArray line = shown(QStringLiteral("Mounting sftp://me:pw@host"));
    QVERIFY2(line.endsWith(" Mounting sftp://me@host (0 s)"), line.constData());
    QCOMPARE(nextLine(), QByteArray("\r"));
}

void ToolSpinnerTest::lineFits_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("columns");
    QTest::addColumn<int>("width");
    const QString narrow(200, QLatin1Char('n'));
    const QString wide(200, QChar(0x65e5));
    QTest::newRow("narrow characters") << narrow << 40 << 39;
    // Half of the last one would not fit.
    QTest::newRow("wide characters") << wide << 40 << 38;
    QTest::newRow("wide characters that fit") << wide << 41 << 40;
    QTest::newRow("no room for the text") << narrow << 8 << 7;
    QTest::newRow("no room for the time") << narrow << 4 << 3;
    QTest::newRow("no room") << narrow << 1 << 0;
}

void ToolSpinnerTest::lineFits()
{
    QFETCH(const QString, text);
    QFETCH(const int, columns);
    QFETCH(const int, width);
    setColumns(columns);
    const QByteArray line = shown(text);
    QVERIFY(line.startsWith('\r'));
    QCOMPARE(displayWidth(QString::fromLocal8Bit(line.mid(1))), width);
    if (columns > 8) {
        QVERIFY2(line.endsWith(" (0 s)"), line.constData());
    }
    if (width > 0) {
        QCOMPARE(nextLine(), QByteArray("\r"));
    }
}

void ToolSpinnerTest::terminalBecomesNarrow()
{
    setColumns(60);
    {
        const Waiting waiting(QString(200, QLatin1Char('n')));
        QCOMPARE(displayWidth(QString::fromLocal8Bit(nextLine().mid(1))), 59);
        setColumns(20);
        // The line takes three rows now.
        QByteArray line;
        do {
            line = nextLine();
        } while (line.size() == 60);
        QVERIFY2(line.startsWith("\r\033[2A\033[J"), line.constData());
        line = nextLine();
        QCOMPARE(displayWidth(QString::fromLocal8Bit(line.mid(1))), 19);
        setColumns(10);
    }
    QByteArray last;
    do {
        last = nextLine();
    } while (last.contains('n'));
    QVERIFY2(last == "\r" || last == "\r\033[1A\033[J", last.constData());
}

QTEST_GUILESS_MAIN(ToolSpinnerTest)
#include "tst_tool_spinner.moc"
