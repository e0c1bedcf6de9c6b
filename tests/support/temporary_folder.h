// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <filesystem>

namespace orvane::test {

/// A test's own folder. Removed at the end, but kept and named when the test has failed.
class TemporaryFolder {
public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    const std::filesystem::path& path() const { return path_; }

private:
    std::filesystem::path path_;
};

} // namespace orvane::test
