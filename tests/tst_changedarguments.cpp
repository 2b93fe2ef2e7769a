// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// A slot of the host changes and destroys what the host has just handed over by reference. What
// was asked is answered as if it had not; AddressSanitizer sees who still looks at what is gone.

#include "jobs/job.h"
#include "jobs/updatesmbentryjob.h"
#include "service/smbbrowserproxy.h"
#include "support/makeentry.h"
#include "support/scriptedauthenticator.h"
#include "support/vfstest.h"
#include "watch/inotifywatcher.h"

#include <QSharedPointer>
#include <QSignalSpy>
#include <QTemporaryDir>

#include <functional>
#include <memory>

using namespace VeyFM;

/// Fills places on first need.
class Filler : public QObject
{
    Q_OBJECT

public:
    std::function<void()> onFill;
    int count = 0;

public Q_SLOTS:
    void fill(const QString& path)
    {
        Q_UNUSED(path)
        ++count;
        if (onFill) {
            onFill();
        }
    }
};

namespace {

// A result as text, whatever it is.
QString text(bool value)
{
    return value ? u"yes"_s : u"no"_s;
}

QString text(const QString& value)
{
    return value;
}

QString text(const Entry& entry)
{
    return u"%1=%2:%3"_s.arg(entry.path(), storedLocalPath(entry)).arg(entry.type());
}

QString text(const EntryList& entries)
{
    QStringList lines;
    for (const Entry& entry : entries) {
        lines << text(entry);
    }
    return lines.join(u',');
}

QString text(const QStringList& lines)
{
    return lines.join(u',');
}

QString text(const QList<QUrl>& urls)
{
    return QUrl::toStringList(urls).join(u',');
}

QString text(const StoragePlace& place)
{
    return place.udi();
}

QString text(const FavouritePlace& place)
{
    return place.name();
}

} // namespace

class ChangedArgumentsTest : public VfsTest
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void whileAPlaceIsFilled_data();
    void whileAPlaceIsFilled();
    void whileWatchersAreTold_data();
    void whileWatchersAreTold();
    void whileAWatchBegins();
    void whileLinksAreTold();
    void whileARescanBegins();
    void whileAJobStarts_data();
    void whileAJobStarts();
    void cleanupTestCase();

private:
    using Run = std::function<QString(bool disturbed)>;

    // The call with an argument of its own, which goes away while the place is filled.
    template <typename Argument, typename Call>
    Run filling(const Argument& argument, Call call)
    {
        return [this, argument, call](bool disturbed) {
            arm();
            auto given = std::make_unique<Argument>(argument);
            m_filler.onFill = [this, disturbed, &given] {
                fill();
                if (disturbed) {
                    *given = Argument();
                    given.reset();
                }
            };
            return text(call(*given));
        };
    }

    template <typename Argument, typename Call>
    Run telling(const Argument& argument, Call call)
    {
        return [this, argument, call](bool disturbed) {
            auto given = std::make_unique<Argument>(argument);
            QStringList told;
            QObject receiver;
            connect(
                vfs->entryWatcher(), &EntryWatcher::entryReset, &receiver, [&](const Entry& entry) {
                    told << entry.path();
                    if (disturbed) {
                        given.reset();
                    }
                });
            call(*given);
            return text(told);
        };
    }

    // A place that is filled when someone looks for "Pending/x".
    void arm()
    {
        VFSPlaceBase* const places = vfs->placeBase();
        places->destroyPlace(makeEntry("Pending/x", "", 0));
        places->destroyPlace(makeEntry("Pending", "", 0));
        const Entry pending =
            places->createPendingPlace(u"Pending"_s, TypePlace, &m_filler, "fill");
        places->addEntryToPlace(pending, vfs->rootEntry());
    }

    void fill()
    {
        VFSPlaceBase* const places = vfs->placeBase();
        const Entry place =
            places->createPlace(u"Pending/x"_s, TypeFavouritePlace, m_directory.path());
        places->addEntryToPlace(place, places->placeEntry(u"Pending"_s));
        places->addEntryToPlace(makeEntry("Pending/x/child", "/child", TypeDir), place);
    }

    QTemporaryDir m_directory;
    Filler m_filler;
};

Q_DECLARE_METATYPE(std::function<QString(bool)>)
Q_DECLARE_METATYPE(std::function<Job*()>)

