// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/placescene.h"

#include <QtTest>

#include <atomic>
#include <chrono>
#include <future>
#include <thread>
#include <vector>

using namespace VeyFM;
using namespace std::chrono_literals;

namespace {

constexpr auto patience = 30s;

template <typename Work>
void inThread(Work work)
{
    std::thread(work).join();
}

// What another thread works out meanwhile.
template <typename Result>
class Task
{
public:
    Task() = default;
    Q_DISABLE_COPY(Task)
    ~Task()
    {
        if (m_thread.joinable()) {
            m_thread.join();
        }
    }

    template <typename Work>
    void start(Work work)
    {
        m_thread = std::thread([this, work] { m_promise.set_value(work()); });
    }

    bool isReady(std::chrono::milliseconds within = patience) const
    {
        return m_result.wait_for(within) == std::future_status::ready;
    }

    Result get()
    {
        return m_result.get();
    }

private:
    std::promise<Result> m_promise;
    std::future<Result> m_result = m_promise.get_future();
    std::thread m_thread;
};

} // namespace

// Several threads at one store. Fillers belong to the main thread, as those of the library do.
class TestVFSPlaceBaseThreads : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void queuesTheSlotFromAnotherThread();
    void queuesTheSlotOfHasPlaceFromAnotherThread();
    void answersWithoutWaitingForASlot();
    void armsWithoutWaitingForASlot();
    void waitsForASlotOtherwise();
    void losesAStrayRecordByDestruction();
    void firesOnceForManyThreads();
    void standsManyThreads();
};

void TestVFSPlaceBaseThreads::queuesTheSlotFromAnotherThread()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    bool inMainThread = false;
    filler.work = [&](const QString& path) {
        inMainThread = QThread::currentThread() == filler.thread();
        base.addEntryToPlace(base.createPlace(path + u"/WG"_s, TypePlace, QString()), samba);
    };
    bool hadChilds = false;
    bool hasChilds = true;
    int found = -1;
    int foundAgain = -1;
    Entry below = samba;
    inThread([&] {
        hadChilds = base.hasChilds(samba);
        found = base.childEntries(samba).size();
        hasChilds = base.hasChilds(samba);
        foundAgain = base.childEntries(samba).size();
        below = base.placeEntry(u"Samba/WG"_s);
    });
    // It is seen as it is, empty, and as one that was fired already.
    QVERIFY(hadChilds);
    QCOMPARE(found, 0);
    QVERIFY(!hasChilds);
    QCOMPARE(foundAgain, 0);
    QVERIFY(below.isNull());
    QVERIFY(filler.filled.isEmpty());
    QVERIFY(base.childEntries(samba).isEmpty());
    QVERIFY(filler.filled.isEmpty());

    QTRY_COMPARE(filler.filled, QStringList(u"Samba"_s));
    QVERIFY(inMainThread);
    QCOMPARE(base.childEntries(samba).paths(), QStringList(u"Samba/WG"_s));
    QCoreApplication::processEvents();
    QCOMPARE(filler.filled.size(), 1);
}

void TestVFSPlaceBaseThreads::queuesTheSlotOfHasPlaceFromAnotherThread()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    filler.work = [&](const QString& path) {
        base.createPlace(path + u"/WG"_s, TypeSambaWorkgroupPlace, QString());
    };
    bool found = true;
    inThread([&] { found = base.hasPlace(u"Samba/WG"_s); });
    QVERIFY(!found);
    QVERIFY(filler.filled.isEmpty());
    QTRY_COMPARE(filler.filled, QStringList(u"Samba"_s));
    inThread([&] { found = base.hasPlace(u"Samba/WG"_s); });
    QVERIFY(found);
}

void TestVFSPlaceBaseThreads::answersWithoutWaitingForASlot()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    base.createPendingPlace(u"Other"_s, TypePlace, &filler, "fillOtherwise");
    Task<bool> other;
    bool answered = false;
    filler.work = [&](const QString&) {
        // The lock of the store is held, as during a call to the service.
        other.start([&] {
            return base.hasPlace(u"Top"_s) && base.hasPlace(top) && !base.hasPlace(u"None"_s) &&
                   !base.hasPlace(u"Other/x"_s) && !base.isPathContainsPlace(u"/Top"_s) &&
                   base.placeOrderIndex(makeDir(u"/a"_s), top) == 0 &&
                   base.placeOrderIndex(top, makeDir(u"/a"_s)) == 0 &&
                   base.placeOrderIndex(top, Entry()) == 0;
        });
        answered = other.isReady();
    };
    base.childEntries(samba);
    QVERIFY(answered);
    QVERIFY(other.get());
    QTRY_COMPARE(filler.filledOtherwise, QStringList(u"Other"_s));
}

void TestVFSPlaceBaseThreads::armsWithoutWaitingForASlot()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    Task<Entry> other;
    bool armed = false;
    bool returned = true;
    filler.work = [&](const QString&) {
        other.start([&] { return base.createPendingPlace(u"Top"_s, TypePlace, &filler, "fill"); });
        QElapsedTimer timer;
        timer.start();
        while (!armed && timer.elapsed() < 30000) {
            armed = base.hasChilds(top);
            std::this_thread::yield();
        }
        // The record is in, while the place has to wait.
        returned = other.isReady(0ms);
    };
    base.childEntries(samba);
    QVERIFY(armed);
    QVERIFY(!returned);
    QCOMPARE(other.get(), top);
}

