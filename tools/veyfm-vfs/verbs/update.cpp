// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "commandline.h"
#include "describe.h"
#include "host/mounturl.h"
#include "locate.h"
#include "mount/jobfailure.h"
#include "mount/login.h"
#include "mount/recordjob.h"
#include "mount/scanjob.h"
#include "mount/sharejob.h"
#include "mount/urlmount.h"
#include "mount/watchedjob.h"
#include "patience.h"
#include "report.h"
#include "service.h"
#include "session.h"
#include "verbs/verbs.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

namespace VeyFM {
namespace Tool {

using Host::schemeOf;
using Host::shownUrl;
using Host::userOf;
using Host::whyNoShare;
using Host::whyNotMountable;
using Host::whyNoUser;

namespace {

const QLatin1Char slash('/');

/// Why an entry was not brought up to date, or empty.
struct Outcome
{
    QString why;
    bool wasInterrupted = false;
};

/// Brings one entry up to date.
class Update
{
public:
    Update(const QString& operand, const Login& login, int timeout)
        : m_operand(operand)
        , m_login(login)
        , m_timeout(timeout)
    {
    }

    Outcome run(const Entry& entry)
    {
        if (entry.isFavouriteNetworkPlace()) {
            return mount(entry);
        }
        if (entry.isSambaSharePlace()) {
            return attach(entry);
        }
        if (entry.isSambaNetworkPlace() || entry.isSambaWorkgroupPlace() ||
            entry.isSambaServerPlace()) {
            return scan(entry);
        }
        return {QStringLiteral("neither a network bookmark nor a place of the Samba network")};
    }

private:
    Outcome mount(const Entry& entry)
    {
        NetworkPlace place;
        const QString stopped =
            askService(m_operand, m_timeout, [&] { place = VFS::ptr()->networkPlace(entry); });
        if (!stopped.isEmpty()) {
            return {stopped, true};
        }
        const QString url = place.url();
        QString why = whyNotMountable(url);
        if (why.isEmpty()) {
            why = whyNoLoginFor(url);
        }
        if (!why.isEmpty()) {
            return {QStringLiteral("%1: %2").arg(shownUrl(url), why)};
        }
        Login login = m_login;
        if (login.user.isEmpty()) {
            login.user = userOf(url);
        }
        const UrlMount mounted = mountUrl(url, login, m_timeout);
        if (!mounted.why.isEmpty()) {
            return {mounted.why, mounted.wasInterrupted};
        }
        if (mounted.localPath == place.localPath()) {
            return {};
        }
        RecordJob job(entry, mounted.localPath);
        return runJob(job, QStringLiteral("change"));
    }

    QString whyNoLoginFor(const QString& url) const
    {
        const QString other = userOf(url);
        if (m_login.user.isEmpty() || other == m_login.user) {
            return QString();
        }
        return other.isEmpty() ? whyNoUser(schemeOf(url), m_login.user)
                               : QStringLiteral("the user is '%1' in the URL and '%2' in --user")
                                     .arg(other, m_login.user);
    }

    Outcome attach(const Entry& entry)
    {
        const VFS* vfs = VFS::ptr();
        const QString scheme = QStringLiteral("smb");
        QString why =
            whyNoShare(entry.lastPathSection(), vfs->smbHost(entry), vfs->smbWorkgroup(entry));
        if (why.isEmpty()) {
            why = whyNoUser(scheme, m_login.user);
        }
        if (why.isEmpty()) {
            why = whyNoTool(scheme);
        }
        if (!why.isEmpty()) {
            return {why};
        }
        const auto authenticator = QSharedPointer<TerminalAuthenticator>::create(m_login);
        JobWatch watch(authenticator, m_timeout);
        watch.setCutOff(m_operand);
        ShareJob job(authenticator, entry);
        const JobResult result = watch.run(job, doing());
        if (result.end == JobResult::TimedOut) {
            return {
                watch.whyStopped() +
                QStringLiteral(": smbclient or the file manager service does not answer")};
        }
        return {
            result.isOk() ? QString() : whyFailed(result, scheme, *authenticator, watch),
            watch.wasInterrupted()};
    }