void ChangedArgumentsTest::initTestCase()
{
    QVERIFY(startVfs(R"({"values": {
        "FavouritePlacesManager.favouritePlaces": [["F", "/nowhere"]],
        "SmbBrowser.hosts": ["h1"],
        "SmbBrowser.shares": {"s1": ""}}})"));
    QVERIFY(QDir(m_directory.path()).mkdir(u"d"_s));
    QVERIFY(QFile::link(m_directory.filePath(u"d"_s), m_directory.filePath(u"link"_s)));
}

void ChangedArgumentsTest::whileAPlaceIsFilled_data()
{
    // A device's local path is looked up, and that of a file is found through the tree.
    const Entry device = makeEntry("Pending/x", "", TypeUsbDiskStoragePlace);
    const Entry dir = makeEntry("Pending/x/d", "", TypeDir);
    const Entry link = makeEntry("Pending/x/link", "", TypeDirLink);
    const Entry none = makeEntry("Pending/x/none", "", TypeFile);
    const QString path = u"Pending/x/d"_s;
    const EntryList dirs(QList<Entry>{dir, dir, link});
    VFS* const v = vfs;
    VFSPlaceBase* const places = vfs->placeBase();

    QTest::addColumn<std::function<QString(bool)>>("run");
    const auto row = [](const char* name, const Run& run) {
        QTest::newRow(name) << run;
    };

    row("entry", filling(path, [v](const QString& p) { return v->entry(p); }));
    row("entry of a place", filling(u"Pending/x"_s, [v](const QString& p) { return v->entry(p); }));
    row("entry of a URL",
        filling(u"vey-fm:Pending/x"_s, [v](const QString& p) { return v->entry(p); }));
    row("normalizePath",
        filling(u"Pending/x/d/../d"_s, [v](const QString& p) { return v->normalizePath(p); }));
    row("localPath of a path", filling(path, [v](const QString& p) { return v->localPath(p); }));
    row("localPath", filling(dir, [v](const Entry& e) { return v->localPath(e); }));
    row("localPath of a device", filling(device, [v](const Entry& e) { return v->localPath(e); }));
    row("childs", filling(dir, [v](const Entry& e) { return v->childs(e); }));
    row("childs of a device", filling(device, [v](const Entry& e) { return v->childs(e); }));
    row("hasChilds", filling(dir, [v](const Entry& e) { return v->hasChilds(e); }));
    row("hasChilds of a device", filling(device, [v](const Entry& e) { return v->hasChilds(e); }));
    row("containsDirsOrPlaces",
        filling(dir, [v](const Entry& e) { return v->containsDirsOrPlaces(e); }));
    row("containsDirsOrPlaces of a device",
        filling(device, [v](const Entry& e) { return v->containsDirsOrPlaces(e); }));
    row("isEntryExists", filling(none, [v](const Entry& e) { return v->isEntryExists(e); }));
    row("isEntryExists of a device",
        filling(device, [v](const Entry& e) { return v->isEntryExists(e); }));
    row("child", filling(device, [v](const Entry& e) { return v->child(e, u"c"_s); }));
    row("child by name",
        filling(u"c"_s, [v, dir](const QString& name) { return v->child(dir, name); }));
    row("child of a device by name",
        filling(u"c"_s, [v, device](const QString& name) { return v->child(device, name); }));
    row("parent", filling(dir, [v](const Entry& e) { return v->parent(e); }));
    row("parent from a root",
        filling(v->rootEntry(), [v, dir](const Entry& root) { return v->parent(dir, root); }));
    row("hasParent", filling(dir, [v](const Entry& e) { return v->hasParent(e); }));
    row("pathEntryList", filling(dir, [v](const Entry& e) { return v->pathEntryList(e); }));
    row("pathEntryList from a root",
        filling(v->rootEntry(), [v, dir](const Entry& r) { return v->pathEntryList(dir, r); }));
    row("symLinkTargetEntry",
        filling(link, [v](const Entry& e) { return v->symLinkTargetEntry(e); }));
    row("placeRelatedEntry", filling(dir, [v](const Entry& e) { return v->placeRelatedEntry(e); }));
    row("isPlaceRelativeEntry",
        filling(dir, [v](const Entry& e) { return v->isPlaceRelativeEntry(e); }));
    row("isStoragePlaceRelativeEntry",
        filling(dir, [v](const Entry& e) { return v->isStoragePlaceRelativeEntry(e); }));
    row("hasStoragePlaceRelativeEntries",
        filling(dirs, [v](const EntryList& l) { return v->hasStoragePlaceRelativeEntries(l); }));
    row("urlsFromEntries",
        filling(dirs, [v](const EntryList& l) { return v->urlsFromEntries(l); }));
    const QList<QUrl> urls{QUrl(u"vey-fm:Pending/x"_s), QUrl(u"file:///etc"_s)};
    row("entriesFromUrls",
        filling(urls, [v](const QList<QUrl>& l) { return v->entriesFromUrls(l); }));
    row("storagePlace", filling(device, [v](const Entry& e) { return v->storagePlace(e); }));
    row("favouritePlace", filling(dir, [v](const Entry& e) { return v->favouritePlace(e); }));

    row("placeEntry",
        filling(u"Pending/x"_s, [places](const QString& p) { return places->placeEntry(p); }));
    row("hasPlace",
        filling(u"Pending/x"_s, [places](const QString& p) { return places->hasPlace(p); }));
    row("hasPlace of an entry",
        filling(device, [places](const Entry& e) { return places->hasPlace(e); }));
    const Entry pending = makeEntry("Pending", "", TypePlace);
    row("childEntries",
        filling(pending, [places](const Entry& e) { return places->childEntries(e); }));
    row("placeHasChildEntry", filling(pending, [places, device](const Entry& e) {
            return places->placeHasChildEntry(e, device);
        }));
    row("placeHasChildEntry by the child", filling(device, [places, pending](const Entry& e) {
            return places->placeHasChildEntry(pending, e);
        }));

    row("Entry::localPath", filling(dir, [](const Entry& e) { return e.localPath(); }));
    row("Entry::localPathWithScheme",
        filling(dir, [](const Entry& e) { return e.localPathWithScheme(); }));
    row("Entry::fileName", filling(dir, [](const Entry& e) { return e.fileName(); }));
    row("Entry::isDirPlace", filling(device, [](const Entry& e) { return e.isDirPlace(); }));
    row("Entry::isPurePlace", filling(device, [](const Entry& e) { return e.isPurePlace(); }));
    row("Entry::isExists", filling(none, [](const Entry& e) { return e.isExists(); }));
    row("Entry::isOnDesktop", filling(dir, [](const Entry& e) { return e.isOnDesktop(); }));
    row("Entry::isExecutable", filling(dir, [](const Entry& e) { return e.isExecutable(); }));
    row("Entry::isExecutable of a device",
        filling(device, [](const Entry& e) { return e.isExecutable(); }));
    row("Entry::isSimilar", filling(dir, [dir](const Entry& e) { return dir.isSimilar(e); }));
    row("Entry::isSimilar of itself", filling(dir, [](const Entry& e) { return e.isSimilar(e); }));
    row("EntryList::hasPurePlace",
        filling(EntryList(QList<Entry>{device, device}), [](const EntryList& l) {
            return l.hasPurePlace();
        }));
    row("EntryList::localPaths", filling(dirs, [](const EntryList& l) { return l.localPaths(); }));
    row("EntryList::localPathsWithScheme",
        filling(dirs, [](const EntryList& l) { return l.localPathsWithScheme(); }));
    row("EntryList::containsSimilar",
        filling(dirs, [link](const EntryList& l) { return l.containsSimilar(link); }));
    row("EntryList::containsSimilar by the entry",
        filling(link, [dirs](const Entry& e) { return dirs.containsSimilar(e); }));

    EntryWatcher* const watcher = v->entryWatcher();
    row("addEntry", filling(dir, [watcher](const Entry& e) {
            watcher->addEntry(e);
            return QStringList();
        }));
    row("removeEntry", filling(dir, [watcher](const Entry& e) {
            watcher->removeEntry(e);
            return QStringList();
        }));
}

