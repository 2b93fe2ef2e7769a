// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/linereader.h"
#include "host/mountprotocol.h"
#include "host/secretline.h"

#include <QTest>

#include <algorithm>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

using namespace VeyFM::MountProtocol;

namespace {

void feed(LineReader& reader, const QByteArray& bytes)
{
    char* const room = reader.room();
    QVERIFY(size_t(bytes.size()) <= reader.roomSize());
    std::copy(bytes.cbegin(), bytes.cend(), room);
    reader.added(size_t(bytes.size()));
}

QByteArray bytesOf(const Line& line)
{
    return QByteArray(line.data, int(line.size));
}

Line lineOf(QByteArray& bytes)
{
    if (bytes.endsWith('\n')) {
        bytes.chop(1);
    }
    return {bytes.data(), size_t(bytes.size())};
}

std::optional<Request> request(QByteArray bytes, QString* why)
{
    return decodeRequest(lineOf(bytes), why);
}

std::optional<Report> report(QByteArray bytes, QString* why)
{
    return decodeReport(lineOf(bytes), why);
}

} // namespace

class TestMountProtocol : public QObject
{
    Q_OBJECT

private Q_SLOTS:
    void cutsLines();
    void readsLinesFromADescriptor();
    void refusesALineThatIsTooLong();
    void overwritesWhatWasTaken();
    void passesRequests_data();
    void passesRequests();
    void refusesRequests_data();
    void refusesRequests();
    void passesReports();
    void refusesReports_data();
    void refusesReports();
    void cutsLongTexts();
    void fitsIntoALine();
    void passesSecrets_data();
    void passesSecrets();
    void refusesSecrets_data();
    void refusesSecrets();
    void erasesTexts();
};

void TestMountProtocol::cutsLines()
{
    LineReader reader;
    Line line;
    QVERIFY(!reader.next(&line));
    feed(reader, "on");
    QVERIFY(!reader.next(&line));
    feed(reader, "e\n\ntwo\nth");
    QVERIFY(reader.next(&line));
    QCOMPARE(bytesOf(line), QByteArray("one"));
    QVERIFY(reader.next(&line));
    QCOMPARE(bytesOf(line), QByteArray(""));
    QVERIFY(reader.next(&line));
    QCOMPARE(bytesOf(line), QByteArray("two"));
    QVERIFY(!reader.next(&line));
    feed(reader, "ree\n");
    QVERIFY(reader.next(&line));
    QCOMPARE(bytesOf(line), QByteArray("three"));
}

void TestMountProtocol::readsLinesFromADescriptor()
{
    int ends[2];
    QCOMPARE(::pipe2(ends, O_CLOEXEC), 0);
    QCOMPARE(::write(ends[1], "a\nb", 3), ssize_t(3));
    LineReader reader;
    Line line;
    QCOMPARE(reader.readFrom(ends[0]), ssize_t(3));
    QVERIFY(reader.next(&line));
    QCOMPARE(bytesOf(line), QByteArray("a"));
    ::close(ends[1]);
    QCOMPARE(reader.readFrom(ends[0]), ssize_t(0));
    QVERIFY(!reader.next(&line));
    ::close(ends[0]);
}

void TestMountProtocol::refusesALineThatIsTooLong()
{
    LineReader reader;
    Line line;
    feed(reader, QByteArray(longestLine, 'x'));
    QVERIFY(!reader.isTooLong());
    QVERIFY(!reader.next(&line));
    feed(reader, "\n");
    QVERIFY(!reader.isTooLong());
    QVERIFY(reader.next(&line));
    QCOMPARE(line.size, size_t(longestLine));
    feed(reader, QByteArray(longestLine + 1, 'x'));
    QVERIFY(reader.isTooLong());
    QVERIFY(!reader.next(&line));
    QCOMPARE(reader.roomSize(), size_t(0));
    QCOMPARE(reader.readFrom(STDIN_FILENO), ssize_t(-1));
}

void TestMountProtocol::overwritesWhatWasTaken()
{
    LineReader reader;
    Line line;
    feed(reader, "\"secret\"\nnext\n");
    QVERIFY(reader.next(&line));
    const char* const buffer = line.data;
    QVERIFY(reader.next(&line));
    QCOMPARE(bytesOf(line), QByteArray("next"));
    const QByteArray all(buffer, 14);
    QVERIFY(!all.contains("cret"));
    reader.room();
    QVERIFY(!QByteArray(buffer, 14).contains("next"));
}

