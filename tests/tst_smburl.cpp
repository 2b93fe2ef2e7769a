// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/smburl.h"

#include <QtTest>

using VeyFM::SmbUrl;

class SmbUrlTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void parses_data();
    void parses();
    void nullAndEmptyParts();
    void invalidLeavesNullFields_data();
    void invalidLeavesNullFields();
    void setWorkgroupAlwaysMakesValid();
    void setHostAlwaysMakesValid();
    void setShareAsksForHost();
    void setTailPathAsksForHostAndShare();
    void toStringIgnoresValid();
    void toStringLeavesOutTailWithoutShare();
    void oddTextsEndInAValue();
};

void SmbUrlTest::parses_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QStringList>("parts"); // Workgroup, host, share, tail.
    QTest::addColumn<QString>("written");

    const auto row = [](const char* name, const char* text, const QStringList& parts,
                        const char* written) {
        QTest::newRow(name) << QString::fromUtf8(text) << parts << QString::fromUtf8(written);
    };
    const auto parts = [](const char* workgroup, const char* host, const char* share,
                          const char* tail) {
        return QStringList{
            QString::fromUtf8(workgroup), QString::fromUtf8(host), QString::fromUtf8(share),
            QString::fromUtf8(tail)};
    };

    row("everything", " \t smb://WG;user@host/share/one/two \n",
        parts("WG", "host", "share", "one/two"), "smb://WG;host/share/one/two");
    row("host", "smb://host", parts("", "host", "", ""), "smb://host/");
    row("host and slash", "smb://host/", parts("", "host", "", ""), "smb://host/");
    row("share", "smb://host/share", parts("", "host", "share", ""), "smb://host/share/");
    row("share and slash", "smb://host/share/", parts("", "host", "share", ""),
        "smb://host/share/");
    row("tail keeps its slashes", "smb://host/share/a//b/", parts("", "host", "share", "a//b/"),
        "smb://host/share/a//b/");
    row("user is dropped", "smb://user@host/s", parts("", "host", "s", ""), "smb://host/s/");
    row("workgroup alone", "smb://WG;host", parts("WG", "host", "", ""), "smb://WG;host/");
    row("empty workgroup", "smb://;host", parts("", "host", "", ""), "smb://host/");
    row("empty user", "smb://@host", parts("", "host", "", ""), "smb://host/");

    // Always the first separator counts.
    row("two semicolons", "smb://A;B;host", parts("A", "B;host", "", ""), "smb://A;B;host/");
    row("two at signs", "smb://u@v@host", parts("", "v@host", "", ""), "smb://v@host/");
    row("user before workgroup", "smb://u@A;host", parts("u@A", "host", "", ""), "smb://u@A;host/");
    row("separators behind the slash", "smb://host/a;b@c/d;e@f",
        parts("", "host", "a;b@c", "d;e@f"), "smb://host/a;b@c/d;e@f");

    // Five characters are tested and six are cut.
    row("single slash", "smb:/host/share", parts("", "ost", "share", ""), "smb://ost/share/");
    row("single slash alone", "smb:/", parts("", "", "", ""), "");
    row("sixth character is anything", "smb:/;host", parts("", "host", "", ""), "smb://host/");

    // Valid, since the beginning is all that counts.
    row("nothing behind", "smb://", parts("", "", "", ""), "");
    row("no host", "smb:///share/tail", parts("", "", "share", "tail"), "");
    row("workgroup without host", "smb://WG;", parts("WG", "", "", ""), "");
    row("no share", "smb://host//tail", parts("", "host", "", "tail"), "smb://host/");

    row("nothing is decoded", "smb://h%20t/s%2Fh/\xC3\xA4", parts("", "h%20t", "s%2Fh", "\xC3\xA4"),
        "smb://h%20t/s%2Fh/\xC3\xA4");
    row("blanks inside stay", "smb:// host / share ", parts("", " host ", " share", ""),
        "smb:// host / share/");
}

void SmbUrlTest::parses()
{
    QFETCH(QString, text);
    QFETCH(QStringList, parts);
    QFETCH(QString, written);

    const SmbUrl url(text);
    QVERIFY(url.isValid());
    QCOMPARE(QStringList({url.workgroup(), url.host(), url.share(), url.tailPath()}), parts);
    QCOMPARE(url.toString(), written);
    QCOMPARE(url.toString().isNull(), url.host().isEmpty());
}

void SmbUrlTest::nullAndEmptyParts()
{
    QVERIFY(SmbUrl(QStringLiteral("smb://host/share")).workgroup().isNull());
    QVERIFY(SmbUrl(QStringLiteral("smb://host/share")).tailPath().isNull());
    QVERIFY(!SmbUrl(QStringLiteral("smb://host/share/")).tailPath().isNull());
    QVERIFY(!SmbUrl(QStringLiteral("smb://;host")).workgroup().isNull());
    QVERIFY(SmbUrl(QStringLiteral("smb://host")).share().isEmpty());
}

