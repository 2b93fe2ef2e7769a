// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "registration.h"

#include "host/boundedchild.h"
#include "service.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusMessage>

#include <chrono>

namespace VeyFM {
namespace Mount {

namespace {

constexpr std::chrono::seconds patience(1);

int forget(const QString& rootUrl)
{
    int words = 0;
    const QCoreApplication application(words, nullptr);
    QDBusMessage message = QDBusMessage::createMethodCall(
        Tool::serviceName(), QStringLiteral("/FuseMountsManager"),
        QStringLiteral("org.veylabs.FileManager.FuseMountsManager"), QStringLiteral("addMount"));
    message.setArguments({rootUrl, QString()});
    message.setAutoStartService(false);
    const QDBusMessage reply = QDBusConnection::sessionBus().call(message, QDBus::Block);
    return reply.type() == QDBusMessage::ReplyMessage ? 0 : 1;
}

} // namespace

void forgetRegistration(const QString& rootUrl)
{
    Host::runInChild([&rootUrl] { return forget(rootUrl); }, patience);
}

} // namespace Mount
} // namespace VeyFM
