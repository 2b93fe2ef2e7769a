// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Extremes of what the library is handed: each ends in a value or a null one, and soon.

#include "core/favouriteplace.h"
#include "core/mountpaths.h"
#include "core/networkplace.h"
#include "core/smburl.h"
#include "service/networkmountsmanagerproxy.h"
#include "vfs/vfs.h"

#include <QtTest>

#include <ctime>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

using namespace VeyFM;

namespace {

// Processor time of this thread, since a busy machine is no hang. What takes the square of
// 100,000 takes far longer, with or without sanitizers.
class Stopwatch
{
public:
    double seconds() const
    {
        return now() - m_start;
    }

private:
    static double now()
    {
        timespec time{};
        ::clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
        return double(time.tv_sec) + double(time.tv_nsec) * 1e-9;
    }

    double m_start = now();
};

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr double limit = 5;
#else
constexpr double limit = 1;
#endif

QString repeated(const char* text, int count)
{
    return QString::fromUtf8(text).repeated(count);
}

// Each letter another one: what takes time for the number of distinct letters shows it here.
QString ideographs(int count)
{
    QString text;
    for (int i = 0; i < count; ++i) {
        text += QChar(0x4E00 + i % 20000);
    }
    return text;
}

template <typename Record>
QByteArray written(const Record& record)
{
    QByteArray bytes;
    QDataStream stream(&bytes, QIODevice::WriteOnly);
    stream << record;
    return bytes;
}

template <typename Record>
QDataStream::Status statusOfRead(const QByteArray& bytes, Record& record)
{
    QDataStream stream(bytes);
    stream >> record;
    return stream.status();
}

template <typename Record>
Record readBack(const QByteArray& bytes)
{
    Record record;
    statusOfRead(bytes, record);
    return record;
}

// The stream form of an entry, which has no public constructor.
QByteArray entryBytes(const QString& path, const QString& localPath, qint32 type)
{
    QByteArray bytes;
    QDataStream stream(&bytes, QIODevice::WriteOnly);
    stream << path << localPath << type;
    return bytes;
}

const FavouritePlaceList favourites{
    FavouritePlace(QStringLiteral("Music"), QStringLiteral("/home/u/Music")),
    FavouritePlace(QString(), QStringLiteral("/b")), FavouritePlace()};

const NetworkPlaceList networkPlaces{
    NetworkPlace(QStringLiteral("a"), QStringLiteral("ftp://a"), QStringLiteral("/a")),
    NetworkPlace(QStringLiteral("b"), QString(), QString())};

template <typename Record>
void cutAtEveryByte(const Record& record)
{
    const QByteArray whole = written(record);
    for (int size = 0; size < whole.size(); ++size) {
        Record cut;
        QVERIFY(statusOfRead(whole.left(size), cut) != QDataStream::Ok);
        // Still a record: it can be written and read.
        Record again;
        QCOMPARE(statusOfRead(written(cut), again), QDataStream::Ok);
        QCOMPARE(written(again), written(cut));
    }
    Record back;
    QCOMPARE(statusOfRead(whole, back), QDataStream::Ok);
    QCOMPARE(written(back), whole);
}

} // namespace

class HostileInputTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void longPath_data();
    void longPath();
    void longText_data();
    void longText();
    void hostThatIsTooLong_data();
    void hostThatIsTooLong();
    void longHistory_data();
    void longHistory();
    void brokenUrl_data();
    void brokenUrl();
    void nulEndsNothing();
    void loneSurrogates();
    void nameOfAnyLetters();
    void nameOfAnyBytes();
    void deepDirectory();
    void cutStream();
    void announcedElements_data();
    void announcedElements();
    void announcedLetters_data();
    void announcedLetters();
    void longSmbUrl_data();
    void longSmbUrl();
    void longMountUrl();

private:
    QTemporaryDir m_dir;
};

void HostileInputTest::initTestCase()
{
    VFS::initialize();
    VFS::ptr();
    QVERIFY(m_dir.isValid());
}

