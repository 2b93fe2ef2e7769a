// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/readdirhook.h"
#include "support/vfsscene.h"
#include "vfs/vfs.h"

#include <QTest>

#include <cerrno>

using namespace VeyFM;

/**
 * Directories that fail while they are opened or read. On FUSE a signal to the reader is enough
 * for that.
 */
class TestVfsReadErrors : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void interruptedListing();
    void interruptedKind();
    void interruptedLooks();
    void otherErrors();

private:
    Entry dir(const char* relative) const
    {
        return VFS::ptr()->entry(m_scene.path(relative));
    }
    int listed(const char* relative) const
    {
        return VFS::ptr()->childs(dir(relative)).size();
    }

    VfsScene m_scene;
};

namespace {

// Every call is interrupted once before it succeeds.
ReaddirHook::Failure everySecondCallInterrupted()
{
    return [interrupted = false](ReaddirHook::Call) mutable {
        interrupted = !interrupted;
        return interrupted ? EINTR : 0;
    };
}

} // namespace

void TestVfsReadErrors::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    QVERIFY(m_scene.makeDir("files"));
    for (int i = 0; i < 100; ++i) {
        QVERIFY(m_scene.makeFile("files/" + QByteArray::number(i)));
    }
    QVERIFY(m_scene.makeDir("upper"));
    QVERIFY(m_scene.makeDir("upper/lower"));
    QVERIFY(m_scene.makeDir("empty"));
}

void TestVfsReadErrors::cleanup()
{
    ReaddirHook::clear();
}

void TestVfsReadErrors::interruptedListing()
{
    ReaddirHook::setFailure(everySecondCallInterrupted());
    QCOMPARE(listed("files"), 100);
    QCOMPARE(listed("empty"), 0);

    // In the middle, several times in a row.
    int calls = 0;
    ReaddirHook::setFailure([&calls](ReaddirHook::Call) {
        ++calls;
        return calls > 50 && calls < 60 ? EINTR : 0;
    });
    QCOMPARE(listed("files"), 100);
    QVERIFY(calls > 60);
}

// Where the kind of a record is learnt by opening it.
void TestVfsReadErrors::interruptedKind()
{
    ReaddirHook::set(ReaddirHook::hideKind);
    ReaddirHook::setFailure(everySecondCallInterrupted());
    const EntryList children = VFS::ptr()->childs(dir("upper"));
    QCOMPARE(children.size(), 1);
    QCOMPARE(children.first().type(), int(TypeDir));
}

void TestVfsReadErrors::interruptedLooks()
{
    ReaddirHook::setFailure(everySecondCallInterrupted());
    QVERIFY(VFS::ptr()->containsDirsOrPlaces(dir("upper")));
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(dir("files")));
    QVERIFY(VFS::ptr()->hasChilds(dir("upper")));
    QVERIFY(VFS::ptr()->hasChilds(dir("empty")));
}

// What has been read until then counts, and a directory that can't be opened lists as nothing.
void TestVfsReadErrors::otherErrors()
{
    int reads = 0;
    ReaddirHook::setFailure([&reads](ReaddirHook::Call call) {
        return call == ReaddirHook::Read && ++reads > 50 ? EIO : 0;
    });
    const int size = listed("files");
    QVERIFY2(size >= 48 && size <= 50, qPrintable(QString::number(size)));
    // One look more, and no other attempt.
    QCOMPARE(reads, 51);

    ReaddirHook::setFailure(
        [](ReaddirHook::Call call) { return call == ReaddirHook::Open ? EMFILE : 0; });
    QCOMPARE(listed("files"), 0);
    QVERIFY(!VFS::ptr()->containsDirsOrPlaces(dir("upper")));
    QVERIFY(!VFS::ptr()->hasChilds(dir("upper")));
}

QTEST_GUILESS_MAIN(TestVfsReadErrors)
#include "tst_vfs_readerrors.moc"
