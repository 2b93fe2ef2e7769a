// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/fusemounturltest.h"

using namespace VeyFM;

void FuseMountUrlTest::otherScheme_data()
{
    QTest::addColumn<QString>("url");
    const QString scheme = protocol.scheme;
    for (const QString& url :
         {protocol.otherScheme + u"://host"_s, scheme.toUpper() + u"://host"_s,
          scheme + u"s://host"_s, u"host"_s, u" "_s + scheme + u"://host"_s, QString()}) {
        QTest::newRow(qPrintable(url)) << url;
    }
}

void FuseMountUrlTest::otherScheme()
{
    QFETCH(QString, url);
    const FuseMountJob job = makeMountJob(url);
    finish(job);
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), u"Url scheme is not "_s + protocol.scheme);
    QVERIFY(!QFileInfo::exists(mountDir(QString())));
    QCOMPARE(service->takeCalls(), QStringList());
}

void FuseMountUrlTest::alreadyMounted_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<QString>("key");
    QTest::addColumn<QString>("path");
    // The path brings a slash of its own.
    QTest::newRow("root") << url(u"host/"_s) << url(u"host/"_s) << u"/mnt//"_s;
    QTest::newRow("no path") << url(u"host"_s) << url(u"host/"_s) << u"/mnt/"_s;
    QTest::newRow("path") << url(u"host/a/b%20c"_s) << url(u"host/"_s) << u"/mnt//a/b c"_s;
    QTest::newRow("user") << url(u"bob@host/a"_s) << url(u"bob@host/"_s) << u"/mnt//a"_s;
    QTest::newRow("port") << url(u"host:2121/a"_s) << url(u"host:2121/"_s) << u"/mnt//a"_s;
    addMountedUrls();
}

void FuseMountUrlTest::alreadyMounted()
{
    QFETCH(QString, url);
    QFETCH(QString, key);
    QFETCH(QString, path);
    // The service's word is taken: there is no such directory.
    setFuseMounts({{key, u"/mnt"_s}});
    const FuseMountJob job = makeMountJob(url);
    startToEnd(job.job.get());
    QCOMPARE(job->error(), 0);
    QCOMPARE(job.localPath(), path);
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(service->takeCalls(), QStringList(u"FuseMountsManager.mounts[]"_s));
    QVERIFY(!QFileInfo::exists(mountDir(QString())));
}

void FuseMountUrlTest::registeredWithoutAPath()
{
    setFuseMounts({{url(u"host/"_s), QString()}});
    tool->expect({});
    const FuseMountJob job = makeMountJob(url(u"host/"_s));
    finish(job);
    QCOMPARE(job.localPath(), mountDir(directory(u"host//"_s)));
}

void FuseMountUrlTest::twoPathsShareAMount()
{
    tool->expect({});
    const FuseMountJob first = makeMountJob(url(u"bob@host/a"_s));
    finish(first);
    const QString mountPath = mountDir(directory(u"bob@host"_s));
    QCOMPARE(recordedMounts(), QStringList(recordedMount(url(u"bob@host/"_s), mountPath)));
    setFuseMounts({{url(u"bob@host/"_s), mountPath}});
    const FuseMountJob second = makeMountJob(url(u"bob@host/b"_s));
    finish(second);
    QCOMPARE(first.localPath(), mountPath + u"//a"_s);
    QCOMPARE(second.localPath(), mountPath + u"//b"_s);
    QCOMPARE(recordedMounts(), QStringList());
}

void FuseMountUrlTest::unsafeUrls_data()
{
    QTest::addColumn<QString>("url");
    QTest::newRow("no host") << url(u"/a"_s);
    QTest::newRow("nothing") << protocol.scheme + u":"_s;
    QTest::newRow("user alone") << url(u"bob@/a"_s);
    QTest::newRow("host is an option") << url(u"-oProxyCommand=x/a"_s);
    QTest::newRow("host is a flag") << url(u"bob@-f/a"_s);
    QTest::newRow("no port") << url(u"host:99999/a"_s);
    QTest::newRow("host goes up") << url(u"../a"_s);
    QTest::newRow("encoded host goes up") << url(u"%2e%2e/a"_s);
    QTest::newRow("slash in the host") << url(u"a%2fb/a"_s);
    QTest::newRow("slash in the user") << url(u"..%2f..%2fbob@host/a"_s);
    QTest::newRow("newline in the user") << url(u"bob%0aann@host/a"_s);
    QTest::newRow("zero byte in the user") << url(u"bob%00ann@host/a"_s);
    QTest::newRow("delete in the user") << url(u"bob%7f@host/a"_s);
    addUnsafeUrls();
}

void FuseMountUrlTest::unsafeUrls()
{
    QFETCH(QString, url);
    const FuseMountJob job = makeMountJob(url);
    finish(job);
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), failure());
    QCOMPARE(auth->calls, QStringList());
    QVERIFY(!QFileInfo::exists(mountDir(QString())));
    QCOMPARE(recordedMounts(), QStringList());
}