void HostileInputTest::longPath_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("path");

    const QString here = QDir::currentPath();
    const QString as = repeated("/a", 100000);
    const int levels = here.count(QLatin1Char('/'));
    QVERIFY(levels > 0);

    QTest::newRow("sections") << repeated("a/", 100000) << here + as;
    QTest::newRow("absolute sections") << as << as;
    QTest::newRow("below a place") << QStringLiteral("Home") + as << QStringLiteral("Home") + as;
    QTest::newRow("in a file URL") << QStringLiteral("file://") + as << as;
    QTest::newRow("down and up") << repeated("/a", 100000) + repeated("/..", 100000)
                                 << QStringLiteral("File System");
    // Above the root directory the walk goes on through the tree, and ends at a lone name.
    QTest::newRow("up") << repeated("../", 100000) << QStringLiteral("_");
    QTest::newRow("in and out") << repeated("/a/b/..", 100000) << as;
    QTest::newRow("up and down again") << repeated("a/../", 100000) << here;
    QTest::newRow("dots") << repeated("/.", 100000) + QStringLiteral("/etc")
                          << QStringLiteral("/etc");
    QTest::newRow("dots alone") << repeated("./", 100000) << here;
    QTest::newRow("slashes") << repeated("/", 1000000) + QStringLiteral("etc")
                             << QStringLiteral("/etc");
    QTest::newRow("places") << repeated("Computer/Home/", 50000) << QStringLiteral("Home");
    QTest::newRow("one place") << repeated("Home/", 100000) + QStringLiteral("x")
                               << QStringLiteral("Home/x");
    QTest::newRow("one name") << QLatin1Char('/') + repeated("n", 4000000)
                              << QLatin1Char('/') + repeated("n", 4000000);
}

void HostileInputTest::longPath()
{
    QFETCH(QString, text);
    QFETCH(QString, path);
    const VFS* vfs = VFS::ptr();
    const Stopwatch watch;

    const Entry entry = vfs->entry(text);
    QCOMPARE(entry.path(), path);
    QVERIFY(watch.seconds() < limit);

    vfs->normalizePath(text);
    vfs->pathEntryList(entry);
    vfs->isPlaceRelativeEntry(entry);
    vfs->placeRelatedEntry(entry);
    vfs->symLinkTargetEntry(entry);
    vfs->childs(entry);
    vfs->hasChilds(entry);
    vfs->urlsFromEntries({entry});
    QVERIFY(watch.seconds() < 2 * limit);
}

void HostileInputTest::longText_data()
{
    QTest::addColumn<QString>("text");
    for (const char* start :
         {"", "a", "/", "file:", "file://", "vey-fm:", "vey-fm://", "http://"}) {
        for (const char* letter : {":", "%", "@", "[", "?", "#", "\\", ";", ".", "\xC2\xAD"}) {
            QTest::addRow("%s and %s", start, letter)
                << QString::fromUtf8(start) + repeated(letter, 1000000);
        }
    }
    QTest::newRow("scheme") << repeated("a", 4000000) + QStringLiteral(":b");
    QTest::newRow("own scheme") << QStringLiteral("vey-fm:") + repeated("%41/../", 200000);
}

void HostileInputTest::longText()
{
    QFETCH(QString, text);
    const VFS* vfs = VFS::ptr();
    const Stopwatch watch;

    const Entry entry = vfs->entry(text);
    QVERIFY(!entry.isPlace());
    QCOMPARE(vfs->localPath(text), entry.localPath());
    vfs->normalizePath(text);
    QVERIFY(watch.seconds() < limit);
}

void HostileInputTest::hostThatIsTooLong_data()
{
    QTest::addColumn<QString>("host");
    QTest::newRow("distinct letters") << ideographs(100000);
    QTest::newRow("marks out of order") << QString::fromUtf8("\xCC\x80\xCC\x96").repeated(100000);
    QTest::newRow("escapes") << QString::fromLatin1(ideographs(50000).toUtf8().toPercentEncoding());
    QTest::newRow("behind a user") << QStringLiteral("user@") + ideographs(100000);
    QTest::newRow("behind two users") << QStringLiteral("a@b@") + ideographs(100000);
    QTest::newRow("behind a dot") << QStringLiteral("www.") + ideographs(100000);
}

