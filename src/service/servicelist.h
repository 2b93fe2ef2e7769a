// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#ifndef VEYFM_SERVICELIST_H
#define VEYFM_SERVICELIST_H

#include <QList>
#include <QMetaObject>
#include <QObject>
#include <QThread>

#include <mutex>

namespace VeyFM {

/// The records of a ServiceList that are few, or only ever asked for as a whole.
template <typename Record>
class PlainRecords
{
public:
    void assign(const QList<Record>& records)
    {
        m_records = records;
    }

    /// @param isForOthers whether the list goes to another thread
    QList<Record> list(bool isForOthers)
    {
        m_isShared = m_isShared || isForOthers;
        return m_records;
    }

    template <typename Patch>
    void change(Patch patch)
    {
        QList<Record> records;
        if (m_isShared) {
            // What other threads were given is never changed in place: Qt finds out that it is
            // shared no longer in a way that does not order their last look before the change.
            records = QList<Record>(m_records.cbegin(), m_records.cend());
            m_isShared = false;
        } else {
            records.swap(m_records);
        }
        patch(records);
        records.swap(m_records);
    }

private:
    QList<Record> m_records;
    bool m_isShared = false; // with other threads
};

/**
 * The records that a proxy keeps: read from the service once, and patched by its signals.
 *
 * The thread of the proxy alone reads and patches. Other threads get a copy of what is there, and
 * never wait for the service: the lock is held for a copy or a change, never around a call, a
 * signal or another lock.
 */
template <typename Record, typename Records = PlainRecords<Record>>
class ServiceList
{
public:
    /// @param readingSlot the slot of @p proxy that calls get(), for when another thread was first
    ServiceList(QObject* proxy, const char* readingSlot)
        : m_proxy(proxy)
        , m_readingSlot(readingSlot)
    {
    }

    /// The records, from @p read at the first call in the thread of the proxy. Another thread that
    /// comes before gets none, and has them read there later.
    template <typename Read>
    QList<Record> get(Read read)
    {
        prepare(read);
        const std::lock_guard<std::mutex> locker(m_lock);
        return m_records.list(!isOwnThread());
    }

    /// What @p look finds in the records, which are read as by get().
    template <typename Read, typename Look>
    Record find(Read read, Look look)
    {
        prepare(read);
        const std::lock_guard<std::mutex> locker(m_lock);
        return look(m_records);
    }

    /// Has @p patch change the records, if they have been read. In the thread of the proxy.
    template <typename Patch>
    void patch(Patch patch)
    {
        if (m_loaded) {
            const std::lock_guard<std::mutex> locker(m_lock);
            m_records.change(patch);
        }
    }

private:
    bool isOwnThread() const
    {
        return QThread::currentThread() == m_proxy->thread();
    }

    template <typename Read>
    void prepare(Read read)
    {
        if (!isOwnThread()) {
            askForRead();
        } else if (!m_loaded) {
            const QList<Record> records = read();
            const std::lock_guard<std::mutex> locker(m_lock);
            m_records.assign(records);
            // After a failed read too: what is not there now will be told by signals.
            m_loaded = true;
        }
    }

    void askForRead()
    {
        {
            const std::lock_guard<std::mutex> locker(m_lock);
            if (m_loaded || m_asked) {
                return;
            }
            m_asked = true;
        }
        QMetaObject::invokeMethod(m_proxy, m_readingSlot, Qt::QueuedConnection);
    }

    QObject* const m_proxy;
    const char* const m_readingSlot;
    std::mutex m_lock; // for changes, and for whatever other threads do
    Records m_records;
    bool m_loaded = false;
    bool m_asked = false;
};

} // namespace VeyFM

#endif
