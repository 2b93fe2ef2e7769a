// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entry.h"
#include "support/makeentry.h"
#include "support/temporarytree.h"
#include "vfs/vfs.h"

#include <QTest>

#include <fcntl.h>
#include <sys/stat.h>

using namespace VeyFM;

namespace {

constexpr uint UnknownId = 0xFFFFFFFEu;

QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

// For as long as it lives, access(2) judges by the rights of nobody, also where root runs this.
class AsNobody
{
public:
    AsNobody()
        : m_isActive(::getuid() != 0 || ::setreuid(65534, uid_t(-1)) == 0)
    {
    }
    ~AsNobody()
    {
        if (::geteuid() == 0 && ::setreuid(0, uid_t(-1)) != 0) {
            qFatal("can't go back to root");
        }
    }
    Q_DISABLE_COPY(AsNobody)

    bool isActive() const
    {
        return m_isActive;
    }

private:
    const bool m_isActive;
};

} // namespace

/// What entries tell of the disk, asked afresh each time.
class TestEntryFilesystem : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void sizes();
    void times();
    void owners();
    void linksAnswerForThemselves();
    void missing();
    void noLocalPath();
    void existence();
    void existenceOfPlacesAndUrls();
    void linkTargets();
    void permissions();
    void placesAreExecutable();
    void absolutePaths();
    void encodedNames();
    void nothingIsRemembered();

private:
    Entry entryOf(const char* relative) const
    {
        return VFS::ptr()->entry(m_tree.path(relative));
    }

    TemporaryTree m_tree;
};

void TestEntryFilesystem::initTestCase()
{
    VFS::initialize();
    QVERIFY(m_tree.write("file", "12345"));
    QVERIFY(m_tree.makeDir("dir"));
    QVERIFY(m_tree.makeLink("file", "link"));
    QVERIFY(m_tree.makeLink("dir", "dirlink"));
    QVERIFY(m_tree.makeLink("nowhere", "dangling"));
}

void TestEntryFilesystem::sizes()
{
    QCOMPARE(entryOf("file").fileSize(), qint64(5));

    // More than 32 bits of it.
    QVERIFY(m_tree.write("large"));
    const qint64 size = qint64(5) << 30;
    QCOMPARE(::truncate64(m_tree.bytes("large").constData(), size), 0);
    QCOMPARE(entryOf("large").fileSize(), size);
    QVERIFY(m_tree.remove("large"));
}

void TestEntryFilesystem::times()
{
    const timespec times[2] = {{10, 0}, {5000000000, 999999999}};
    QCOMPARE(::utimensat(AT_FDCWD, m_tree.bytes("file").constData(), times, 0), 0);
    struct stat status;
    QCOMPARE(::lstat(m_tree.bytes("file").constData(), &status), 0);

    const Entry file = entryOf("file");
    QCOMPARE(file.lastModified(), qint64(status.st_mtime));
    QCOMPARE(file.lastModified(), Q_INT64_C(5000000000));
    QCOMPARE(file.lastStatusChange(), qint64(status.st_ctime));
    QVERIFY(file.lastStatusChange() != file.lastModified());
}

void TestEntryFilesystem::owners()
{
    const Entry file = entryOf("file");
    QCOMPARE(file.ownerId(), uint(::geteuid()));
    if (::geteuid() == 0) {
        QCOMPARE(::lchown(m_tree.bytes("file").constData(), 12345, 54321), 0);
        QCOMPARE(file.ownerId(), 12345u);
        QCOMPARE(file.groupId(), 54321u);
        QCOMPARE(::lchown(m_tree.bytes("file").constData(), 0, 0), 0);
        QCOMPARE(file.owner(), text("root"));
        QCOMPARE(file.group(), text("root"));
    }
    struct stat status;
    QCOMPARE(::lstat(m_tree.bytes("file").constData(), &status), 0);
    QCOMPARE(file.groupId(), uint(status.st_gid));
}