// A URL's host is put into another form to be looked at, which for such a host takes minutes.
void HostileInputTest::hostThatIsTooLong()
{
    QFETCH(QString, host);
    VFS* vfs = VFS::ptr();
    const Stopwatch watch;

    // No host in the eyes of a parser, and what then counts as path has it in front.
    const Entry file = vfs->entry(QStringLiteral("file://") + host + QStringLiteral("/tmp/x"));
    const QString decoded = QUrl::fromPercentEncoding(host.toUtf8());
    QCOMPARE(file.path(), QLatin1Char('/') + decoded + QStringLiteral("/tmp/x"));
    QVERIFY(vfs->entry(QStringLiteral("vey-fm://") + host + QStringLiteral("/Home")).isNull());

    const QString http = QStringLiteral("http://") + host;
    QCOMPARE(vfs->entry(http).path(), http);
    QVERIFY(vfs->entry(http).localPath().isEmpty());
    QVERIFY(vfs->entry(QStringLiteral("smb://") + host).isNull());
    // No host, but a parser that guesses takes it for one.
    QVERIFY(vfs->entry(QStringLiteral("file:@") + host).isNull());

    const QString sftp = QStringLiteral("sftp://") + host;
    const QString name = vfs->createEntryForUrl(sftp, m_dir.path()).lastPathSection();
    QCOMPARE(name, host.contains(u'@') ? host.section(u'@', 0, 0) + u'@' : QString());
    const Entry unmounted = vfs->entry(sftp);
    QCOMPARE(vfs->urlsFromEntries(unmounted).value(0).host(), QString());
    QSignalSpy mounted(vfs, &VFS::fuseMountAdded);
    Q_EMIT vfs->networkMountsManager()->mountAdded(
        sftp, vfs->createEntryForUrl(QStringLiteral("sftp://h/"), m_dir.path()));
    QCOMPARE(mounted.size(), 1);
    QVERIFY(watch.seconds() < limit);
}

void HostileInputTest::longHistory_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QStringList>("history");
    const QStringList computer{QStringLiteral("Computer")};
    const QStringList home{QStringLiteral("Computer"), QStringLiteral("Home")};
    QTest::newRow("places") << repeated("Computer/Home/", 50000) << home;
    QTest::newRow("one place") << repeated("Computer/", 100000) << computer;
    QTest::newRow("below a place") << QStringLiteral("Home/") + repeated("a/", 100000) << home;
    QTest::newRow("no section is a place") << repeated("Home", 100000) << QStringList();
}

void HostileInputTest::longHistory()
{
    QFETCH(QString, text);
    QFETCH(QStringList, history);
    const Stopwatch watch;
    QCOMPARE(VFS::ptr()->exploreParentPlacesHistory(text), history);
    QVERIFY(watch.seconds() < limit);
}

void HostileInputTest::brokenUrl_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("path");
    const auto row = [](const char* text, const char* path) {
        QTest::newRow(text) << QString::fromUtf8(text) << QString::fromUtf8(path);
    };
    row("file:", "");
    row("file:/", "/");
    row("file://", "");
    row("file:///", "/");
    row("file:////", "");
    row("file://host", "");
    row("file://host/etc", "");
    row("file://[::1]/etc", "");
    row("file:///%zz%", "/%zz%");
    row("file:///etc?x#y", "/etc");
    row("vey-fm:", "");
    row("vey-fm:%", "");
    row("vey-fm:%00", "");
    row("vey-fm:Home/..", "");
    row("vey-fm:Home#Trash", "Home");
    row("vey-fm:/Home", "");
    row("vey-fm:vey-fm:Home", "");
    row("vey-fm://[", "");
    row("smb://", "");
    row("x:", "");
}

void HostileInputTest::brokenUrl()
{
    QFETCH(QString, text);
    QFETCH(QString, path);
    QCOMPARE(VFS::ptr()->entry(text).path(), path);
}

// The system ends a path at its first NUL. What stands before it must not be taken for the whole.
void HostileInputTest::nulEndsNothing()
{
    const VFS* vfs = VFS::ptr();
    const QString path = m_dir.path() + QChar(0) + QStringLiteral("x");

    const Entry entry = vfs->entry(path);
    QCOMPARE(entry.path(), path);
    QCOMPARE(entry.type(), int(TypeNone));
    QVERIFY(!vfs->isEntryExists(entry));
    QCOMPARE(entry.lastModified(), qint64(-1));
    QCOMPARE(entry.ownerId(), 0xFFFFFFFEu);
    QCOMPARE(vfs->entry(QStringLiteral("file:///etc%00")).type(), int(TypeNone));
    QVERIFY(!vfs->entry(QStringLiteral("Home") + QChar(0)).isPlace());

    // A stream may call it a directory.
    QFile file(m_dir.filePath(QStringLiteral("file")));
    QVERIFY(file.open(QIODevice::WriteOnly));
    const Entry directory = readBack<Entry>(entryBytes(path, path, TypeDir));
    QVERIFY(directory.isDir());
    QCOMPARE(vfs->childs(directory).size(), 0);
    QVERIFY(!vfs->hasChilds(directory));
    QVERIFY(!vfs->containsDirsOrPlaces(directory));
    QVERIFY(!vfs->childs(vfs->entry(m_dir.path())).isEmpty());
}

