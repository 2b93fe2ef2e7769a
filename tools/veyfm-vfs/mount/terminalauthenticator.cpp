// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/terminalauthenticator.h"

#include "host/mounturl.h"
#include "jobs/mountsftpurljob.h"
#include "mount/descendants.h"
#include "mount/sshconfig.h"
#include "report.h"
#include "spinner.h"
#include "terminal.h"

#include <QRegularExpression>
#include <QStringList>

#include <sys/prctl.h>
#include <sys/resource.h>

namespace VeyFM {
namespace Tool {

using Host::whyNoUser;

namespace {

constexpr int mostTries = 3;

const QLatin1String smb("smb");
const QLatin1String sftp("sftp");

/// Neither this process nor the tools that get the password leave a core file with it.
void leaveNoCoreFile()
{
    const rlimit none = {0, 0};
    ::setrlimit(RLIMIT_CORE, &none);
    // The limit does not hold where core files go into a program.
    ::prctl(PR_SET_DUMPABLE, 0);
}

QString wasCancelled()
{
    return QStringLiteral("cancelled");
}

QString threeWereRefused()
{
    return QStringLiteral("three passwords were refused");
}

/// Whether ssh asks for something else than a password, in words of its own.
bool isOwnWords(const QString& protocol, const QString& message)
{
    return protocol == sftp && message != MountSFtpURLJob::tr("Enter host password for user:");
}

/// Why no tool can be given this password, or empty.
QString whyUnfit(const Secret& password, const QString& protocol)
{
    if (password.isTooLong()) {
        return QStringLiteral("a password can't be longer than %1 bytes")
            .arg(qulonglong(Secret::longest));
    }
    if (password.isEmpty() && protocol == smb) {
        return QStringLiteral("smbclient can't be given an empty password");
    }
    if (password.holdsControlCharacter()) {
        return QStringLiteral("a password can't hold a control character");
    }
    if (!password.isText()) {
        return QStringLiteral("the encoding of the locale can't express this password");
    }
    return QString();
}

/// A text of a tool on standard error, line by line.
void sayLines(QString text)
{
    text.remove(QLatin1Char('\r'));
    const QStringList lines = text.split(QLatin1Char('\n'), Qt::SkipEmptyParts);
    for (const QString& line : lines) {
        say(escaped(line));
    }
}

} // namespace

/// A question is open as long as it lives. Only a person may take the time that it needs.
class TerminalAuthenticator::Asking
{
public:
    explicit Asking(const TerminalAuthenticator& authenticator)
        : m_handler(authenticator.m_askingHandler)
        , m_isPersonAsked(authenticator.isPersonAsked())
    {
        if (m_isPersonAsked) {
            Spinner::end();
        }
        if (m_isPersonAsked && m_handler) {
            m_handler(true);
        }
    }
    ~Asking()
    {
        if (m_isPersonAsked && m_handler) {
            m_handler(false);
        }
    }
    Asking(const Asking&) = delete;
    Asking& operator=(const Asking&) = delete;

private:
    const std::function<void(bool)>& m_handler;
    const bool m_isPersonAsked;
};

TerminalAuthenticator::TerminalAuthenticator(const Login& login)
    : m_login(login)
{
    leaveNoCoreFile();
}

TerminalAuthenticator::~TerminalAuthenticator() = default;

void TerminalAuthenticator::setAskingHandler(std::function<void(bool)> handler)
{
    m_askingHandler = std::move(handler);
}

void TerminalAuthenticator::cancel()
{
    m_prompt.cancel();
}

void TerminalAuthenticator::beginJob()
{
    m_prompt.restart();
    setResource(QString(), QString(), QString(), QString());
    m_whyGivenUp.clear();
    m_wasAccepted = false;
    m_keyConfirmed = false;
    m_passwordGiven = false;
    m_userChangedLast = false;
}

void TerminalAuthenticator::setAccount(const QString& user, const QString& host)
{
    m_user = user;
    m_host = host;
}

QString TerminalAuthenticator::sshCommand() const
{
    // Other names would have to be quoted.
    static const QRegularExpression plain(
        QStringLiteral("^[\\w.@+-]+$"), QRegularExpression::UseUnicodePropertiesOption);
    const QString host = m_host.isEmpty() ? server() : m_host;
    return QStringLiteral("ssh ") +
           (plain.match(m_user).hasMatch() ? m_user + QLatin1Char('@') + host : host);
}

bool TerminalAuthenticator::wasAccepted() const
{
    return m_wasAccepted;
}

bool TerminalAuthenticator::isDescriptorSilent() const
{
    return m_isDescriptorSilent;
}

bool TerminalAuthenticator::wasUserChangedLast() const
{
    return m_userChangedLast;
}

QStringList TerminalAuthenticator::changedUsers() const
{
    const std::lock_guard<std::mutex> lock(m_changedUsersLock);
    return m_changedUsers;
}

QString TerminalAuthenticator::whyGivenUp() const
{
    return m_whyGivenUp;
}

bool TerminalAuthenticator::isWorthAnotherJob()
{
    if (!m_whyGivenUp.isEmpty() || !m_keyConfirmed || !m_passwordGiven) {
        return false;
    }
    m_tries[resource()].wasRefused = true;
    return true;
}

QString TerminalAuthenticator::resource() const
{
    // An IPv6 address stands in brackets, as in the URL.
    const bool isAddress = server().contains(QLatin1Char(':'));
    const QString host = isAddress ? QLatin1Char('[') + server() + QLatin1Char(']') : server();
    QString text = protocol() + QLatin1String("://") + host;
    if (!object().isEmpty()) {
        text += QLatin1Char('/') + object();
    }
    return text;
}

QString TerminalAuthenticator::whose(const QString& user) const
{
    return user.isEmpty() ? resource() : QStringLiteral("%1 on %2").arg(user, resource());
}

/// Whether it is another host than that of the URL that asks.
bool TerminalAuthenticator::isOnTheWay() const
{
    return protocol() == sftp && !isSshNameOf(server(), m_user, m_host);
}

QString TerminalAuthenticator::giveUp(const QString& why, bool* cancelled)
{
    if (m_whyGivenUp.isEmpty()) {
        m_whyGivenUp = why;
    }
    *cancelled = true;
    return QString();
}

void TerminalAuthenticator::credentialsRejected(const QString& user)
{
    Q_UNUSED(user)
    m_tries[resource()].wasRefused = true;
}

void TerminalAuthenticator::credentialsAccepted()
{
    m_wasAccepted = true;
    m_tries[resource()].wasRefused = false;
}

QString TerminalAuthenticator::requestPassword(
    bool isRetry, const QString& title, const QString& message, QString& user, bool* userChanged,
    bool* cancelled)
{
    Q_UNUSED(isRetry) // Some jobs say so of the first question, too.
    m_userChangedLast = false;
    if (m_prompt.isCancelled() || !m_whyGivenUp.isEmpty()) {
        return giveUp(wasCancelled(), cancelled);
    }
    // A job that asks when its tool has ended throws the answer away.
    const bool isUsed = protocol() == smb || hasRunningDescendants();
    if (!isUsed) {
        m_tries[resource()].wasRefused = true; // Without a user the jobs do not tell.
    }
    QString why = whyNoMoreTries(isUsed);
    if (!why.isEmpty()) {
        return giveUp(why, cancelled);
    }

    const Asking asking(*this);
    if (isUsed && isOwnWords(protocol(), message)) {
        return answerOwnWords(message, user, cancelled);
    }
    if (isUsed && m_tries.value(resource()).wasRefused && isPersonAsked()) {
        m_prompt.show(message.isEmpty() || protocol() != smb ? title : message);
    }
    QString name = user;
    if (isUserAsked(user, isUsed)) {
        why = whyNoUserName(name);
    }
    if (!why.isEmpty()) {
        return giveUp(why, cancelled);
    }
    if (name != user) {
        user = name;
        *userChanged = true;
        // The mount jobs start again, and ask for the password of that user if it needs one.
        if (protocol() != smb) {
            noteChangedUser(user);
            return QString();
        }
    }
    m_passwordGiven = isUsed;
    if (!isUsed) {
        return QString();
    }
    Secret password;
    why = whyNoPassword(name, QStringLiteral("Password for %1: ").arg(whose(name)), password);
    if (!why.isEmpty()) {
        return giveUp(why, cancelled);
    }
    ++m_tries[resource()].count;
    return password.text();
}

QString
TerminalAuthenticator::answerOwnWords(const QString& question, const QString& user, bool* cancelled)
{
    const bool isPassphrase = question.startsWith(QLatin1String("Enter passphrase for key"));
    if (isPassphrase && !isPersonAsked()) {
        return QString(); // There may be another way to log in.
    }
    Tries& tries = m_tries[isPassphrase ? question : resource()];
    QString why = tries.count == mostTries ? threeWereRefused() : QString();
    Secret answer;
    if (why.isEmpty()) {
        why = whyNoPassword(user, question, answer);
    }
    if (!why.isEmpty()) {
        return giveUp(why, cancelled);
    }
    ++tries.count;
    m_passwordGiven = true;
    return answer.text();
}

void TerminalAuthenticator::noteChangedUser(const QString& user)
{
    m_user = user;
    m_tries[resource()].wasRefused = false;
    m_userChangedLast = true;
    const std::lock_guard<std::mutex> lock(m_changedUsersLock);
    m_changedUsers.append(user);
}

/// Why there is no use in another try; empty when there is.
QString TerminalAuthenticator::whyNoMoreTries(bool isUsed) const
{
    const Tries tries = m_tries.value(resource());
    if (!tries.wasRefused) {
        return QString();
    }
    if (tries.count == mostTries) {
        return threeWereRefused();
    }
    if (m_descriptorRead) {
        return QStringLiteral("the password was refused");
    }
    if (protocol() == sftp && !isUsed && !m_passwordGiven) {
        return QStringLiteral("the connection ended before a password was asked for: look with "
                              "'%1' whether the host answers, and lets you in")
            .arg(sshCommand());
    }
    return QString();
}

bool TerminalAuthenticator::isPersonAsked() const
{
    return !m_login.noInput && m_login.passwordDescriptor < 0 && m_prompt.isAvailable();
}

bool TerminalAuthenticator::isUserAsked(const QString& user, bool isUsed) const
{
    if (!user.isEmpty()) {
        return protocol() == smb;
    }
    if (protocol() != sftp) {
        return true;
    }
    // Without a name ssh has one of its own.
    return isUsed && (!m_login.user.isEmpty() || isPersonAsked());
}

QString TerminalAuthenticator::whyNoAnswer(const QString& needed, const QString& options) const
{
    QString why = needed + QLatin1String(" is needed");
    if (m_login.noInput) {
        why += QLatin1String(", and --no-input forbids asking");
    } else if (m_login.passwordDescriptor < 0) {
        why += QLatin1String(", and there is no terminal to ask on");
    }
    return why + QLatin1String(": use ") + options;
}

QString TerminalAuthenticator::whyNotAnswered() const
{
    return m_prompt.isOutOfReach()
               ? QStringLiteral("asking needs the terminal, and no shell can bring the program "
                                "from the background to the foreground")
               : wasCancelled();
}

/// Why there is no name; else it goes into @p user, which stays as it is when that is meant.
QString TerminalAuthenticator::whyNoUserName(QString& user)
{
    if (!m_login.user.isEmpty()) {
        user = m_login.user;
        return whyNoUser(protocol(), user);
    }
    if (!isPersonAsked()) {
        return whyNoAnswer(
            QStringLiteral("a login for ") + resource(),
            m_login.passwordDescriptor < 0 ? QStringLiteral("--user and --password-fd")
                                           : QStringLiteral("--user"));
    }
    const QString offered = user.isEmpty() ? loginName() : user;
    while (true) {
        Secret line;
        const QString question = QStringLiteral("User name for %1 [%2]: ").arg(resource(), offered);
        if (!m_prompt.ask(question, Prompt::Shown, line)) {
            return whyNotAnswered();
        }
        const QString typed = line.text().trimmed();
        if (typed.isEmpty() && protocol() == sftp) {
            return QString();
        }
        const QString name = typed.isEmpty() ? offered : typed;
        const QString why = line.isTooLong() ? QStringLiteral("the name of the user is too long")
                                             : whyNoUser(protocol(), name);
        if (why.isEmpty()) {
            user = name;
            return QString();
        }
        m_prompt.show(why);
    }
}

/// Why there is no password; else it goes into @p password.
QString
TerminalAuthenticator::whyNoPassword(const QString& user, const QString& question, Secret& password)
{
    if (m_login.passwordDescriptor >= 0) {
        return whyNotFromDescriptor(user, password);
    }
    if (!isPersonAsked()) {
        return whyNoAnswer(
            QStringLiteral("a password for ") + whose(user), QStringLiteral("--password-fd"));
    }
    while (true) {
        if (!m_prompt.ask(question, Prompt::Hidden, password)) {
            return whyNotAnswered();
        }
        const QString why = whyUnfit(password, protocol());
        if (why.isEmpty()) {
            return QString();
        }
        m_prompt.show(why);
    }
}

QString TerminalAuthenticator::whyNotFromDescriptor(const QString& user, Secret& password)
{
    if (m_descriptorRead) {
        return QStringLiteral("a second password is needed, for ") + whose(user);
    }
    if (isOnTheWay()) {
        return QStringLiteral("a password for %1 is needed, and that of --password-fd is for %2: "
                              "let that host take a key, or type both")
            .arg(whose(user), m_host);
    }
    m_descriptorRead = true;
    if (m_prompt.readLine(m_login.passwordDescriptor, password)) {
        return whyUnfit(password, protocol());
    }
    m_isDescriptorSilent = m_prompt.isCancelled();
    return m_isDescriptorSilent ? wasCancelled()
                                : QStringLiteral("no password could be read from descriptor %1")
                                      .arg(m_login.passwordDescriptor);
}

bool TerminalAuthenticator::askQuestion(const QString& title, const QString& text)
{
    Q_UNUSED(title) // It says that this is a question.
    m_userChangedLast = false;
    if (m_prompt.isCancelled() || !m_whyGivenUp.isEmpty()) {
        return false;
    }
    const Asking asking(*this);
    if (!isPersonAsked()) {
        sayLines(text);
        m_whyGivenUp =
            QStringLiteral("the key of the host is not known, and nobody could be asked about it: "
                           "connect once with '%1', which asks")
                .arg(sshCommand());
        return false;
    }
    m_prompt.show(text);
    while (true) {
        Secret line;
        if (!m_prompt.ask(QStringLiteral("Type yes or no: "), Prompt::Shown, line)) {
            m_whyGivenUp = whyNotAnswered();
            return false;
        }
        const QString answer = line.text().trimmed();
        if (answer == QLatin1String("yes")) {
            m_keyConfirmed = true;
            return true;
        }
        if (answer == QLatin1String("no")) {
            m_whyGivenUp = QStringLiteral("the key of the host was not accepted");
            return false;
        }
    }
}

} // namespace Tool
} // namespace VeyFM
