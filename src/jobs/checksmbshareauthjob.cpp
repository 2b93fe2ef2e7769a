// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "jobs/checksmbshareauthjob.h"

#include "core/fuse.h"
#include "core/urltext.h"
#include "vfs/standardpaths.h"

#include <QPointer>
#include <QProcess>
#include <QProcessEnvironment>

#include <algorithm>

namespace VeyFM {

namespace {

constexpr int toolTimeoutMs = 30000;

// Runs a tool to its end, or until it takes too long, and returns what it printed, line by line.
// How the tool ended is not looked at. The pieces of the command are by turns ours and names, which
// a server may have told: where they would be options, the tool is as good as missing.
QStringList linesOf(QProcess& process, const QStringList& pieces)
{
    QStringList words = UrlText::commandWords(pieces);
    if (words.isEmpty()) {
        return {};
    }
    const QString program = words.takeFirst();
    process.start(program, words, QIODevice::ReadWrite);
    // A tool that asks for a password itself, for a user with an empty one, is refused at once.
    process.closeWriteChannel();
    process.waitForFinished(toolTimeoutMs);
    return QString::fromLocal8Bit(process.readAllStandardOutput())
        .split(QLatin1Char('\n'), Qt::SkipEmptyParts);
}

} // namespace

CheckSmbShareAuthJob::CheckSmbShareAuthJob(
    QSharedPointer<Authenticator> authenticator, const QString& share, const QString& host,
    const QString& workgroup, QObject* parent)
    : Job(parent)
    , m_authenticator(std::move(authenticator))
{
    m_authenticator->setResource(QStringLiteral("smb"), workgroup, host, share);
}

CheckSmbShareAuthJob::~CheckSmbShareAuthJob() = default;

QString CheckSmbShareAuthJob::share() const
{
    return m_authenticator->object();
}

QString CheckSmbShareAuthJob::host() const
{
    return m_authenticator->server();
}

QString CheckSmbShareAuthJob::workgroup() const
{
    return m_authenticator->domain();
}

QString CheckSmbShareAuthJob::hostForKerberos() const
{
    return m_hostForKerberos;
}

QString CheckSmbShareAuthJob::resourcePath() const
{
    return workgroup().isEmpty() ? QStringLiteral("%1/%2").arg(host(), share())
                                 : QStringLiteral("%1;%2/%3").arg(workgroup(), host(), share());
}

int CheckSmbShareAuthJob::checkKerberosAuth()
{
    const QString canonicalHost = StandardPaths::toCanonicalHostName(host());
    QProcess process;
    const QStringList lines = linesOf(
        process, {QStringLiteral("smbclient //"), canonicalHost, QStringLiteral("/"), share(),
                  QStringLiteral(" -k -c du")});
    const bool listed = std::any_of(lines.begin(), lines.end(), [](const QString& line) {
        return line.contains(QLatin1String("Total number of bytes"));
    });
    if (!listed) {
        return 1;
    }
    m_hostForKerberos = canonicalHost;
    return 0;
}

int CheckSmbShareAuthJob::checkAuth(const QString& user, const QString& password) const
{
    QProcess process;
    if (!user.isEmpty() && !password.isEmpty()) {
        QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
        environment.insert(QStringLiteral("PASSWD"), password);
        process.setProcessEnvironment(environment);
    }
    const QString guest = QStringLiteral("%");
    const QStringList lines = linesOf(
        process, {QStringLiteral("smbclient //"), host(), QStringLiteral("/"), share(),
                  QStringLiteral(" -U "), user.isEmpty() ? guest : user, QStringLiteral(" -c du")});
    QProcessEnvironment environment = process.processEnvironment();
    environment.remove(QStringLiteral("PASSWD"));
    process.setProcessEnvironment(environment);

    // Only a refusal counts. A tool that can't be started, crashes or fails in another way reads
    // as access granted; what is really wrong will show when the share is used.
    for (const QString& line : lines) {
        if (line.contains(QLatin1String("NT_STATUS_ACCESS_DENIED"))) {
            return AccessDenied;
        }
        if (line.contains(QLatin1String("NT_STATUS_LOGON_FAILURE"))) {
            return LogonFailure;
        }
    }
    return NoRefusal;
}

void CheckSmbShareAuthJob::start()
{
    if (!Fuse::isInFuseGroup()) {
        finishedWithError(4, tr("You must be in 'fuse' group in order to browse samba shares!"));
        return;
    }
    if (checkKerberosAuth() == 0) {
        finishedOk();
        return;
    }
    const int guestResult = checkAuth(QString(), QString());
    if (guestResult == NoRefusal) {
        finishedOk();
        return;
    }
    askUntilGranted(guestResult);
}

void CheckSmbShareAuthJob::askUntilGranted(int guestResult)
{
    // An authenticator may run an event loop, and the job be deleted in there.
    const QPointer<CheckSmbShareAuthJob> alive(this);
    const QSharedPointer<Authenticator> asked = m_authenticator;
    int result = guestResult;
    bool userChanged = false;
    bool cancelled = false;
    QString user;
    QString password =
        asked->requestPassword(false, QString(), QString(), user, &userChanged, &cancelled);
    if (!alive) {
        return;
    }
    if (!cancelled) {
        result = checkAuth(user, password);
        if (result == NoRefusal) {
            // A first answer that works is not reported as accepted, unlike a later one.
            finishedOk();
            return;
        }
        asked->credentialsRejected(user);
    }
    // A user who gave up at the first question is asked once more, with the reason why the guest
    // was refused. The flags are not cleared in between.
    while (alive) {
        const bool denied = result == AccessDenied;
        const QString title = denied ? tr("Access denied") : tr("Logon failure");
        const QString message =
            (denied ? tr("Access denied for %1") : tr("Logon failure for %1")).arg(resourcePath());
        password = asked->requestPassword(true, title, message, user, &userChanged, &cancelled);
        if (!alive) {
            return;
        }
        if (cancelled) {
            finishedWithError(2, tr("Login cancelled"));
            return;
        }
        result = checkAuth(user, password);
        if (result == NoRefusal) {
            asked->credentialsAccepted();
            if (alive) {
                finishedOk();
            }
            return;
        }
        asked->credentialsRejected(user);
    }
}

} // namespace VeyFM
