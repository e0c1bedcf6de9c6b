// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/scratch_folder.h"
#include "kit/host/unfinished_folder.h"
#include "tests/support/folder_names.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <unistd.h>

#include <filesystem>
#include <functional>
#include <optional>
#include <set>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Names = std::set<std::string>;

class UnfinishedFolderTest : public ::testing::Test {
protected:
    const fs::path& above() const { return folder_.path(); }

    static std::string refusalOf(const std::function<void()>& act) {
        try {
            act();
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

    /// Runs a child that makes an unfinished folder with a file in it and then is killed.
    void leaveOne(const std::string& stem) const {
        const kit::RunResult result = kit::runCaptured([&] {
            const kit::UnfinishedFolder left(above(), stem, 0777);
            writeFile(left.path() / "file", "half");
            static_cast<void>(raise(SIGKILL));
        });
        EXPECT_EQ(result.exitStatus, 128 + SIGKILL);
    }

private:
    TemporaryFolder folder_;
};

TEST_F(UnfinishedFolderTest, FolderIsRemovedWithItsOwner) {
    {
        const kit::UnfinishedFolder folder(above(), "unit", 0777);
        EXPECT_EQ(folderNames(above()),
                  Names{".unit.unfinished-" + std::to_string(getpid()) + "-0"});
        writeFile(folder.path() / "file", "half");
    }
    EXPECT_EQ(folderNames(above()), Names{});
}

TEST_F(UnfinishedFolderTest, NextOneRemovesWhatKilledProcessesHaveLeft) {
    leaveOne("unit");
    leaveOne("other");
    EXPECT_EQ(folderNames(above()).size(), 1U); // the second has removed the first
    { const kit::UnfinishedFolder folder(above(), "third", 0777); }
    EXPECT_EQ(folderNames(above()), Names{});
}

TEST_F(UnfinishedFolderTest, FolderOfALivingProcessStays) {
    const kit::UnfinishedFolder first(above(), "unit", 0777);
    { const kit::UnfinishedFolder second(above(), "unit", 0777); }
    EXPECT_TRUE(fs::is_directory(first.path()));
}

TEST_F(UnfinishedFolderTest, OtherNamesAreNotLeftovers) {
    const Names others = {"unit.unfinished-1-0",  ".unit.unfinished-1",
                          ".unit.unfinished-1-",  ".unit.unfinished--0",
                          ".unit.unfinished-x-0", ".unit.unfinished-1-0x",
                          ".unit.unfinished",     ".unit"};
    for (const std::string& name : others) {
        EXPECT_FALSE(kit::isUnfinishedName(name)) << name;
        fs::create_directory(above() / name);
    }
    EXPECT_TRUE(kit::isUnfinishedName(".unit.unfinished-1-0"));
    { const kit::UnfinishedFolder folder(above(), "unit", 0777); }
    EXPECT_EQ(folderNames(above()), others);
}

TEST_F(UnfinishedFolderTest, FilesAndLinksWithSuchANameStay) {
    const TemporaryFolder elsewhere;
    writeFile(elsewhere.path() / "mine", "kept");
    fs::create_directory_symlink(elsewhere.path(), above() / ".unit.unfinished-1-0");
    writeFile(above() / ".unit.unfinished-1-1", "file");
    { const kit::UnfinishedFolder folder(above(), "unit", 0777); }
    EXPECT_EQ(folderNames(above()), (Names{".unit.unfinished-1-0", ".unit.unfinished-1-1"}));
    EXPECT_EQ(folderNames(elsewhere.path()), Names{"mine"});
}

TEST_F(UnfinishedFolderTest, FolderInWhichNoneCanBeMadeIsNamed) {
    const fs::path missing = above() / "missing";
    EXPECT_EQ(refusalOf([&] { const kit::UnfinishedFolder folder(missing, "unit", 0777); }),
              "cannot make a folder in " + missing.string() + ": No such file or directory");
}

TEST_F(UnfinishedFolderTest, FailureInItNamesTheFuturePath) {
    const fs::path future = above() / "unit";
    const kit::UnfinishedFolder folder(above(), "unit", 0777);
    const auto refusalIn = [&](const std::function<void(const fs::path&)>& fillIt) {
        return refusalOf([&] { folder.fill(future, fillIt); });
    };
    const std::string missing = ": No such file or directory";
    EXPECT_EQ(refusalIn([](const fs::path& path) { fs::create_directory(path / "a/b"); }),
              "cannot make " + (future / "a/b").string() + missing);
    EXPECT_EQ(refusalIn([](const fs::path& path) { fs::create_hard_link(path / "a", path / "b"); }),
              "cannot make " + (future / "b").string() + missing);
    EXPECT_EQ(refusalIn([](const fs::path& path) { kit::openForReading(path / "a"); }),
              "cannot read " + (future / "a").string() + missing);
    EXPECT_EQ(refusalIn([](const fs::path& /*path*/) { kit::openForReading("/proc/none/a"); }),
              "cannot read /proc/none/a" + missing);
}

TEST(ScratchFolderTest, FolderIsForItsUserAlone) {
    std::optional<kit::ScratchFolder> scratch(std::in_place);
    const fs::path path = scratch->path();
    EXPECT_EQ(path.parent_path(), fs::temp_directory_path());
    EXPECT_EQ(fs::status(path).permissions(), fs::perms::owner_all);
    scratch.reset();
    EXPECT_FALSE(fs::exists(path));
}

} // namespace

} // namespace orvane::test