void ChangedArgumentsTest::whileAPlaceIsFilled()
{
    QFETCH(std::function<QString(bool)>, run);
    m_filler.count = 0;
    const QString expected = run(false);
    QCOMPARE(m_filler.count, 1);
    QCOMPARE(run(true), expected);
    QCOMPARE(m_filler.count, 2);
}

void ChangedArgumentsTest::whileWatchersAreTold_data()
{
    QTest::addColumn<std::function<QString(bool)>>("run");
    QTest::addColumn<QString>("told");
    const Entry one = makeEntry("/one", "/one", TypeDir);
    const EntryList three(QList<Entry>{one, makeEntry("/two", "/two", TypeDir), one});
    VFS* const v = vfs;
    QTest::newRow("notifyWatchers")
        << telling(one, [v](const Entry& e) { v->notifyWatchers(e); }) << u"/one"_s;
    QTest::newRow("notifyWatchers with a list")
        << telling(three, [v](const EntryList& l) { v->notifyWatchers(l); }) << u"/one,/two,/one"_s;
    QTest::newRow("directNotifyWatchers")
        << telling(three, [v](const EntryList& l) { v->directNotifyWatchers(l, true); })
        << u"/one,/two,/one"_s;
}

void ChangedArgumentsTest::whileWatchersAreTold()
{
    QFETCH(std::function<QString(bool)>, run);
    QFETCH(QString, told);
    QCOMPARE(run(false), told);
    QCOMPARE(run(true), told);
}

