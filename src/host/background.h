// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_HOST_BACKGROUND_H
#define VEYFM_HOST_BACKGROUND_H

#include <QObject>

#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <utility>

namespace VeyFM {
namespace Host {

/// Runs work in a thread that nobody waits for, and in which no signal handlers run. False where
/// the system has no more threads, and nothing is done.
bool startThread(std::function<void()> work);

/**
 * Work in a thread that may hang in there for ever, such as a look at a file system whose server
 * has gone. The result comes as a call in the thread of this object, unless it was deleted before;
 * the thread then goes on alone.
 */
class Background : public QObject
{
    Q_OBJECT

public:
    explicit Background(QObject* parent = nullptr);
    ~Background() override;

    /// Calls @p done with what @p work returns. The work must own what it uses. False where there
    /// is no thread for it.
    template <typename Work, typename Done>
    bool run(Work work, Done done)
    {
        return startThread([work = std::move(work), done = std::move(done), address = m_address] {
            auto result = work();
            const std::lock_guard<std::mutex> lock(address->lock);
            if (address->receiver) {
                address->results.push_back(
                    [done, result = std::move(result)] { done(std::move(result)); });
                QMetaObject::invokeMethod(address->receiver, "slotResult", Qt::QueuedConnection);
            }
        });
    }

private Q_SLOTS:
    void slotResult();

private:
    struct Address
    {
        std::mutex lock;
        Background* receiver = nullptr;
        std::deque<std::function<void()>> results;
    };

    const std::shared_ptr<Address> m_address;
};

} // namespace Host
} // namespace VeyFM

#endif
