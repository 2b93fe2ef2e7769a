// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/vfsclient.h"
#include "support/vfstest.h"

#include <QSignalSpy>

using namespace VeyFM;

/// notifyAllWatchers(): from one process to all, by way of the service.
class NotifyRoadTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void echoComesAfterTheCall();
    void withoutEchoNothingHappens();
    void anyEntryIsReset();
    void otherProcessesAreTold();
    void otherProcessesTellUs();
    void emptyListIsSent();
    void callIsNotWaitedFor();
    void cleanupTestCase();
};

void NotifyRoadTest::initTestCase()
{
    QVERIFY(startVfs("{}"));
}

void NotifyRoadTest::echoComesAfterTheCall()
{
    EntryList entries(vfs->homeEntry());
    entries.append(vfs->trashEntry());
    service->takeCalls();
    vfs->notifyAllWatchers(entries);
    QCOMPARE(log->take(), QStringList());
    const QStringList told = log->takeAll(service);
    QCOMPARE(told.size(), 2);
    QVERIFY(told.first().startsWith(u"reset Home"_s));
    QVERIFY(told.last().startsWith(u"reset Trash"_s));
    QCOMPARE(service->takeCalls().size(), 1);
}

void NotifyRoadTest::withoutEchoNothingHappens()
{
    // There is no delivery on the spot to fall back to.
    service->load(object(R"({"echo": false})"));
    vfs->notifyAllWatchers(EntryList(vfs->homeEntry()));
    QCOMPARE(log->takeAll(service), QStringList());
    service->load(object(R"({"echo": true})"));
}

void NotifyRoadTest::anyEntryIsReset()
{
    // Watched or not, refreshable or not, null or not.
    EntryList entries(vfs->entry(u"/proc/self"_s));
    entries.append(Entry());
    vfs->notifyAllWatchers(entries);
    const QStringList told = log->takeAll(service);
    QCOMPARE(told.size(), 2);
    QVERIFY(told.first().startsWith(u"reset /proc/self"_s));
    QCOMPARE(told.last(), u"reset -"_s);
}

void NotifyRoadTest::otherProcessesAreTold()
{
    VfsClient client;
    QVERIFY(client.start());
    vfs->notifyAllWatchers(EntryList(vfs->trashEntry()));
    QVERIFY(client.waitFor(u"reset Trash"_s));
    QCOMPARE(client.quit(), 0);
    log->takeAll(service);
}

void NotifyRoadTest::otherProcessesTellUs()
{
    VfsClient client;
    QVERIFY(client.start());
    QSignalSpy resets(vfs->entryWatcher(), &EntryWatcher::entryReset);
    client.send(u"notify Desktop"_s);
    // The sender gets its own words back, after the call has returned.
    QVERIFY(client.waitFor(u"notified"_s));
    QVERIFY(client.passed.isEmpty());
    QVERIFY(client.waitFor(u"reset Desktop"_s));
    QVERIFY(!resets.isEmpty() || resets.wait());
    QCOMPARE(resets.first().first().value<Entry>(), vfs->desktopEntry());
    QCOMPARE(client.quit(), 0);
    log->takeAll(service);
}

void NotifyRoadTest::emptyListIsSent()
{
    service->takeCalls();
    vfs->notifyAllWatchers(EntryList());
    QCOMPARE(log->takeAll(service), QStringList());
    QCOMPARE(service->takeCalls(), QStringList(u"FileSystem.notifyWatchers[[]]"_s));
}

void NotifyRoadTest::callIsNotWaitedFor()
{
    service->takeCalls();
    service->stop();
    vfs->notifyAllWatchers(EntryList(vfs->homeEntry()));
    service->resume();
    // The mark goes another way to the service, and may come to it before the call.
    QTRY_COMPARE(service->calls().size(), 1);
    QCOMPARE(log->takeAll(service).size(), 1);
}

void NotifyRoadTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(NotifyRoadTest)
#include "tst_notifyroad.moc"
