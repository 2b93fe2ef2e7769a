// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include <QCoreApplication>
#include <QFile>
#include <QLocale>
#include <QProcess>
#include <QRegularExpression>
#include <QSet>
#include <QTemporaryDir>
#include <QTranslator>
#include <QXmlStreamReader>
#include <QtTest>

namespace {

struct Message
{
    QString source;
    QString translation;
    bool isFinished;
};

QList<Message> messagesOf(const QString& path)
{
    QList<Message> messages;
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
        return messages;
    }
    QXmlStreamReader xml(&file);
    Message message;
    while (!xml.atEnd()) {
        xml.readNext();
        if (!xml.isStartElement()) {
            continue;
        }
        if (xml.name() == QLatin1String("source")) {
            message.source = xml.readElementText();
        } else if (xml.name() == QLatin1String("translation")) {
            message.isFinished = !xml.attributes().hasAttribute(QStringLiteral("type"));
            message.translation = xml.readElementText();
            messages.append(message);
        }
    }
    return xml.hasError() ? QList<Message>() : messages;
}

/// "%1" and the like, sorted.
QStringList placeholdersOf(const QString& text)
{
    QStringList found;
    QRegularExpressionMatchIterator match =
        QRegularExpression(QStringLiteral("%\\d+")).globalMatch(text);
    while (match.hasNext()) {
        found.append(match.next().captured());
    }
    found.sort();
    return found;
}

} // namespace

class TestTranslations : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void namesOfPlaces_data();
    void namesOfPlaces();
    void everyTextIsTranslated_data();
    void everyTextIsTranslated();
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

void TestTranslations::everyTextIsTranslated_data()
{
    QTest::addColumn<QString>("catalogue");
    QTest::newRow("de") << QStringLiteral("libveyfmvfs_de.ts");
    QTest::newRow("ru") << QStringLiteral("libveyfmvfs_ru.ts");
}

// As the sources have the texts today, not as the catalogue had them at its last update.
void TestTranslations::everyTextIsTranslated()
{
    QFETCH(QString, catalogue);
    const QTemporaryDir directory;
    const QString copy = directory.filePath(catalogue);
    QVERIFY(QFile::copy(QStringLiteral(VEYFM_TRANSLATIONS "/") + catalogue, copy));
    const int before = messagesOf(copy).size();
    QVERIFY(QFile::setPermissions(copy, QFile::ReadOwner | QFile::WriteOwner));
    QCOMPARE(
        QProcess::execute(
            QStringLiteral(VEYFM_LUPDATE),
            {QStringLiteral("-silent"), QStringLiteral("-no-obsolete"),
             QStringLiteral(VEYFM_SOURCES), QStringLiteral("-ts"), copy}),
        0);

    const QList<Message> messages = messagesOf(copy);
    QCOMPARE(messages.size(), before);
    QVERIFY(messages.size() > 12);
    for (const Message& message : messages) {
        QVERIFY2(message.isFinished, qPrintable(message.source));
        QVERIFY2(!message.translation.isEmpty(), qPrintable(message.source));
        QCOMPARE(placeholdersOf(message.translation), placeholdersOf(message.source));
        QCOMPARE(
            message.translation.count(QLatin1Char('\n')), message.source.count(QLatin1Char('\n')));
    }
}

QTEST_GUILESS_MAIN(TestTranslations)
#include "tst_translations.moc"
