// SPDX-License-Identifier: Apache-2.0
//
// A page of a mapped file may have no bytes to give: the file was cut off after it was mapped, or
// the page is a hole, and its memory file system has no room to fill it. Reading such a page ends a
// process by SIGBUS.
#pragma once

#include <signal.h>

#include <filesystem>

namespace orvane::kit {

/// While it exists, a lost page reads as zeros, and this process goes on. One at a time, in a
/// single-threaded process only.
class LostPages {
public:
    LostPages();
    ~LostPages();
    LostPages(const LostPages&) = delete;
    LostPages& operator=(const LostPages&) = delete;

    /// Throws KitError if a lost page was read. `file` is the one that was mapped.
    void requireNone(const std::filesystem::path& file) const;

private:
    struct sigaction former_ {};
};

} // namespace orvane::kit
