// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/sshserver.h"

#include "real/sandbox.h"
#include "real/sandboxsystem.h"

#include <QFile>
#include <QProcess>

#include <sys/stat.h>
#include <unistd.h>

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
    const char* logins = "";
    switch (m_login) {
    case Password:
        logins = "PubkeyAuthentication no\nPasswordAuthentication yes\n"
                 "KbdInteractiveAuthentication no\nUsePAM no\n";
        break;
    case KeyboardInteractive:
        logins = "PubkeyAuthentication no\nPasswordAuthentication no\n"
                 "KbdInteractiveAuthentication yes\nUsePAM yes\n";
        break;
    case Key:
        logins = "PubkeyAuthentication yes\nPasswordAuthentication no\n"
                 "KbdInteractiveAuthentication no\nUsePAM no\n";
        break;
    }
    return QByteArray("ListenAddress ") + m_host +
           "\n"
           "HostKey " +
           directory(m_host) +
           "/key\n"
           "PidFile none\n"
           "LogLevel VERBOSE\n"
           "UseDNS no\n"
           "AuthorizedKeysFile " +
           directory(m_host) + "/client.pub\n" + logins +
           "Subsystem sftp /usr/lib/openssh/sftp-server\n";
}

bool SshServer::makeClientKey() const
{
    const QByteArray file = directory(m_host) + "/client";
    return run({keygen, "-q", "-t", "ed25519", "-N", passphrase, "-C", "tester", "-f", file}) &&
           ::chown(file.constData(), Sandbox::tester.id, Sandbox::tester.id) == 0;
}

bool SshServer::start()
{
    const QByteArray folder = directory(m_host);
    const QByteArray config = folder + "/sshd_config";
    // The folder that sshd empties itself into is the same for all.
    ::mkdir("/run/sshd", 0755);
    return ::mkdir(folder.constData(), 0755) == 0 &&
           SandboxSystem::writeFile(config, configuration()) &&
           (m_login != KeyboardInteractive || SandboxSystem::replaceFile("/etc/pam.d/sshd", pam)) &&
           run({keygen, "-q", "-t", "ed25519", "-N", "", "-C", "sandbox", "-f", folder + "/key"}) &&
           (m_login != Key || makeClientKey()) &&
           listen({"/usr/sbin/sshd", "-D", "-e", "-f", config}, m_host, 22);
}

QByteArray SshServer::publicKey(const char* host)
{
    QFile file(QFile::decodeName(directory(host) + "/key.pub"));
    return file.open(QIODevice::ReadOnly) ? file.readAll().trimmed() : QByteArray();
}

QString SshServer::clientKey(const char* host)
{
    return QFile::decodeName(directory(host) + "/client");
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
