// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef QUESTIONS_H
#define QUESTIONS_H

#include <VeyFM/MountQuestion>

#include <QHash>
#include <QObject>

#include <optional>

class Terminal;

namespace VeyFM {
class MountResourceJob;
}

/// Asks a person what a job wants to know. The job goes on when the answer has been typed.
class Questions : public QObject
{
public:
    Questions(VeyFM::MountResourceJob* job, Terminal* terminal);

private:
    void askPassword(const VeyFM::MountQuestion& question);
    void
    askSecret(const VeyFM::MountQuestion& question, const QString& user, const QString& prompt);
    void askConfirmation(const VeyFM::MountQuestion& question);

    VeyFM::MountResourceJob* const m_job;
    Terminal* const m_terminal;
    QHash<QString, QString> m_passwords; ///< By host and question.
};

#endif
