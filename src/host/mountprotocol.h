// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_MOUNTPROTOCOL_H
#define VEYFM_MOUNTPROTOCOL_H

#include "host/linereader.h"

#include <QByteArray>
#include <QString>

#include <optional>

namespace VeyFM {

/**
 * What a host and veyfm-mount say to each other: JSON, a value a line. docs/mount-protocol.md
 * describes it. A password is a line of its own, see secretline.h.
 */
namespace MountProtocol {

constexpr int version = 1;
constexpr int longestLine = 65536;    ///< Bytes, without the end of the line.
constexpr int longestText = 16384;    ///< Bytes of a text for the user, as it is written.
constexpr int longestPassword = 1024; ///< Bytes of its UTF-8.

/// What a host says.
struct Request
{
    enum Kind {
        Mount,  ///< The first one: url, user.
        Answer, ///< id, reply, and user for a login.
        Cancel,
        Take ///< The mount is the host's from now on.
    };
    enum Reply {
        No,
        Yes,
        Login,   ///< With a password, where hasPassword says so, in the next line.
        GivenUp, ///< The person did.
    };

    Kind kind = Cancel;
    QString url;
    QString user;        ///< Null where it was left out: as it is.
    int patience = 5000; ///< Milliseconds that a look at what is mounted may take.
    int id = 0;
    Reply reply = GivenUp;
    bool hasPassword = false;
    bool isLast =
        false; ///< Of a login: when it is refused the mount ends, and nothing more is tried.
};

/// A question for the user.
struct Question
{
    enum Kind { Confirm, Password };

    Kind kind = Confirm;
    int id = 0;
    QString title;
    QString message;
    QString user;     ///< That is known so far; may be empty. This and what follows: for passwords.
    QString protocol; ///< See Authenticator.
    QString host;
    QString domain;
    QString object;
    bool isRetry = false; ///< Whether an earlier answer was refused.
};

/// How it ended.
struct End
{
    enum Mounted {
        New,     ///< Now.
        Present, ///< It was mounted before.
        Reached  ///< A Samba URL, for which nothing is mounted.
    };

    int code = 0; ///< See Job; nothing but the text and the directory hold for others than 0.
    QString text;
    QString url;  ///< With the user that was taken in the end.
    QString path; ///< In the tree of places; empty where there is none.
    QString localPath;
    /// That the root of the URL is mounted on. With a failure, where there is a mount all the same:
    /// there was, or the path below it is missing.
    QString directory;
    Mounted mounted = New;
    bool isShared = false; ///< Whether the service knows of the mount.
    QString why;           ///< Why it does not.
};

/// What veyfm-mount says.
struct Report
{
    enum Kind {
        Ready,    ///< The first one: text is the program and its version.
        Waiting,  ///< text says for what.
        Asked,    ///< question.
        Rejected, ///< user.
        Accepted,
        Ended ///< end; the last one.
    };

    Kind kind = Ready;
    QString text;
    QString user;
    Question question;
    End end;
};

/// A line, with its end. Texts of others are cut at longestText; a report that is too long all the
/// same becomes a failure. @{
QByteArray encode(const Request& request);
QByteArray encode(const Report& report);
/// @}

/// What a line says; nothing, with the reason in @p why, where it says none of it. @{
std::optional<Request> decodeRequest(const Line& line, QString* why);
std::optional<Report> decodeReport(const Line& line, QString* why);
/// @}

} // namespace MountProtocol
} // namespace VeyFM

#endif
