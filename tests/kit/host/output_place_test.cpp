// SPDX-License-Identifier: Apache-2.0
#include "kit/host/kit_error.h"
#include "kit/host/output_place.h"
#include "tests/support/permissions.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// Every answer must be the one that the system itself gives afterwards.
class OutputPlaceTest : public UnitTest {
protected:
    /// Where the kernel has to walk a path again, since somebody renames or mounts something
    /// meanwhile, it counts the links twice, and may refuse a path within its limit.
    static bool systemOpens(const std::string& path) {
        int descriptor = -1;
        int attempts = 0;
        do {
            descriptor = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_NOCTTY, 0666);
        } while (descriptor == -1 && errno == ELOOP && ++attempts < 20);
        if (descriptor == -1) {
            return false;
        }
        ::close(descriptor);
        return true;
    }

    static void expectAnswer(bool canBe, const std::string& path) {
        EXPECT_EQ(kit::canBeOpened(path, false), canBe) << path;
        EXPECT_EQ(systemOpens(path), canBe) << path;
    }

    /// A link at /tmp/link to `target`.
    static void expectLink(bool canBe, const std::string& target) {
        fs::remove("/tmp/link");
        fs::create_symlink(target, "/tmp/link");
        expectAnswer(canBe, "/tmp/link");
    }
};

TEST_F(OutputPlaceTest, FilesAndFreePathsCanBeWrittenAndFoldersCannot) {
    writeFile("/tmp/file", "x");
    fs::create_directory("/tmp/folder");
    expectAnswer(true, "/tmp/file");
    expectAnswer(true, "/tmp/none");
    expectAnswer(false, "/tmp/folder");
    expectAnswer(false, "/tmp/none-such/file");
    expectAnswer(false, "/tmp/file/below");
    expectAnswer(false, "/tmp/" + std::string(256, 'n'));
}

TEST_F(OutputPlaceTest, LinksAreFollowed) {
    writeFile("/tmp/file", "x");
    fs::create_directory("/tmp/folder");
    fs::create_directory_symlink("folder", "/tmp/into");
    expectLink(true, "file");
    expectLink(true, "/tmp/file");
    expectLink(true, "fresh");
    expectLink(true, "/fs/rwdata/fresh");
    expectLink(true, "../fresh");
    expectLink(true, "folder/../fresher");
    expectLink(true, "into/fresh");
    expectLink(true, "into/../freshest");
    expectLink(false, "folder");
    expectLink(false, "/none/at/all");
    expectLink(false, "none/file");
    expectLink(false, "file/below");
    expectLink(false, "link");
    expectLink(false, ".");
    expectLink(false, "/");
    expectLink(false, "newer/");
    expectLink(false, "newer/.");
    expectLink(false, "folder/..");
    expectLink(false, "folder/");
}

TEST_F(OutputPlaceTest, LinksToLinksAreFollowed) {
    fs::create_symlink("b", "/tmp/a");
    fs::create_symlink("/fs/c", "/tmp/b");
    fs::create_symlink("tmpfs/d", "/fs/c");
    expectAnswer(true, "/tmp/a");
    EXPECT_TRUE(fs::exists("/fs/tmpfs/d"));
}

TEST_F(OutputPlaceTest, LinkChainsHaveTheSystemsLimit) {
    for (int link = 0; link < 45; ++link) {
        fs::create_symlink("l" + std::to_string(link + 1), "/tmp/l" + std::to_string(link));
    }
    expectAnswer(true, "/tmp/l5"); // 40 links
    fs::remove("/tmp/l45");
    expectAnswer(false, "/tmp/l4"); // 41
}

TEST_F(OutputPlaceTest, LinksOfFoldersCountAsWell) {
    fs::create_directory_symlink("/tmp", "/fs/to-tmp");
    for (int link = 0; link < 21; ++link) {
        fs::create_symlink("/fs/to-tmp/l" + std::to_string(link + 1),
                           "/tmp/l" + std::to_string(link));
    }
    expectAnswer(true, "/tmp/l1"); // 20 links, and 20 of their folders
    fs::remove("/tmp/l21");
    expectAnswer(false, "/fs/to-tmp/l1"); // 41
    expectAnswer(false, "/tmp/l0");       // 42
}

TEST_F(OutputPlaceTest, RightsOfThisProcessDoNotMatter) {
    writeFile("/tmp/file", "x");
    fs::permissions("/tmp/file", fs::perms::none);
    fs::permissions("/tmp", fs::perms::owner_exec);
    {
        const EnforcedPermissions permissions;
        EXPECT_TRUE(kit::canBeOpened("/tmp/file", true));
        EXPECT_TRUE(kit::canBeOpened("/tmp/none", true));
        EXPECT_FALSE(systemOpens("/tmp/none"));
    }
    fs::permissions("/tmp", fs::perms::owner_all);
}

TEST_F(OutputPlaceTest, PlaceThatThisProcessMayNotLookAtIsUnknown) {
    fs::create_directory("/tmp/folder");
    fs::create_symlink("folder/file", "/tmp/link");
    fs::permissions("/tmp/folder", fs::perms::none);
    const EnforcedPermissions permissions;
    try {
        kit::canBeOpened("/tmp/link", false);
        ADD_FAILURE() << "answered";
    } catch (const kit::KitError& error) {
        EXPECT_STREQ(error.what(), "cannot read /tmp/folder/file: Permission denied");
    }
}

TEST_F(OutputPlaceTest, PipeIsNamed) {
    ASSERT_EQ(::mkfifo("/tmp/pipe", 0600), 0);
    fs::create_symlink("pipe", "/tmp/link");
    try {
        kit::canBeOpened("/tmp/link", false);
        ADD_FAILURE() << "answered";
    } catch (const kit::KitError& error) {
        EXPECT_STREQ(error.what(), "/tmp/pipe is a pipe: a run waits there for its other end");
    }
}

TEST_F(OutputPlaceTest, AskingCreatesAndChangesNothing) {
    writeFile("/tmp/file", "kept");
    fs::create_symlink("fresh", "/tmp/link");
    EXPECT_TRUE(kit::canBeOpened("/tmp/file", false));
    EXPECT_TRUE(kit::canBeOpened("/tmp/link", false));
    EXPECT_TRUE(kit::canBeOpened("/tmp/none", false));
    EXPECT_EQ(readFile("/tmp/file"), "kept");
    EXPECT_FALSE(fs::exists("/tmp/fresh") || fs::exists("/tmp/none"));
}

} // namespace

} // namespace orvane::test
