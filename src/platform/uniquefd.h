// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYSU_UNIQUEFD_H
#define VEYSU_UNIQUEFD_H

#include <unistd.h>

#include <utility>

namespace VeySu {

/// Owns a file descriptor; -1 stands for none.
class UniqueFd
{
public:
    UniqueFd() = default;
    explicit UniqueFd(int fd)
        : m_fd(fd)
    {
    }
    UniqueFd(UniqueFd&& other) noexcept
        : m_fd(std::exchange(other.m_fd, -1))
    {
    }
    UniqueFd& operator=(UniqueFd&& other) noexcept
    {
        std::swap(m_fd, other.m_fd);
        return *this;
    }
    ~UniqueFd()
    {
        if (m_fd >= 0) {
            close(m_fd);
        }
    }

    bool isValid() const
    {
        return m_fd >= 0;
    }
    int get() const
    {
        return m_fd;
    }

private:
    int m_fd = -1;
};

} // namespace VeySu

#endif
