// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_NEWSQUEUE_H
#define VEYFM_NEWSQUEUE_H

#include <deque>
#include <functional>
#include <memory>
#include <utility>

namespace VeyFM {

/**
 * The steps of news that are told to hosts, done in the order in which the news came.
 *
 * A slot of a host may run an event loop, a dialog say, in which newer news arrive. These can't
 * wait for the slot to return, since the slot may wait for them. So what is left of the older ones
 * is done before them, and not behind: nobody hears the past last.
 *
 * A step may tell the host of one thing, at its end. It may destroy the queue in that way, and
 * then the rest of the steps is dropped.
 */
class NewsQueue
{
public:
    using Step = std::function<void()>;

    NewsQueue() = default;
    NewsQueue(const NewsQueue&) = delete;
    NewsQueue& operator=(const NewsQueue&) = delete;

    ~NewsQueue()
    {
        m_steps->clear();
    }

    /// Does what is left of older news, then these steps.
    template <typename... Steps>
    void tell(Steps... steps)
    {
        (m_steps->push_back(std::move(steps)), ...);
        const auto left = m_steps; // Outlives this object.
        while (!left->empty()) {
            const Step step = std::move(left->front());
            left->pop_front();
            m_added = 0;
            step();
        }
    }

    /// In a step: has another follow, directly behind it and those that it has added before.
    void then(Step step)
    {
        m_steps->insert(m_steps->begin() + m_added, std::move(step));
        ++m_added;
    }

private:
    const std::shared_ptr<std::deque<Step>> m_steps = std::make_shared<std::deque<Step>>();
    int m_added = 0; // by the step that runs
};

} // namespace VeyFM

#endif
