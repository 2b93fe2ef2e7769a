// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/terminalauthenticator.h"

#include "host/helpertexts.h"
#include "host/mounturl.h"
#include "jobs/mountsftpurljob.h"
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
const QLatin1String ftp("ftp");
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

QString TerminalAuthenticator::withSshCommand(const char* why) const
{
    return QStringLiteral("%1: look with '%2' whether the host answers, and lets you in")
        .arg(QLatin1String(why), sshCommand());
}

bool TerminalAuthenticator::wasAccepted() const
{
    return m_wasAccepted;
}

bool TerminalAuthenticator::isDescriptorSilent() const
{
    return m_isDescriptorSilent;
}

QString TerminalAuthenticator::user() const
{
    return m_user;
}

bool TerminalAuthenticator::isLastTry() const
{
    return m_descriptorRead || m_tries.value(resource()).count == mostTries;
}

QString TerminalAuthenticator::whyGivenUp() const
{
    if (!m_whyGivenUp.isEmpty() || !isLastTry()) {
        return m_whyGivenUp;
    }
    return m_descriptorRead ? QStringLiteral("the password was refused") : threeWereRefused();
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
    if (m_prompt.isCancelled() || !m_whyGivenUp.isEmpty()) {
        return giveUp(wasCancelled(), cancelled);
    }
    if (isRetry) {
        m_tries[resource()].wasRefused = true; // Without a user the jobs do not tell.
    }
    QString why = whyNoMoreTries();
    if (!why.isEmpty()) {
        return giveUp(why, cancelled);
    }
    // Nobody in particular was refused, and only the name of somebody is of use.
    const bool isUsed = protocol() != ftp || !user.isEmpty();

    const Asking asking(*this);
    if (isUsed && isOwnWords(protocol(), message)) {
        return answerOwnWords(message, user, cancelled);
    }
    if (isUsed && m_tries.value(resource()).wasRefused && isPersonAsked()) {
        m_prompt.show(message.isEmpty() || protocol() != smb ? title : message);
    }
    QString name = user;
    if (isUserAsked(user)) {
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
    Tries& tries = m_tries[isPassphrase ? question : resource()];
    if (isPassphrase && !isPersonAsked()) {
        // There may be another way to log in, but not behind that.
        return ++tries.count == 1 ? QString()
                                  : giveUp(withSshCommand(Host::endedBeforePassword), cancelled);
    }
    QString why = tries.count == mostTries ? threeWereRefused() : QString();
    Secret answer;
    if (why.isEmpty()) {
        why = whyNoPassword(user, question, answer);
    }
    if (!why.isEmpty()) {
        return giveUp(why, cancelled);
    }
    ++tries.count;
    return answer.text();
}

void TerminalAuthenticator::noteChangedUser(const QString& user)
{
    m_user = user;
    m_tries[resource()].wasRefused = false;
}

/// Why there is no use in another try; empty when there is.
QString TerminalAuthenticator::whyNoMoreTries() const
{
    return m_tries.value(resource()).wasRefused && isLastTry() ? whyGivenUp() : QString();
}

bool TerminalAuthenticator::isPersonAsked() const
{
    return !m_login.noInput && m_login.passwordDescriptor < 0 && m_prompt.isAvailable();
}

bool TerminalAuthenticator::isUserAsked(const QString& user) const
{
    if (!user.isEmpty()) {
        return protocol() == smb;
    }
    if (protocol() != sftp) {
        return true;
    }
    // Without a name ssh has one of its own.
    return !m_login.user.isEmpty() || isPersonAsked();
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