void ChangedArgumentsTest::whileAWatchBegins()
{
    // To look for the plain twin of a place fills the place above, whose slot ends all watches.
    EntryWatcher* const watcher = vfs->entryWatcher();
    const Entry place = vfs->placeBase()->createPlace(
        u"Watched"_s, TypeFavouritePlace, m_directory.filePath(u"d"_s));
    vfs->placeBase()->createPendingPlace(m_directory.path(), TypePlace, &m_filler, "fill");
    m_filler.count = 0;
    m_filler.onFill = [watcher] {
        watcher->clear();
    };
    watcher->addEntry(place);
    QCOMPARE(m_filler.count, 1);
    watcher->removeEntry(place);
    vfs->placeBase()->destroyPlace(makeEntry(m_directory.path(), QString(), TypePlace));
}

void ChangedArgumentsTest::whileLinksAreTold()
{
    InotifyWatcher watcher;
    const QString target = m_directory.filePath(u"d"_s);
    for (const QString& name : {u"a"_s, u"b"_s}) {
        QVERIFY(QFile::link(target, m_directory.filePath(name)));
        QVERIFY(watcher.addPath(m_directory.filePath(name)));
    }
    auto fileName = std::make_unique<QString>(u"file"_s);
    QStringList told;
    connect(&watcher, &InotifyWatcher::pathChanged, this, [&](const QString&, const QString& name) {
        told << name;
        fileName.reset();
    });
    const auto path = std::make_unique<QString>(target);
    watcher.notifySymlinks("pathChanged", *path, *fileName);
    QCOMPARE(told, QStringList({u"file"_s, u"file"_s}));
}

void ChangedArgumentsTest::whileARescanBegins()
{
    // Known hosts and shares are told of from inside the call, before the service is asked.
    auto host = std::make_unique<QString>(u"h1"_s);
    auto workgroup = std::make_unique<QString>(u"W"_s);
    SmbBrowserProxy* const browser = vfs->smbBrowser();
    QObject receiver;
    connect(browser, &SmbBrowserProxy::workgroupUpdated, &receiver, [&] { workgroup.reset(); });
    connect(browser, &SmbBrowserProxy::hostUpdated, &receiver, [&] {
        host.reset();
        workgroup.reset();
    });
    service->takeCalls();
    browser->rescanWorkgroup(*workgroup);
    QVERIFY(!workgroup);
    workgroup = std::make_unique<QString>(u"W"_s);
    browser->rescanHost(*host, *workgroup);
    QVERIFY(!host);
    log->takeAll(service);
    QCOMPARE(
        service->takeCalls().filter(u"rescan"_s),
        QStringList(
            {u"SmbBrowser.rescanWorkgroup[\"W\"]"_s, u"SmbBrowser.rescanHost[\"h1\",\"W\"]"_s}));
}

void ChangedArgumentsTest::whileAJobStarts_data()
{
    QTest::addColumn<std::function<Job*()>>("make");
    VFS* const v = vfs;
    const Entry device = makeEntry("Pending/x", "", TypeUsbDiskStoragePlace);
    const auto row = [](const char* name, const std::function<Job*()>& make) {
        QTest::newRow(name) << make;
    };
    row("mount", [v, device] { return v->mount(device); });
    row("unmount", [v, device] { return v->unmount(device); });
    row("eject", [v, device] { return v->eject(device); });
    row("update a share", [] {
        return new UpdateSmbEntryJob(
            QSharedPointer<ScriptedAuthenticator>::create(),
            makeEntry("Pending/x", "", TypeSambaSharePlace));
    });
}

void ChangedArgumentsTest::whileAJobStarts()
{
    QFETCH(std::function<Job*()>, make);
    arm();
    std::unique_ptr<Job> job(make());
    const QSignalSpy finished(job.get(), &Job::finished);
    m_filler.onFill = [this, &job] {
        fill();
        job.reset();
    };
    service->takeCalls();
    job->start();
    QVERIFY(!job);
    QCOMPARE(finished.count(), 0);
    QCOMPARE(service->takeCalls().filter(u"StoragePlace"_s), QStringList());
}

void ChangedArgumentsTest::cleanupTestCase()
{
    QCOMPARE(service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(ChangedArgumentsTest)
#include "tst_changedarguments.moc"