void SmbUrlTest::invalidLeavesNullFields_data()
{
    QTest::addColumn<QString>("text");

    QTest::newRow("null") << QString();
    QTest::newRow("blank") << QStringLiteral("  ");
    QTest::newRow("upper case") << QStringLiteral("SMB://host/share");
    QTest::newRow("mixed case") << QStringLiteral("Smb://host/share");
    QTest::newRow("no slash") << QStringLiteral("smb:host");
    QTest::newRow("other scheme") << QStringLiteral("smbs://host/share");
    QTest::newRow("not at the beginning") << QStringLiteral("x smb://host/share");
}

void SmbUrlTest::invalidLeavesNullFields()
{
    QFETCH(QString, text);

    const SmbUrl url(text);
    QVERIFY(!url.isValid());
    QVERIFY(url.workgroup().isNull());
    QVERIFY(url.host().isNull());
    QVERIFY(url.share().isNull());
    QVERIFY(url.tailPath().isNull());
    QVERIFY(url.toString().isNull());
}

void SmbUrlTest::setWorkgroupAlwaysMakesValid()
{
    SmbUrl url{QString()};
    url.setWorkgroup(QString());
    QVERIFY(url.isValid());
    url.setWorkgroup(QStringLiteral("WG"));
    QVERIFY(url.isValid());
    QCOMPARE(url.workgroup(), QStringLiteral("WG"));
}

void SmbUrlTest::setHostAlwaysMakesValid()
{
    SmbUrl url{QString()};
    url.setHost(QString());
    QVERIFY(url.isValid());
    url.setShare(QStringLiteral("share"));
    QVERIFY(!url.isValid());
    url.setHost(QString());
    QVERIFY(url.isValid());
    url.setHost(QStringLiteral("host"));
    QVERIFY(url.isValid());
    QCOMPARE(url.host(), QStringLiteral("host"));
}

void SmbUrlTest::setShareAsksForHost()
{
    SmbUrl url(QStringLiteral("smb://"));
    QVERIFY(url.isValid());
    url.setShare(QStringLiteral("share"));
    QVERIFY(!url.isValid());
    QCOMPARE(url.share(), QStringLiteral("share"));

    url.setHost(QStringLiteral("host"));
    url.setShare(QString()); // Of the share itself nothing is asked.
    QVERIFY(url.isValid());
}

void SmbUrlTest::setTailPathAsksForHostAndShare()
{
    SmbUrl url(QStringLiteral("smb://host"));
    url.setTailPath(QStringLiteral("tail"));
    QVERIFY(!url.isValid());
    QCOMPARE(url.tailPath(), QStringLiteral("tail"));

    url.setShare(QStringLiteral("share"));
    url.setTailPath(QString()); // Of the tail itself nothing is asked.
    QVERIFY(url.isValid());

    url.setHost(QString());
    url.setTailPath(QStringLiteral("tail"));
    QVERIFY(!url.isValid());
}

void SmbUrlTest::toStringIgnoresValid()
{
    SmbUrl url(QStringLiteral("smb://host"));
    url.setTailPath(QString());
    QVERIFY(!url.isValid());
    QCOMPARE(url.toString(), QStringLiteral("smb://host/"));

    url.setHost(QString());
    url.setWorkgroup(QStringLiteral("WG"));
    QVERIFY(url.isValid());
    QVERIFY(url.toString().isNull());
}

void SmbUrlTest::toStringLeavesOutTailWithoutShare()
{
    SmbUrl url(QStringLiteral("smb://WG;host"));
    url.setTailPath(QStringLiteral("tail"));
    QCOMPARE(url.toString(), QStringLiteral("smb://WG;host/"));
    url.setShare(QStringLiteral("share"));
    QCOMPARE(url.toString(), QStringLiteral("smb://WG;host/share/tail"));
}

void SmbUrlTest::oddTextsEndInAValue()
{
    const QString slashes(100000, QLatin1Char('/'));
    const SmbUrl url(QLatin1String("smb:") + slashes);
    QVERIFY(url.isValid());
    QVERIFY(url.host().isEmpty());
    QCOMPARE(url.tailPath().size(), 100000 - 4);

    const SmbUrl separators(QLatin1String("smb://") + QString(100000, QLatin1Char(';')));
    QCOMPARE(separators.host().size(), 100000 - 1);

    const QString broken = QStringLiteral("smb://h") + QChar(0xD800) + QChar(0);
    QCOMPARE(SmbUrl(broken).host().size(), 3);
}

QTEST_APPLESS_MAIN(SmbUrlTest)
#include "tst_smburl.moc"