void TestMountProtocol::passesRequests_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::newRow("mount") << QByteArray(
        R"({"do":"mount","url":"sftp://anna@server/~/Ördner","version":1})");
    QTest::newRow("mount for a user")
        << QByteArray(R"({"do":"mount","url":"ftp://server/","user":"anna","version":1})");
    QTest::newRow("mount with patience")
        << QByteArray(R"({"do":"mount","patience":200,"url":"ftp://server/","version":1})");
    QTest::newRow("yes") << QByteArray(R"({"do":"answer","id":1,"yes":true})");
    QTest::newRow("no") << QByteArray(R"({"do":"answer","id":2147483647,"yes":false})");
    QTest::newRow("password") << QByteArray(R"({"do":"answer","id":2,"password":true})");
    QTest::newRow("last password")
        << QByteArray(R"({"do":"answer","id":2,"last":true,"password":true})");
    QTest::newRow("user and password")
        << QByteArray(R"({"do":"answer","id":2,"password":true,"user":"an\nna"})");
    QTest::newRow("empty user") << QByteArray(
        R"({"do":"answer","id":2,"password":true,"user":""})");
    QTest::newRow("user alone") << QByteArray(
        R"({"do":"answer","id":2,"password":false,"user":"anna"})");
    QTest::newRow("given up") << QByteArray(R"({"cancelled":true,"do":"answer","id":2})");
    QTest::newRow("cancel") << QByteArray(R"({"do":"cancel"})");
    QTest::newRow("take") << QByteArray(R"({"do":"take"})");
}

void TestMountProtocol::passesRequests()
{
    QFETCH(QByteArray, line);
    QString why;
    const auto decoded = request(line, &why);
    QVERIFY2(decoded, qPrintable(why));
    QCOMPARE(encode(*decoded), line + '\n');
}

void TestMountProtocol::refusesRequests_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QString>("why");
    QTest::newRow("empty") << QByteArray() << "a line is no JSON: illegal value";
    QTest::newRow("array") << QByteArray("[]") << "a line is no JSON object";
    QTest::newRow("nothing to do") << QByteArray("{}") << "\"do\" is not a text";
    QTest::newRow("unknown") << QByteArray(R"({"do":"dance"})")
                             << "\"do\" is 'dance', which is not known";
    QTest::newRow("do of another type") << QByteArray(R"({"do":1})") << "\"do\" is not a text";
    QTest::newRow("no version") << QByteArray(R"({"do":"mount","url":"ftp://h/"})")
                                << "\"version\" is not a number";
    QTest::newRow("version 2") << QByteArray(R"({"do":"mount","url":"ftp://h/","version":2})")
                               << "version 2 of the protocol is not known, only 1";
    QTest::newRow("no url") << QByteArray(R"({"do":"mount","version":1})")
                            << "\"url\" is not a text";
    QTest::newRow("user of another type")
        << QByteArray(R"({"do":"mount","version":1,"url":"ftp://h/","user":null})")
        << "\"user\" is not a text";
    QTest::newRow("long url") << R"({"do":"mount","version":1,"url":")" + QByteArray(5000, 'x') +
                                     "\"}"
                              << "\"url\" is too long";
    QTest::newRow("no number") << QByteArray(R"({"do":"answer","yes":true})")
                               << "\"id\" is not a number";
    QTest::newRow("half a number") << QByteArray(R"({"do":"answer","id":1.5,"yes":true})")
                                   << "\"id\" is no whole number that fits";
    QTest::newRow("negative") << QByteArray(R"({"do":"answer","id":-1,"yes":true})")
                              << "\"id\" is no whole number that fits";
    QTest::newRow("huge") << QByteArray(R"({"do":"answer","id":1e300,"yes":true})")
                          << "\"id\" is no whole number that fits";
    QTest::newRow("yes of another type")
        << QByteArray(R"({"do":"answer","id":1,"yes":"true"})") << "\"yes\" is not true or false";
    QTest::newRow("a password here") << QByteArray(R"({"do":"answer","id":1,"password":"secret"})")
                                     << "\"password\" is not true or false";
    const QString either = QStringLiteral(
        "an answer has either \"yes\", or \"user\" and \"password\", or \"cancelled\"");
    QTest::newRow("no answer") << QByteArray(R"({"do":"answer","id":1})") << either;
    QTest::newRow("two answers") << QByteArray(
                                        R"({"do":"answer","id":1,"yes":true,"password":true})")
                                 << either;
}

void TestMountProtocol::refusesRequests()
{
    QFETCH(QByteArray, line);
    QFETCH(QString, why);
    QString told;
    QVERIFY(!request(line, &told));
    QCOMPARE(told, why);
}

void TestMountProtocol::passesReports()
{
    const QByteArray lines[] = {
        R"({"program":"veyfm-mount 0.1.0","say":"ready","version":1})",
        R"({"say":"waiting","text":"being mounted by another program"})",
        R"({"id":1,"kind":"confirm","message":"The\nkey","say":"question","title":"Question"})",
        R"({"domain":"","host":"server","id":2,"kind":"password","message":"m","object":"",)"
        R"("protocol":"sftp","retry":true,"say":"question","title":"t","user":"anna"})",
        R"({"say":"rejected","user":"anna"})",
        R"({"say":"accepted"})",
        R"({"code":5,"say":"end","text":"Mounting sftp resource failed"})",
        R"({"code":1,"directory":"/m/sftp/h","say":"end","text":"no such file"})",
        R"({"code":0,"directory":"/m/sftp/h","localPath":"/m/sftp/h/x","mounted":"present",)"
        R"("path":"SFTP/h/x","say":"end","shared":true,"text":"","url":"sftp://h/x"})",
        R"({"code":0,"directory":"/m/sftp/h","localPath":"/m/sftp/h/x","mounted":"new",)"
        R"("path":"","say":"end","shared":false,"text":"","url":"sftp://h/x","why":"no bus"})"};
    for (const QByteArray& line : lines) {
        QString why;
        const auto decoded = report(line, &why);
        QVERIFY2(decoded, qPrintable(why));
        QCOMPARE(encode(*decoded), line + '\n');
    }
}

void TestMountProtocol::refusesReports_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QString>("why");
    QTest::newRow("unknown") << QByteArray(R"({"say":"lock"})")
                             << "\"say\" is 'lock', which is not known";
    QTest::newRow("version 2") << QByteArray(R"({"say":"ready","program":"p","version":2})")
                               << "version 2 of the protocol is not known, only 1";
    QTest::newRow("kind") << QByteArray(
                                 R"({"say":"question","kind":"x","id":1,"title":"","message":""})")
                          << "\"kind\" is 'x', which is not known";
    QTest::newRow("how mounted")
        << QByteArray(R"({"say":"end","code":0,"text":"","url":"","path":"","localPath":"",)"
                      R"("directory":"","mounted":"so","shared":true})")
        << "\"mounted\" is 'so', which is not known";
}

void TestMountProtocol::refusesReports()
{
    QFETCH(QByteArray, line);
    QFETCH(QString, why);
    QString told;
    QVERIFY(!report(line, &told));
    QCOMPARE(told, why);
}

void TestMountProtocol::cutsLongTexts()
{
    Report asked;
    asked.kind = Report::Asked;
    asked.question.kind = Question::Confirm;
    QString why;
    asked.question.message = QString(longestText + 1, QLatin1Char('x'));
    QCOMPARE(report(encode(asked), &why)->question.message.size(), longestText);
    // Written in six bytes each, all the same.
    asked.question.message = QString(longestText, QChar(1));
    QCOMPARE(report(encode(asked), &why)->question.message.size(), longestText / 6);
    // A pair is not cut in two.
    asked.question.message =
        QLatin1String("xx") + QString::fromUtf8("\xf0\x9f\x94\x92").repeated(longestText / 6 + 1);
    const QString cut = report(encode(asked), &why)->question.message;
    QVERIFY(cut.size() > longestText / 4);
    QVERIFY(cut.back().isLowSurrogate());
    QVERIFY(asked.question.message.startsWith(cut));
}

void TestMountProtocol::fitsIntoALine()
{
    Report ended;
    ended.kind = Report::Ended;
    ended.end.localPath = QString(longestLine, QLatin1Char('x'));
    const QByteArray line = encode(ended);
    QVERIFY(line.size() <= longestLine);
    QString why;
    QCOMPARE(report(line, &why)->end.code, 5);
}

void TestMountProtocol::passesSecrets_data()
{
    QTest::addColumn<QString>("password");
    QTest::newRow("empty") << QStringLiteral("");
    QTest::newRow("plain") << QStringLiteral("secret");
    QTest::newRow("quotes") << QStringLiteral("\"\\/'$");
    QTest::newRow("tab") << QStringLiteral("a\tb");
    QTest::newRow("letters") << QString::fromUtf8("äß€\xf0\x9f\x94\x92");
    QTest::newRow("longest") << QString(longestPassword, QLatin1Char('x'));
}

void TestMountProtocol::passesSecrets()
{
    QFETCH(QString, password);
    const SecretLine secret(password);
    QByteArray bytes(secret.data(), int(secret.size()));
    QVERIFY(bytes.endsWith("\"\n"));
    Line line = lineOf(bytes);
    QCOMPARE(decodeSecret(&line), QString());
    QCOMPARE(QString::fromUtf8(line.data, int(line.size)), password);
}

void TestMountProtocol::refusesSecrets_data()
{
    QTest::addColumn<QByteArray>("line");
    QTest::addColumn<QString>("why");
    const QString none = QStringLiteral("a password is a line of its own with one JSON string");
    const QString invalid = QStringLiteral("a password is no valid JSON string");
    const QString control = QStringLiteral("a password can't hold a control character");
    QTest::newRow("nothing") << QByteArray() << none;
    QTest::newRow("one quote") << QByteArray("\"") << none;
    QTest::newRow("object") << QByteArray(R"({"do":"cancel"})") << none;
    QTest::newRow("behind") << QByteArray(R"("a" )") << none;
    QTest::newRow("two") << QByteArray(R"("a","b")") << invalid;
    QTest::newRow("escape") << QByteArray(R"("\x")") << invalid;
    QTest::newRow("escaped end") << QByteArray(R"("a\")") << invalid;
    QTest::newRow("short code") << QByteArray(R"("\u12")") << invalid;
    QTest::newRow("no code") << QByteArray(R"("\u12g4")") << invalid;
    QTest::newRow("high alone") << QByteArray(R"("\ud800")") << invalid;
    QTest::newRow("high and no low") << QByteArray(R"("\ud800\u0041")") << invalid;
    QTest::newRow("low alone") << QByteArray(R"("\udc00")") << invalid;
    QTest::newRow("no UTF-8") << QByteArray("\"\xff\"") << invalid;
    QTest::newRow("cut UTF-8") << QByteArray("\"\xc3\"") << invalid;
    QTest::newRow("long UTF-8") << QByteArray("\"\xe0\x80\x80\"") << invalid;
    QTest::newRow("surrogate in UTF-8") << QByteArray("\"\xed\xa0\x80\"") << invalid;
    QTest::newRow("beyond UTF-8") << QByteArray("\"\xf4\x90\x80\x80\"") << invalid;
    QTest::newRow("bare control") << QByteArray("\"a\tb\"") << invalid;
    QTest::newRow("line feed") << QByteArray(R"("a\nyes")") << control;
    QTest::newRow("NUL") << QByteArray(R"("\u0000")") << control;
    QTest::newRow("too long") << '"' + QByteArray(longestPassword + 1, 'x') + '"'
                              << "a password can't be longer than 1024 bytes";
}

void TestMountProtocol::refusesSecrets()
{
    QFETCH(QByteArray, line);
    QFETCH(QString, why);
    Line read = lineOf(line);
    QCOMPARE(decodeSecret(&read), why);
}

void TestMountProtocol::erasesTexts()
{
    QString secret = QString::fromLatin1("secret");
    erase(&secret);
    QCOMPARE(secret, QString(6, QChar(QChar::Null)));

    // A copy is somebody else's, and so is a literal.
    QString first = QString::fromLatin1("secret");
    const QString second = first;
    erase(&first);
    QCOMPARE(second, QLatin1String("secret"));
    QString literal = QStringLiteral("literal");
    erase(&literal);
    QCOMPARE(literal, QLatin1String("literal"));
}

QTEST_GUILESS_MAIN(TestMountProtocol)
#include "tst_mountprotocol.moc"
