// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "workerauthenticator.h"

#include "host/helpertexts.h"
#include "host/mounturl.h"
#include "host/secretline.h"

#include <cerrno>
#include <utility>

#include <sys/wait.h>

namespace VeyFM {
namespace Mount {

using MountProtocol::Question;
using MountProtocol::Report;
using MountProtocol::Request;

namespace {

const QLatin1String smb("smb");
const QLatin1String sftp("sftp");

/// The worker has no other children.
bool hasTool()
{
    siginfo_t child;
    return ::waitid(P_ALL, 0, &child, WEXITED | WNOHANG | WNOWAIT) == 0;
}

bool survivesLocale(const QString& password)
{
    QByteArray bytes = password.toLocal8Bit();
    QString back = QString::fromLocal8Bit(bytes);
    const bool same = back == password;
    bytes.fill('\0');
    MountProtocol::erase(&back);
    return same;
}

} // namespace

WorkerAuthenticator::WorkerAuthenticator(SupervisorLink& link)
    : m_link(link)
{
}

WorkerAuthenticator::~WorkerAuthenticator()
{
    MountProtocol::erase(&m_keptPassword);
}

void WorkerAuthenticator::setOfferedUser(const QString& user)
{
    m_offeredUser = user;
}

void WorkerAuthenticator::setMountHost(const QString& host)
{
    m_mountHost = host;
}

void WorkerAuthenticator::beginJob()
{
    setResource(QString(), QString(), QString(), QString());
    m_passwordGiven = false;
    m_asked.clear();
    m_keyConfirmed = false;
    m_wasAccepted = false;
    m_whyEnded.clear();
}

bool WorkerAuthenticator::wasAccepted() const
{
    return m_wasAccepted;
}

bool WorkerAuthenticator::isGivenUp() const
{
    return m_isGivenUp;
}

QString WorkerAuthenticator::takeNewUser()
{
    return std::exchange(m_newUser, QString());
}

QString WorkerAuthenticator::whyEnded() const
{
    return m_whyEnded;
}

bool WorkerAuthenticator::isWorthAnotherJob()
{
    if (m_isGivenUp || !m_keyConfirmed || !m_passwordGiven) {
        return false;
    }
    m_refused.insert(resource());
    return true;
}

QString WorkerAuthenticator::resource() const
{
    return QStringList({protocol(), server(), object()}).join(QLatin1Char('/'));
}

void WorkerAuthenticator::credentialsRejected(const QString& user)
{
    m_refused.insert(resource());
    Report report;
    report.kind = Report::Rejected;
    report.user = user;
    m_link.say(report);
}

void WorkerAuthenticator::credentialsAccepted()
{
    m_wasAccepted = true;
    Report report;
    report.kind = Report::Accepted;
    m_link.say(report);
}

QString WorkerAuthenticator::requestPassword(
    bool isRetry, const QString& title, const QString& message, QString& user, bool* userChanged,
    bool* cancelled)
{
    Q_UNUSED(isRetry) // Some jobs say so of the first question, too.
    *userChanged = false;
    *cancelled = m_isGivenUp || !m_newUser.isNull() || !m_whyEnded.isEmpty();
    if (*cancelled) {
        return QString();
    }
    const bool isUsed = protocol() == smb || hasTool();
    const bool wasPasswordGiven = std::exchange(m_passwordGiven, false);
    if (!isUsed) {
        m_refused.insert(resource());
        m_asked.clear();
        if (wasPasswordGiven && m_isLastTry) {
            m_isGivenUp = true;
            *cancelled = true;
            return QString();
        }
        if (wasPasswordGiven) {
            return QString(); // The tool asks again.
        }
        if (protocol() == sftp) {
            // It would end like that for ever.
            m_whyEnded = QLatin1String(Host::endedBeforePassword);
            *cancelled = true;
            return QString();
        }
    }
    if (isUsed && !m_keptPassword.isNull() && m_keptFor == resource()) {
        m_passwordGiven = true;
        return std::exchange(m_keptPassword, QString());
    }
    Question question;
    question.kind = Question::Password;
    question.title = title;
    question.message = message;
    question.user = user.isEmpty() && protocol() == smb ? m_offeredUser : user;
    question.protocol = protocol();
    question.host = server();
    question.domain = domain();
    question.object = object();
    // A tool that asks the same again did not like what it got, such as the passphrase of a key.
    question.isRetry = m_refused.contains(resource()) || m_asked.contains(resource() + message);
    m_asked.insert(resource() + message);
    const QString before = user;
    QString password = ask(question, isUsed, user, cancelled);
    *userChanged = user != before;
    return password;
}

/// Again and again, until the answer is of use.
QString WorkerAuthenticator::ask(Question question, bool isUsed, QString& user, bool* cancelled)
{
    while (true) {
        Reply reply = m_link.ask(question);
        if (reply.answer.reply == Request::GivenUp) {
            m_isGivenUp = true;
            *cancelled = true;
            return QString();
        }
        const QString name = reply.answer.user.isNull() ? question.user : reply.answer.user;
        const QString why = whyUnfit(name, name != user, reply.password);
        if (!why.isEmpty()) {
            MountProtocol::erase(&reply.password);
            question.message = why;
            question.isRetry = true;
            continue;
        }
        if (protocol() != smb && name != user) {
            m_newUser = name;
            m_keptPassword = reply.answer.hasPassword ? reply.password : QString();
            m_keptFor = resource();
            m_isLastTry = reply.answer.isLast;
            m_refused.clear();
            *cancelled = true;
            return QString();
        }
        user = name;
        if (!isUsed) {
            MountProtocol::erase(&reply.password);
            return QString();
        }
        m_refused.remove(resource());
        m_passwordGiven = true;
        m_isLastTry = reply.answer.isLast;
        return reply.password;
    }
}

/// Why the job can't hand the answer to its tool, or empty.
QString WorkerAuthenticator::whyUnfit(
    const QString& user, bool isUserChanged, const QString& password) const
{
    if (isUserChanged && !m_mountHost.isNull() && server() != m_mountHost) {
        return QStringLiteral("%1 is a host on the way: its user can't be changed here")
            .arg(server());
    }
    if (!survivesLocale(password)) {
        return QStringLiteral("the encoding of the locale can't express this password");
    }
    return isUserChanged ? Host::whyNoUser(protocol(), user) : QString();
}

bool WorkerAuthenticator::askQuestion(const QString& title, const QString& text)
{
    if (m_isGivenUp) {
        return false;
    }
    Question question;
    question.kind = Question::Confirm;
    question.title = title;
    question.message = text;
    const Reply reply = m_link.ask(question);
    const bool yes = reply.answer.reply == Request::Yes;
    m_keyConfirmed = m_keyConfirmed || yes;
    // Who refuses the key of a host does not want that host.
    m_isGivenUp = !yes;
    return yes;
}

} // namespace Mount
} // namespace VeyFM
