// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "vfs/vfssettings.h"

#include <QDir>
#include <QFile>
#include <QSettings>
#include <QTemporaryDir>
#include <QTest>

using namespace VeyFM;

class TestVFSSettings : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void initTestCase();
    void cleanup();
    void mountRootPath();
    void enabledByDefault();
    void values_data();
    void values();
    void readAgain();
    void seesOtherObjects();
    void writesNothing();

private:
    QString file() const
    {
        return m_config.filePath(QStringLiteral("veylabs/vey-fm-vfs.conf"));
    }
    void write(const QByteArray& content)
    {
        QVERIFY(QDir().mkpath(QFileInfo(file()).path()));
        QFile out(file());
        QVERIFY(out.open(QIODevice::WriteOnly));
        QCOMPARE(out.write(content), qint64(content.size()));
    }

    QTemporaryDir m_config;
};

// QSettings keeps the directory of its first use.
void TestVFSSettings::initTestCase()
{
    QVERIFY(m_config.isValid());
    qputenv("XDG_CONFIG_HOME", QFile::encodeName(m_config.path()));
}

// Looked at once while there is no file: QSettings tells versions of a file by size and date, and a
// row of the next test may have both of the last.
void TestVFSSettings::cleanup()
{
    QFile::remove(file());
    QVERIFY(VFSSettings().isNetworkEnabled());
}

void TestVFSSettings::mountRootPath()
{
    const VFSSettings settings;
    QCOMPARE(settings.mountRootPath(), QDir::homePath() + QStringLiteral("/.vey-fm-vfs"));
    QVERIFY(!QFile::exists(settings.mountRootPath()));

    const QByteArray home = qgetenv("HOME");
    qputenv("HOME", "/srv/elsewhere");
    const QString moved = settings.mountRootPath();
    qputenv("HOME", home);
    QCOMPARE(moved, QStringLiteral("/srv/elsewhere/.vey-fm-vfs"));
}

void TestVFSSettings::enabledByDefault()
{
    QVERIFY(VFSSettings().isNetworkEnabled());
    write("[Other]\nEnabled=false\n");
    QVERIFY(VFSSettings().isNetworkEnabled());
}

void TestVFSSettings::values_data()
{
    QTest::addColumn<QByteArray>("value");
    QTest::addColumn<bool>("enabled");
    QTest::newRow("true") << QByteArray("true") << true;
    QTest::newRow("false") << QByteArray("false") << false;
    QTest::newRow("False") << QByteArray("False") << false;
    QTest::newRow("1") << QByteArray("1") << true;
    QTest::newRow("0") << QByteArray("0") << false;
    QTest::newRow("empty") << QByteArray() << false;
    QTest::newRow("anything") << QByteArray("maybe") << true;
}

void TestVFSSettings::values()
{
    QFETCH(QByteArray, value);
    write("[Network]\nEnabled=" + value + '\n');
    QTEST(VFSSettings().isNetworkEnabled(), "enabled");
}

void TestVFSSettings::readAgain()
{
    const VFSSettings settings;
    QVERIFY(settings.isNetworkEnabled());
    write("[Network]\nEnabled=false\n");
    QVERIFY(!settings.isNetworkEnabled());
    write("[Network]\nEnabled=true\n");
    QVERIFY(settings.isNetworkEnabled());
    write("[Network]\nEnabled=false\n");
    QVERIFY(!settings.isNetworkEnabled());
    QVERIFY(QFile::remove(file()));
    QVERIFY(settings.isNetworkEnabled());
}

void TestVFSSettings::seesOtherObjects()
{
    const VFSSettings settings;
    QVERIFY(settings.isNetworkEnabled());
    QSettings other(QStringLiteral("veylabs"), QStringLiteral("vey-fm-vfs"));
    QCOMPARE(other.fileName(), file());
    other.setValue(QStringLiteral("Network/Enabled"), false);
    QVERIFY(!settings.isNetworkEnabled());
    other.setValue(QStringLiteral("Network/Enabled"), true);
    QVERIFY(settings.isNetworkEnabled());
}

void TestVFSSettings::writesNothing()
{
    {
        const VFSSettings settings;
        QVERIFY(settings.isNetworkEnabled());
    }
    QVERIFY(!QFile::exists(file()));
}

QTEST_GUILESS_MAIN(TestVFSSettings)
#include "tst_vfssettings.moc"
