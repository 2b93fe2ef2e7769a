// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Stands in for a tool that a job runs: writes down how it was started and plays what a test wants
// of it. The tests put it first on PATH under the name of the tool; see standin.h.

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <fstream>
#include <iterator>
#include <sstream>
#include <string>
#include <sys/ioctl.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <termios.h>
#include <unistd.h>
#include <vector>

namespace {

std::string base;
std::string directory; // The argument that is a path.

void append(const std::string& file, const std::string& bytes)
{
    std::ofstream(base + file, std::ios::app | std::ios::binary) << bytes;
}

std::string contents(const std::string& path)
{
    std::ifstream file(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

// The first free number is the number of this run. The caller runs one tool at a time.
bool claimRun(const std::string& prefix)
{
    for (int run = 1; run < 1000; ++run) {
        base = prefix + '.' + std::to_string(run);
        const int fd = open((base + ".args").c_str(), O_CREAT | O_EXCL | O_WRONLY, 0600);
        if (fd >= 0) {
            close(fd);
            return true;
        }
        if (errno != EEXIST) {
            return false;
        }
    }
    return false;
}

std::string unescaped(const std::string& text)
{
    std::string result;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\\' && i + 1 < text.size()) {
            ++i;
            result += text[i] == 'n' ? '\n' : text[i] == '0' ? '\0' : text[i];
        } else {
            result += text[i];
        }
    }
    return result;
}

void print(int fd, const std::string& text)
{
    size_t done = 0;
    while (done < text.size()) {
        const ssize_t written = write(fd, text.data() + done, text.size() - done);
        if (written <= 0) {
            _exit(98);
        }
        done += size_t(written);
    }
}

// Up to the end of the line, one byte at a time: what follows is for the next answer.
void readLine()
{
    std::string line;
    char c = 0;
    while (read(STDIN_FILENO, &c, 1) == 1) {
        line += c;
        if (c == '\n') {
            break;
        }
    }
    append(".input", line);
}

void setEcho(bool on)
{
    termios mode;
    if (tcgetattr(STDIN_FILENO, &mode) != 0) {
        _exit(97);
    }
    mode.c_lflag = on ? mode.c_lflag | ECHO : mode.c_lflag & ~tcflag_t(ECHO);
    tcsetattr(STDIN_FILENO, TCSANOW, &mode);
}

// Until what was printed on a pipe has been read, so that what comes next is another read.
void waitForReader()
{
    int waiting = 1;
    while (ioctl(STDERR_FILENO, FIONREAD, &waiting) == 0 && waiting > 0) {
        usleep(500);
    }
}

sigset_t only(int signal)
{
    sigset_t set;
    sigemptyset(&set);
    sigaddset(&set, signal);
    return set;
}

void maskSignal(int how, int signal)
{
    const sigset_t set = only(signal);
    sigprocmask(how, &set, nullptr);
}

void waitForSignal(int signal)
{
    const sigset_t set = only(signal);
    int received = 0;
    sigwait(&set, &received);
    append(".signals", std::to_string(received) + '\n');
}

void waitForEver()
{
    // A test that went wrong leaves nothing behind.
    alarm(90);
    while (true) {
        pause();
    }
}

void finishSlowly()
{
    const pid_t child = fork();
    if (child == 0) {
        usleep(300000);
        append(".finished", "");
        _exit(0);
    }
    waitpid(child, nullptr, 0);
}

// A file system that nobody serves, and that is dead as soon as this process ends.
void mountDirectory()
{
    const int device = open("/dev/fuse", O_RDWR | O_CLOEXEC);
    const std::string options = "rootmode=40000,user_id=0,group_id=0,fd=" + std::to_string(device);
    if (device < 0 ||
        mount("standin", directory.c_str(), "fuse", MS_NOSUID | MS_NODEV, options.c_str()) != 0) {
        _exit(92);
    }
}

// As a tool that serves a mount in the background: a program of its own, which prints a line when
// it has mounted.
void serveDirectory(const std::string& words)
{
    std::istringstream stream(words);
    std::vector<std::string> texts{std::istream_iterator<std::string>(stream), {}};
    texts.insert(texts.begin() + 1, directory);
    std::vector<char*> arguments;
    for (std::string& text : texts) {
        arguments.push_back(text.data());
    }
    arguments.push_back(nullptr);
    int mounted[2];
    if (pipe2(mounted, O_CLOEXEC) != 0) {
        _exit(92);
    }
    if (fork() == 0) {
        setsid();
        const int nowhere = open("/dev/null", O_RDWR | O_CLOEXEC);
        dup2(nowhere, STDIN_FILENO);
        dup2(nowhere, STDERR_FILENO);
        dup2(mounted[1], STDOUT_FILENO);
        execv(arguments[0], arguments.data());
        _exit(92);
    }
    close(mounted[1]);
    char c = 0;
    if (read(mounted[0], &c, 1) != 1) {
        _exit(92);
    }
}

// The nearest ancestor that is veyfm-vfs.
pid_t program()
{
    pid_t pid = getppid();
    while (pid > 1) {
        const std::string stat = contents("/proc/" + std::to_string(pid) + "/stat");
        if (stat.find(" (veyfm-vfs) ") != std::string::npos) {
            return pid;
        }
        const size_t state = stat.rfind(')') + 2;
        pid = stat.size() > state + 2 ? std::atoi(stat.c_str() + state + 2) : 0;
    }
    _exit(91);
}

void play(const std::string& line)
{
    const size_t blank = line.find(' ');
    const std::string verb = line.substr(0, blank);
    const std::string rest = blank == std::string::npos ? std::string() : line.substr(blank + 1);
    if (verb == "out") {
        print(STDOUT_FILENO, unescaped(rest));
    } else if (verb == "err") {
        print(STDERR_FILENO, unescaped(rest));
    } else if (verb == "read") {
        readLine();
    } else if (verb == "echo") {
        setEcho(rest == "on");
    } else if (verb == "drained") {
        waitForReader();
    } else if (verb == "block") {
        maskSignal(SIG_BLOCK, std::atoi(rest.c_str()));
    } else if (verb == "unblock") {
        maskSignal(SIG_UNBLOCK, std::atoi(rest.c_str()));
    } else if (verb == "await") {
        waitForSignal(std::atoi(rest.c_str()));
    } else if (verb == "hang") {
        waitForEver();
    } else if (verb == "fork") {
        const pid_t child = fork();
        if (child == 0) {
            waitForEver();
        }
        append(".child", std::to_string(child));
    } else if (verb == "finish") {
        finishSlowly();
    } else if (verb == "mount") {
        mountDirectory();
    } else if (verb == "serve") {
        serveDirectory(rest);
    } else if (verb == "interrupt") {
        kill(program(), SIGINT);
        raise(SIGINT);
    } else if (verb == "kill") {
        raise(std::atoi(rest.c_str()));
    } else if (verb == "exit") {
        _exit(std::atoi(rest.c_str()));
    } else {
        _exit(96);
    }
}

} // namespace

