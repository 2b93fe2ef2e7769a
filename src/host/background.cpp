// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "host/background.h"

#include <csignal>
#include <system_error>
#include <thread>

namespace VeyFM {
namespace Host {

bool startThread(std::function<void()> work)
{
    // A thread begins with the mask of its creator.
    sigset_t all;
    sigset_t before;
    ::sigfillset(&all);
    ::pthread_sigmask(SIG_SETMASK, &all, &before);
    bool isStarted = true;
    try {
        std::thread(std::move(work)).detach();
    } catch (const std::system_error&) {
        isStarted = false;
    }
    ::pthread_sigmask(SIG_SETMASK, &before, nullptr);
    return isStarted;
}

Background::Background(QObject* parent)
    : QObject(parent)
    , m_address(std::make_shared<Address>())
{
    m_address->receiver = this;
}

Background::~Background()
{
    const std::lock_guard<std::mutex> lock(m_address->lock);
    m_address->receiver = nullptr;
}

void Background::slotResult()
{
    std::function<void()> result;
    {
        const std::lock_guard<std::mutex> lock(m_address->lock);
        result = std::move(m_address->results.front());
        m_address->results.pop_front();
    }
    result();
}

} // namespace Host
} // namespace VeyFM
