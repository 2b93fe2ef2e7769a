// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TOOL_MOUNTAUTHENTICATOR_H
#define VEYFM_TOOL_MOUNTAUTHENTICATOR_H

#include "mount/terminalauthenticator.h"

#include <functional>

namespace VeyFM {
namespace Tool {

/// Notes what tells the mounts of the jobs from those that others make meanwhile.
class MountAuthenticator : public TerminalAuthenticator
{
public:
    using TerminalAuthenticator::TerminalAuthenticator;

    /// Called with true when a question begins, and with false when it has ended and the tool has
    /// not got the answer yet. No more when a tool has mounted something.
    void setQuestionHandler(std::function<void(bool asking)> handler);

    /// Whether the tool of a job has done well.
    bool hasMounted() const;

    QString requestPassword(
        bool isRetry, const QString& title, const QString& message, QString& user,
        bool* userChanged, bool* cancelled) override;
    bool askQuestion(const QString& title, const QString& text) override;
    void credentialsAccepted() override;

private:
    void noteQuestion(bool asking) const;

    std::function<void(bool)> m_questionHandler;
    bool m_hasMounted = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
