// SPDX-License-Identifier: Apache-2.0
#include "kit/host/kit_error.h"
#include "kit/host/unfinished_file.h"
#include "tests/support/folder_names.h"
#include "tests/support/permissions.h"
#include "tests/support/resource_limit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <optional>
#include <set>
#include <string>
#include <utility>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

class UnfinishedFileTest : public ::testing::Test {
protected:
    const fs::path& folder() const { return folder_.path(); }
    fs::path file() const { return folder() / "page.html"; }

    std::set<std::string> names() const { return folderNames(folder()); }

    /// The error for a file that can't be made at `file`.
    static std::string errorAt(const fs::path& file) {
        try {
            const kit::UnfinishedFile unfinished(file);
            unfinished.finish("new");
            return "none";
        } catch (const kit::KitError& error) {
            return error.text();
        }
    }

private:
    TemporaryFolder folder_;
};

TEST_F(UnfinishedFileTest, FileIsWholeOrNotThere) {
    {
        const kit::UnfinishedFile unfinished(file());
        EXPECT_FALSE(fs::exists(file()));
        unfinished.finish("new");
        EXPECT_EQ(readFile(file()), "new");
    }
    EXPECT_EQ(names(), std::set<std::string>{"page.html"});
    std::optional<kit::UnfinishedFile> given(std::in_place, folder() / "other");
    given.reset();
    EXPECT_EQ(names(), std::set<std::string>{"page.html"});
}

TEST_F(UnfinishedFileTest, FileThatIsThereIsReplacedAtTheEnd) {
    writeFile(file(), "old, and longer");
    {
        const kit::UnfinishedFile unfinished(file());
        EXPECT_EQ(readFile(file()), "old, and longer");
        unfinished.finish("new");
    }
    EXPECT_EQ(readFile(file()), "new");
}

TEST_F(UnfinishedFileTest, FileBehindALinkIsReplaced) {
    fs::create_directory(folder() / "far");
    writeFile(folder() / "far/page.html", "old");
    fs::create_symlink("far/page.html", file());
    kit::UnfinishedFile(file()).finish("new");
    EXPECT_TRUE(fs::is_symlink(file()));
    EXPECT_EQ(readFile(folder() / "far/page.html"), "new");
}

TEST_F(UnfinishedFileTest, NameWithoutAFolderIsInTheWorkingDirectory) {
    const fs::path before = fs::current_path();
    fs::current_path(folder());
    kit::UnfinishedFile("page.html").finish("new");
    fs::current_path(before);
    EXPECT_EQ(readFile(file()), "new");
}

TEST_F(UnfinishedFileTest, AnythingButAFileStays) {
    fs::create_directory(file());
    EXPECT_EQ(errorAt(file()),
              "cannot write " + file().string() + ": it is there and not a regular file");
    const fs::path pipe = folder() / "pipe";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0666), 0);
    EXPECT_EQ(errorAt(pipe),
              "cannot write " + pipe.string() + ": it is there and not a regular file");
    EXPECT_EQ(errorAt("/dev/null"), "cannot write /dev/null: it is there and not a regular file");
    EXPECT_EQ(names(), (std::set<std::string>{"page.html", "pipe"}));
}

TEST_F(UnfinishedFileTest, FolderThatCannotBeWrittenIsAnError) {
    const auto complaint = [this](const std::string& name, const std::string& reason) {
        const std::string above = (folder() / name).string();
        return "cannot write " + above + "/page.html: cannot make a folder in " + above + ": " +
               reason;
    };
    EXPECT_EQ(errorAt(folder() / "none/page.html"), complaint("none", "No such file or directory"));
    writeFile(folder() / "file", "");
    EXPECT_EQ(errorAt(folder() / "file/page.html"), complaint("file", "Not a directory"));
    fs::create_directory(folder() / "closed");
    fs::permissions(folder() / "closed", fs::perms::owner_read | fs::perms::owner_exec);
    const EnforcedPermissions enforced;
    EXPECT_EQ(errorAt(folder() / "closed/page.html"), complaint("closed", "Permission denied"));
}

TEST_F(UnfinishedFileTest, FullDiskLeavesWhatWasThere) {
    writeFile(file(), "old");
    {
        const ResourceLimit limit(RLIMIT_FSIZE, 2);
        EXPECT_EQ(errorAt(file()), "cannot write " + file().string() + ": File too large");
    }
    EXPECT_EQ(readFile(file()), "old");
    EXPECT_EQ(names(), std::set<std::string>{"page.html"});
}

} // namespace

} // namespace orvane::test
