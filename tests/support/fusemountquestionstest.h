// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_FUSEMOUNTQUESTIONSTEST_H
#define VEYFM_TESTS_FUSEMOUNTQUESTIONSTEST_H

#include "support/fusemountjobtest.h"

Q_DECLARE_METATYPE(QList<QByteArrayList>)
Q_DECLARE_METATYPE(ScriptedAuthenticator::Answer)
Q_DECLARE_METATYPE(QList<ScriptedAuthenticator::Answer>)

/// What FTP and SFTP mounts ask, and what comes of the answers: what is the same for both. A
/// subclass brings the protocol, and tests of what is that one's own.
class FuseMountQuestionsTest : public FuseMountJobTest
{
    Q_OBJECT

protected:
    using FuseMountJobTest::FuseMountJobTest;

    using Runs = QList<QByteArrayList>;
    using Answers = QList<Auth::Answer>;

    /// Adds rows that the other protocol has not, or differently. @{
    virtual void addConversations() = 0;
    virtual void addEndsWithFiles() = 0;
    virtual void addChangesToAMountedUser() {}
    /// @}

    void expect(const Runs& runs) const;

private Q_SLOTS:
    void passwordReachesTheTool_data();
    void passwordReachesTheTool();
    void conversation_data();
    void conversation();
    void conversationFails_data();
    void conversationFails();
    void isRecordedBeforeItIsAccepted();
    void filesInTheDirectorySurvive_data();
    void filesInTheDirectorySurvive();
    void filesSurviveADeletedJob();
    void changedUserMovesTheDirectory();
    void changedUserIsMountedAlready_data();
    void changedUserIsMountedAlready();
    void unsafeChangedUser();
};

#endif
