// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <map>
#include <string>
#include <thread>
#include <tuple>

namespace orvane::test {

/// Mode, size in bytes, and the times of the last change of content and of state in nanoseconds.
using FileState = std::tuple<mode_t, off_t, std::int64_t, std::int64_t>;

inline std::int64_t nanoseconds(const timespec& time) {
    return std::int64_t{time.tv_sec} * 1'000'000'000 + time.tv_nsec;
}

/// Writes before and after this call get different times: a file system's clock ticks every 10 ms
/// or more often.
inline void letTimePass() {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
}

/// A folder and every entry below it, with every trace that a temporary change would leave. Even a
/// write of the same bytes shows: the time of the last change of state can't be set back.
inline std::map<std::string, FileState> treeStates(const std::filesystem::path& root) {
    std::map<std::string, FileState> tree;
    const auto add = [&tree](const std::filesystem::path& path) {
        struct stat state {};
        EXPECT_EQ(::lstat(path.c_str(), &state), 0) << path;
        tree[path] = {state.st_mode, state.st_size, nanoseconds(state.st_mtim),
                      nanoseconds(state.st_ctim)};
    };
    add(root);
    for (const auto& entry : std::filesystem::recursive_directory_iterator(root)) {
        add(entry.path());
    }
    return tree;
}

} // namespace orvane::test
