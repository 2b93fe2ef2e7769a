// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/program.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <vector>

#include <fcntl.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace Benchmarks {

namespace {

double nanoseconds(const timeval& time)
{
    return double(time.tv_sec) * 1e9 + double(time.tv_usec) * 1e3;
}

[[noreturn]] void fail(const std::vector<std::string>& words)
{
    for (const std::string& word : words) {
        std::fprintf(stderr, "%s ", word.c_str());
    }
    std::fprintf(stderr, "failed\n");
    std::exit(1);
}

} // namespace

ProgramRun runProgram(std::initializer_list<std::string> command)
{
    std::vector<std::string> words(command);
    std::vector<char*> arguments;
    for (std::string& word : words) {
        arguments.push_back(word.data());
    }
    arguments.push_back(nullptr);

    int ends[2];
    if (pipe2(ends, O_CLOEXEC) != 0) {
        fail(words);
    }
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    posix_spawn_file_actions_adddup2(&actions, ends[1], STDOUT_FILENO);

    const auto start = std::chrono::steady_clock::now();
    pid_t child = 0;
    const int spawned =
        posix_spawn(&child, arguments[0], &actions, nullptr, arguments.data(), environ);
    posix_spawn_file_actions_destroy(&actions);
    close(ends[1]);
    if (spawned != 0) {
        fail(words);
    }
    ProgramRun run;
    char buffer[256];
    for (ssize_t got; (got = read(ends[0], buffer, sizeof(buffer))) > 0;) {
        run.output.append(buffer, size_t(got));
    }
    close(ends[0]);
    int status = 0;
    rusage usage{};
    if (wait4(child, &status, 0, &usage) != child || status != 0) {
        fail(words);
    }
    const std::chrono::duration<double, std::nano> elapsed =
        std::chrono::steady_clock::now() - start;
    run.cpu = nanoseconds(usage.ru_utime) + nanoseconds(usage.ru_stime);
    run.elapsed = elapsed.count();
    return run;
}

} // namespace Benchmarks