void TestVFSPlaceBaseThreads::waitsForASlotOtherwise()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    Task<int> children;
    Task<Entry> below;
    bool returned = true;
    filler.work = [&](const QString& path) {
        children.start([&] { return base.childEntries(samba).size(); });
        below.start([&] { return base.placeEntry(u"Samba/WG"_s); });
        returned = children.isReady(50ms) || below.isReady(50ms);
        base.addEntryToPlace(base.createPlace(path + u"/WG"_s, TypePlace, QString()), samba);
    };
    base.childEntries(samba);
    QVERIFY(!returned);
    QCOMPARE(children.get(), 1);
    QCOMPARE(below.get().path(), u"Samba/WG"_s);
}

void TestVFSPlaceBaseThreads::losesAStrayRecordByDestruction()
{
    // A record without its place is there while one who arms a place waits for the lock. Nothing
    // tells that he has come so far, so he gets more and more time.
    bool lost = false;
    for (int attempt = 0; attempt < 12 && !lost; ++attempt) {
        VFSPlaceBase base;
        PlaceFiller filler;
        const Entry samba = base.createPendingPlace(u"Samba"_s, TypePlace, &filler, "fill");
        const Entry stray = makePlace(u"Stray"_s);
        Task<Entry> other;
        bool destroyed = true;
        filler.work = [&](const QString&) {
            other.start([&] {
                return base.createPendingPlace(u"Stray"_s, TypePlace, &filler, "fillOtherwise");
            });
            other.isReady(std::chrono::milliseconds(1 << attempt));
            destroyed = base.destroyPlace(stray) || base.hasPlace(stray);
        };
        base.childEntries(samba);
        other.get();
        QVERIFY(!destroyed);
        QVERIFY(base.hasPlace(stray));
        lost = !base.hasChilds(stray);
    }
    QVERIFY(lost);
}

void TestVFSPlaceBaseThreads::firesOnceForManyThreads()
{
    constexpr int count = 200;
    VFSPlaceBase base;
    PlaceFiller filler;
    QStringList paths;
    for (int i = 0; i < count; ++i) {
        paths.append(QString::number(i));
        base.createPendingPlace(paths.last(), TypePlace, &filler, "fill");
    }
    std::atomic<int> ready{0};
    std::vector<std::thread> threads;
    for (int number = 0; number < 4; ++number) {
        threads.emplace_back([&, number] {
            for (++ready; ready < 4;) {
                std::this_thread::yield();
            }
            for (const QString& path : qAsConst(paths)) {
                if (number % 2 == 0) {
                    base.hasPlace(path + u"/x"_s);
                } else {
                    base.childEntries(makePlace(path));
                }
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    QTRY_VERIFY(filler.filled.size() >= count);
    QCoreApplication::processEvents();
    filler.filled.sort();
    paths.sort();
    QCOMPARE(filler.filled, paths);
}

void TestVFSPlaceBaseThreads::standsManyThreads()
{
    constexpr int rounds = 300;
    constexpr int threadCount = 4;
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry steady = base.createPlace(u"Steady"_s, TypePlace, u"/steady"_s);
    filler.work = [&](const QString& path) {
        base.addEntryToPlace(base.createPlace(path + u"/x"_s, TypePlace, QString()), steady);
    };
    std::atomic<int> wrong{0};
    std::atomic<int> running{threadCount};
    const auto expect = [&](bool right) {
        wrong += right ? 0 : 1;
    };
    const auto work = [&](int number) {
        const QString own = QStringLiteral("own%1").arg(number);
        const QString shared = u"shared"_s;
        for (int i = 0; i < rounds; ++i) {
            const QString path = own + QString::number(i);
            const Entry place = base.createPlace(path, TypePlace, u"/"_s + path);
            expect(base.addEntryToPlace(place, top));
            expect(base.hasPlace(path));
            expect(base.placeEntry(path) == place);
            expect(base.dirPlaceEntry(u"/"_s + path) == place);
            expect(base.placeRelatedPath(u"/"_s + path + u"/y"_s) == path + u"/y"_s);
            expect(base.placeHasChildEntry(top, place));
            expect(base.checkAndGetParentPlace(place, top) == top);
            expect(base.exploreParentPlacesHistory(path, u"Top"_s).first() == top.path());
            // These are made and taken down under one another's hands.
            base.createPendingPlace(shared, TypePlace, &filler, "fill");
            base.addEntryToPlace(makePlace(shared), steady);
            base.setPlaceLocalPath(makePlace(shared), path);
            base.hasPlace(shared + u"/none"_s);
            base.childEntries(makePlace(shared));
            base.hasChilds(makePlace(shared));
            base.destroyPlace(makePlace(shared));
            base.removeEntryFromPlace(makePlace(shared + u"/x"_s), steady);
            if (i % 2 == 0) {
                expect(base.destroyPlace(place));
                expect(!base.hasPlace(path));
            }
        }
        --running;
    };
    std::vector<std::thread> threads;
    for (int number = 0; number < threadCount; ++number) {
        threads.emplace_back(work, number);
    }
    // The main thread fills its own place meanwhile, and what was queued for it after that: how
    // Qt hands a call over is not what is tried here, and a thread sanitizer does not see it.
    while (running > 0) {
        base.createPendingPlace(u"mine"_s, TypePlace, &filler, "fill");
        base.hasPlace(u"mine/x"_s);
        std::this_thread::yield();
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    QCoreApplication::processEvents();
    QCOMPARE(wrong.load(), 0);
    QCOMPARE(base.childEntries(top).size(), threadCount * rounds / 2);
    QVERIFY(base.hasPlace(steady));
    QVERIFY(base.hasPlace(u"mine/x"_s));
    base.destroyPlace(makePlace(u"shared"_s));
    QVERIFY(!base.hasPlace(u"shared"_s));
}

QTEST_GUILESS_MAIN(TestVFSPlaceBaseThreads)
#include "tst_vfsplacebase_threads.moc"
