// SPDX-License-Identifier: Apache-2.0
#include "kit/written_files.h"

#include "kit/kit_error.h"

#include <sys/stat.h>

#include <chrono>
#include <thread>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

std::int64_t nanoseconds(const timespec& time) {
    return std::int64_t{time.tv_sec} * 1'000'000'000 + time.tv_nsec;
}

} // namespace

Snapshot takeSnapshot(const fs::path& folder) {
    Snapshot snapshot;
    std::error_code error;
    for (auto entry = fs::recursive_directory_iterator(folder, error);
         entry != fs::recursive_directory_iterator(); entry.increment(error)) {
        struct stat state {};
        if (::lstat(entry->path().c_str(), &state) == 0 && S_ISREG(state.st_mode)) {
            snapshot[entry->path().lexically_relative(folder).string()] = {
                state.st_ino, state.st_size, nanoseconds(state.st_mtim),
                nanoseconds(state.st_ctim)};
        }
    }
    return snapshot;
}

void awaitNewMarks() {
    // File systems stamp with a clock that ticks every 1 to 10 ms.
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
}

std::vector<std::string> writtenBetween(const Snapshot& before, const Snapshot& after) {
    std::vector<std::string> written;
    for (const auto& [path, mark] : after) {
        const auto old = before.find(path);
        if (old == before.end() || !(old->second == mark)) {
            written.push_back(path);
        }
    }
    return written;
}

} // namespace orvane::kit
