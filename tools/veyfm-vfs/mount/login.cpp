// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/login.h"

#include "commandline.h"

#include <fcntl.h>
#include <pwd.h>
#include <unistd.h>

namespace VeyFM {
namespace Tool {

namespace {

const QString& userOption()
{
    static const QString name = QStringLiteral("user");
    return name;
}

const QString& passwordOption()
{
    static const QString name = QStringLiteral("password-fd");
    return name;
}

const QString& noInputOption()
{
    static const QString name = QStringLiteral("no-input");
    return name;
}

/// Whether the caller handed the descriptor on. Those that this program opens for itself are all
/// closed on exec, and so tell themselves apart.
bool isHandedOn(int descriptor)
{
    const int flags = ::fcntl(descriptor, F_GETFD);
    return flags >= 0 && (flags & FD_CLOEXEC) == 0;
}

} // namespace

QString loginName()
{
    char buffer[4096];
    passwd record;
    passwd* found = nullptr;
    if (::getpwuid_r(::getuid(), &record, buffer, sizeof buffer, &found) != 0 || !found) {
        return QString();
    }
    return QString::fromLocal8Bit(found->pw_name);
}

QVector<Option> loginOptions()
{
    return {
        {{userOption()}, QStringLiteral("Log in as this user"), QStringLiteral("NAME")},
        {{passwordOption()},
         QStringLiteral("Read the password from this descriptor, do not ask"),
         QStringLiteral("N"),
         {},
         true},
        {{noInputOption()}, QStringLiteral("Never ask: fail where an answer is needed")}};
}

QString whyNoLogin(const Invocation& invocation)
{
    if (invocation.isSet(userOption()) && invocation.value(userOption()).isEmpty()) {
        return QStringLiteral("the name of --user is empty");
    }
    if (!invocation.isSet(passwordOption())) {
        return QString();
    }
    const QString number = invocation.value(passwordOption());
    bool isNumber = false;
    const int descriptor = number.toInt(&isNumber);
    if (isNumber && isHandedOn(descriptor)) {
        return QString();
    }
    return QStringLiteral("descriptor %1 of --password-fd is not open").arg(number);
}

Login readLogin(const Invocation& invocation)
{
    Login login;
    login.user = invocation.value(userOption());
    login.noInput = invocation.isSet(noInputOption());
    if (invocation.isSet(passwordOption())) {
        login.passwordDescriptor = invocation.value(passwordOption()).toInt();
        // The tools that are started have no business with it.
        ::fcntl(login.passwordDescriptor, F_SETFD, FD_CLOEXEC);
    }
    return login;
}

} // namespace Tool
} // namespace VeyFM
