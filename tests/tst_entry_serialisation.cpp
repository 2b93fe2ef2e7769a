// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "core/entrylist.h"
#include "support/dbuswire.h"
#include "support/makeentry.h"
#include "vfs/vfs.h"

#include <QDBusMetaType>
#include <QTest>

using namespace VeyFM;

namespace {

QString text(const char* utf8)
{
    return QString::fromUtf8(utf8);
}

template <typename T>
QByteArray streamed(const T& value)
{
    QByteArray bytes;
    QDataStream stream(&bytes, QIODevice::WriteOnly);
    stream << value;
    return bytes;
}

// QSet and QCOMPARE look at the path alone. Here all three fields count.
bool isIdentical(const Entry& a, const Entry& b)
{
    return streamed(a) == streamed(b);
}

// "a" at "/b", a file.
const char* const fileInHex = "00000002"
                              "0061"
                              "00000004"
                              "002f0062"
                              "00002710";

} // namespace

/// The two forms in which entries leave the process. Others read them, so they never change.
class TestEntrySerialisation : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void streamBytes_data();
    void streamBytes();
    void streamCarriesStoredFields();
    void streamTruncated();
    void streamOfGarbage();
    void streamByMetaType();
    void signatures();
    void onTheWire_data();
    void onTheWire();
    void wireCarriesStoredFields();
    void listOnTheWire();
    void readingReplacesTheList();
    void emptyListOnTheWire();
    void metaTypes();

private:
    QScopedPointer<DBusWire> m_wire;
};

void TestEntrySerialisation::initTestCase()
{
    VFS::initialize();
    m_wire.reset(new DBusWire);
    QVERIFY(m_wire->isConnected());
}

void TestEntrySerialisation::streamBytes_data()
{
    QTest::addColumn<Entry>("entry");
    QTest::addColumn<QByteArray>("hex");
    // Null texts are written as such, and empty ones as empty.
    QTest::newRow("null") << Entry()
                          << QByteArray("ffffffff"
                                        "ffffffff"
                                        "00000000");
    QTest::newRow("empty") << makeEntry("", "", 0)
                           << QByteArray("00000000"
                                         "00000000"
                                         "00000000");
    QTest::newRow("file") << makeEntry("a", "/b", TypeFile) << QByteArray(fileInHex);
    QTest::newRow("negative type") << makeEntry("a", "", -2)
                                   << QByteArray("00000002"
                                                 "0061"
                                                 "00000000"
                                                 "fffffffe");
    QTest::newRow("surrogates") << makeEntry(text("\xF0\x9F\x93\x81"), QString(), TypeFuseUrl)
                                << QByteArray("00000004"
                                              "d83ddcc1"
                                              "ffffffff"
                                              "00007594");
}

void TestEntrySerialisation::streamBytes()
{
    QFETCH(Entry, entry);
    QFETCH(QByteArray, hex);
    QCOMPARE(streamed(entry).toHex(), hex);

    QDataStream stream(QByteArray::fromHex(hex));
    Entry read = makeEntry("old", "/old", TypeDir);
    stream >> read;
    QCOMPARE(stream.status(), QDataStream::Ok);
    QVERIFY(stream.atEnd());
    QCOMPARE(streamed(read).toHex(), hex);
    QCOMPARE(read.path().isNull(), entry.path().isNull());
}

void TestEntrySerialisation::streamCarriesStoredFields()
{
    const Entry asking = makeEntry("/usr", "", TypeDir);
    QCOMPARE(asking.localPath(), text("/usr"));
    QCOMPARE(
        streamed(asking).toHex(), QByteArray("00000008"
                                             "002f007500730072"
                                             "00000000"
                                             "00002711"));
    // And this one has a stored path that it does not use.
    const Entry storage = makeEntry("a", "/b", TypeUsbDiskStoragePlace);
    QVERIFY(storage.localPath().isEmpty());
    QCOMPARE(
        streamed(storage).toHex(), QByteArray("00000002"
                                              "0061"
                                              "00000004"
                                              "002f0062"
                                              "00000dac"));
}

void TestEntrySerialisation::streamTruncated()
{
    const QByteArray whole = QByteArray::fromHex(fileInHex);
    for (int size = 0; size < whole.size(); ++size) {
        QDataStream stream(whole.left(size));
        Entry entry = makeEntry("old", "/old", TypeDir);
        stream >> entry;
        QCOMPARE(stream.status(), QDataStream::ReadPastEnd);
        // What came whole is there, the rest is empty: nothing old stays.
        QCOMPARE(entry.path(), size < 6 ? QString() : text("a"));
        QCOMPARE(entry.isNull(), size < 6);
        QCOMPARE(entry.type(), 0);
        if (size >= 14) {
            QCOMPARE(entry.localPath(), text("/b"));
        }
    }
}

void TestEntrySerialisation::streamOfGarbage()
{
    // A length of four gigabytes, and one that is no whole number of characters.
    for (const char* hex : {"fffffffe00610062", "0000000300610062"}) {
        QDataStream stream(QByteArray::fromHex(hex));
        Entry entry = makeEntry("old", "/old", TypeDir);
        stream >> entry;
        QVERIFY(stream.status() != QDataStream::Ok);
        QVERIFY(entry.isNull());
        QCOMPARE(entry.type(), 0);
    }
}

