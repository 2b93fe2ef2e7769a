// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/mountresourcejob_p.h"

#include "host/background.h"
#include "host/secretline.h"
#include "vfs/vfs.h"
#include "vfs/vfsplacebase.h"

#include <QDir>
#include <QFileInfo>
#include <QPointer>

#include <algorithm>
#include <cerrno>
#include <cstring>

#include <sys/wait.h>
#include <unistd.h>

namespace VeyFM {

using MountProtocol::Report;
using MountProtocol::Request;

namespace {

constexpr int patienceWithProgram = 5000; // Milliseconds, as the others.
constexpr int patienceWithService = 1000;
constexpr int patienceWithServer = 5000;

constexpr size_t mostBytesAtOnce = 4096;

MountQuestion shownQuestion(const MountProtocol::Question& asked)
{
    return {asked.title, asked.message, asked.user,   asked.protocol,
            asked.host,  asked.domain,  asked.object, asked.isRetry};
}

} // namespace

MountResourceJobPrivate::MountResourceJobPrivate(
    QSharedPointer<Authenticator> authenticator, const QString& url)
    : url(url)
    , authenticator(std::move(authenticator))
{
    m_silence.setSingleShot(true);
    m_patience.setSingleShot(true);
}

MountResourceJobPrivate::~MountResourceJobPrivate() = default;

MountResourceJob* MountResourceJobPrivate::job() const
{
    return static_cast<MountResourceJob*>(q_ptr);
}

void MountResourceJobPrivate::start()
{
    if (m_state != Waiting) {
        return;
    }
    QObject::connect(&m_patience, &QTimer::timeout, job(), [this] { finish(); });
    QObject::connect(&m_silence, &QTimer::timeout, job(), [this] {
        stop(5, MountResourceJob::tr("No progress within %1 s").arg(silenceLimit / 1000.0));
    });
    if (m_isCancelled) {
        stop(2, MountResourceJob::tr("Mounting was cancelled"));
    } else {
        run();
    }
}

void MountResourceJobPrivate::run()
{
    m_state = Talking;
    m_helper = std::make_unique<Host::ChildProcess>();
    QObject::connect(m_helper.get(), &Host::ChildProcess::readyRead, job(), [this] {
        if (read()) {
            takeLineLater();
        }
    });
    QObject::connect(m_helper.get(), &Host::ChildProcess::ended, job(), [this](int status) {
        m_status = status;
        takeLineLater();
    });
    QObject::connect(m_helper.get(), &Host::ChildProcess::failed, job(), [this](int error) {
        if (m_state == Talking) {
            m_code = 5;
            m_text = MountResourceJob::tr("Can't start %1: %2")
                         .arg(program, QString::fromLocal8Bit(std::strerror(error)));
        }
        finish();
    });
    m_helper->start(program, {}, Host::ChildProcess::Conversation);
    Request request;
    request.kind = Request::Mount;
    request.url = url;
    request.user = user.isEmpty() ? QString() : user;
    request.patience = patience;
    send(request);
    restartSilence();
}

void MountResourceJobPrivate::send(const Request& request)
{
    const QByteArray line = encode(request);
    m_helper->send(line.constData(), size_t(line.size()));
}

void MountResourceJobPrivate::send(Request::Kind kind)
{
    Request request;
    request.kind = kind;
    send(request);
}

// For texts.
QString MountResourceJobPrivate::programName() const
{
    return QFileInfo(program).fileName();
}

void MountResourceJobPrivate::restartSilence()
{
    m_silence.stop();
    if (silenceLimit > 0 && m_state == Talking && !question) {
        m_silence.start(silenceLimit);
    }
}

void MountResourceJobPrivate::cancel()
{
    m_isCancelled = true;
    if (m_state == Talking) {
        stop(2, MountResourceJob::tr("Mounting was cancelled"));
    } else if (m_state == Stopping) {
        m_code = 2;
        m_text = MountResourceJob::tr("Mounting was cancelled");
    }
}

// Little at a time: a program that never stops talking must not keep the host from its other work.
// Whether there was something.
bool MountResourceJobPrivate::read()
{
    const size_t most = std::min(m_reader.roomSize(), mostBytesAtOnce);
    if (most == 0) {
        return false; // There are lines to be taken first.
    }
    const ssize_t size = ::read(m_helper->descriptor(), m_reader.room(), most);
    if (size > 0) {
        m_reader.added(size_t(size));
    } else if (size == 0 || (errno != EAGAIN && errno != EINTR)) {
        m_helper->stopReading();
    }
    return size > 0;
}

void MountResourceJobPrivate::takeLineLater()
{
    if (!m_isTakingLater) {
        m_isTakingLater = true;
        QMetaObject::invokeMethod(
            job(), [this] { takeLine(); }, Qt::QueuedConnection);
    }
}

// One at a time: whoever is told of it may run an event loop, in which the next one counts.
void MountResourceJobPrivate::takeLine()
{
    m_isTakingLater = false;
    if (m_state == Finished) {
        return;
    }
    MountProtocol::Line line;
    if (m_reader.next(&line)) {
        QString why;
        const std::optional<Report> report = decodeReport(line, &why);
        takeLineLater();
        if (m_state != Talking && m_state != Stopping) {
            return; // Behind the end nothing is said that counts.
        }
        if (report) {
            take(*report);
        } else {
            misunderstood(why);
        }
        return;
    }
    if (m_reader.isTooLong()) {
        m_helper->stopReading();
        misunderstood(QStringLiteral("a line is too long"));
    }
    if (!m_status) {
        return;
    }
    // Its last words may come in with the news that it has ended.
    if (m_chunksLeft > 0 && read()) {
        --m_chunksLeft;
        QTimer::singleShot(0, job(), [this] { takeLineLater(); });
    } else {
        programEnded(*m_status);
    }
}

void MountResourceJobPrivate::take(const Report& report)
{
    if (report.kind == Report::Ended) {
        takeEnd(report.end);
        return;
    }
    if (m_state != Talking) {
        return; // It was said before the program heard of its end.
    }
    if ((report.kind == Report::Ready) == m_isReady) {
        misunderstood(QStringLiteral("a line that does not belong here"));
        return;
    }
    m_isReady = true;
    switch (report.kind) {
    case Report::Asked:
        if (question) {
            misunderstood(QStringLiteral("a second question at the same time"));
            return;
        }
        ask(report.question);
        return;
    case Report::Waiting:
        restartSilence();
        Q_EMIT job()->waitingForOther(report.text);
        return;
    case Report::Rejected:
        restartSilence();
        if (const QSharedPointer<Authenticator> asked = authenticator) {
            asked->credentialsRejected(report.user);
        } else {
            Q_EMIT job()->credentialsRejected(report.user);
        }
        return;
    case Report::Accepted:
        restartSilence();
        if (const QSharedPointer<Authenticator> asked = authenticator) {
            asked->credentialsAccepted();
        } else {
            Q_EMIT job()->credentialsAccepted();
        }
        return;
    case Report::Ready:
    case Report::Ended:
        restartSilence();
        return;
    }
}

void MountResourceJobPrivate::ask(const MountProtocol::Question& asked)
{
    m_questionId = asked.id;
    m_questionKind = asked.kind;
    question = shownQuestion(asked);
    m_silence.stop();
    if (authenticator) {
        askAuthenticator();
        return;
    }
    const MountQuestion copy = *question;
    if (asked.kind == MountProtocol::Question::Confirm) {
        Q_EMIT job()->confirmationRequested(copy);
    } else {
        Q_EMIT job()->passwordRequested(copy);
    }
}

bool MountResourceJobPrivate::isAsked(int id, MountProtocol::Question::Kind kind) const
{
    return question && m_questionId == id && m_questionKind == kind && m_state == Talking;
}

// The authenticator may run an event loop, in which all can happen to the job.
void MountResourceJobPrivate::askAuthenticator()
{
    const QPointer<MountResourceJob> alive(job());
    const QSharedPointer<Authenticator> asked = authenticator;
    const MountQuestion copy = *question;
    const int id = m_questionId;
    if (m_questionKind == MountProtocol::Question::Confirm) {
        const bool yes = asked->askQuestion(copy.title, copy.message);
        if (alive && isAsked(id, MountProtocol::Question::Confirm)) {
            job()->confirm(yes);
        }
        return;
    }
    asked->setResource(copy.protocol, copy.domain, copy.host, copy.object);
    QString name = copy.user;
    bool userChanged = false;
    bool cancelled = false;
    QString password = asked->requestPassword(
        copy.isRetry, copy.title, copy.message, name, &userChanged, &cancelled);
    if (alive && isAsked(id, MountProtocol::Question::Password)) {
        // Samba jobs take the name as it is.
        const bool isTaken = userChanged || copy.protocol == QLatin1String("smb");
        if (cancelled) {
            job()->giveUp();
        } else if (userChanged && password.isNull() && copy.protocol != QLatin1String("smb")) {
            job()->answerUser(name);
        } else {
            job()->answerPassword(isTaken ? name : copy.user, password);
        }
    }
    MountProtocol::erase(&password);
}

void MountResourceJobPrivate::answer(const Request& answered, const QString& password)
{
    const bool fits =
        answered.reply == Request::GivenUp ||
        (answered.reply == Request::Login) == (m_questionKind == MountProtocol::Question::Password);
    if (m_state != Talking || !question || !fits) {
        return;
    }
    Request request = answered;
    request.kind = Request::Answer;
    request.id = m_questionId;
    request.isLast = isLastTry;
    // A name alone has to be said; see readAnswer().
    if (request.hasPassword && request.user == question->user) {
        request.user = QString();
    }
    question.reset();
    send(request);
    if (request.hasPassword) {
        const MountProtocol::SecretLine secret(password);
        m_helper->send(secret.data(), secret.size());
    }
    restartSilence();
}

void MountResourceJobPrivate::takeEnd(const MountProtocol::End& end)
{
    if (end.code == 0 && m_state == Talking && !m_isReady) {
        misunderstood(QStringLiteral("an end without a begin"));
    } else if (end.code == 0 && m_state == Talking) {
        result = end;
        question.reset();
        m_silence.stop();
        m_state = HandingOver;
        m_code = 5;
        m_text = MountResourceJob::tr("%1 has not handed the mount over").arg(programName());
        m_patience.start(patienceWithProgram);
        send(Request::Take);
    } else if (m_state == Talking) {
        m_hasEnded = true;
        stop(end.code, end.text);
    } else if (end.code == 2 && m_code == 2) {
        m_text = end.text; // In the words of the protocol.
    }
}

// Has the program end and clean up, and the job with it.
void MountResourceJobPrivate::stop(int code, const QString& text)
{
    m_code = code;
    m_text = text;
    m_state = Stopping;
    question.reset();
    m_silence.stop();
    if (!m_helper) {
        m_patience.start(0);
        return;
    }
    if (!m_hasEnded) {
        send(Request::Cancel);
    }
    m_helper->closeWriting();
    m_patience.start(patienceWithProgram);
}

void MountResourceJobPrivate::misunderstood(const QString& why)
{
    if (m_state == Talking) {
        stop(5, MountResourceJob::tr("Can't understand %1: %2").arg(programName(), why));
    }
}

void MountResourceJobPrivate::programEnded(int status)
{
    const bool isWell = WIFEXITED(status) && WEXITSTATUS(status) == 0;
    if (m_state == HandingOver && isWell) {
        m_patience.stop();
        m_state = Looking;
        lookForEntry();
        return;
    }
    if (m_state == Talking) {
        m_code = 5;
        m_text = WIFSIGNALED(status)
                     ? MountResourceJob::tr("%1 was ended by signal %2")
                           .arg(programName())
                           .arg(WTERMSIG(status))
                     : MountResourceJob::tr("%1 has ended too early").arg(programName());
    }
    if (m_state != Looking) {
        finish();
    }
}

// The place of the mount comes with the news of the service, which may be behind the program's.
void MountResourceJobPrivate::lookForEntry()
{
    m_code = 0;
    if (!result.isShared || result.directory.isEmpty()) {
        finish();
        return;
    }
    const QString placePath = VFS::ptr()->createEntryForUrl(result.url, result.directory).path();
    const Entry place = VFS::ptr()->placeBase()->placeEntry(placePath);
    if (!place.isNull()) {
        lookBelow(place);
        return;
    }
    const auto connection = std::make_shared<QMetaObject::Connection>();
    *connection = QObject::connect(
        VFS::ptr(), &VFS::fuseMountAdded, job(),
        [this, placePath, connection](const QString&, const Entry& added) {
            if (m_state == Looking && added.path() == placePath) {
                QObject::disconnect(*connection);
                // Behind all others that hear of the mount.
                QTimer::singleShot(0, job(), [this, added] { lookBelow(added); });
            }
        });
    m_patience.start(patienceWithService);
}

// In the background: of what lies in a mount the kernel asks the server.
void MountResourceJobPrivate::lookBelow(const Entry& place)
{
    if (m_state != Looking) {
        return;
    }
    const QString root = QDir::cleanPath(place.localPath());
    if (result.localPath == root) {
        entry = place;
        finish();
        return;
    }
    if (!result.localPath.startsWith(root + QLatin1Char('/'))) {
        finish();
        return;
    }
    const QString path = place.path() + result.localPath.mid(root.size());
    m_patience.start(patienceWithServer);
    auto* const background = new Host::Background(job());
    background->run(
        [path, vfs = VFS::ptr()] { return vfs->entry(path); },
        [this](const Entry& found) {
            if (m_state == Looking) {
                entry = found;
                finish();
            }
        });
}

void MountResourceJobPrivate::finish()
{
    m_state = Finished;
    question.reset();
    m_patience.stop();
    m_silence.stop();
    m_helper.reset();
    if (m_code == 0) {
        job()->finishedOk();
        return;
    }
    result = MountProtocol::End();
    job()->finishedWithError(m_code, m_text);
}

} // namespace VeyFM
