// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/urltext.h"

#include <QtTest>

using namespace VeyFM;

/// The guards that stand before every tool.
class UrlTextTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void writtenScheme_data();
    void writtenScheme();
    void words_data();
    void words();
    void dashesAsTheToolGetsThem();
    void safeUrls_data();
    void safeUrls();
    void toolHost_data();
    void toolHost();
};

void UrlTextTest::writtenScheme_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("scheme");
    const auto row = [](const char* url, const char* scheme) {
        QTest::newRow(url) << QString::fromUtf8(url) << QString::fromUtf8(scheme);
    };
    row("sftp://host", "sftp");
    row("SFtp://host", "SFtp");
    row("host", "");
    row("", "");
    row(":", "");
}

void UrlTextTest::writtenScheme()
{
    QFETCH(QString, url);
    QFETCH(QString, scheme);
    QCOMPARE(UrlText::writtenScheme(url), scheme);
}

void UrlTextTest::words_data()
{
    QTest::addColumn<QString>("name");
    QTest::addColumn<QStringList>("words");
    const auto row = [](const char* name, const QStringList& words) {
        QTest::newRow(name) << QString::fromUtf8(name) << words;
    };
    const QString end = QStringLiteral("-e");
    row("n", {QStringLiteral("t"), QStringLiteral("-o"), QStringLiteral("/n"), end});
    row("", {QStringLiteral("t"), QStringLiteral("-o"), QStringLiteral("/"), end});
    row("a b-c", {QStringLiteral("t"), QStringLiteral("-o"), QStringLiteral("/a"),
                  QStringLiteral("b-c"), end});
    // A name may swallow what is ours, and then our dash is no option either.
    row("a\"", {QStringLiteral("t"), QStringLiteral("-o"), QStringLiteral("/a -e")});
    row("a -", {});
    row("a -e", {});
    row("a\" -x", {QStringLiteral("t"), QStringLiteral("-o"), QStringLiteral("/a -x -e")});
    row("a \"-x\"", {});
    row("a\nb", {});
    row("\x01", {});
}

void UrlTextTest::words()
{
    QFETCH(QString, name);
    QFETCH(QStringList, words);
    QCOMPARE(UrlText::commandWords({QStringLiteral("t -o /"), name, QStringLiteral(" -e")}), words);
}

// Where the encoding of the locale has nothing but the dash for a character, as some have.
void UrlTextTest::dashesAsTheToolGetsThem()
{
    const QStringList pieces = {QStringLiteral("t /"), QStringLiteral("a \uff0dx")};
    const bool isDash = pieces.last().toLocal8Bit().contains("-");
    QCOMPARE(UrlText::commandWords(pieces).isEmpty(), isDash);
}

void UrlTextTest::safeUrls_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<bool>("sftp");
    QTest::addColumn<bool>("ftp");
    const auto row = [](const char* rest, bool sftp, bool ftp) {
        QTest::newRow(rest) << QString::fromUtf8(rest) << sftp << ftp;
    };
    row("host", true, true);
    row("me@host", true, true);
    row("me%40example.com@host", true, true);
    row("CORP%5cjane@host", true, true);
    row("h\u00f6st", true, true);
    row("[::1]", true, true);
    row("a,b@host", true, false);
    row("a%2Cb@host", true, false);
    row("a%252Cb@host", true, true); // It is not decoded twice.
    row("a%3ab@host", false, true);
    row("-a@host", false, true);
    row("%2da@host", false, true);
    row("[]-a@host", false, true);
    row("a[b@host", false, true);
    row("a]b@host", false, true);
    row("a@-host", false, false);
    row("a%2fb@host", false, false);
    row("a%0ab@host", false, false);
    row("a%00b@host", false, false);
    row("[host]", false, false);
    row("[]", false, false);
    row("[v1.x]", false, false);
    row("[::1%25]", false, false);
    row("[::1%25-x]", false, false);
    row("[::1%25a%20b]", false, false);
    row("[::1%25\u00e4]", false, false);
    row("host:99999", false, false);
    row("", false, false);
}

void UrlTextTest::safeUrls()
{
    QFETCH(QString, url);
    QFETCH(bool, sftp);
    QFETCH(bool, ftp);
    QCOMPARE(UrlText::isSafeForTool(QUrl(QStringLiteral("sftp://") + url)), sftp);
    QCOMPARE(UrlText::isSafeForTool(QUrl(QStringLiteral("ftp://") + url)), ftp);
}

void UrlTextTest::toolHost_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("host");
    const auto row = [](const char* url, const char* host) {
        QTest::newRow(url) << QString::fromUtf8(url) << QString::fromUtf8(host);
    };
    row("sftp://HOST/", "host");
    row("sftp://[me]@host/", "host");
    row("sftp://me@[::1]:22/", "[::1]");
    row("ftp://[FE80:0::1%25eth0]/", "[fe80::1%eth0]");
}

void UrlTextTest::toolHost()
{
    QFETCH(QString, url);
    QFETCH(QString, host);
    QCOMPARE(UrlText::toolHost(QUrl(url)), host);
}

QTEST_GUILESS_MAIN(UrlTextTest)
#include "tst_urltext.moc"
