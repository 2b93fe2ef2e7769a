// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/fusemounturltest.h"

#include <sys/stat.h>
#include <unistd.h>

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

void FuseMountUrlTest::addresses_data()
{
    QTest::addColumn<QString>("host");
    QTest::addColumn<QByteArray>("given");
    QTest::addColumn<QString>("name");
    // In brackets, since a colon ends the host otherwise; but not in the name of the directory.
    QTest::newRow("loopback") << u"[::1]"_s << QByteArray("[::1]") << u"::1"_s;
    QTest::newRow("port") << u"[::1]:2222"_s << QByteArray("[::1]") << u"::1"_s;
    QTest::newRow("long form") << u"[2001:DB8:0:0:0:0:0:1]"_s << QByteArray("[2001:db8::1]")
                               << u"2001:db8::1"_s;
    QTest::newRow("mapped") << u"[::ffff:192.0.2.1]"_s << QByteArray("[::ffff:192.0.2.1]")
                            << u"::ffff:192.0.2.1"_s;
    QTest::newRow("zone") << u"[fe80::1%25eth0]"_s << QByteArray("[fe80::1%eth0]")
                          << u"fe80::1%eth0"_s;
    QTest::newRow("zone of a strange name")
        << u"[fe80::1%25a-b.2_c~]"_s << QByteArray("[fe80::1%a-b.2_c~]") << u"fe80::1%a-b.2_c~"_s;
    QTest::newRow("version 4") << u"192.0.2.1"_s << QByteArray("192.0.2.1") << u"192.0.2.1"_s;
}

void FuseMountUrlTest::addresses()
{
    QFETCH(QString, host);
    QFETCH(QByteArray, given);
    QFETCH(QString, name);
    tool->expect({});
    const FuseMountJob job = makeMountJob(url(u"bob@"_s + host + u"/a"_s));
    finish(job);
    QCOMPARE(job->error(), 0);
    const bool isFtp = protocol.scheme == u"ftp"_s;
    QCOMPARE(tool->arguments(1).value(isFtp ? 2 : 0), isFtp ? given : "bob@" + given + ":/");
    QCOMPARE(job.localPath(), mountDir(directory(u"bob@"_s + name)) + u"//a"_s);
    QCOMPARE(auth->server(), name);
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
    QTest::newRow("nothing in brackets") << url(u"[]/a"_s);
    QTest::newRow("option in brackets") << url(u"[-oProxyCommand=x]/a"_s);
    QTest::newRow("name in brackets") << url(u"bob@[host]/a"_s);
    QTest::newRow("address of version 4 in brackets") << url(u"[127.0.0.1]/a"_s);
    QTest::newRow("address of a version to come") << url(u"[v7.host]/a"_s);
    QTest::newRow("broken address") << url(u"[1::2::3]/a"_s);
    QTest::newRow("text behind the brackets") << url(u"[::1]-oProxyCommand=x/a"_s);
    QTest::newRow("encoded brackets") << url(u"%5B::1%5D/a"_s);
    QTest::newRow("option as a zone") << url(u"[fe80::1%25-oProxyCommand=x]/a"_s);
    QTest::newRow("slash in the zone") << url(u"[fe80::1%25a%2fb]/a"_s);
    QTest::newRow("comma in the zone") << url(u"[fe80::1%25a,allow_other]/a"_s);
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

void FuseMountUrlTest::directoriesAreForTheUserAlone()
{
    tool->expect({});
    const mode_t before = ::umask(0);
    const FuseMountJob job = makeMountJob(url(u"host"_s));
    finish(job);
    ::umask(before);
    QCOMPARE(job->error(), 0);
    const QString relative = directory(u"host"_s);
    for (const QString& path : {QString(), relative.section(u'/', 0, 1), relative}) {
        struct stat info = {};
        QCOMPARE(::stat(QFile::encodeName(mountDir(path)).constData(), &info), 0);
        QCOMPARE(int(info.st_mode & 07777), 0700);
    }
}

void FuseMountUrlTest::linkInPlaceOfTheDirectory()
{
    QVERIFY(QDir().mkpath(mountDir(directory(u"other"_s))));
    const QString link = mountDir(directory(u"host"_s));
    QVERIFY(QFile::link(u"other"_s, link));
    const FuseMountJob job = makeMountJob(url(u"host/a"_s));
    finish(job);
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), failure());
    QCOMPARE(auth->calls, QStringList());
    QCOMPARE(recordedMounts(), QStringList());
    QVERIFY(QFileInfo(link).isSymLink());
    QVERIFY(isMountDir(directory(u"other"_s)));
}

void FuseMountUrlTest::directoryOfAnotherUser()
{
    const QString path = mountDir(directory(u"host"_s));
    QVERIFY(QDir().mkpath(path));
    if (::chown(QFile::encodeName(path).constData(), 65534, 65534) != 0) {
        QSKIP("only root can make the directory of another user");
    }
    const FuseMountJob job = makeMountJob(url(u"host/a"_s));
    finish(job);
    QCOMPARE(job->error(), 5);
    QCOMPARE(job->errorString(), failure());
    QCOMPARE(recordedMounts(), QStringList());
    QVERIFY(isMountDir(directory(u"host"_s))); // It is not ours to remove.
}
