// SPDX-License-Identifier: Apache-2.0
#include "kit/host/sparse_content.h"

#include "kit/host/kit_error.h"

#include <stdio.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iterator>
#include <string>
#include <utility>

namespace orvane::kit {

namespace {

constexpr std::size_t PAGE = 4096;       ///< bytes compared at a time
constexpr std::uint64_t CHUNK = 0x40000; ///< bytes read at a time
constexpr std::uint64_t RUN_SIZE = 64;   ///< what a run takes besides its bytes, in bytes

class RunCollector {
public:
    /// Takes the next bytes; those between the last ones and these were zero.
    void take(std::string_view bytes, std::uint64_t offset) {
        for (std::size_t page = 0; page < bytes.size(); page += PAGE) {
            const std::string_view part = bytes.substr(page, PAGE);
            if (!isAllZero(part)) {
                takePage(part, offset + page);
            }
        }
    }

    SparseContent runs;
    std::uint64_t taken = 0; ///< bytes of memory

private:
    void takePage(std::string_view page, std::uint64_t offset) {
        std::size_t at = 0;
        while (at < page.size()) {
            const std::size_t zero = std::min(page.find('\0', at), page.size());
            if (zero > at) {
                add(page.substr(at, zero - at), offset + at);
            }
            at = std::min(page.find_first_not_of('\0', zero), page.size());
        }
    }

    /// Adds bytes, none of which is zero.
    void add(std::string_view bytes, std::uint64_t offset) {
        if (!runs.empty()) {
            auto& [begin, run] = *runs.rbegin();
            const std::uint64_t gap = offset - (begin + run.size());
            if (gap < RUN_GAP) {
                run.append(static_cast<std::size_t>(gap), '\0').append(bytes);
                taken += gap + bytes.size();
                return;
            }
        }
        runs.emplace_hint(runs.end(), offset, bytes);
        taken += RUN_SIZE + bytes.size();
    }
};

/// The next offset, from `offset` on, of data (SEEK_DATA) or of a hole (SEEK_HOLE); `size` when
/// there is none.
std::uint64_t seekNext(const Descriptor& descriptor, std::uint64_t offset, int what,
                       std::uint64_t size) {
    const off_t found = ::lseek(descriptor.number(), static_cast<off_t>(offset), what);
    if (found >= 0) {
        return std::min(static_cast<std::uint64_t>(found), size);
    }
    // After the last data, or on a device that does not know holes.
    return what == SEEK_DATA && errno != ENXIO ? offset : size;
}

} // namespace

SparseContent sparseContent(std::string_view bytes, std::uint64_t offset) {
    RunCollector collector;
    collector.take(bytes, offset);
    return std::move(collector.runs);
}

SparseContent sparseContent(const Descriptor& descriptor, const std::filesystem::path& file,
                            std::uint64_t size) {
    RunCollector collector;
    Bytes buffer(CHUNK, '\0');
    std::uint64_t end = 0;
    while (end < size) {
        std::uint64_t at = seekNext(descriptor, end, SEEK_DATA, size);
        end = at < size ? seekNext(descriptor, at, SEEK_HOLE, size) : size;
        while (at < end) {
            const std::size_t wanted = static_cast<std::size_t>(std::min(CHUNK, end - at));
            const ssize_t count =
                ::pread(descriptor.number(), buffer.data(), wanted, static_cast<off_t>(at));
            if (count <= 0) {
                throw count < 0 ? systemError("cannot read ", file)
                                : KitError("", file, " has become shorter");
            }
            collector.take({buffer.data(), static_cast<std::size_t>(count)}, at);
            if (collector.taken > MOST_CONTENT) {
                throw KitError("", file,
                               " holds more than can be copied: at most " +
                                   std::to_string(MOST_CONTENT) +
                                   " bytes besides its zeros are allowed");
            }
            at += static_cast<std::uint64_t>(count);
        }
    }
    return std::move(collector.runs);
}

bool isAllZero(std::string_view bytes) {
    return bytes.empty() ||
           (bytes[0] == '\0' && std::memcmp(bytes.data(), bytes.data() + 1, bytes.size() - 1) == 0);
}

Bytes withoutTrailingZeros(const Bytes& bytes) {
    return bytes.substr(0, bytes.find_last_not_of('\0') + 1);
}

} // namespace orvane::kit
