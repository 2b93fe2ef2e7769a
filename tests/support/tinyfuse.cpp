// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// veyfm-tinyfuse DIRECTORY [FILE...]: a file system with files by their paths, or with one file,
// "file". They all hold "hello". Prints a line when it is mounted, and ends when it is not any
// more.

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <linux/fuse.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr uint64_t rootNode = FUSE_ROOT_ID;
const std::string content = "hello";

struct Node
{
    uint64_t parent;
    std::string name;
    bool isDirectory;
};
std::vector<Node> nodes = {{0, "", true}}; // The first one is the root.

int device = -1;

/// 0 for none.
uint64_t find(uint64_t parent, const std::string& name)
{
    for (uint64_t node = rootNode; node <= nodes.size(); ++node) {
        if (nodes[node - 1].parent == parent && nodes[node - 1].name == name) {
            return node;
        }
    }
    return 0;
}

void addFile(const std::string& path)
{
    uint64_t parent = rootNode;
    size_t begin = 0;
    while (begin <= path.size()) {
        const size_t end = std::min(path.find('/', begin), path.size());
        const std::string name = path.substr(begin, end - begin);
        const uint64_t known = find(parent, name);
        if (known == 0) {
            nodes.push_back({parent, name, end < path.size()});
        }
        parent = known != 0 ? known : nodes.size();
        begin = end + 1;
    }
}

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
    const bool isDirectory = nodes[node - 1].isDirectory;
    fuse_attr attributes = {};
    attributes.ino = node;
    attributes.mode = isDirectory ? S_IFDIR | 0755 : S_IFREG | 0444;
    attributes.nlink = isDirectory ? 2 : 1;
    attributes.size = isDirectory ? 0 : content.size();
    attributes.uid = getuid();
    attributes.gid = getgid();
    attributes.blksize = 4096;
    return attributes;
}

/// All of a directory at once, and nothing where it is read on.
void list(const fuse_in_header& request, const fuse_read_in& read)
{
    std::string entries;
    for (uint64_t node = rootNode; node <= nodes.size() && read.offset == 0; ++node) {
        const Node& child = nodes[node - 1];
        if (child.parent != request.nodeid) {
            continue;
        }
        fuse_dirent entry = {};
        entry.ino = node;
        entry.off = node;
        entry.namelen = uint32_t(child.name.size());
        entry.type = child.isDirectory ? DT_DIR : DT_REG;
        entries.append(reinterpret_cast<const char*>(&entry), FUSE_NAME_OFFSET);
        entries += child.name;
        entries.resize(FUSE_DIRENT_ALIGN(entries.size()));
    }
    answer(request, 0, entries.data(), entries.size());
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
        const uint64_t node = find(request.nodeid, body);
        if (node == 0) {
            answer(request, ENOENT);
            break;
        }
        fuse_entry_out reply = {};
        reply.nodeid = node;
        reply.attr = attributes(node);
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
        list(request, *reinterpret_cast<const fuse_read_in*>(body));
        break;
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
    for (int i = 2; i < argc; ++i) {
        addFile(argv[i]);
    }
    if (argc == 2) {
        addFile("file");
    }
    if (argc < 2 || device < 0 ||
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
