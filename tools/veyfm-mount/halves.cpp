// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "halves.h"

#include <QJsonDocument>
#include <QJsonObject>

namespace VeyFM {
namespace Mount {

namespace {

const QLatin1String directoryKey("lock");
const QLatin1String rootKey("root");
const QLatin1String urlKey("url");
const QLatin1String sharedKey("shared");

} // namespace

QByteArray encode(const LockRequest& request)
{
    const QJsonObject object{
        {directoryKey, request.directory},
        {rootKey, request.mountRoot},
        {urlKey, request.url},
        {sharedKey, request.isShared}};
    return QJsonDocument(object).toJson(QJsonDocument::Compact) + '\n';
}

std::optional<LockRequest> decodeLockRequest(const MountProtocol::Line& line)
{
    const QJsonObject object =
        QJsonDocument::fromJson(QByteArray(line.data, int(line.size))).object();
    if (!object.contains(directoryKey)) {
        return std::nullopt;
    }
    LockRequest request;
    request.directory = object.value(directoryKey).toString();
    request.mountRoot = object.value(rootKey).toString();
    request.url = object.value(urlKey).toString();
    request.isShared = object.value(sharedKey).toBool();
    return request;
}

} // namespace Mount
} // namespace VeyFM
