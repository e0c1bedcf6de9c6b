// SPDX-License-Identifier: Apache-2.0
#include "kit/host/input_kind.h"
#include "kit/host/kit_error.h"
#include "tests/support/permissions.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using kit::InputKind;

class InputKindTest : public UnitTest {
protected:
    /// Both functions must agree; on what is no device they do.
    static void expectKind(InputKind kind, const std::string& path) {
        EXPECT_EQ(kit::lookAtSequentialInput(path), kind) << path;
        EXPECT_EQ(kit::lookAtPositionedInput(path), kind) << path;
    }

    static void expectRefused(const std::string& path, const std::string& complaint) {
        for (const auto look : {kit::lookAtSequentialInput, kit::lookAtPositionedInput}) {
            try {
                look(path);
                ADD_FAILURE() << path << " is accepted";
            } catch (const kit::KitError& error) {
                EXPECT_EQ(error.what(), path + complaint);
            }
        }
    }
};

TEST_F(InputKindTest, FilesAndFoldersAreFoundThroughLinks) {
    writeFile("/tmp/file", "");
    fs::create_symlink("file", "/tmp/to-file");
    fs::create_symlink("/tmp", "/tmp/to-folder");
    expectKind(InputKind::file, "/tmp/file");
    expectKind(InputKind::file, "/tmp/to-file");
    expectKind(InputKind::folder, "/tmp");
    expectKind(InputKind::folder, "/tmp/to-folder/");
}

TEST_F(InputKindTest, WhatCannotBeOpenedIsMissing) {
    writeFile("/tmp/file", "");
    fs::create_symlink("none", "/tmp/broken");
    fs::create_symlink("circle", "/tmp/circle");
    fs::create_symlink(std::string(300, 'n'), "/tmp/long");
    ASSERT_EQ(::mknod("/tmp/socket", S_IFSOCK | 0600U, 0), 0);
    for (const char* path : {"/tmp/none", "/none/at/all", "/tmp/file/below", "/tmp/file/",
                             "/tmp/broken", "/tmp/circle", "/tmp/long", "/tmp/socket"}) {
        expectKind(InputKind::missing, path);
    }
}

TEST_F(InputKindTest, PipeIsRefusedWithoutOpeningIt) {
    ASSERT_EQ(::mkfifo("/tmp/pipe", 0600), 0);
    fs::create_symlink("pipe", "/tmp/to-pipe");
    expectRefused("/tmp/pipe", " is a pipe: a run waits there for its other end");
    expectRefused("/tmp/to-pipe", " is a pipe: a run waits there for its other end");
}

TEST_F(InputKindTest, WhatMayNotBeReadIsNotMissing) {
    writeFile("/tmp/file", "");
    fs::create_directory("/tmp/folder");
    fs::permissions("/tmp/file", fs::perms::none);
    fs::permissions("/tmp/folder", fs::perms::none);
    const EnforcedPermissions permissions;
    for (const char* path : {"/tmp/file", "/tmp/folder", "/tmp/folder/below"}) {
        try {
            kit::lookAtSequentialInput(path);
            ADD_FAILURE() << path << " is accepted";
        } catch (const kit::KitError& error) {
            EXPECT_EQ(error.what(), std::string("cannot read ") + path + ": Permission denied");
        }
    }
}

} // namespace

} // namespace orvane::test
