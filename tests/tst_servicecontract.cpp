// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/fakeservice/contract.h"
#include "support/servicescene.h"

// Made from the installed files, one an interface: a change that breaks a generated client breaks
// this build.
#include "favouriteplacesmanager_client.h"
#include "filesystem_client.h"
#include "fusemountsmanager_client.h"
#include "networkmountsmanager_client.h"
#include "networkplacesmanager_client.h"
#include "service_client.h"
#include "smbbrowser_client.h"
#include "storageplacesmanager_client.h"

#include <QDBusMetaType>
#include <QDir>
#include <QSignalSpy>
#include <QTest>
#include <QXmlStreamReader>

using namespace VeyFM;

namespace {

const char prefix[] = "org.veylabs.FileManager.";

} // namespace

/// The introspection files as the one contract of library, service and tests.
class ServiceContractTest : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void nothingIsMissing();
    void methods_data();
    void methods();
    void signatures_data();
    void signatures();
    void everyRecordIsAnnotated();
    void metaObjectsHaveTheSignals();
    void generatedClientsWork();
    void cleanupTestCase();

private:
    ServiceScene m_service;
    const Contract m_contract{QStringLiteral(VEYFM_CONTRACT)};
};

void ServiceContractTest::initTestCase()
{
    QVERIFY2(m_service.start(), qPrintable(m_service.errorString()));
}

void ServiceContractTest::nothingIsMissing()
{
    const QStringList files = QDir(QStringLiteral(VEYFM_CONTRACT)).entryList({u"*.xml"_s});
    QCOMPARE(
        files,
        QStringList(
            {u"org.veylabs.FileManager.FavouritePlacesManager.xml"_s,
             u"org.veylabs.FileManager.FileSystem.xml"_s,
             u"org.veylabs.FileManager.FuseMountsManager.xml"_s,
             u"org.veylabs.FileManager.NetworkMountsManager.xml"_s,
             u"org.veylabs.FileManager.NetworkPlacesManager.xml"_s,
             u"org.veylabs.FileManager.Service.xml"_s, u"org.veylabs.FileManager.SmbBrowser.xml"_s,
             u"org.veylabs.FileManager.StoragePlacesManager.xml"_s}));
}

void ServiceContractTest::methods_data()
{
    QTest::addColumn<QString>("method");
    QTest::addColumn<QString>("in");
    QTest::addColumn<QString>("out");
    const auto row = [](const char* method, const QString& in, const QString& out) {
        QTest::newRow(method) << QString::fromLatin1(method) << in << out;
    };
    const QString device = u"(sbbbssssi)"_s;
    row("Service.incrementProcessRef", {}, {});
    row("Service.decrementProcessRef", {}, {});
    row("FileSystem.notifyWatchers", u"a(ssi)"_s, {});
    row("StoragePlacesManager.availableStoragePlaces", {}, u"a(sbbbssssi)"_s);
    row("StoragePlacesManager.storageDeviceInfo", device, u"(ssssbssssssttbttt)"_s);
    row("StoragePlacesManager.mountStoragePlace", device, u"b"_s);
    row("StoragePlacesManager.unmountStoragePlace", device, u"b"_s);
    row("StoragePlacesManager.ejectStoragePlaceDevice", device, u"b"_s);
    row("FavouritePlacesManager.favouritePlaces", {}, u"a(ss)"_s);
    row("FavouritePlacesManager.addFavouritePlace", u"(ss)"_s, {});
    row("FavouritePlacesManager.removeFavouritePlace", u"(ss)"_s, {});
    row("NetworkPlacesManager.networkPlaces", {}, u"a(sss)"_s);
    row("NetworkPlacesManager.addNetworkPlace", u"(sss)"_s, u"b"_s);
    row("NetworkPlacesManager.removeNetworkPlace", u"(sss)"_s, {});
    row("NetworkPlacesManager.updateNetworkPlace", u"(sss)"_s, {});
    row("SmbBrowser.workgroups", {}, u"as"_s);
    row("SmbBrowser.hosts", u"s"_s, u"as"_s);
    row("SmbBrowser.shares", u"ss"_s, u"a{ss}"_s);
    row("SmbBrowser.rescan", {}, {});
    row("SmbBrowser.rescanWorkgroup", u"s"_s, {});
    row("SmbBrowser.rescanHost", u"ss"_s, {});
    row("SmbBrowser.shareLocalPath", u"ssss"_s, u"s"_s);
    row("SmbBrowser.smbNetworkLocalPath", {}, u"s"_s);
    row("NetworkMountsManager.mounts", {}, u"a{s(ssi)}"_s);
    row("NetworkMountsManager.addMount", u"s(ssi)"_s, {});
    row("FuseMountsManager.mounts", {}, u"a{ss}"_s);
    row("FuseMountsManager.addMount", u"ss"_s, {});
}