int main(int argc, char** argv)
{
    const char* const directory = std::getenv("VEYFM_STANDIN");
    if (!directory) {
        return 95;
    }
    // A test that went wrong leaves nothing behind.
    alarm(90);
    const std::string path = argv[0];
    const std::string tool = std::string(directory) + '/' + path.substr(path.find_last_of('/') + 1);
    if (!claimRun(tool)) {
        return 94;
    }
    for (int i = 1; i < argc; ++i) {
        append(".args", std::string(argv[i]) + '\0');
        if (argv[i][0] == '/' && argv[i][1] != '/') {
            ::directory = argv[i];
        }
    }
    append(".status", contents("/proc/self/status"));
    for (int fd = STDERR_FILENO + 1; fd < 100; ++fd) {
        if (fcntl(fd, F_GETFD) >= 0) {
            append(".descriptors", std::to_string(fd) + '\0');
        }
    }
    append(".env", contents("/proc/self/environ"));
    append(".cmdline", contents("/proc/self/cmdline"));
    append(".pid", std::to_string(getpid()));

    std::ifstream scenario(base + ".play");
    if (!scenario) {
        return 93; // Nobody expected this run.
    }
    std::string line;
    while (std::getline(scenario, line)) {
        if (!line.empty()) {
            play(line);
        }
    }
    return 0;
}
