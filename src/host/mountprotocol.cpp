// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountprotocol.h"

#include <QJsonDocument>
#include <QJsonObject>

#include <cmath>
#include <limits>

namespace VeyFM {
namespace MountProtocol {

namespace {

/// As many characters as fit, when they are written as JSON.
QString clipped(const QString& text)
{
    int bytes = 0;
    for (int i = 0; i < text.size(); ++i) {
        const ushort c = text.at(i).unicode();
        bytes += c < 0x20 ? 6 : c == '"' || c == '\\' ? 2 : c < 0x80 ? 1 : 3;
        if (bytes > longestText) {
            return text.left(text.at(i).isLowSurrogate() ? i - 1 : i);
        }
    }
    return text;
}

QByteArray lineOf(const QJsonObject& object)
{
    return QJsonDocument(object).toJson(QJsonDocument::Compact) + '\n';
}

/// The members of an object. The first that is not what it should be is noted.
class Members
{
public:
    explicit Members(const Line& line)
    {
        QJsonParseError error;
        const auto document =
            QJsonDocument::fromJson(QByteArray::fromRawData(line.data, int(line.size)), &error);
        if (error.error != QJsonParseError::NoError) {
            m_why = QStringLiteral("a line is no JSON: ") + error.errorString();
        } else if (!document.isObject()) {
            m_why = QStringLiteral("a line is no JSON object");
        }
        m_object = document.object();
    }

    bool has(const char* name) const
    {
        return m_object.contains(QLatin1String(name));
    }

    QString text(const char* name)
    {
        return take(name, QJsonValue::String, "a text").toString();
    }

    bool flag(const char* name)
    {
        return take(name, QJsonValue::Bool, "true or false").toBool();
    }

    bool flagOrFalse(const char* name)
    {
        return has(name) && flag(name);
    }

    int number(const char* name)
    {
        const double value = take(name, QJsonValue::Double, "a number").toDouble();
        const bool isInt = std::floor(value) == value && value >= 0 &&
                           value <= double(std::numeric_limits<int>::max());
        if (!isInt) {
            refuse(QStringLiteral("\"%1\" is no whole number that fits").arg(QLatin1String(name)));
            return 0;
        }
        return int(value);
    }

    /// As text(), but not of any length: it comes back in reports, beside others.
    QString shortText(const char* name)
    {
        const QString value = text(name);
        if (value.size() > longestText / 4) {
            refuse(QStringLiteral("\"%1\" is too long").arg(QLatin1String(name)));
        }
        return value;
    }

    /// Null where there is none.
    QString shortTextOrNull(const char* name)
    {
        if (!has(name)) {
            return QString();
        }
        const QString value = shortText(name);
        return value.isNull() ? QStringLiteral("") : value;
    }

    void checkVersion()
    {
        const int number = this->number("version");
        if (isGood() && number != version) {
            refuse(QStringLiteral("version %1 of the protocol is not known, only %2")
                       .arg(number)
                       .arg(version));
        }
    }

    void refuse(const QString& why)
    {
        if (m_why.isEmpty()) {
            m_why = why;
        }
    }

    /// A value of a member that is not known.
    void refuseValue(const char* name, const QString& value)
    {
        refuse(QStringLiteral("\"%1\" is '%2', which is not known")
                   .arg(QLatin1String(name), value.left(40)));
    }

    bool isGood() const
    {
        return m_why.isEmpty();
    }
    QString why() const
    {
        return m_why;
    }

private:
    QJsonValue take(const char* name, QJsonValue::Type type, const char* what)
    {
        const QJsonValue value = m_object.value(QLatin1String(name));
        if (value.type() != type) {
            refuse(
                QStringLiteral("\"%1\" is not %2").arg(QLatin1String(name), QLatin1String(what)));
        }
        return value;
    }