void ServiceContractTest::methods()
{
    QFETCH(QString, method);
    QFETCH(QString, in);
    QFETCH(QString, out);
    const QString interface = QLatin1String(prefix) + method.section(QLatin1Char('.'), 0, 0);
    const QString name = method.section(QLatin1Char('.'), 1);
    QVERIFY(m_contract.hasMethod(interface, name));
    QCOMPARE(m_contract.method(interface, name).in, in);
    QCOMPARE(m_contract.method(interface, name).out, out);
}

void ServiceContractTest::signatures_data()
{
    QTest::addColumn<int>("type");
    QTest::addColumn<QByteArray>("signature");
    const auto row = [](const char* type, const char* signature) {
        QTest::newRow(type) << QMetaType::type(type) << QByteArray(signature);
    };
    row("VeyFM::Entry", "(ssi)");
    row("VeyFM::EntryList", "a(ssi)");
    row("VeyFM::StringMap", "a{ss}");
    row("VeyFM::StringEntryMap", "a{s(ssi)}");
    row("VeyFM::FavouritePlace", "(ss)");
    row("VeyFM::FavouritePlaceList", "a(ss)");
    row("VeyFM::NetworkPlace", "(sss)");
    row("VeyFM::NetworkPlaceList", "a(sss)");
    row("VeyFM::StoragePlace", "(sbbbssssi)");
    row("VeyFM::StoragePlaceList", "a(sbbbssssi)");
    row("VeyFM::StorageDeviceInfo", "(ssssbssssssttbttt)");
}

void ServiceContractTest::signatures()
{
    QFETCH(int, type);
    QFETCH(QByteArray, signature);
    QVERIFY(type != QMetaType::UnknownType);
    QCOMPARE(QByteArray(QDBusMetaType::typeToSignature(type)), signature);
}

void ServiceContractTest::everyRecordIsAnnotated()
{
    const QDir directory(QStringLiteral(VEYFM_CONTRACT));
    int annotated = 0;
    for (const QString& name : directory.entryList({u"*.xml"_s})) {
        QFile file(directory.filePath(name));
        QVERIFY(file.open(QIODevice::ReadOnly));
        QXmlStreamReader xml(&file);
        QMap<QString, QString> records; // By annotation, the signature of its argument.
        QMap<QString, QString> types;   // By annotation, its Qt type.
        bool isSignal = false;
        int in = 0;
        int out = 0;
        while (!xml.atEnd()) {
            const auto token = xml.readNext();
            const QString element = xml.name().toString();
            const bool isMember = element == u"method"_s || element == u"signal"_s;
            if (token == QXmlStreamReader::StartElement && isMember) {
                isSignal = element == u"signal"_s;
                in = out = 0;
                records.clear();
                types.clear();
            } else if (token == QXmlStreamReader::StartElement && element == u"arg"_s) {
                const bool isOut = isSignal || xml.attributes().value(u"direction"_s) == u"out"_s;
                const QString key = isOut ? u"Out%1"_s.arg(out++) : u"In%1"_s.arg(in++);
                const QString type = xml.attributes().value(u"type"_s).toString();
                if (type.size() > 1 && type != u"as"_s) {
                    records.insert(u"org.qtproject.QtDBus.QtTypeName."_s + key, type);
                }
            } else if (token == QXmlStreamReader::StartElement && element == u"annotation"_s) {
                types.insert(
                    xml.attributes().value(u"name"_s).toString(),
                    xml.attributes().value(u"value"_s).toString());
            } else if (token == QXmlStreamReader::EndElement && isMember) {
                QCOMPARE(types.keys(), records.keys());
                for (auto it = types.cbegin(); it != types.cend(); ++it) {
                    const int id = QMetaType::type(it->toLatin1());
                    QCOMPARE(
                        QString::fromLatin1(QDBusMetaType::typeToSignature(id)),
                        records.value(it.key()));
                    ++annotated;
                }
            }
        }
        QVERIFY2(!xml.hasError(), qPrintable(xml.errorString()));
    }
    QCOMPARE(annotated, 28);
}

