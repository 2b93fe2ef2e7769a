// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SCRIPTEDAUTHENTICATOR_H
#define VEYFM_TESTS_SCRIPTEDAUTHENTICATOR_H

#include "jobs/authenticator.h"

#include <QStringList>

#include <functional>
#include <utility>

/**
 * Answers from lists, and writes down every call:
 *
 *   "ask [protocol domain server object] title|message|user", "retry ..." for a retry, with
 *   " +userChanged" and " +cancelled" behind it for flags that were set already
 *   "rejected user", "accepted", "question title|text"
 *
 * A question that nobody expected is written down as "unexpected" and given up.
 */
class ScriptedAuthenticator : public VeyFM::Authenticator
{
public:
    struct Answer
    {
        QString password;
        QString user;                      ///< Null to leave it.
        int userChanged = -1;              ///< Negative to leave the flag.
        int cancelled = -1;                ///< Negative to leave the flag.
        std::function<void()> before = {}; ///< Runs while the job waits.
    };

    static Answer password(const QString& password, const QString& user = QString())
    {
        return {password, user};
    }
    static Answer changeUser(const QString& user, const QString& password = QString())
    {
        return {password, user, 1};
    }
    static Answer cancel()
    {
        return {QString(), QString(), -1, 1};
    }

    QString requestPassword(
        bool isRetry, const QString& title, const QString& message, QString& user,
        bool* userChanged, bool* cancelled) override
    {
        const QString resource =
            QStringList({protocol(), domain(), server(), object()}).join(QLatin1Char(' '));
        calls.append(
            (isRetry ? QLatin1String("retry [") : QLatin1String("ask [")) + resource +
            QLatin1String("] ") + title + QLatin1Char('|') + message + QLatin1Char('|') + user +
            QLatin1String(*userChanged ? " +userChanged" : "") +
            QLatin1String(*cancelled ? " +cancelled" : ""));
        if (answers.isEmpty()) {
            calls.append(QStringLiteral("unexpected"));
            *cancelled = true;
            return QString();
        }
        const Answer answer = answers.takeFirst();
        if (answer.before) {
            answer.before();
        }
        if (!answer.user.isNull()) {
            user = answer.user;
        }
        if (answer.userChanged >= 0) {
            *userChanged = answer.userChanged != 0;
        }
        if (answer.cancelled >= 0) {
            *cancelled = answer.cancelled != 0;
        }
        return answer.password;
    }

    void credentialsRejected(const QString& user) override
    {
        calls.append(QLatin1String("rejected ") + user);
    }

    void credentialsAccepted() override
    {
        calls.append(QStringLiteral("accepted"));
        if (whenAccepted) {
            whenAccepted();
        }
    }

    bool askQuestion(const QString& title, const QString& text) override
    {
        calls.append(QLatin1String("question ") + title + QLatin1Char('|') + text);
        if (duringQuestion) {
            duringQuestion();
        }
        if (questionAnswers.isEmpty()) {
            calls.append(QStringLiteral("unexpected"));
            return false;
        }
        return questionAnswers.takeFirst();
    }

    QList<Answer> answers;
    QList<bool> questionAnswers;
    std::function<void()> duringQuestion; ///< Runs while the job waits.
    QStringList calls;
    std::function<void()> whenAccepted; ///< Runs inside credentialsAccepted().
};

#endif
