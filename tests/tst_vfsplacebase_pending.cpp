// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/placescene.h"

#include <QtTest>

#include <memory>

using namespace VeyFM;

namespace {

int messageCount = 0;

void countMessage(QtMsgType, const QMessageLogContext&, const QString&)
{
    ++messageCount;
}

} // namespace

// Places that are filled when somebody first looks, and what counts as looking.
class TestVFSPlaceBasePending : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void exists();
    void isFilledByItsChildren();
    void isFilledByALookForAChild();
    void countsAsHavingChildren();
    void isFilledByAPathBelowThatIsMissing();
    void isNotFilledByAPathBelowThatIsThere();
    void isFilledByHasPlaceAlways();
    void isFilledOneLevelUpOnly();
    void isNotFilledByAPathWithoutASlash();
    void isNotFilledByAnythingElse();
    void passesThePathAboveTheLastSlash();
    void isArmedAgainOnAnExistingPlace();
    void isNotCalledForAnEarlierRecord();
    void keepsItsChildrenWhenArmedAgain();
    void isForgottenByDestruction();
    void isGoneBeforeTheSlotRuns();
    void mayBeDestroyedByItsSlot();
    void mayArmItselfAgain();
    void fillsIntoTheVoid();
    void outlivesItsReceiver();
    void callsNoUnknownSlot();
    void isForgottenWithTheStore();
};

void TestVFSPlaceBasePending::exists()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    QCOMPARE(fields(samba), u"Samba||1005"_s);
    QCOMPARE(fields(base.placeEntry(u"Samba"_s)), u"Samba||1005"_s);
    QVERIFY(base.hasPlace(samba));
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    QVERIFY(base.addEntryToPlace(samba, top));
    QVERIFY(filler.filled.isEmpty());
}

void TestVFSPlaceBasePending::isFilledByItsChildren()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    filler.work = [&](const QString& path) {
        base.addEntryToPlace(base.createPlace(path + u"/WG"_s, TypePlace, QString()), samba);
    };
    QCOMPARE(base.childEntries(samba).paths(), QStringList(u"Samba/WG"_s));
    QCOMPARE(base.childEntries(samba).paths(), QStringList(u"Samba/WG"_s));
    QCOMPARE(filler.filled, QStringList(u"Samba"_s));
}

void TestVFSPlaceBasePending::isFilledByALookForAChild()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    filler.work = [&](const QString&) {
        base.addEntryToPlace(makeDir(u"/a"_s), samba);
    };
    QVERIFY(base.placeHasChildEntry(samba, makeDir(u"/a"_s)));
    QVERIFY(!base.placeHasChildEntry(samba, makeDir(u"/b"_s)));
    QCOMPARE(filler.filled, QStringList(u"Samba"_s));
}

void TestVFSPlaceBasePending::countsAsHavingChildren()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    QVERIFY(base.hasChilds(samba));
    QVERIFY(base.hasChilds(samba));
    base.clearPlace(samba);
    QVERIFY(base.hasChilds(samba));
    QVERIFY(filler.filled.isEmpty());
    QVERIFY(base.childEntries(samba).isEmpty());
    QVERIFY(!base.hasChilds(samba));
    QCOMPARE(filler.filled, QStringList(u"Samba"_s));
}

void TestVFSPlaceBasePending::isFilledByAPathBelowThatIsMissing()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    filler.work = [&](const QString& path) {
        base.createPlace(path + u"/WG"_s, TypeSambaWorkgroupPlace, QString());
    };
    QCOMPARE(fields(base.placeEntry(u"Samba/WG"_s)), u"Samba/WG||1006"_s);
    QVERIFY(base.placeEntry(u"Samba/none"_s).isNull());
    QCOMPARE(filler.filled, QStringList(u"Samba"_s));
}

void TestVFSPlaceBasePending::isNotFilledByAPathBelowThatIsThere()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    const Entry group = base.createPlace(u"Samba/WG"_s, TypeSambaWorkgroupPlace, QString());
    QCOMPARE(base.placeEntry(u"Samba/WG"_s), group);
    QVERIFY(filler.filled.isEmpty());
}

void TestVFSPlaceBasePending::isFilledByHasPlaceAlways()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    base.createPlace(u"Samba/WG"_s, TypeSambaWorkgroupPlace, QString());
    QVERIFY(base.hasPlace(u"Samba/WG"_s));
    QCOMPARE(filler.filled, QStringList(u"Samba"_s));

    base.createPendingPlace(u"Disks"_s, TypeStorageDevicesPlace, &filler, "fill");
    filler.work = [&](const QString& path) {
        base.createPlace(path + u"/usb"_s, TypeUsbDiskStoragePlace, QString());
    };
    QVERIFY(base.hasPlace(makePlace(u"Disks/usb"_s)));
    QVERIFY(!base.hasPlace(u"Disks/other"_s));
    QCOMPARE(filler.filled, QStringList({u"Samba"_s, u"Disks"_s}));
}