void ServiceContractTest::metaObjectsHaveTheSignals()
{
    // Clients connect by these texts.
    const QMap<QString, QStringList> expected = {
        {u"StoragePlacesManager"_s,
         {u"storagePlaceUpdated(VeyFM::StoragePlace)"_s,
          u"storagePlaceAdded(VeyFM::StoragePlace)"_s,
          u"storagePlaceRemoved(VeyFM::StoragePlace)"_s}},
        {u"FavouritePlacesManager"_s,
         {u"favouritePlaceAdded(VeyFM::FavouritePlace)"_s,
          u"favouritePlaceRemoved(VeyFM::FavouritePlace)"_s}},
        {u"NetworkPlacesManager"_s,
         {u"networkPlaceAdded(VeyFM::NetworkPlace)"_s,
          u"networkPlaceRemoved(VeyFM::NetworkPlace)"_s,
          u"networkPlaceUpdated(VeyFM::NetworkPlace)"_s}},
        {u"SmbBrowser"_s,
         {u"rescanFinished(bool)"_s, u"rescanWorkgroupFinished(QString,bool)"_s,
          u"rescanHostFinished(QString,QString,bool)"_s,
          u"shareUpdated(QString,QString,QString,QString)"_s}},
        {u"NetworkMountsManager"_s, {u"mountAdded(QString,VeyFM::Entry)"_s}},
        {u"FuseMountsManager"_s, {}}};
    for (auto it = expected.cbegin(); it != expected.cend(); ++it) {
        const auto interface = m_service.interface(it.key());
        QStringList found;
        const QMetaObject* const meta = interface->metaObject();
        for (int i = meta->methodOffset(); i < meta->methodCount(); ++i) {
            if (meta->method(i).methodType() == QMetaMethod::Signal) {
                found << QString::fromLatin1(meta->method(i).methodSignature());
            }
        }
        QStringList wanted = it.value();
        found.sort();
        wanted.sort();
        QCOMPARE(found, wanted);
    }
    QDBusInterface fileSystem(
        ServiceScene::name(), u"/"_s, u"org.veylabs.FileManager.FileSystem"_s);
    QVERIFY(fileSystem.metaObject()->indexOfSignal("notifyWatchersSignal(VeyFM::EntryList)") >= 0);
}

void ServiceContractTest::generatedClientsWork()
{
    const QDBusConnection bus = QDBusConnection::sessionBus();
    m_service->setValue(
        u"StoragePlacesManager.availableStoragePlaces"_s,
        QJsonArray{device(u"a"_s, u"A"_s), device(u"b"_s, u"B"_s)});
    OrgVeylabsFileManagerStoragePlacesManagerInterface storage(
        ServiceScene::name(), u"/StoragePlacesManager"_s, bus);
    const StoragePlaceList devices = storage.availableStoragePlaces().value();
    QCOMPARE(devices.value(1).udi(), u"B"_s);
    QVERIFY(!storage.mountStoragePlace(devices.first()).value());

    OrgVeylabsFileManagerSmbBrowserInterface samba(ServiceScene::name(), u"/SmbBrowser"_s, bus);
    m_service->setValue(u"SmbBrowser.shares"_s, object(R"({"s": "/s"})"));
    const StringMap shares = samba.shares(u"h"_s, u"w"_s).value();
    QCOMPARE(shares.value(u"s"_s), u"/s"_s);

    OrgVeylabsFileManagerFileSystemInterface files(ServiceScene::name(), u"/"_s, bus);
    QSignalSpy echo(&files, &OrgVeylabsFileManagerFileSystemInterface::notifyWatchersSignal);
    files.notifyWatchers(EntryList()).waitForFinished();
    QVERIFY(!echo.isEmpty() || echo.wait());
}

void ServiceContractTest::cleanupTestCase()
{
    QCOMPARE(m_service->violations(), QStringList());
}

QTEST_GUILESS_MAIN(ServiceContractTest)
#include "tst_servicecontract.moc"