void HostileInputTest::loneSurrogates()
{
    const VFS* vfs = VFS::ptr();
    const QString high(QChar(0xD800));
    const QString low(QChar(0xDC00));
    for (const QString& text : {high, low, low + high, high + QLatin1Char('/') + low}) {
        QCOMPARE(vfs->entry(QLatin1Char('/') + text).path(), QLatin1Char('/') + text);
        QCOMPARE(vfs->entry(text).path(), QDir::currentPath() + QLatin1Char('/') + text);
        QVERIFY(vfs->entry(QStringLiteral("vey-fm:") + text).isNull());
        QCOMPARE(
            SmbUrl(QStringLiteral("smb://") + text).host(), text.section(QLatin1Char('/'), 0, 0));
        const FavouritePlace place(text, text);
        QCOMPARE(readBack<FavouritePlace>(written(place)).name(), text);
    }
}

// A file name has up to 255 bytes, of any kind but two.
void HostileInputTest::nameOfAnyLetters()
{
    QByteArray name;
    for (int letter = 1; letter < 0x80; ++letter) {
        if (letter != '/') {
            name += char(letter);
        }
    }
    for (ushort letter = 0xA0; name.size() < 254; ++letter) {
        name += QString(QChar(letter)).toUtf8();
    }
    name.resize(name.size() > 255 ? 254 : name.size());
    name += QByteArray(255 - name.size(), 'x');
    QCOMPARE(name.size(), 255);

    const QString directory = m_dir.filePath(QStringLiteral("letters"));
    QVERIFY(QDir().mkdir(directory));
    const QByteArray bytes = directory.toLocal8Bit() + '/' + name;
    const int file = ::open(bytes.constData(), O_CREAT | O_WRONLY | O_CLOEXEC, 0600);
    QVERIFY(file >= 0);
    ::close(file);

    const VFS* vfs = VFS::ptr();
    const QString path = directory + QLatin1Char('/') + QString::fromUtf8(name);
    const Entry entry = vfs->entry(path);
    QCOMPARE(entry.path(), path);
    QCOMPARE(entry.localPath(), path);
    QCOMPARE(entry.type(), int(TypeFile));
    QCOMPARE(vfs->parent(entry).path(), directory);

    const EntryList children = vfs->childs(vfs->entry(directory));
    QCOMPARE(children.size(), 1);
    QCOMPARE(children.first(), entry);
    QCOMPARE(children.first().type(), int(TypeFile));
    QCOMPARE(vfs->child(vfs->entry(directory), QString::fromUtf8(name)), entry);
}

void HostileInputTest::nameOfAnyBytes()
{
    QByteArray name;
    for (int byte = 255; byte > 0; --byte) {
        if (byte != '/') {
            name += char(byte);
        }
    }
    name += '\xFF';
    QCOMPARE(name.size(), 255);

    const QString directory = m_dir.filePath(QStringLiteral("bytes"));
    QVERIFY(QDir().mkdir(directory));
    const QByteArray prefix = directory.toLocal8Bit() + '/';
    QCOMPARE(::mkdir((prefix + name).constData(), 0700), 0);
    const VFS* vfs = VFS::ptr();
    const Entry parent = vfs->entry(directory);
    // No text names it, so it is left out of a listing. A link is not.
    QCOMPARE(vfs->childs(parent).size(), 0);
    QVERIFY(vfs->hasChilds(parent));

    QCOMPARE(::rmdir((prefix + name).constData()), 0);

    name[0] = '\xFE';
    QCOMPARE(::symlink("nowhere", (prefix + name).constData()), 0);
    const EntryList children = vfs->childs(parent);
    QCOMPARE(children.size(), 1);
    QCOMPARE(children.first().type(), int(TypeFileLink));
    const QString path = directory + QLatin1Char('/') + QString::fromLocal8Bit(name);
    QCOMPARE(children.first().path(), path);
    QCOMPARE(vfs->entry(path).path(), path);
    QCOMPARE(vfs->entry(path).type(), int(TypeNone));
    // The temporary directory can't name it either, and would stay.
    QCOMPARE(::unlink((prefix + name).constData()), 0);
}

// As deep as the system can name at once.
void HostileInputTest::deepDirectory()
{
    QString path = m_dir.filePath(QStringLiteral("deep"));
    int levels = 0;
    while (path.size() < 4000) {
        QVERIFY(QDir().mkdir(path));
        path += QStringLiteral("/a name of some letters");
        ++levels;
    }
    path.truncate(path.lastIndexOf(QLatin1Char('/')));
    const VFS* vfs = VFS::ptr();
    const Stopwatch watch;
    const Entry entry = vfs->entry(path);
    QCOMPARE(entry.type(), int(TypeDir));
    const EntryList chain = vfs->pathEntryList(entry);
    QVERIFY(chain.size() > levels);
    QCOMPARE(chain.last(), entry);
    QCOMPARE(vfs->urlsFromEntries({entry}), QList<QUrl>{QUrl::fromLocalFile(path)});
    QVERIFY(watch.seconds() < limit);
}