    Outcome scan(const Entry& entry)
    {
        ScanJob job(entry);
        return runJob(job, ScanJob::news());
    }

    /// Runs a job that waits for the service alone.
    Outcome runJob(Job& job, const QString& news)
    {
        JobWatch watch(QSharedPointer<TerminalAuthenticator>::create(m_login), m_timeout);
        watch.setCutOff(m_operand);
        const JobResult result = watch.run(job, doing());
        if (result.end == JobResult::TimedOut) {
            return {whyNoNews(news, m_timeout)};
        }
        return {result.isOk() ? QString() : watch.whyStopped(), watch.wasInterrupted()};
    }

    QString doing() const
    {
        return QStringLiteral("Updating ") + m_operand;
    }

    const QString m_operand;
    const Login m_login;
    const int m_timeout;
};

/// Finds an entry below places that are opened on the way, and opens it itself.
Located openedEntry(const QString& path)
{
    for (int end = path.indexOf(slash); end > 0; end = path.indexOf(slash, end + 1)) {
        const Entry above = VFS::ptr()->entry(path.left(end));
        if (opensOnFirstLook(above)) {
            VFS::ptr()->childs(above);
        }
    }
    const Located located = locate(path);
    if (opensOnFirstLook(located.entry)) {
        VFS::ptr()->childs(located.entry);
    }
    return located;
}

int run(Invocation& invocation)
{
    const int timeout = jobTimeout(invocation);
    QString why;
    const QString stopped = askService(invocation.verb().name, timeout, [&why] {
        why = whyNoRunningService();
        if (why.isEmpty()) {
            openTree();
        }
        if (why.isEmpty() && Patience::isOver()) {
            why = whySilent();
        }
    });
    if (!stopped.isEmpty()) {
        report(invocation.verb().name, stopped);
        return Failed;
    }
    if (!why.isEmpty()) {
        return failWithoutService(invocation, why);
    }
    Output& output = invocation.output();
    JsonArray json(output);
    int exitCode = Done;
    const QStringList operands = invocation.operands();
    for (const QString& operand : operands) {
        const QString shown = shownUrl(operand);
        Located located;
        Outcome outcome;
        outcome.why = askService(shown, timeout, [&] { located = openedEntry(operand); });
        outcome.wasInterrupted = !outcome.why.isEmpty();
        if (outcome.why.isEmpty()) {
            outcome.why = located.why;
        }
        if (outcome.why.isEmpty()) {
            outcome = Update(shown, readLogin(invocation), timeout).run(located.entry);
        }
        if (!outcome.why.isEmpty()) {
            report(shown, outcome.why);
            exitCode = Failed;
            if (outcome.wasInterrupted) {
                break;
            }
            continue;
        }
        const Entry entry = VFS::ptr()->placeBase()->placeEntry(located.entry.path());
        if (invocation.json()) {
            json.append(toJson(entry));
        } else if (!entry.localPath().isEmpty()) {
            output.writeRecord(output.name(entry.localPath()));
        }
    }
    if (invocation.json()) {
        json.end();
    }
    return exitCode;
}

} // namespace

Verb updateVerb()
{
    Verb verb;
    verb.name = QStringLiteral("update");
    verb.operands = QStringLiteral("ENTRY...");
    verb.summary = QStringLiteral("Bring network bookmarks and places of Samba up to date");
    verb.details = QStringLiteral(
        "Mounts what a network bookmark stands for, has a Samba share attached, and prints the\n"
        "local path of either. For the Samba network, a workgroup or a host the service looks\n"
        "again at what is there. Passwords are asked for as with mount; where --password-fd\n"
        "gives them, each entry that needs one reads a line.");
    verb.leastOperands = 1;
    verb.needs = Needs::Nothing; // The tree is made under a watch.
    verb.options = loginOptions() + QVector<Option>{jobTimeoutOption()};
    verb.whyWrong = whyNoLogin;
    verb.run = run;
    return verb;
}

} // namespace Tool
} // namespace VeyFM