void TestVFSPlaceBasePending::isFilledOneLevelUpOnly()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    filler.work = [&](const QString& path) {
        if (path == u"Samba"_s) {
            base.createPendingPlace(u"Samba/WG"_s, TypeSambaWorkgroupPlace, &filler, "fill");
        } else {
            base.createPlace(path + u"/HOST"_s, TypeSambaServerPlace, QString());
        }
    };
    QVERIFY(base.placeEntry(u"Samba/WG/HOST"_s).isNull());
    QVERIFY(!base.hasPlace(u"Samba/WG/HOST"_s));
    QVERIFY(filler.filled.isEmpty());

    QVERIFY(base.hasPlace(u"Samba/WG"_s));
    QCOMPARE(base.placeEntry(u"Samba/WG/HOST"_s).type(), int(TypeSambaServerPlace));
    QCOMPARE(filler.filled, QStringList({u"Samba"_s, u"Samba/WG"_s}));
}

void TestVFSPlaceBasePending::isNotFilledByAPathWithoutASlash()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    base.createPendingPlace(QString(), TypePlace, &filler, "fill");
    QVERIFY(base.hasPlace(u"Samba"_s));
    QVERIFY(!base.hasPlace(u"Other"_s));
    QVERIFY(base.hasPlace(QString()));
    QVERIFY(base.placeEntry(u"Other"_s).isNull());
    QVERIFY(filler.filled.isEmpty());
    // An empty path above the slash is a path like any other.
    QVERIFY(base.placeEntry(u"/x"_s).isNull());
    QCOMPARE(filler.filled, QStringList(QString()));
}

void TestVFSPlaceBasePending::isNotFilledByAnythingElse()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    const Entry dir = makeDir(u"Samba/x"_s);
    base.createPlace(samba);
    base.addEntryToPlace(samba, top);
    base.addEntryToPlace(dir, samba);
    base.addEntriesToPlace(QList<Entry>{dir, dir}, samba);
    base.removeEntryFromPlace(dir, samba);
    base.placeOrderIndex(samba, top);
    base.placeOrderIndex(samba, samba);
    base.checkAndGetParentPlace(makePlace(u"none"_s), top);
    base.setPlaceLocalPath(samba, u"/samba"_s);
    base.dirPlaceEntry(u"/samba/none"_s);
    base.checkAndGetDirPlace(u"/samba/none"_s);
    base.placeRelatedPath(u"/samba/none"_s);
    QVERIFY(base.isPathContainsPlace(u"Samba/none/x"_s));
    base.exploreParentPlacesHistory(u"Samba/none/x"_s, u"Top"_s);
    base.childEntries(top);
    base.placeHasChildEntry(top, samba);
    base.clearPlace(samba);
    base.placeEntry(u"Samba"_s);
    QVERIFY(filler.filled.isEmpty());
    QVERIFY(base.hasChilds(samba));
    base.destroyPlace(samba);
    QVERIFY(filler.filled.isEmpty());
}

void TestVFSPlaceBasePending::passesThePathAboveTheLastSlash()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const QString longPath = QString(100000, QLatin1Char('x')) + u"//"_s;
    base.createPendingPlace(longPath, TypePlace, &filler, "fill");
    QVERIFY(base.placeEntry(longPath + u"/y"_s).isNull());
    QCOMPARE(filler.filled, QStringList(longPath));
    base.createPendingPlace(u"A"_s, TypePlace, &filler, "fill");
    QVERIFY(!base.hasPlace(u"A/"_s));
    QCOMPARE(filler.filled.last(), u"A"_s);
}

void TestVFSPlaceBasePending::isArmedAgainOnAnExistingPlace()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry made = base.createPlace(u"Home"_s, TypeHomeDirPlace, u"/home/u"_s);
    QVERIFY(!base.hasChilds(made));
    const Entry armed = base.createPendingPlace(u"Home"_s, TypeNetworkPlace, &filler, "fill");
    QCOMPARE(fields(armed), u"Home|/home/u|2001"_s);
    QVERIFY(base.hasChilds(made));
    base.childEntries(made);
    QVERIFY(!base.hasChilds(made));
    base.createPendingPlace(u"Home"_s, TypeNetworkPlace, &filler, "fill");
    base.childEntries(made);
    QCOMPARE(filler.filled, QStringList({u"Home"_s, u"Home"_s}));
}

void TestVFSPlaceBasePending::isNotCalledForAnEarlierRecord()
{
    VFSPlaceBase base;
    PlaceFiller first;
    PlaceFiller second;
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &first, "fill");
    const Entry samba =
        base.createPendingPlace(u"Samba"_s, TypeNetworkPlace, &second, "fillOtherwise");
    QCOMPARE(fields(samba), u"Samba||1005"_s);
    base.childEntries(samba);
    base.childEntries(samba);
    QVERIFY(first.filled.isEmpty());
    QVERIFY(second.filled.isEmpty());
    QCOMPARE(second.filledOtherwise, QStringList(u"Samba"_s));
}