void TestEntrySerialisation::streamByMetaType()
{
    const Entry entry = makeEntry("a", "/b", TypeFile);
    QByteArray bytes;
    {
        QDataStream stream(&bytes, QIODevice::WriteOnly);
        QVERIFY(QMetaType::save(stream, qMetaTypeId<Entry>(), &entry));
    }
    QCOMPARE(bytes.toHex(), QByteArray(fileInHex));
    QDataStream stream(bytes);
    Entry read;
    QVERIFY(QMetaType::load(stream, qMetaTypeId<Entry>(), &read));
    QVERIFY(isIdentical(read, entry));
}

void TestEntrySerialisation::signatures()
{
    QCOMPARE(QByteArray(QDBusMetaType::typeToSignature(qMetaTypeId<Entry>())), QByteArray("(ssi)"));
    QCOMPARE(
        QByteArray(QDBusMetaType::typeToSignature(qMetaTypeId<EntryList>())), QByteArray("a(ssi)"));
}

void TestEntrySerialisation::onTheWire_data()
{
    QTest::addColumn<Entry>("entry");
    QTest::newRow("default") << Entry();
    QTest::newRow("file") << makeEntry("Home/\xC3\xBC", "/home/u/\xC3\xBC", TypeFile);
    QTest::newRow("place") << makeEntry("Computer", "", TypeComputerPlace);
    QTest::newRow("negative type") << makeEntry("a", "/b", -1);
    QTest::newRow("surrogates") << makeEntry("\xF0\x9F\x93\x81", "/\xF0\x9F\x93\x81", TypeDirLink);
}

void TestEntrySerialisation::onTheWire()
{
    QFETCH(Entry, entry);
    const QDBusArgument argument = m_wire->exchange(QVariant::fromValue(entry));
    QCOMPARE(m_wire->signature(), text("(ssi)"));
    QCOMPARE(argument.currentSignature(), text("(ssi)"));

    QString path;
    QString localPath;
    int type = -7;
    argument.beginStructure();
    argument >> path >> localPath >> type;
    argument.endStructure();
    QCOMPARE(path, entry.path());
    QCOMPARE(localPath, entry.type() == 0 ? QString() : entry.localPath());
    QCOMPARE(type, entry.type());

    const auto read =
        qdbus_cast<Entry>(QVariant::fromValue(m_wire->exchange(QVariant::fromValue(entry))));
    QCOMPARE(read.path(), entry.path());
    QCOMPARE(read.isNull(), entry.isNull());
    QCOMPARE(read.type(), entry.type());
}

void TestEntrySerialisation::wireCarriesStoredFields()
{
    const auto overTheWire = [this](const Entry& entry) {
        Entry read = makeEntry("old", "/old", TypeDir);
        m_wire->exchange(QVariant::fromValue(entry)) >> read;
        return read;
    };
    const Entry asking = makeEntry("/usr", "", TypeDir);
    QVERIFY(isIdentical(overTheWire(asking), asking));
    const Entry storage = makeEntry("a", "/b", TypeUsbDiskStoragePlace);
    QVERIFY(isIdentical(overTheWire(storage), storage));
}

void TestEntrySerialisation::listOnTheWire()
{
    EntryList list;
    list << makeEntry("a", "/a", TypeFile) << makeEntry("a", "/b", TypeDir) << Entry()
         << makeEntry("Network/x", "", TypeFavouriteNetworkPlace);
    const auto read =
        qdbus_cast<EntryList>(QVariant::fromValue(m_wire->exchange(QVariant::fromValue(list))));
    QCOMPARE(m_wire->signature(), text("a(ssi)"));
    QCOMPARE(read.size(), 4);
    QVERIFY(isIdentical(read[0], list[0]));
    QVERIFY(isIdentical(read[1], list[1]));
    QVERIFY(read[2].isNull());
    QVERIFY(isIdentical(read[3], list[3]));
}

void TestEntrySerialisation::readingReplacesTheList()
{
    const QDBusArgument argument =
        m_wire->exchange(QVariant::fromValue(EntryList(makeEntry("new", "/new", TypeFile))));
    EntryList list(makeEntry("old", "/old", TypeFile));
    argument >> list;
    QCOMPARE(list.paths(), QStringList{text("new")});
}

void TestEntrySerialisation::emptyListOnTheWire()
{
    const QDBusArgument argument = m_wire->exchange(QVariant::fromValue(EntryList()));
    QCOMPARE(m_wire->signature(), text("a(ssi)"));
    EntryList list(makeEntry("old", "/old", TypeFile));
    argument >> list;
    QVERIFY(list.isEmpty());
}

void TestEntrySerialisation::metaTypes()
{
    // Both spellings, since signals within the namespace have the short one.
    QCOMPARE(QMetaType::type("Entry"), qMetaTypeId<Entry>());
    QCOMPARE(QMetaType::type("VeyFM::Entry"), qMetaTypeId<Entry>());
    QCOMPARE(QMetaType::type("EntryList"), qMetaTypeId<EntryList>());
    QCOMPARE(QMetaType::type("VeyFM::EntryList"), qMetaTypeId<EntryList>());
}

QTEST_GUILESS_MAIN(TestEntrySerialisation)
#include "tst_entry_serialisation.moc"
