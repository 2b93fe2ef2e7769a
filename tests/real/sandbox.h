// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_TESTS_SANDBOX_H
#define VEYFM_TESTS_SANDBOX_H

#include "real/sandboxserver.h"

#include <QByteArrayList>
#include <QCoreApplication>
#include <QString>
#include <QTest>

#include <functional>
#include <memory>
#include <vector>

/// An account of the sandbox. Its home is /run/sandbox/home/<name>, and holds "name.txt", which has
/// the name, and a folder "papers" with an empty "draft.txt".
struct SandboxAccount
{
    const char* name;
    const char* password;
    unsigned id; ///< Of the user and of the group of the same name.
};

/**
 * A small machine for tests with real servers and real mounts: mount, network, process, IPC and
 * host name namespaces of the test's own. In there
 *
 *   - the first process is root and runs the servers; all ends with it, mounts and network too,
 *   - the tests run as the user `tester`, who is in the group `fuse` and may open /dev/fuse for
 *     that alone, without a terminal,
 *   - `alice` and `bob` have accounts on the servers, and the three homes are different,
 *   - there is loopback and nothing else: server.test (or server), other.test, key.test,
 *     stalled.test and closed.test, which nobody listens on, are addresses of their own, so each
 *     server has its usual port; so is ::1, where the machine knows IPv6,
 *   - /run is empty, and everything is written below it, in memory: HOME, the XDG folders and
 *     temporary files of the tests too. Nothing is left on the disk, however the test ends.
 *
 * Sandboxes know nothing of each other and may run side by side. They need root; where they can't
 * be had, the tests run outside and skip.
 *
 *   int main(int argc, char** argv)
 *   {
 *       Sandbox sandbox({"/usr/bin/sshfs"});
 *       sandbox.addServer(std::make_unique<SomeServer>());
 *       return sandbox.run([&] { return runSandboxTests<SomeTest>(argc, argv); });
 *   }
 *
 * That is before anything has threads, and before QCoreApplication.
 */
class Sandbox
{
public:
    static constexpr SandboxAccount tester = {"tester", "quill-0-tester", 2000};
    static constexpr SandboxAccount alice = {"alice", "amber-1-alice", 2001};
    static constexpr SandboxAccount bob = {"bob", "basalt-2-bob", 2002};
    static constexpr const char* wrongPassword = "cobalt-3-wrong";

    static constexpr const char* serverHost = "server.test";
    static constexpr const char* otherHost = "other.test";
    static constexpr const char* closedHost = "closed.test";
    static constexpr const char* keyHost = "key.test";
    static constexpr const char* stalledHost = "stalled.test"; ///< See StallingServer.

    /// Takes the programs, by absolute path, without which the tests skip.
    explicit Sandbox(const QByteArrayList& programs = {});
    Sandbox(const Sandbox&) = delete;
    Sandbox& operator=(const Sandbox&) = delete;

    /// Servers start in this order, before the tests.
    void addServer(std::unique_ptr<SandboxServer> server);

    /**
     * Runs the tests in the sandbox and returns their exit code, which is 77 when they had to
     * skip. It returns in the process of the tests; that which called it ends here with the same
     * code.
     */
    int run(const std::function<int()>& tests);

    /// Whether this process is in a sandbox, as far as it knows; why not, if it isn't. @{
    static bool isEntered();
    static QString skipReason();
    /// @}

    /// Whether ::1 is a host here.
    static bool hasVersion6();

    /// The home of an account.
    static QString home(const SandboxAccount& account);

    /// "/run/sandbox", where servers may have folders of their own.
    static QString directory();

private:
    QString missingPrograms() const;
    bool startServers() const;
    int runFirstProcess(const std::function<int()>& tests);
    static int runTests(const std::function<int()>& tests);

    QByteArrayList m_programs;
    std::vector<std::unique_ptr<SandboxServer>> m_servers;
};

/// Skips the test where there is no sandbox. For init(), so that each test says so.
#define SKIP_WITHOUT_SANDBOX()                                                                     \
    do {                                                                                           \
        if (!Sandbox::isEntered())                                                                 \
            QSKIP(qPrintable(Sandbox::skipReason()));                                              \
    } while (false)

/// What run() is given: the tests of a class.
template <typename Tests>
int runSandboxTests(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    Tests tests;
    return QTest::qExec(&tests, argc, argv);
}

#endif
