// SPDX-FileCopyrightText: 2026 The libveyfmvfs authors
// SPDX-License-Identifier: LGPL-2.1-or-later

// Any text to SmbUrl.

#include "fuzzing.h"

#include "core/smburl.h"

using Fuzzing::require;
using VeyFM::SmbUrl;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QString text = Fuzzing::text(data, size);
    const SmbUrl url(text);

    require(
        url.isValid() == text.trimmed().startsWith(QLatin1String("smb:/")),
        "the prefix alone decides what is valid");
    if (!url.isValid()) {
        require(
            url.workgroup().isNull() && url.host().isNull() && url.share().isNull() &&
                url.tailPath().isNull(),
            "what is not valid has no parts");
    }
    const QLatin1Char slash('/');
    require(!url.workgroup().contains(slash), "a workgroup has no slash");
    require(!url.workgroup().contains(QLatin1Char(';')), "the first semicolon ends the workgroup");
    require(!url.host().contains(slash), "a host has no slash");
    require(!url.share().contains(slash), "a share has no slash");

    const QString written = url.toString();
    require(written.isNull() == url.host().isEmpty(), "there is a text exactly where a host is");
    if (written.isNull()) {
        return 0;
    }

    // What the grammar can't tell apart does not come back: a host with a sign of its own, a tail
    // below an empty share, white space at the end.
    const bool plainHost = !url.host().contains(QLatin1Char('@')) &&
                           (!url.workgroup().isEmpty() || !url.host().contains(QLatin1Char(';')));
    if (!plainHost) {
        return 0;
    }
    const SmbUrl again(written);
    require(again.isValid(), "what was written is valid");
    require(again.workgroup() == url.workgroup(), "the workgroup comes back");
    require(again.host() == url.host(), "the host comes back");
    require(again.share() == url.share(), "the share comes back");
    if (!url.share().isEmpty() && url.tailPath().trimmed() == url.tailPath()) {
        require(again.tailPath() == url.tailPath(), "the tail comes back");
    }
    return 0;
}