void TestEntryFilesystem::linksAnswerForThemselves()
{
    const Entry link = entryOf("link");
    QCOMPARE(link.type(), int(TypeFileLink));
    QCOMPARE(link.fileSize(), qint64(qstrlen("file")));
    QCOMPARE(entryOf("dangling").fileSize(), qint64(qstrlen("nowhere")));

    const timespec times[2] = {{10, 0}, {20, 0}};
    const QByteArray linkPath = m_tree.bytes("link");
    QCOMPARE(::utimensat(AT_FDCWD, linkPath.constData(), times, AT_SYMLINK_NOFOLLOW), 0);
    QCOMPARE(link.lastModified(), qint64(20));
    QVERIFY(entryOf("file").lastModified() != 20);

    if (::geteuid() == 0) {
        QCOMPARE(::lchown(linkPath.constData(), 12345, 54321), 0);
        QCOMPARE(link.ownerId(), 12345u);
        QCOMPARE(link.groupId(), 54321u);
        QCOMPARE(entryOf("file").ownerId(), 0u);
    }
    QVERIFY(entryOf("dangling").lastStatusChange() > 0);
    QVERIFY(entryOf("dangling").ownerId() != UnknownId);
}

void TestEntryFilesystem::missing()
{
    const Entry missing = entryOf("missing");
    QVERIFY(!missing.isNull());
    QCOMPARE(missing.lastModified(), qint64(-1));
    QCOMPARE(missing.lastStatusChange(), qint64(-1));
    QCOMPARE(missing.fileSize(), qint64(0));
    // -2 as unsigned, and not the -1 of Qt.
    QCOMPARE(missing.ownerId(), UnknownId);
    QCOMPARE(missing.groupId(), UnknownId);
    QVERIFY(!missing.exists());
    QVERIFY(!missing.isReadable());
    QVERIFY(!missing.isWritable());
    QVERIFY(!missing.isExecutable());
    QVERIFY(missing.symLinkTarget().isEmpty());

    const Entry belowFile = makeEntry(text("x"), m_tree.path("file/x"), TypeFile);
    QCOMPARE(belowFile.ownerId(), UnknownId);
    QCOMPARE(belowFile.lastModified(), qint64(-1));
}

void TestEntryFilesystem::noLocalPath()
{
    const Entry url = VFS::ptr()->entry(text("http://example.org/a"));
    QCOMPARE(url.type(), int(TypeCustomUrl));
    for (const Entry& entry : {Entry(), url}) {
        QCOMPARE(entry.lastModified(), qint64(-1));
        QCOMPARE(entry.lastStatusChange(), qint64(-1));
        QCOMPARE(entry.fileSize(), qint64(0));
        QCOMPARE(entry.ownerId(), UnknownId);
        QCOMPARE(entry.groupId(), UnknownId);
        QVERIFY(!entry.exists());
        QVERIFY(!entry.isReadable());
        QVERIFY(!entry.isWritable());
        QVERIFY(!entry.isExecutable());
        QVERIFY(entry.symLinkTarget().isEmpty());
        QVERIFY(entry.fileName().isEmpty());
        QVERIFY(!entry.isHidden());
    }
}

void TestEntryFilesystem::existence()
{
    QVERIFY(entryOf("file").exists());
    QVERIFY(entryOf("dir").exists());
    QVERIFY(entryOf("link").exists());
    QVERIFY(!entryOf("dangling").exists());
    QVERIFY(entryOf("file").isExists());
    QVERIFY(!entryOf("missing").isExists());
}

