// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

#include "support/slowdirectory.h"

#include <QByteArray>
#include <QFile>

#include <cerrno>
#include <cstring>
#include <dirent.h>
#include <fcntl.h>
#include <linux/fuse.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <unistd.h>

namespace {

QString failure(const char* call)
{
    return QStringLiteral("%1: %2").arg(
        QLatin1String(call), QString::fromLocal8Bit(std::strerror(errno)));
}

fuse_attr directoryAttributes(quint64 node)
{
    fuse_attr attributes = {};
    attributes.ino = node;
    attributes.mode = S_IFDIR | 0755;
    attributes.nlink = 2;
    return attributes;
}

} // namespace

SlowDirectory::SlowDirectory(Kind kind, const QString& mountPoint)
    : m_kind(kind)
    , m_mountPoint(mountPoint)
{
    m_mounted = mount();
    if (m_mounted) {
        m_thread = std::thread(&SlowDirectory::serve, this);
    }
}

SlowDirectory::~SlowDirectory()
{
    release();
    // The device ends with ENODEV once the last user of the mount has gone.
    if (m_mounted) {
        ::umount2(QFile::encodeName(m_mountPoint).constData(), MNT_DETACH);
    }
    if (m_thread.joinable()) {
        m_thread.join();
    }
    if (m_descriptor >= 0) {
        ::close(m_descriptor);
    }
}

bool SlowDirectory::mount()
{
    m_descriptor = ::open("/dev/fuse", O_RDWR | O_CLOEXEC);
    if (m_descriptor < 0) {
        m_problem = failure("/dev/fuse");
        return false;
    }
    if (::unshare(CLONE_NEWNS) != 0 ||
        ::mount("none", "/", nullptr, MS_REC | MS_PRIVATE, nullptr) != 0) {
        m_problem = failure("mount namespace");
        return false;
    }
    const QByteArray options =
        "rootmode=40000,user_id=0,group_id=0,fd=" + QByteArray::number(m_descriptor);
    if (::mount(
            "slow", QFile::encodeName(m_mountPoint).constData(), "fuse", MS_NOSUID | MS_NODEV,
            options.constData()) != 0) {
        m_problem = failure("mount");
        return false;
    }
    return true;
}

QString SlowDirectory::problem() const
{
    return m_problem;
}

int SlowDirectory::progress() const
{
    return m_progress;
}

void SlowDirectory::release()
{
    m_released = true;
    const quint64 id = m_waiting.exchange(0);
    if (id != 0) {
        answer(id, EIO, nullptr, 0);
    }
}

void SlowDirectory::answer(quint64 id, int error, const void* data, size_t size)
{
    fuse_out_header header = {};
    header.len = uint32_t(sizeof header + size);
    header.error = -error;
    header.unique = id;
    iovec parts[] = {{&header, sizeof header}, {const_cast<void*>(data), size}};
    // Who asked may have been killed meanwhile; then there is nobody to answer.
    if (::writev(m_descriptor, parts, size > 0 ? 2 : 1) < 0) {
        return;
    }
}

void SlowDirectory::answerLookup(quint64 id, const char* name)
{
    fuse_entry_out reply = {};
    reply.nodeid = FUSE_ROOT_ID + 1;
    reply.attr = directoryAttributes(reply.nodeid);
    if (std::strcmp(name, "a") == 0) {
        answer(id, 0, &reply, sizeof reply);
    } else {
        answer(id, ENOENT, nullptr, 0);
    }
}

void SlowDirectory::answerNames(quint64 id, quint64 offset, size_t size)
{
    QByteArray records;
    for (;;) {
        const QByteArray name = "file-" + QByteArray::number(offset + 1);
        const size_t recordSize = FUSE_DIRENT_ALIGN(FUSE_NAME_OFFSET + size_t(name.size()));
        if (size_t(records.size()) + recordSize > size) {
            break;
        }
        fuse_dirent record = {};
        record.ino = offset + 2;
        record.off = ++offset;
        record.namelen = uint32_t(name.size());
        record.type = DT_REG;
        QByteArray bytes(int(recordSize), '\0');
        std::memcpy(bytes.data(), &record, FUSE_NAME_OFFSET);
        std::memcpy(bytes.data() + FUSE_NAME_OFFSET, name.constData(), size_t(name.size()));
        records += bytes;
        ++m_progress;
    }
    answer(id, 0, records.constData(), size_t(records.size()));
}

void SlowDirectory::serve()
{
    alignas(fuse_in_header) char request[FUSE_MIN_READ_BUFFER + 4096];
    for (;;) {
        const ssize_t size = ::read(m_descriptor, request, sizeof request);
        if (size < 0 && (errno == EINTR || errno == ENOENT || errno == EAGAIN)) {
            continue;
        }
        if (size < ssize_t(sizeof(fuse_in_header))) {
            return;
        }
        const auto* header = reinterpret_cast<const fuse_in_header*>(request);
        switch (header->opcode) {
        case FUSE_INIT: {
            fuse_init_out reply = {};
            reply.major = FUSE_KERNEL_VERSION;
            reply.minor = FUSE_KERNEL_MINOR_VERSION;
            reply.max_write = 4096;
            answer(header->unique, 0, &reply, sizeof reply);
            break;
        }
        case FUSE_GETATTR: {
            fuse_attr_out reply = {};
            reply.attr = directoryAttributes(header->nodeid);
            answer(header->unique, 0, &reply, sizeof reply);
            break;
        }
        case FUSE_OPENDIR: {
            fuse_open_out reply = {};
            answer(header->unique, 0, &reply, sizeof reply);
            break;
        }
        case FUSE_READDIR:
            if (m_kind == Stalled && m_released) {
                answer(header->unique, EIO, nullptr, 0);
            } else if (m_kind == Stalled) {
                m_waiting = header->unique;
                ++m_progress;
            } else {
                const auto* read = reinterpret_cast<const fuse_read_in*>(header + 1);
                answerNames(header->unique, read->offset, read->size);
            }
            break;
        case FUSE_STATFS:
            if (m_kind == Stalled) {
                m_waiting = header->unique;
                ++m_progress;
            } else {
                const fuse_statfs_out reply = {};
                answer(header->unique, 0, &reply, sizeof reply);
            }
            break;
        case FUSE_RELEASEDIR:
            answer(header->unique, 0, nullptr, 0);
            break;
        case FUSE_FORGET:
        case FUSE_BATCH_FORGET:
        case FUSE_INTERRUPT:
            break; // No answer is due.
        case FUSE_LOOKUP:
            answerLookup(header->unique, reinterpret_cast<const char*>(header + 1));
            break;
        default:
            answer(header->unique, ENOSYS, nullptr, 0);
            break;
        }
    }
}