void HostileInputTest::cutStream()
{
    cutAtEveryByte(readBack<Entry>(
        entryBytes(QStringLiteral("Home/x"), QStringLiteral("/home/u/x"), TypeFile)));
    cutAtEveryByte(favourites.first());
    cutAtEveryByte(networkPlaces.first());
    cutAtEveryByte(favourites);
    cutAtEveryByte(networkPlaces);

    // A list is read in full or not at all.
    FavouritePlaceList list;
    const QByteArray whole = written(favourites);
    QVERIFY(statusOfRead(whole.left(whole.size() - 1), list) != QDataStream::Ok);
    QVERIFY(list.isEmpty());
}

void HostileInputTest::announcedElements_data()
{
    QTest::addColumn<quint32>("count");
    QTest::newRow("many") << 100000000u;
    QTest::newRow("most") << 0x7FFFFFFFu;
    QTest::newRow("negative") << 0x80000000u;
    QTest::newRow("minus one") << 0xFFFFFFFFu;
}

// Reserving room for them all would ask for gigabytes, and end the process.
void HostileInputTest::announcedElements()
{
    QFETCH(quint32, count);
    QByteArray bytes;
    QDataStream stream(&bytes, QIODevice::WriteOnly);
    stream << count << QStringLiteral("a") << QStringLiteral("b") << QStringLiteral("c");

    const Stopwatch watch;
    FavouritePlaceList places = favourites;
    QCOMPARE(statusOfRead(bytes, places), QDataStream::ReadPastEnd);
    QVERIFY(places.isEmpty());
    NetworkPlaceList network = networkPlaces;
    QCOMPARE(statusOfRead(bytes, network), QDataStream::ReadPastEnd);
    QVERIFY(network.isEmpty());
    QVERIFY(watch.seconds() < limit);
}

void HostileInputTest::announcedLetters_data()
{
    QTest::addColumn<quint32>("size");
    QTest::addColumn<int>("status");
    QTest::newRow("odd") << 3u << int(QDataStream::ReadCorruptData);
    QTest::newRow("gigabyte") << 0x40000000u << int(QDataStream::ReadPastEnd);
    QTest::newRow("most") << 0xFFFFFFFEu << int(QDataStream::ReadPastEnd);
}

void HostileInputTest::announcedLetters()
{
    QFETCH(quint32, size);
    QFETCH(int, status);
    QByteArray bytes;
    QDataStream stream(&bytes, QIODevice::WriteOnly);
    stream << size << quint32(0x00610062);

    const Stopwatch watch;
    Entry entry;
    QCOMPARE(int(statusOfRead(bytes, entry)), status);
    QVERIFY(entry.isNull());
    NetworkPlace place;
    QCOMPARE(int(statusOfRead(bytes, place)), status);
    QVERIFY(place.isNull());
    QVERIFY(watch.seconds() < limit);
}

void HostileInputTest::longSmbUrl_data()
{
    QTest::addColumn<QString>("rest");
    for (const char* letter : {"/", ";", "@", "%", ":", " ", "a"}) {
        QTest::newRow(letter) << repeated(letter, 4000000);
    }
    QTest::newRow("distinct letters") << ideographs(1000000);
}

void HostileInputTest::longSmbUrl()
{
    QFETCH(QString, rest);
    const Stopwatch watch;
    const SmbUrl url(QStringLiteral("smb://") + rest);
    QVERIFY(url.isValid());
    const SmbUrl again(url.toString());
    QCOMPARE(again.isValid(), !url.host().isEmpty());
    QVERIFY(watch.seconds() < limit);
}

void HostileInputTest::longMountUrl()
{
    const QString path = QStringLiteral("/~") + repeated("/a", 1000000);
    const QUrl url(QStringLiteral("sftp://host") + path);
    const Stopwatch watch;
    QCOMPARE(MountPaths::mountRootUrl(url), QStringLiteral("sftp://host/~/"));
    QCOMPARE(MountPaths::mountRootRelativePath(url), path.mid(2));
    QVERIFY(watch.seconds() < limit);
}

QTEST_GUILESS_MAIN(HostileInputTest)
#include "tst_hostileinput.moc"
