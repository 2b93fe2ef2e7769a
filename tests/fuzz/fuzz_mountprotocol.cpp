// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any bytes to what reads the lines between a host and veyfm-mount, in pieces of any size: the
// first byte of the input is that of a piece. Each line is read as all that it may be.

#include "fuzzing.h"

#include "host/linereader.h"
#include "host/mountprotocol.h"
#include "host/secretline.h"

#include <QByteArray>

#include <algorithm>
#include <cstring>

using Fuzzing::require;
using namespace VeyFM::MountProtocol;

namespace {

Line lineOf(QByteArray& bytes)
{
    require(bytes.endsWith('\n'), "a line has an end");
    require(bytes.indexOf('\n') == bytes.size() - 1, "a line has one end");
    require(bytes.size() <= longestLine + 1, "a line is not too long");
    return {bytes.data(), size_t(bytes.size() - 1)};
}

/// What is written again reads the same.
template <typename Message, typename Decode>
void checkMessage(const std::optional<Message>& message, const QString& why, const Decode& decode)
{
    require(message.has_value() == why.isEmpty(), "either it is one, or there is a reason");
    if (!message) {
        return;
    }
    QByteArray bytes = encode(*message);
    QString again;
    const auto read = decode(lineOf(bytes), &again);
    require(read.has_value(), "what was read can be written");
    require(encode(*read) == bytes, "what was written reads the same");
}

void checkSecret(const Line& line)
{
    QByteArray bytes(line.data, int(line.size));
    Line secret{bytes.data(), size_t(bytes.size())};
    if (!decodeSecret(&secret).isEmpty()) {
        return;
    }
    const char* const end = bytes.constData() + bytes.size();
    require(secret.data >= bytes.constData() && secret.data + secret.size <= end, "it is in place");
    require(secret.size <= longestPassword, "a password is not too long");
    require(!std::memchr(secret.data, '\n', secret.size), "a password is one line of its tool");
    const QString password = QString::fromUtf8(secret.data, int(secret.size));
    const QByteArray text(secret.data, int(secret.size));
    require(password.toUtf8() == text, "a password is valid UTF-8");
    const SecretLine written(password);
    QByteArray copy(written.data(), int(written.size()));
    Line again = lineOf(copy);
    require(decodeSecret(&again).isEmpty(), "a password can be written");
    require(QByteArray(again.data, int(again.size)) == text, "a password reads the same");
}

void checkLine(const Line& line)
{
    QString why;
    const auto request = decodeRequest(line, &why);
    checkMessage(request, why, decodeRequest);
    why.clear();
    const auto report = decodeReport(line, &why);
    checkMessage(report, why, decodeReport);
    checkSecret(line);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    if (size == 0) {
        return 0;
    }
    const size_t piece = size_t(data[0]) + 1;
    const char* from = reinterpret_cast<const char*>(data) + 1;
    const char* const end = reinterpret_cast<const char*>(data) + size;
    LineReader reader;
    QByteArray lines;
    while (from != end && !reader.isTooLong()) {
        char* const room = reader.room();
        const size_t count = std::min({piece, reader.roomSize(), size_t(end - from)});
        require(count > 0, "there is room for a line");
        std::copy(from, from + count, room);
        reader.added(count);
        from += count;
        Line line;
        while (reader.next(&line)) {
            require(line.size <= size_t(longestLine), "a line is not too long");
            lines += QByteArray(line.data, int(line.size)) + '\n';
            checkLine(line);
        }
    }
    const QByteArray all(reinterpret_cast<const char*>(data) + 1, int(size - 1));
    require(all.startsWith(lines), "no byte is lost");
    require(
        reader.isTooLong() || !all.mid(lines.size()).contains('\n'), "all lines have been read");
    return 0;
}
