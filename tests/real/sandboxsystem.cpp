// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/sandboxsystem.h"

#include "real/sandbox.h"

#include <QDir>
#include <QFile>

#include <cerrno>
#include <crypt.h>
#include <cstring>
#include <fcntl.h>
#include <net/if.h>
#include <sched.h>
#include <sys/ioctl.h>
#include <sys/mount.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>

namespace {

constexpr unsigned fuseGroup = 2100;

const char hosts[] = "127.0.0.1 localhost sandbox\n"
                     "127.0.0.11 server.test server\n"
                     "127.0.0.12 other.test\n"
                     "127.0.0.13 closed.test\n"
                     "127.0.0.14 key.test\n"
                     "127.0.0.15 stalled.test\n";

// Files alone: neither a name service of the machine nor a network is asked.
const char nameServices[] = "passwd: files\n"
                            "group: files\n"
                            "shadow: files\n"
                            "hosts: files\n"
                            "services: files\n"
                            "protocols: files\n";

QString failure(const char* what)
{
    return QStringLiteral("no sandbox: %1: %2")
        .arg(QString::fromUtf8(what), QString::fromLocal8Bit(std::strerror(errno)));
}

bool mountMemory(const char* path)
{
    return ::mount("tmpfs", path, "tmpfs", 0, "mode=0755") == 0;
}

bool bind(const QByteArray& source, const QByteArray& target)
{
    return ::mount(source.constData(), target.constData(), nullptr, MS_BIND | MS_REC, nullptr) == 0;
}

bool makeDirectory(const QByteArray& path, unsigned mode = 0755, unsigned owner = 0)
{
    return ::mkdir(path.constData(), 0700) == 0 && ::chmod(path.constData(), mode) == 0 &&
           ::chown(path.constData(), owner, owner) == 0;
}

bool makeFile(const QByteArray& path, const QByteArray& content, unsigned owner)
{
    return SandboxSystem::writeFile(path, content) && ::chown(path.constData(), owner, owner) == 0;
}

bool makeHome(const SandboxAccount& account)
{
    const QByteArray home = QFile::encodeName(Sandbox::home(account));
    return makeDirectory(home, 0755, account.id) &&
           makeFile(home + "/name.txt", account.name, account.id) &&
           makeDirectory(home + "/papers", 0755, account.id) &&
           makeFile(home + "/papers/draft.txt", {}, account.id);
}

bool raiseLoopback()
{
    ifreq request = {};
    std::strcpy(request.ifr_name, "lo");
    const int fd = ::socket(AF_INET, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    request.ifr_flags = IFF_UP | IFF_RUNNING;
    const bool raised = fd >= 0 && ::ioctl(fd, SIOCSIFFLAGS, &request) == 0;
    ::close(fd);
    return raised;
}

// As Debian has it where the package fuse makes the group: for its members alone.
bool makeFuseDevice()
{
    const QByteArray node = QByteArray(SandboxSystem::directory) + "/fuse";
    return ::mknod(node.constData(), S_IFCHR | 0600, makedev(10, 229)) == 0 &&
           ::chown(node.constData(), 0, fuseGroup) == 0 && ::chmod(node.constData(), 0660) == 0 &&
           bind(node, "/dev/fuse");
}

bool makeAccounts()
{
    QByteArray users = "root:x:0:0::/root:/bin/sh\n"
                       "sshd:x:102:65534::/run/sshd:/usr/sbin/nologin\n"
                       "nobody:x:65534:65534::/nonexistent:/usr/sbin/nologin\n";
    QByteArray groups = "root:x:0:\nnogroup:x:65534:\n"
                        "fuse:x:" +
                        QByteArray::number(fuseGroup) + ":" + Sandbox::tester.name + "\n";
    QByteArray passwords = "root:*:19000::::::\nsshd:*:19000::::::\nnobody:*:19000::::::\n";
    bool made = makeDirectory(QByteArray(SandboxSystem::directory) + "/home");
    for (const SandboxAccount& account : {Sandbox::tester, Sandbox::alice, Sandbox::bob}) {
        const QByteArray name = account.name;
        const QByteArray id = QByteArray::number(account.id);
        const QByteArray home = QFile::encodeName(Sandbox::home(account));
        users += name + ":x:" + id + ":" + id + "::" + home + ":/bin/sh\n";
        groups += name + ":x:" + id + ":\n";
        passwords += name + ":" + QByteArray(::crypt(account.password, "$5$rounds=1000$sandbox$")) +
                     ":19000::::::\n";
        made = made && makeHome(account);
    }
    return made && SandboxSystem::replaceFile("/etc/passwd", users) &&
           SandboxSystem::replaceFile("/etc/group", groups) &&
           SandboxSystem::replaceFile("/etc/shadow", passwords, 0600);
}

} // namespace

QString SandboxSystem::prepare()
{
    if (::unshare(CLONE_NEWNS | CLONE_NEWNET | CLONE_NEWIPC | CLONE_NEWUTS) != 0) {
        return failure("namespaces");
    }
    if (::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0 ||
        ::mount("proc", "/proc", "proc", MS_NOSUID | MS_NODEV | MS_NOEXEC, nullptr) != 0 ||
        !mountMemory("/run") || !mountMemory("/var/log")) {
        return failure("mounts");
    }
    ::umask(022);
    if (!makeDirectory(directory) || !makeDirectory(logDirectory) ||
        !makeDirectory(QByteArray(directory) + "/files") ||
        !makeDirectory(QByteArray(directory) + "/tmp", 01777) ||
        !makeDirectory(QByteArray(directory) + "/user", 0700, Sandbox::tester.id)) {
        return failure(directory);
    }
    if (!replaceFile("/etc/hosts", hosts) || !replaceFile("/etc/nsswitch.conf", nameServices) ||
        !makeAccounts()) {
        return failure("accounts");
    }
    if (::sethostname("sandbox", 7) != 0 || !raiseLoopback()) {
        return failure("loopback");
    }
    if (!makeFuseDevice()) {
        return failure("/dev/fuse");
    }
    return QString();
}

bool SandboxSystem::writeFile(const QByteArray& path, const QByteArray& content, unsigned mode)
{
    QFile file(QFile::decodeName(path));
    return file.open(QIODevice::WriteOnly) && ::fchmod(file.handle(), mode) == 0 &&
           file.write(content) == content.size();
}

bool SandboxSystem::replaceFile(const QByteArray& path, const QByteArray& content, unsigned mode)
{
    QByteArray name = path.mid(1);
    const QByteArray file = QByteArray(directory) + "/files/" + name.replace('/', '-');
    return writeFile(file, content, mode) && bind(file, path);
}

bool SandboxSystem::replaceDirectory(const QByteArray& path)
{
    return mountMemory(path.constData());
}

QByteArray SandboxSystem::logs()
{
    QByteArray result;
    const QDir folder(QString::fromLatin1(logDirectory));
    const QStringList names = folder.entryList(QDir::Files);
    for (const QString& name : names) {
        QFile file(folder.filePath(name));
        if (file.open(QIODevice::ReadOnly)) {
            result += "--- " + name.toLocal8Bit() + '\n' + file.readAll();
        }
    }
    return result;
}
