// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <gtest/gtest.h>
#include <unistd.h>

#include <string>

namespace orvane::test {

/// Expects that `complaint` says of the folder that this process has locked it. On file systems
/// whose device numbers differ from those in /proc/locks, nobody can be named.
inline void expectHolderNamed(const std::string& complaint, const std::string& folder) {
    const std::string begin = folder + " is being changed by ";
    EXPECT_TRUE(complaint == begin + "process " + std::to_string(getpid()) ||
                complaint == begin + "another process")
        << complaint;
}

} // namespace orvane::test
