// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "mount/networkmounts.h"

#include "host/mountinfo.h"

#include <QDir>
#include <QStringList>
#include <QUrl>

#include <algorithm>

namespace VeyFM {
namespace Tool {

using Host::KernelMount;
using Host::kernelPath;

namespace {

const QLatin1Char slash('/');

bool isAtOrBelow(const QString& path, const QString& directory)
{
    return path == directory || path.startsWith(directory + slash);
}

/// The URL that leads to a directory below the root of the mounts, "sftp/me@host~" to the home
/// directory of "me". Empty for a directory that no job makes.
QString urlOfDirectory(const QString& relative)
{
    const QStringList parts = relative.split(slash);
    const QString scheme = parts.constFirst();
    const bool isSftp = scheme == QLatin1String("sftp");
    if (parts.size() != 2 || (!isSftp && scheme != QLatin1String("ftp"))) {
        return QString();
    }
    QString account = parts.constLast();
    const bool isHome = isSftp && account.endsWith(QLatin1Char('~'));
    if (isHome) {
        account.chop(1);
    }
    const int at = account.lastIndexOf(QLatin1Char('@'));
    QUrl url;
    url.setScheme(scheme);
    url.setHost(account.mid(at + 1), QUrl::DecodedMode);
    if (at > 0) {
        url.setUserName(account.left(at), QUrl::DecodedMode);
    }
    url.setPath(isHome ? QStringLiteral("/~/") : QString(slash));
    return url.isValid() && !url.host().isEmpty() ? url.toString() : QString();
}

/// The lines as they grow.
class Collection
{
public:
    Collection(const MountInfo& kernel, const QString& root)
        : m_kernel(kernel)
        , m_root(root)
        , m_kernelRoot(kernelPath(root, root))
    {
    }

    void addDirectory(const QString& url, const QString& directory)
    {
        add(url, directory, QString());
    }

    void addPlace(const QString& url, const Entry& place)
    {
        const QString path = kernelPath(place.localPath(), m_root);
        bool isHeld = false;
        for (Line& line : m_lines) {
            const bool isFree =
                line.mount.placePath.isEmpty() || line.mount.placePath == place.path();
            if (isFree && isAtOrBelow(path, line.kernelPath)) {
                line.mount.placePath = place.path();
                isHeld = true;
            }
        }
        if (isHeld) {
            return;
        }
        const QString mountPoint = fuseMountAbove(path);
        add(url, mountPoint.isEmpty() ? QDir::cleanPath(place.localPath()) : mountPoint,
            place.path());
    }

    void addRest(const QString& state)
    {
        const QVector<KernelMount> mounts = m_kernel.mounts();
        for (const KernelMount& mount : mounts) {
            const bool isNew = std::none_of(m_lines.begin(), m_lines.end(), [&](const Line& line) {
                return line.kernelPath == mount.directory;
            });
            if (isNew && isOfJobs(mount)) {
                const QString relative = mount.directory.mid(m_kernelRoot.size() + 1);
                m_lines.append(
                    {mount.directory, {urlOfDirectory(relative), mount.directory, state, {}}});
            }
        }
    }

    QVector<NetworkMount> sorted()
    {
        std::stable_sort(m_lines.begin(), m_lines.end(), [](const Line& left, const Line& right) {
            return left.kernelPath < right.kernelPath;
        });
        QVector<NetworkMount> mounts;
        for (const Line& line : qAsConst(m_lines)) {
            mounts.append(line.mount);
        }
        return mounts;
    }

private:
    struct Line
    {
        QString kernelPath;
        NetworkMount mount;
    };

    bool isOfJobs(const KernelMount& mount) const
    {
        return mount.isFuse() && mount.directory.startsWith(m_kernelRoot + slash);
    }

    QString fuseMountAbove(const QString& path) const
    {
        const QVector<KernelMount> mounts = m_kernel.mounts();
        const auto found =
            std::find_if(mounts.begin(), mounts.end(), [&](const KernelMount& mount) {
                return isOfJobs(mount) && isAtOrBelow(path, mount.directory);
            });
        return found == mounts.end() ? QString() : found->directory;
    }

    void add(const QString& url, const QString& directory, const QString& placePath)
    {
        const QString path = kernelPath(directory, m_root);
        QString state = QStringLiteral("unknown");
        if (m_kernel.why().isEmpty()) {
            state =
                m_kernel.isMountPoint(path) ? QStringLiteral("mounted") : QStringLiteral("stale");
        }
        m_lines.append({path, {url, directory, state, placePath}});
    }

    const MountInfo& m_kernel;
    const QString m_root;
    const QString m_kernelRoot;
    QVector<Line> m_lines;
};

} // namespace

QVector<NetworkMount>
networkMounts(const RegisteredMounts& registered, const MountInfo& kernel, const QString& root)
{
    Collection all(kernel, root);
    for (auto it = registered.directories.cbegin(); it != registered.directories.cend(); ++it) {
        all.addDirectory(it.key(), it.value());
    }
    for (auto it = registered.places.cbegin(); it != registered.places.cend(); ++it) {
        all.addPlace(it.key(), it.value());
    }
    // Where the service could not tell what it has, nobody knows what it has not.
    all.addRest(registered.isKnown ? QStringLiteral("unregistered") : QStringLiteral("mounted"));
    return all.sorted();
}

} // namespace Tool
} // namespace VeyFM
