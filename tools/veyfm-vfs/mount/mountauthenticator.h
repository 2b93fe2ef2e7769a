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

    /// Called when a question has ended and the tool has not got the answer yet. No more when a
    /// tool has mounted something.
    void setAskedHandler(std::function<void()> handler);

    /// Whether the tool of a job has done well.
    bool hasMounted() const;

    QString requestPassword(
        bool isRetry, const QString& title, const QString& message, QString& user,
        bool* userChanged, bool* cancelled) override;
    bool askQuestion(const QString& title, const QString& text) override;
    void credentialsAccepted() override;

private:
    void noteAsked() const;

    std::function<void()> m_askedHandler;
    bool m_hasMounted = false;
};

} // namespace Tool
} // namespace VeyFM

#endif
