// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/sshserver.h"

#include "real/sandboxsystem.h"

#include <QFile>
#include <QProcess>

#include <sys/stat.h>

namespace {

const QByteArray keygen = "/usr/bin/ssh-keygen";

const char pam[] = "auth required pam_unix.so nodelay\n"
                   "account required pam_unix.so\n"
                   "session required pam_permit.so\n";

} // namespace

SshServer::SshServer(const char* host, Login login)
    : m_host(host)
    , m_login(login)
{
}

QByteArrayList SshServer::programs() const
{
    return {"/usr/sbin/sshd", "/usr/lib/openssh/sftp-server", keygen, "/usr/bin/ssh"};
}

QByteArray SshServer::directory(const char* host)
{
    return QByteArray(SandboxSystem::directory) + "/sshd-" + host;
}

QByteArray SshServer::configuration() const
{
    const bool password = m_login == Password;
    return QByteArray("ListenAddress ") + m_host +
           "\n"
           "HostKey " +
           directory(m_host) +
           "/key\n"
           "PidFile none\n"
           "LogLevel VERBOSE\n"
           "UseDNS no\n"
           "AuthorizedKeysFile none\n"
           "PubkeyAuthentication no\n"
           "PasswordAuthentication " +
           (password ? "yes\nKbdInteractiveAuthentication no\nUsePAM no\n"
                     : "no\nKbdInteractiveAuthentication yes\nUsePAM yes\n") +
           "Subsystem sftp /usr/lib/openssh/sftp-server\n";
}

bool SshServer::start()
{
    const QByteArray folder = directory(m_host);
    const QByteArray config = folder + "/sshd_config";
    // The folder that sshd empties itself into is the same for all.
    ::mkdir("/run/sshd", 0755);
    return ::mkdir(folder.constData(), 0755) == 0 &&
           SandboxSystem::writeFile(config, configuration()) &&
           (m_login == Password || SandboxSystem::replaceFile("/etc/pam.d/sshd", pam)) &&
           run({keygen, "-q", "-t", "ed25519", "-N", "", "-C", "sandbox", "-f", folder + "/key"}) &&
           listen({"/usr/sbin/sshd", "-D", "-e", "-f", config}, m_host, 22);
}

QByteArray SshServer::publicKey(const char* host)
{
    QFile file(QFile::decodeName(directory(host) + "/key.pub"));
    return file.open(QIODevice::ReadOnly) ? file.readAll().trimmed() : QByteArray();
}

QString SshServer::fingerprint(const char* host)
{
    QProcess process;
    process.start(
        QString::fromLatin1(keygen),
        {QStringLiteral("-lf"), QFile::decodeName(directory(host) + "/key.pub")});
    process.waitForFinished();
    return QString::fromLatin1(process.readAllStandardOutput()).section(QLatin1Char(' '), 1, 1);
}
