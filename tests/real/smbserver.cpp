// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "real/smbserver.h"

#include "real/sandbox.h"
#include "real/sandboxsystem.h"

#include <algorithm>
#include <array>
#include <sys/stat.h>

namespace {

const char configuration[] = R"([global]
    server role = standalone server
    workgroup = SANDBOX
    smb ports = 445
    interfaces = 127.0.0.11/8
    bind interfaces only = yes
    disable netbios = yes
    map to guest = Bad User
    load printers = no
    printcap name = /dev/null
    disable spoolss = yes
[public]
    path = /run/sandbox/home/bob
    guest ok = yes
[private]
    path = /run/sandbox/home/alice
    valid users = alice
[public -Tc .profile name.txt]
    path = /run/sandbox/home/bob
    guest ok = yes
)";

} // namespace

QByteArrayList SmbServer::programs() const
{
    return {"/usr/sbin/smbd", "/usr/bin/smbpasswd"};
}

bool SmbServer::start()
{
    return hideSystemFiles() && SandboxSystem::writeFile("/etc/samba/smb.conf", configuration) &&
           addUser(Sandbox::alice) && addUser(Sandbox::bob) &&
           listen(
               {"/usr/sbin/smbd", "--foreground", "--no-process-group", "--debug-stdout"},
               Sandbox::serverHost, 445);
}

bool SmbServer::hideSystemFiles()
{
    constexpr std::array<const char*, 3> hidden = {
        "/etc/samba", "/var/cache/samba", "/var/lib/samba"};
    constexpr std::array<const char*, 3> made = {
        "/run/samba", "/var/lib/samba/private", "/var/log/samba"};
    return std::all_of(
               hidden.begin(), hidden.end(),
               [](const char* path) { return SandboxSystem::replaceDirectory(path); }) &&
           std::all_of(
               made.begin(), made.end(), [](const char* path) { return ::mkdir(path, 0755) == 0; });
}

bool SmbServer::addUser(const SandboxAccount& account)
{
    const QByteArray password = account.password;
    return run({"/usr/bin/smbpasswd", "-s", "-a", account.name}, password + '\n' + password + '\n');
}
