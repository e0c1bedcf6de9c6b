// SPDX-License-Identifier: Apache-2.0
#include "kit/host/finished_folder.h"
#include "kit/host/kit_error.h"
#include "tests/support/folder_names.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <set>
#include <stdexcept>
#include <string>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Names = std::set<std::string>;

void putFile(const fs::path& folder) {
    writeFile(folder / "file", "content");
}

class FinishedFolderTest : public ::testing::Test {
protected:
    FinishedFolderTest() : hostCwd_(fs::current_path()) {}
    ~FinishedFolderTest() override { fs::current_path(hostCwd_); }

    const fs::path& above() const { return folder_.path(); }
    fs::path place() const { return above() / "unit"; }

    static std::string refusalOf(const fs::path& folder,
                                 const std::function<void(const fs::path&)>& fill = putFile) {
        try {
            kit::makeFinishedFolder(folder, fill);
        } catch (const kit::KitError& error) {
            return error.what();
        }
        return "";
    }

    void expectMade() const { EXPECT_EQ(readFile(place() / "file"), "content"); }

private:
    TemporaryFolder folder_;
    fs::path hostCwd_;
};

TEST_F(FinishedFolderTest, FolderAppearsOnlyWhenComplete) {
    fs::path seen;
    kit::makeFinishedFolder(place(), [&](const fs::path& folder) {
        seen = folder;
        EXPECT_EQ(folder.parent_path(), above());
        EXPECT_EQ(folder.filename().string().rfind(".unit.unfinished-", 0), 0U) << folder;
        EXPECT_TRUE(fs::is_empty(folder));
        EXPECT_FALSE(fs::exists(place()));
        putFile(folder);
        EXPECT_FALSE(fs::exists(place()));
    });
    expectMade();
    EXPECT_FALSE(fs::exists(seen));
    EXPECT_EQ(folderNames(above()), Names{"unit"});
}

TEST_F(FinishedFolderTest, EmptyFolderStaysUntilTheNewOneIsComplete) {
    fs::create_directory(place());
    kit::makeFinishedFolder(place(), [&](const fs::path& folder) {
        putFile(folder);
        EXPECT_TRUE(fs::is_empty(place()));
    });
    expectMade();
    EXPECT_EQ(folderNames(above()), Names{"unit"});
}

TEST_F(FinishedFolderTest, AccessRightsOfAnEmptyFolderAreKept) {
    fs::create_directory(place());
    fs::permissions(place(), fs::perms::owner_all);
    kit::makeFinishedFolder(place(), putFile);
    EXPECT_EQ(fs::status(place()).permissions(), fs::perms::owner_all);
}

TEST_F(FinishedFolderTest, FailureLeavesNothingAndNamesTheFinalPath) {
    for (const char* below : {"a", "a/b", ""}) {
        const fs::path named = *below == '\0' ? place() : place() / below;
        EXPECT_EQ(refusalOf(place(),
                            [&](const fs::path& folder) {
                                putFile(folder);
                                throw kit::KitError("no ", *below == '\0' ? folder : folder / below,
                                                    " here");
                            }),
                  "no " + named.string() + " here");
        EXPECT_EQ(folderNames(above()), Names{});
    }
}

TEST_F(FinishedFolderTest, FailureAboutAnotherPathOrNoneIsReportedAsItIs) {
    for (const fs::path& path : {fs::path("/proc/none"), above(), fs::path()}) {
        EXPECT_EQ(
            refusalOf(place(), [&](const fs::path&) { throw kit::KitError("no ", path, " here"); }),
            "no " + path.string() + " here");
    }
    EXPECT_EQ(refusalOf(place(), [](const fs::path&) { throw kit::KitError("no luck"); }),
              "no luck");
}

TEST_F(FinishedFolderTest, FailedLinkIsNamedNotItsTarget) {
    EXPECT_EQ(refusalOf(place(),
                        [](const fs::path& folder) {
                            fs::create_symlink("/target", folder / "none/link");
                        }),
              "cannot make " + (place() / "none/link").string() + ": No such file or directory");
}

TEST_F(FinishedFolderTest, RefusalOfTheFileSystemNamesTheFinalPath) {
    EXPECT_EQ(
        refusalOf(place(), [](const fs::path& folder) { fs::create_directory(folder / "a/b"); }),
        "cannot make " + (place() / "a/b").string() + ": No such file or directory");
    EXPECT_EQ(folderNames(above()), Names{});
}

