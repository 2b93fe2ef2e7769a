// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// veyfm-tinyfuse DIRECTORY: a file system with one file, "file", which holds "hello". Prints a line
// when it is mounted, and ends when it is not any more.

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include <fcntl.h>
#include <linux/fuse.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr uint64_t rootNode = FUSE_ROOT_ID;
constexpr uint64_t fileNode = 2;
const std::string content = "hello";

int device = -1;

void answer(const fuse_in_header& request, int error, const void* data = nullptr, size_t size = 0)
{
    fuse_out_header header = {};
    header.len = uint32_t(sizeof(header) + size);
    header.error = -error;
    header.unique = request.unique;
    std::vector<char> bytes(sizeof(header) + size);
    std::memcpy(bytes.data(), &header, sizeof(header));
    if (size > 0) {
        std::memcpy(bytes.data() + sizeof(header), data, size);
    }
    // Nobody to tell of a failure: the request may have been taken back.
    if (write(device, bytes.data(), bytes.size()) < 0) {
        return;
    }
}

template <typename Data>
void answerWith(const fuse_in_header& request, const Data& data)
{
    answer(request, 0, &data, sizeof(data));
}

fuse_attr attributes(uint64_t node)
{
    fuse_attr attributes = {};
    attributes.ino = node;
    attributes.mode = node == rootNode ? S_IFDIR | 0755 : S_IFREG | 0444;
    attributes.nlink = node == rootNode ? 2 : 1;
    attributes.size = node == rootNode ? 0 : content.size();
    attributes.uid = getuid();
    attributes.gid = getgid();
    attributes.blksize = 4096;
    return attributes;
}

void serve(const fuse_in_header& request, const char* body)
{
    switch (request.opcode) {
    case FUSE_INIT: {
        fuse_init_out reply = {};
        reply.major = FUSE_KERNEL_VERSION;
        reply.minor = 31;
        reply.max_write = 4096;
        answerWith(request, reply);
        break;
    }
    case FUSE_GETATTR: {
        fuse_attr_out reply = {};
        reply.attr = attributes(request.nodeid);
        answerWith(request, reply);
        break;
    }
    case FUSE_LOOKUP: {
        if (request.nodeid != rootNode || std::strcmp(body, "file") != 0) {
            answer(request, ENOENT);
            break;
        }
        fuse_entry_out reply = {};
        reply.nodeid = fileNode;
        reply.attr = attributes(fileNode);
        answerWith(request, reply);
        break;
    }
    case FUSE_OPEN:
    case FUSE_OPENDIR:
        answerWith(request, fuse_open_out{});
        break;
    case FUSE_READ: {
        const auto* const read = reinterpret_cast<const fuse_read_in*>(body);
        const std::string rest = read->offset < content.size() ? content.substr(read->offset) : "";
        answer(request, 0, rest.data(), rest.size());
        break;
    }
    case FUSE_STATFS:
        answerWith(request, fuse_statfs_out{});
        break;
    case FUSE_READDIR:
    case FUSE_RELEASE:
    case FUSE_RELEASEDIR:
    case FUSE_FLUSH:
    case FUSE_ACCESS:
    case FUSE_DESTROY:
        answer(request, 0);
        break;
    case FUSE_FORGET:
    case FUSE_BATCH_FORGET:
    case FUSE_INTERRUPT:
        break;
    default:
        answer(request, ENOSYS);
    }
}

} // namespace

int main(int argc, char** argv)
{
    // A test that went wrong leaves nothing behind.
    alarm(90);
    device = open("/dev/fuse", O_RDWR | O_CLOEXEC);
    const std::string options = "rootmode=40000,user_id=" + std::to_string(getuid()) +
                                ",group_id=" + std::to_string(getgid()) +
                                ",fd=" + std::to_string(device);
    if (argc != 2 || device < 0 ||
        mount("tinyfuse", argv[1], "fuse", MS_NOSUID | MS_NODEV, options.c_str()) != 0) {
        std::perror("tinyfuse");
        return 1;
    }
    std::puts("mounted");
    std::fflush(stdout);
    alignas(fuse_in_header) static char buffer[1 << 17];
    while (true) {
        const ssize_t size = read(device, buffer, sizeof(buffer));
        if (size >= ssize_t(sizeof(fuse_in_header))) {
            serve(*reinterpret_cast<fuse_in_header*>(buffer), buffer + sizeof(fuse_in_header));
        } else if (size >= 0 || (errno != EINTR && errno != EAGAIN && errno != ENOENT)) {
            // Without a look for leaks, which stops this process, and waits for ever where the
            // test has it go on at the same time.
            _exit(0);
        }
    }
}
