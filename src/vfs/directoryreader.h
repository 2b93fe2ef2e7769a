// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_DIRECTORYREADER_H
#define VEYFM_DIRECTORYREADER_H

#include <QByteArray>

#include <cerrno>
#include <memory>

#include <dirent.h>

namespace VeyFM {

/**
 * Reads the records of one directory, for one thread: what childs(), hasChilds() and
 * containsDirsOrPlaces() have in common. Its stream is closed with it.
 *
 * A signal that interrupts the system neither keeps a directory closed nor ends it early. Any
 * other error reads as the end.
 */
class DirectoryReader
{
public:
    /// Opens a directory. A path with a NUL names none: the system would end it there, and open
    /// another one.
    explicit DirectoryReader(const QByteArray& path);

    bool isOpen() const
    {
        return m_stream != nullptr;
    }

    /**
     * The next record, valid until the one behind it is read, or null at the end.
     *
     * A stream of one's own is safe to read with readdir(3) in any thread; readdir_r(3) is
     * deprecated and fails on long names.
     */
    const dirent* next()
    {
        const dirent* record = nullptr;
        if (m_stream) {
            do {
                errno = 0;
                record = ::readdir(m_stream.get());
            } while (!record && errno == EINTR);
        }
        return record;
    }

    /// Of an open directory. It belongs to the stream.
    int descriptor() const
    {
        return ::dirfd(m_stream.get());
    }

    /// Leaves the stream open for good.
    void abandon()
    {
        (void)m_stream.release();
    }

    static bool isDots(const char* name)
    {
        return name[0] == '.' && (name[1] == '\0' || (name[1] == '.' && name[2] == '\0'));
    }

private:
    struct Close
    {
        void operator()(DIR* stream) const
        {
            ::closedir(stream);
        }
    };

    std::unique_ptr<DIR, Close> m_stream;
};

} // namespace VeyFM

#endif