void TestEntryFilesystem::existenceOfPlacesAndUrls()
{
    const Entry computer = VFS::ptr()->computerEntry();
    QVERIFY(!computer.exists());
    QVERIFY(computer.isExists());
    // A place that is in no tree does not exist, though its directory does.
    const Entry stranger = makeEntry(text("Stranger"), m_tree.path(), TypeFavouritePlace);
    QVERIFY(stranger.exists());
    QVERIFY(!stranger.isExists());
    QVERIFY(makeEntry("mailto:a@example.org", "", TypeCustomUrl).isExists());
    QVERIFY(!makeEntry("http://example.org", "", TypeCustomUrl).isExists());
}

void TestEntryFilesystem::linkTargets()
{
    QCOMPARE(entryOf("link").symLinkTarget(), m_tree.path("file"));
    QCOMPARE(entryOf("dangling").symLinkTarget(), m_tree.path("nowhere"));
    QVERIFY(entryOf("file").symLinkTarget().isEmpty());
}

void TestEntryFilesystem::permissions()
{
    // The way there has to be open to all.
    QCOMPARE(::chmod(QFile::encodeName(m_tree.path()).constData(), 0755), 0);
    const Entry file = entryOf("file");
    const QByteArray path = m_tree.bytes("file");
    const AsNobody nobody;
    QVERIFY(nobody.isActive());
    for (uint mode : {0u, 4u, 2u, 1u, 6u, 7u}) {
        QCOMPARE(::chmod(path.constData(), mode * 0111), 0);
        QCOMPARE(file.isReadable(), (mode & 4) != 0);
        QCOMPARE(file.isWritable(), (mode & 2) != 0);
        QCOMPARE(file.isExecutable(), (mode & 1) != 0);
    }
    QCOMPARE(::chmod(path.constData(), 0644), 0);
}

void TestEntryFilesystem::placesAreExecutable()
{
    QVERIFY(makeEntry("Pure", "", TypeComputerPlace).isExecutable());
    // A pure place says so whatever its local path is.
    QVERIFY(makeEntry(text("Pure"), m_tree.path("missing"), TypePlace).isExecutable());
    QVERIFY(makeEntry("Share", "", TypeSambaSharePlace).isExecutable());
    QVERIFY(!makeEntry(text("Share"), m_tree.path("missing"), TypeSambaSharePlace).isExecutable());
    QVERIFY(makeEntry(text("Share"), m_tree.path("dir"), TypeSambaSharePlace).isExecutable());
    // A directory place without a directory is none of them.
    QVERIFY(!makeEntry("Favourite", "", TypeFavouritePlace).isExecutable());
}

void TestEntryFilesystem::absolutePaths()
{
    QCOMPARE(entryOf("file").absoluteFilePath(), m_tree.path("file"));
    const Entry relative = makeEntry("x", "a/../b", TypeFile);
    QCOMPARE(relative.absoluteFilePath(), QDir::currentPath() + text("/b"));
}

void TestEntryFilesystem::encodedNames()
{
    const char* const name = "\xC3\xBC \xF0\x9F\x93\x81 50% a:b";
    QVERIFY(m_tree.write(name, "123"));
    const Entry file = entryOf(name);
    QCOMPARE(file.fileName(), text(name));
    QCOMPARE(file.fileSize(), qint64(3));
    QVERIFY(file.exists());
    // Not escaped: this is a prefix and not a URL.
    QCOMPARE(file.localPathWithScheme(), text("file://") + m_tree.path(name));
}

void TestEntryFilesystem::nothingIsRemembered()
{
    const Entry file = entryOf("later");
    QCOMPARE(file.type(), int(TypeNone));
    QVERIFY(!file.exists());
    QVERIFY(m_tree.write("later", "1234567"));
    QVERIFY(file.exists());
    QCOMPARE(file.fileSize(), qint64(7));
    QVERIFY(m_tree.remove("later"));
    QVERIFY(!file.exists());
    QCOMPARE(file.fileSize(), qint64(0));
    QCOMPARE(file.type(), int(TypeNone));
}

QTEST_GUILESS_MAIN(TestEntryFilesystem)
#include "tst_entry_filesystem.moc"
