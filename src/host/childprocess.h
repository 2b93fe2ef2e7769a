// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_CHILDPROCESS_H
#define VEYFM_HOST_CHILDPROCESS_H

#include <QObject>
#include <QSocketNotifier>
#include <QStringList>

#include <deque>
#include <memory>
#include <vector>

#include <sys/types.h>

namespace VeyFM {
namespace Host {

class Background;

/**
 * A program that runs beside this one, and is spoken with through one socket.
 *
 * Unlike QProcess this never waits: starting copies no memory of this process and is done in a
 * thread, since the program has to be read from the disk, writing keeps what does not go at once,
 * and the destructor neither kills the program nor waits for it, but closes the socket and leaves
 * the rest to a thread. What was kept is overwritten when it has gone.
 *
 * Signals come from the event loop of the object's thread. It may be deleted in their slots.
 */
class ChildProcess : public QObject
{
    Q_OBJECT

public:
    enum Streams {
        Conversation, ///< The socket is standard input and output; standard error is ours.
        Output        ///< The socket is standard output and error; there is no input.
    };

    explicit ChildProcess(QObject* parent = nullptr);
    ~ChildProcess() override;

    /// Starts a program, which is looked for in PATH where it has no slash, in a process group of
    /// its own, with the usual signals and no other open file. What is sent meanwhile is not lost.
    void start(const QString& program, const QStringList& arguments, Streams streams);

    /// Bytes for the program; nothing once it has closed its end.
    void send(const char* bytes, size_t size);

    /// The program sees the end of its input behind what was sent.
    void closeWriting();

    /// To be read from until there is nothing more.
    int descriptor() const;

    /// No more readyRead().
    void stopReading();

    /// Sends a signal, if the process is still there.
    void kill(int signal);

Q_SIGNALS:
    /// The program can't be started, for an error as errno has them. Nothing else comes, and this
    /// not inside start().
    void failed(int error);

    /// There is something to read, or nothing will come any more.
    void readyRead();

    /// The process has ended, with a status as waitpid() tells it. There may be something left to
    /// read; no readyRead() comes behind this.
    void ended(int status);

private:
    struct Started;

    void failLater(int error);
    void takeStarted(const std::shared_ptr<Started>& started);
    void flush();
    void reap();

    pid_t m_pid = -1;
    int m_socket = -1;
    int m_handle = -1; ///< A pidfd.
    bool m_isClosing = false;
    std::deque<std::vector<char>> m_unsent;
    std::unique_ptr<QSocketNotifier> m_reading;
    std::unique_ptr<QSocketNotifier> m_writing;
    std::unique_ptr<QSocketNotifier> m_ending;
    std::unique_ptr<Background> m_starting;
};

} // namespace Host
} // namespace VeyFM

#endif