TEST_F(FinishedFolderTest, AnyOtherExceptionLeavesNothing) {
    fs::create_directory(place());
    EXPECT_THROW(kit::makeFinishedFolder(place(),
                                         [](const fs::path& folder) {
                                             putFile(folder);
                                             throw std::runtime_error("fill");
                                         }),
                 std::runtime_error);
    EXPECT_EQ(folderNames(above()), Names{"unit"});
    EXPECT_TRUE(fs::is_empty(place()));
}

TEST_F(FinishedFolderTest, LeftoverOfAnotherRunIsHarmlessAndStays) {
    fs::path first;
    kit::makeFinishedFolder(place(), [&](const fs::path& folder) { first = folder; });
    fs::remove(place());
    fs::create_directory(first); // as left by a killed run with the same process number
    kit::makeFinishedFolder(place(), [&](const fs::path& folder) {
        EXPECT_NE(folder, first);
        putFile(folder);
    });
    expectMade();
    EXPECT_TRUE(fs::is_empty(first));
}

TEST_F(FinishedFolderTest, FolderThatAppearsMeanwhileIsNotReplaced) {
    EXPECT_EQ(refusalOf(place(),
                        [this](const fs::path& folder) {
                            putFile(folder);
                            fs::create_directory(place());
                            writeFile(place() / "mine", "kept");
                        }),
              "cannot make " + place().string() + ": Directory not empty");
    EXPECT_EQ(folderNames(place()), Names{"mine"});
    EXPECT_EQ(folderNames(above()), Names{"unit"});
}

TEST_F(FinishedFolderTest, FolderMayBeNamedInManyWays) {
    fs::create_directory(above() / "other");
    fs::current_path(above());
    for (const std::string name : {"unit", "./unit", "unit/", "other/../unit", "unit//"}) {
        SCOPED_TRACE(name);
        for (const bool isThere : {false, true}) {
            if (isThere) {
                fs::create_directory(place());
            }
            EXPECT_EQ(refusalOf(name), "");
            expectMade();
            fs::remove_all(place());
        }
    }
    EXPECT_EQ(folderNames(above()), Names{"other"});
}

TEST_F(FinishedFolderTest, WorkingDirectoryAndLinksToEmptyFoldersAreReplaced) {
    fs::create_directory(place());
    fs::current_path(place());
    EXPECT_EQ(refusalOf("."), "");
    fs::current_path(above());
    expectMade();
    fs::remove_all(place());

    fs::create_directory(place());
    fs::create_directory_symlink("unit", above() / "link");
    EXPECT_EQ(refusalOf(above() / "link"), "");
    expectMade();
    EXPECT_TRUE(fs::is_symlink(above() / "link"));
}

TEST_F(FinishedFolderTest, LongestNameIsAccepted) {
    const std::string name(255, 'n');
    EXPECT_EQ(refusalOf(above() / name), "");
    EXPECT_EQ(folderNames(above()), Names{name});
    EXPECT_EQ(refusalOf(above() / (name + "n")),
              "cannot make " + (above() / (name + "n")).string() + ": File name too long");
    EXPECT_EQ(folderNames(above()), Names{name});
}

TEST_F(FinishedFolderTest, ImpossiblePathIsRefused) {
    EXPECT_EQ(refusalOf(""), "cannot make : No such file or directory");
    EXPECT_EQ(refusalOf("/"), "/ is there already and is not an empty folder");
    writeFile(above() / "file", "");
    EXPECT_EQ(refusalOf(above() / "file/unit"),
              "cannot make " + (above() / "file/unit").string() + ": Not a directory");
    EXPECT_EQ(refusalOf(above() / "missing/.."),
              "cannot make " + (above() / "missing/..").string() + ": No such file or directory");
}

TEST_F(FinishedFolderTest, FolderAboveWithoutPermissionIsRefused) {
    fs::permissions(above(), fs::perms::owner_read | fs::perms::owner_exec);
    std::string refusal;
    {
        const EnforcedPermissions permissions;
        refusal = refusalOf(place());
    }
    fs::permissions(above(), fs::perms::owner_all);
    EXPECT_EQ(refusal, "cannot make " + place().string() + ": Permission denied");
}

} // namespace

} // namespace orvane::test
