// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"
#include "kit/host/folder_lock.h"
#include "kit/host/kit_error.h"
#include "tests/support/holder_named.h"
#include "tests/support/temporary_folder.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

std::string refusalOf(const fs::path& folder) {
    try {
        const kit::FolderLock lock(folder);
    } catch (const kit::KitError& error) {
        return error.what();
    }
    return "";
}

TEST(FolderLockTest, LockEndsWithItsOwner) {
    const TemporaryFolder folder;
    { const kit::FolderLock lock(folder.path()); }
    EXPECT_EQ(refusalOf(folder.path()), "");
}

TEST(FolderLockTest, HolderIsNamed) {
    const TemporaryFolder folder;
    const kit::FolderLock lock(folder.path());
    expectHolderNamed(refusalOf(folder.path()), folder.path());
}

TEST(FolderLockTest, OtherFoldersAreFree) {
    const TemporaryFolder folder;
    const TemporaryFolder other;
    const kit::FolderLock lock(folder.path());
    EXPECT_EQ(refusalOf(other.path()), "");
}

TEST(FolderLockTest, LockEndsWithAKilledProcess) {
    const TemporaryFolder folder;
    const kit::RunResult result = kit::runCaptured([&folder] {
        const kit::FolderLock lock(folder.path());
        static_cast<void>(raise(SIGKILL));
    });
    EXPECT_EQ(result.exitStatus, 128 + SIGKILL);
    EXPECT_EQ(refusalOf(folder.path()), "");
}

/// Programs that a holder starts don't have its lock, however long they live.
TEST(FolderLockTest, LockIsNotInherited) {
    const TemporaryFolder folder;
    int toChild[2] = {-1, -1};
    ASSERT_EQ(pipe(toChild), 0);
    pid_t child = -1;
    {
        const kit::FolderLock lock(folder.path());
        child = fork();
        if (child == 0) {
            dup2(toChild[0], STDIN_FILENO);
            close(toChild[0]);
            close(toChild[1]);
            execlp("cat", "cat", nullptr);
            _exit(1);
        }
    }
    EXPECT_EQ(refusalOf(folder.path()), "");
    close(toChild[0]);
    close(toChild[1]);
    EXPECT_EQ(waitpid(child, nullptr, 0), child);
}

TEST(FolderLockTest, FolderThatIsNotThereIsRefused) {
    EXPECT_EQ(refusalOf("/proc/none"), "cannot lock /proc/none: No such file or directory");
    const fs::path file = "/proc/version";
    EXPECT_EQ(refusalOf(file), "cannot lock /proc/version: Not a directory");
}

} // namespace

} // namespace orvane::test
