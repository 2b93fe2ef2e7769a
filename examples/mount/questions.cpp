// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "questions.h"

#include "terminal.h"

#include <VeyFM/MountResourceJob>
#include <VeyFM/MountSFtpURLJob>

using VeyFM::MountQuestion;
using VeyFM::MountResourceJob;

namespace {

/// What a server may have sent; control characters steer terminals.
QString harmless(const QString& text)
{
    QString shown;
    for (const QChar character : text) {
        const bool isHarmless = character.isPrint() || character == QLatin1Char('\n');
        shown += isHarmless ? character : QChar(QLatin1Char(' '));
    }
    return shown;
}

/// Whether SSH asks for something else than a password, such as the passphrase of a key.
bool isInOtherWords(const MountQuestion& question)
{
    return question.protocol == QLatin1String("sftp") &&
           question.message != VeyFM::MountSFtpURLJob::tr("Enter host password for user:");
}

QString keyOf(const MountQuestion& question)
{
    return question.host + QLatin1Char('\n') + question.message;
}

} // namespace

Questions::Questions(MountResourceJob* job, Terminal* terminal)
    : m_job(job)
    , m_terminal(terminal)
{
    connect(job, &MountResourceJob::passwordRequested, this, &Questions::askPassword);
    connect(job, &MountResourceJob::confirmationRequested, this, &Questions::askConfirmation);
}

void Questions::askPassword(const MountQuestion& question)
{
    if (question.isRetry) {
        m_terminal->say(QStringLiteral("The login was refused."));
        m_passwords.remove(keyOf(question));
    }
    // A jump host asks anew whenever the one behind it has refused a login.
    const auto known = m_passwords.constFind(keyOf(question));
    if (known != m_passwords.constEnd()) {
        m_job->answerPassword(question.user, *known);
        return;
    }
    if (isInOtherWords(question)) {
        askSecret(question, question.user, harmless(question.message));
        return;
    }
    const QString prompt = QStringLiteral("User on %1 [%2]: ").arg(question.host, question.user);
    m_terminal->ask(prompt, Terminal::Shown, [this, question](const QString& name) {
        if (name.isNull()) {
            m_job->giveUp();
        } else {
            askSecret(
                question, name.isEmpty() ? question.user : name, QStringLiteral("Password: "));
        }
    });
}

void Questions::askSecret(const MountQuestion& question, const QString& user, const QString& prompt)
{
    m_terminal->ask(prompt, Terminal::Hidden, [this, question, user](const QString& secret) {
        if (secret.isNull()) {
            m_job->giveUp();
        } else {
            m_passwords.insert(keyOf(question), secret);
            m_job->answerPassword(user, secret);
        }
    });
}

void Questions::askConfirmation(const MountQuestion& question)
{
    const QString prompt = harmless(question.message) + QLatin1Char(' ');
    m_terminal->ask(prompt, Terminal::Shown, [this](const QString& answer) {
        m_job->confirm(answer == QLatin1String("yes"));
    });
}
