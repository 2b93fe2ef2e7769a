// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTRESOURCEJOB_P_H
#define VEYFM_MOUNTRESOURCEJOB_P_H

#include "host/childprocess.h"
#include "host/linereader.h"
#include "host/mountprotocol.h"
#include "host/mountresourcejob.h"
#include "jobs/job_p.h"

#include <QTimer>

#include <memory>
#include <optional>

namespace VeyFM {

class MountResourceJobPrivate : public JobPrivate
{
public:
    MountResourceJobPrivate(QSharedPointer<Authenticator> authenticator, const QString& url);
    ~MountResourceJobPrivate() override;

    MountResourceJob* job() const;

    void start();
    void cancel();
    void answer(const MountProtocol::Request& request, const QString& password = QString());

    const QString url;
    const QSharedPointer<Authenticator> authenticator;
    QString user;
    QString program;
    int silenceLimit = 0;
    int patience = MountProtocol::Request().patience;
    bool isLastTry = false;
    std::optional<MountQuestion> question;
    MountProtocol::End result; ///< As far as the job has ended well.
    Entry entry;

private:
    enum State {
        Waiting,     ///< For start().
        Talking,     ///< With the program, which is at work.
        Stopping,    ///< Until it has cleaned up. What it says does not count any more.
        HandingOver, ///< Until it confirms by its end that the mount is ours.
        Looking,     ///< For the entry.
        Finished
    };

    void run();
    void send(const MountProtocol::Request& request);
    void send(MountProtocol::Request::Kind kind);
    QString programName() const;
    bool read();
    void takeLineLater();
    void takeLine();
    void take(const MountProtocol::Report& report);
    void takeEnd(const MountProtocol::End& end);
    void ask(const MountProtocol::Question& asked);
    void askAuthenticator();
    bool isAsked(int id, MountProtocol::Question::Kind kind) const;
    void programEnded(int status);
    void restartSilence();

    void stop(int code, const QString& text);
    void misunderstood(const QString& why);
    void finish();

    void lookForEntry();
    void lookBelow(const Entry& place);

    State m_state = Waiting;
    bool m_isTakingLater = false;
    std::optional<int> m_status; ///< Of the program, once it has ended.
    int m_chunksLeft = 32;       ///< That are read behind its end, which others may go on writing.
    bool m_isReady = false;      ///< Whether the program has said which protocol it speaks.
    bool m_hasEnded = false;     ///< Whether the program has said how it ended, which was not well.
    bool m_isCancelled = false;  ///< Whether cancel() was called.
    int m_questionId = 0;
    MountProtocol::Question::Kind m_questionKind = MountProtocol::Question::Confirm;
    int m_code = 0; ///< What the job will end with.
    QString m_text;
    MountProtocol::LineReader m_reader;
    QTimer m_silence;
    QTimer m_patience; ///< With the program that cleans up, and then with the news of the service.
    std::unique_ptr<Host::ChildProcess> m_helper;

    Q_DECLARE_PUBLIC(MountResourceJob)
};

} // namespace VeyFM

#endif
