// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "tests/kit/unit/unit_tree.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdint>
#include <filesystem>
#include <map>
#include <string>

namespace orvane::test {

/// A unit that the kit has not made.
class SourceUnitTest : public ::testing::Test {
protected:
    SourceUnitTest() {
        for (const char* folder :
             {"fs/mp/etc/mm", "fs/rwdata/.Version", "fs/tmpfs", "dev", "tmp"}) {
            std::filesystem::create_directories(source() / folder);
        }
    }

    std::filesystem::path source() const { return folder_.path() / "source"; }
    std::filesystem::path root() const { return folder_.path() / "root"; }

    std::filesystem::path at(const std::string& path) const { return source() / path.substr(1); }

    void put(const std::string& path, const std::string& content) const {
        writeFile(at(path), content);
    }
    void putLink(const std::string& path, const std::string& target) const {
        std::filesystem::create_symlink(target, at(path));
    }
    void putFolder(const std::string& path) const { std::filesystem::create_directories(at(path)); }

    /// Everything in the source, and when it last changed.
    std::map<std::string, std::string> state() const {
        std::map<std::string, std::string> tree = treeOf(source());
        for (auto& [path, content] : tree) {
            struct stat status {};
            EXPECT_EQ(::lstat(at(path).c_str(), &status), 0) << path;
            content += " " + std::to_string(status.st_ctim.tv_sec) + "." +
                       std::to_string(status.st_ctim.tv_nsec);
        }
        return tree;
    }

private:
    TemporaryFolder folder_;
};

} // namespace orvane::test
