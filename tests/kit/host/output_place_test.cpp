// SPDX-License-Identifier: Apache-2.0
#include "kit/host/output_place.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <filesystem>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// Every answer must be the one that the system itself gives afterwards.
class OutputPlaceTest : public UnitTest {
protected:
    static bool systemOpens(const std::string& path) {
        const int descriptor = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_NOCTTY, 0666);
        if (descriptor == -1) {
            return false;
        }
        ::close(descriptor);
        return true;
    }

    static void expectAnswer(bool canBe, const std::string& path) {
        EXPECT_EQ(kit::canBeWritten(path), canBe) << path;
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

TEST_F(OutputPlaceTest, AskingCreatesAndChangesNothing) {
    writeFile("/tmp/file", "kept");
    fs::create_symlink("fresh", "/tmp/link");
    EXPECT_TRUE(kit::canBeWritten("/tmp/file"));
    EXPECT_TRUE(kit::canBeWritten("/tmp/link"));
    EXPECT_TRUE(kit::canBeWritten("/tmp/none"));
    EXPECT_EQ(readFile("/tmp/file"), "kept");
    EXPECT_FALSE(fs::exists("/tmp/fresh") || fs::exists("/tmp/none"));
}

} // namespace

} // namespace orvane::test