void TestVFSPlaceBasePending::keepsItsChildrenWhenArmedAgain()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry top = base.createPlace(u"Top"_s, TypePlace, QString());
    base.addEntryToPlace(makeDir(u"/a"_s), top);
    base.createPendingPlace(u"Top"_s, TypePlace, &filler, "fill");
    filler.work = [&](const QString&) {
        base.addEntryToPlace(makeDir(u"/b"_s), top);
    };
    QCOMPARE(base.childEntries(top).paths(), QStringList({u"/a"_s, u"/b"_s}));
}

void TestVFSPlaceBasePending::isForgottenByDestruction()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    QVERIFY(!base.destroyPlace(samba));
    QVERIFY(!base.hasPlace(samba));
    QVERIFY(!base.hasChilds(samba));
    base.createPlace(samba);
    QVERIFY(!base.hasChilds(samba));
    QVERIFY(base.childEntries(samba).isEmpty());
    QVERIFY(!base.hasPlace(u"Samba/x"_s));
    QVERIFY(filler.filled.isEmpty());
}

void TestVFSPlaceBasePending::isGoneBeforeTheSlotRuns()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    bool hadChilds = true;
    filler.work = [&](const QString&) {
        hadChilds = base.hasChilds(samba);
        base.childEntries(samba);
        base.placeHasChildEntry(samba, samba);
        base.hasPlace(u"Samba/x"_s);
        base.placeEntry(u"Samba/x"_s);
    };
    base.childEntries(samba);
    QVERIFY(!hadChilds);
    QCOMPARE(filler.filled, QStringList(u"Samba"_s));
}

void TestVFSPlaceBasePending::mayBeDestroyedByItsSlot()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    filler.work = [&](const QString& path) {
        base.destroyPlace(makePlace(path));
    };
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    QVERIFY(base.childEntries(samba).isEmpty());
    QVERIFY(!base.hasPlace(samba));
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    QVERIFY(!base.placeHasChildEntry(samba, samba));
    QVERIFY(!base.hasPlace(samba));
    QCOMPARE(filler.filled.size(), 2);
}

void TestVFSPlaceBasePending::mayArmItselfAgain()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    filler.work = [&](const QString& path) {
        base.createPendingPlace(path, TypeSambaNetworkPlace, &filler, "fill");
    };
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    base.childEntries(samba);
    QCOMPARE(filler.filled.size(), 1);
    QVERIFY(base.hasChilds(samba));
    base.childEntries(samba);
    QCOMPARE(filler.filled.size(), 2);
}

void TestVFSPlaceBasePending::fillsIntoTheVoid()
{
    VFSPlaceBase base;
    const Entry samba = base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, nullptr, "fill");
    QVERIFY(base.hasChilds(samba));
    const auto previous = qInstallMessageHandler(countMessage);
    messageCount = 0;
    const EntryList children = base.childEntries(samba);
    qInstallMessageHandler(previous);
    QCOMPARE(messageCount, 0);
    QVERIFY(children.isEmpty());
    QVERIFY(!base.hasChilds(samba));
}

void TestVFSPlaceBasePending::outlivesItsReceiver()
{
    VFSPlaceBase base;
    auto filler = std::make_unique<PlaceFiller>();
    const Entry samba =
        base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, filler.get(), "fill");
    filler.reset();
    QVERIFY(base.hasChilds(samba));
    QVERIFY(!base.hasPlace(u"Samba/x"_s));
    QVERIFY(!base.hasChilds(samba));
    QVERIFY(base.childEntries(samba).isEmpty());
}

void TestVFSPlaceBasePending::callsNoUnknownSlot()
{
    VFSPlaceBase base;
    PlaceFiller filler;
    const Entry samba =
        base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "missing");
    QTest::ignoreMessage(
        QtWarningMsg, "QMetaObject::invokeMethod: No such method PlaceFiller::missing(QString)");
    QVERIFY(base.childEntries(samba).isEmpty());
    QVERIFY(!base.hasChilds(samba));
    base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, nullptr);
    QVERIFY(base.childEntries(samba).isEmpty());
    QVERIFY(!base.hasChilds(samba));
    QVERIFY(filler.filled.isEmpty());
}

void TestVFSPlaceBasePending::isForgottenWithTheStore()
{
    PlaceFiller filler;
    {
        VFSPlaceBase base;
        base.createPendingPlace(u"Samba"_s, TypeSambaNetworkPlace, &filler, "fill");
    }
    QCoreApplication::processEvents();
    QVERIFY(filler.filled.isEmpty());
}

QTEST_GUILESS_MAIN(TestVFSPlaceBasePending)
#include "tst_vfsplacebase_pending.moc"
