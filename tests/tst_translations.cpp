// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include <QCoreApplication>
#include <QLocale>
#include <QSet>
#include <QTranslator>
#include <QtTest>

class TestTranslations : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void namesOfPlaces_data();
    void namesOfPlaces();
};

void TestTranslations::namesOfPlaces_data()
{
    QTest::addColumn<QString>("home");
    QTest::newRow("de") << QStringLiteral("Persönlicher Ordner");
    QTest::newRow("ru") << QStringLiteral("Домашняя папка");
}

// The names are keys of the tree and sections of paths: each is there, none equals another, none
// holds a slash, and "_" is the root's.
void TestTranslations::namesOfPlaces()
{
    QFETCH(QString, home);
    QTranslator translator;
    // An empty suffix, not a null one, which would stand for ".qm".
    QVERIFY(translator.load(
        QLocale(QString::fromLatin1(QTest::currentDataTag())), QStringLiteral("libveyfmvfs"),
        QStringLiteral("_"), QStringLiteral(VEYFM_CATALOGUES), QStringLiteral("")));

    QSet<QString> names;
    const char* const texts[] = {"Places",  "Computer", "Favourites", "Storage devices",
                                 "Desktop", "Trash",    "Home",       "File System",
                                 "Network", "Samba",    "FTP",        "SFTP"};
    for (const char* text : texts) {
        const QString name = translator.translate("VeyFM::VFS", text);
        QVERIFY2(!name.isEmpty(), text);
        QVERIFY2(!name.contains(QLatin1Char('/')), text);
        QVERIFY2(name != QLatin1String("_"), text);
        QVERIFY2(!names.contains(name), text);
        names.insert(name);
    }
    QCOMPARE(translator.translate("VeyFM::VFS", "Home"), home);
}

QTEST_GUILESS_MAIN(TestTranslations)
#include "tst_translations.moc"