    QJsonObject m_object;
    QString m_why;
};

template <typename Message>
std::optional<Message> result(const Message& message, const Members& members, QString* why)
{
    *why = members.why();
    return members.isGood() ? std::optional<Message>(message) : std::nullopt;
}

// The names of kinds, in the order of the enumerations.
constexpr const char* requestNames[] = {"mount", "answer", "cancel", "take"};
constexpr const char* reportNames[] = {"ready",    "waiting",  "question",
                                       "rejected", "accepted", "end"};
constexpr const char* questionNames[] = {"confirm", "password"};
constexpr const char* mountedNames[] = {"new", "present", "reached"};

/// The kind that a member names; the first, and the members are refused, where it names none.
template <typename Kind, size_t count>
Kind kindOf(Members& members, const char* name, const char* const (&names)[count])
{
    const QString value = members.text(name);
    for (size_t i = 0; i < count; ++i) {
        if (value == QLatin1String(names[i])) {
            return Kind(i);
        }
    }
    members.refuseValue(name, value);
    return Kind(0);
}

void readAnswer(Members& members, Request* request)
{
    request->id = members.number("id");
    request->user = members.shortTextOrNull("user");
    request->hasPassword = members.flagOrFalse("password");
    const bool isLogin = request->hasPassword || !request->user.isNull();
    const bool isConfirmed = members.has("yes");
    const bool isGivenUp = members.flagOrFalse("cancelled");
    if (int(isLogin) + int(isConfirmed) + int(isGivenUp) != 1) {
        members.refuse(QStringLiteral("an answer has either \"yes\", or \"user\" and \"password\", "
                                      "or \"cancelled\""));
    } else if (isLogin) {
        request->reply = Request::Login;
        request->isLast = members.flagOrFalse("last");
    } else if (isConfirmed) {
        request->reply = members.flag("yes") ? Request::Yes : Request::No;
    } else {
        request->reply = Request::GivenUp;
    }
}

Question readQuestion(Members& members)
{
    Question question;
    question.kind = kindOf<Question::Kind>(members, "kind", questionNames);
    question.id = members.number("id");
    question.title = members.text("title");
    question.message = members.text("message");
    if (question.kind == Question::Password) {
        question.user = members.text("user");
        question.protocol = members.text("protocol");
        question.host = members.text("host");
        question.domain = members.text("domain");
        question.object = members.text("object");
        question.isRetry = members.flag("retry");
    }
    return question;
}

End readEnd(Members& members)
{
    End end;
    end.code = members.number("code");
    end.text = members.text("text");
    if (end.code == 0 || members.has("directory")) {
        end.directory = members.text("directory");
    }
    if (end.code == 0) {
        end.url = members.text("url");
        end.path = members.text("path");
        end.localPath = members.text("localPath");
        end.mounted = kindOf<End::Mounted>(members, "mounted", mountedNames);
        end.isShared = members.flag("shared");
        end.why = members.has("why") ? members.text("why") : QString();
    }
    return end;
}

void writeQuestion(const Question& question, QJsonObject* object)
{
    object->insert(QStringLiteral("id"), question.id);
    object->insert(QStringLiteral("kind"), QLatin1String(questionNames[question.kind]));
    object->insert(QStringLiteral("title"), clipped(question.title));
    object->insert(QStringLiteral("message"), clipped(question.message));
    if (question.kind == Question::Password) {
        object->insert(QStringLiteral("user"), question.user);
        object->insert(QStringLiteral("protocol"), question.protocol);
        object->insert(QStringLiteral("host"), question.host);
        object->insert(QStringLiteral("domain"), question.domain);
        object->insert(QStringLiteral("object"), question.object);
        object->insert(QStringLiteral("retry"), question.isRetry);
    }
}

void writeEnd(const End& end, QJsonObject* object)
{
    object->insert(QStringLiteral("code"), end.code);
    object->insert(QStringLiteral("text"), clipped(end.text));
    if (end.code == 0 || !end.directory.isEmpty()) {
        object->insert(QStringLiteral("directory"), end.directory);
    }
    if (end.code != 0) {
        return;
    }
    object->insert(QStringLiteral("url"), end.url);
    object->insert(QStringLiteral("path"), end.path);
    object->insert(QStringLiteral("localPath"), end.localPath);
    object->insert(QStringLiteral("mounted"), QLatin1String(mountedNames[end.mounted]));
    object->insert(QStringLiteral("shared"), end.isShared);
    if (!end.why.isEmpty()) {
        object->insert(QStringLiteral("why"), clipped(end.why));
    }
}

} // namespace

QByteArray encode(const Request& request)
{
    QJsonObject object{{QStringLiteral("do"), QLatin1String(requestNames[request.kind])}};
    switch (request.kind) {
    case Request::Mount:
        object.insert(QStringLiteral("version"), version);
        object.insert(QStringLiteral("url"), request.url);
        if (request.patience != Request().patience) {
            object.insert(QStringLiteral("patience"), request.patience);
        }
        break;
    case Request::Answer:
        object.insert(QStringLiteral("id"), request.id);
        break;
    case Request::Cancel:
    case Request::Take:
        return lineOf(object);
    }
    const bool isLogin = request.kind == Request::Answer && request.reply == Request::Login;
    if ((request.kind == Request::Mount || isLogin) && !request.user.isNull()) {
        object.insert(QStringLiteral("user"), request.user);
    }
    if (isLogin) {
        object.insert(QStringLiteral("password"), request.hasPassword);
        if (request.isLast) {
            object.insert(QStringLiteral("last"), true);
        }
    } else if (request.kind == Request::Answer && request.reply == Request::GivenUp) {
        object.insert(QStringLiteral("cancelled"), true);
    } else if (request.kind == Request::Answer) {
        object.insert(QStringLiteral("yes"), request.reply == Request::Yes);
    }
    return lineOf(object);
}

QByteArray encode(const Report& report)
{
    QJsonObject object{{QStringLiteral("say"), QLatin1String(reportNames[report.kind])}};
    switch (report.kind) {
    case Report::Ready:
        object.insert(QStringLiteral("version"), version);
        object.insert(QStringLiteral("program"), report.text);
        break;
    case Report::Waiting:
        object.insert(QStringLiteral("text"), clipped(report.text));
        break;
    case Report::Asked:
        writeQuestion(report.question, &object);
        break;
    case Report::Rejected:
        object.insert(QStringLiteral("user"), report.user);
        break;
    case Report::Accepted:
        break;
    case Report::Ended:
        writeEnd(report.end, &object);
        break;
    }
    const QByteArray line = lineOf(object);
    if (line.size() <= longestLine + 1) {
        return line;
    }
    Report tooLong;
    tooLong.kind = Report::Ended;
    tooLong.end.code = 5;
    tooLong.end.text =
        QStringLiteral("what is to be said is longer than %1 bytes").arg(longestLine);
    return encode(tooLong);
}

std::optional<Request> decodeRequest(const Line& line, QString* why)
{
    Members members(line);
    Request request;
    request.kind = kindOf<Request::Kind>(members, "do", requestNames);
    if (members.isGood() && request.kind == Request::Mount) {
        members.checkVersion();
        request.url = members.shortText("url");
        request.user = members.shortTextOrNull("user");
        if (members.has("patience")) {
            request.patience = members.number("patience");
        }
    } else if (members.isGood() && request.kind == Request::Answer) {
        readAnswer(members, &request);
    }
    return result(request, members, why);
}

std::optional<Report> decodeReport(const Line& line, QString* why)
{
    Members members(line);
    Report report;
    report.kind = kindOf<Report::Kind>(members, "say", reportNames);
    if (!members.isGood()) {
        return result(report, members, why);
    }
    switch (report.kind) {
    case Report::Ready:
        members.checkVersion();
        report.text = members.text("program");
        break;
    case Report::Waiting:
        report.text = members.text("text");
        break;
    case Report::Asked:
        report.question = readQuestion(members);
        break;
    case Report::Rejected:
        report.user = members.text("user");
        break;
    case Report::Accepted:
        break;
    case Report::Ended:
        report.end = readEnd(members);
        break;
    }
    return result(report, members, why);
}

} // namespace MountProtocol
} // namespace VeyFM
