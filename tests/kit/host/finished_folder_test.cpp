// SPDX-License-Identifier: Apache-2.0
#include "kit/host/descriptor.h"
#include "kit/host/finished_folder.h"
#include "kit/host/folder_lock.h"
#include "kit/host/kit_error.h"
#include "tests/support/folder_names.h"
#include "tests/support/holder_named.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cstring>
#include <filesystem>
#include <functional>
#include <set>
#include <stdexcept>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

using Names = std::set<std::string>;

ino_t inodeOf(const fs::path& path) {
    struct stat state {};
    EXPECT_EQ(stat(path.c_str(), &state), 0) << path;
    return state.st_ino;
}

/// The names that are moved into a folder, in their order.
class FolderArrivals {
public:
    explicit FolderArrivals(const fs::path& folder)
        : events_(inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
        EXPECT_NE(inotify_add_watch(events_.number(), folder.c_str(), IN_MOVED_TO), -1);
    }
    std::vector<std::string> take() {
        std::vector<std::string> names;
        alignas(inotify_event) std::array<char, 4096> buffer{};
        const ssize_t length = read(events_.number(), buffer.data(), buffer.size());
        for (ssize_t at = 0; at < length;) {
            inotify_event event{};
            std::memcpy(&event, buffer.data() + at, sizeof event);
            names.emplace_back(buffer.data() + at + sizeof event);
            at += static_cast<ssize_t>(sizeof event + event.len);
        }
        return names;
    }

private:
    kit::Descriptor events_;
};

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
            kit::makeFinishedFolder(folder, "file", fill);
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
    kit::makeFinishedFolder(place(), "file", [&](const fs::path& folder) {
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

TEST_F(FinishedFolderTest, EmptyFolderIsFilledAndNotReplaced) {
    fs::create_directory(place());
    fs::permissions(place(), fs::perms::owner_all);
    const ino_t before = inodeOf(place());
    kit::makeFinishedFolder(place(), "file", [&](const fs::path& folder) {
        EXPECT_EQ(folder.parent_path(), place());
        EXPECT_EQ(folderNames(place()), Names{folder.filename().string()});
        putFile(folder);
        fs::create_directory(folder / "folder");
        EXPECT_EQ(folderNames(place()).size(), 1U);
    });
    expectMade();
    EXPECT_EQ(folderNames(place()), (Names{"file", "folder"}));
    EXPECT_EQ(folderNames(above()), Names{"unit"});
    EXPECT_EQ(inodeOf(place()), before);
    EXPECT_EQ(fs::status(place()).permissions(), fs::perms::owner_all);
}

TEST_F(FinishedFolderTest, LastEntryIsMovedAfterAllOthers) {
    for (const std::string last : {"a", "b", "c"}) {
        fs::create_directory(place());
        FolderArrivals arrivals(place());
        kit::makeFinishedFolder(place(), last, [](const fs::path& folder) {
            for (const char* name : {"c", "a", "b"}) {
                fs::create_directory(folder / name);
            }
        });
        const std::vector<std::string> names = arrivals.take();
        ASSERT_EQ(names.size(), 3U);
        EXPECT_EQ(names.back(), last);
        fs::remove_all(place());
    }
}

TEST_F(FinishedFolderTest, EmptyFolderWhoseFolderCannotBeWrittenIsFilled) {
    fs::create_directory(place());
    fs::permissions(above(), fs::perms::owner_read | fs::perms::owner_exec);
    {
        const EnforcedPermissions permissions;
        EXPECT_EQ(refusalOf(place()), "");
    }
    fs::permissions(above(), fs::perms::owner_all);
    expectMade();
}

TEST_F(FinishedFolderTest, EntryThatAppearsInTheEmptyFolderStaysAlone) {
    fs::create_directory(place());
    EXPECT_EQ(refusalOf(place(),
                        [this](const fs::path& folder) {
                            putFile(folder);
                            writeFile(place() / "file", "mine");
                        }),
              place().string() + " is there already and is not an empty folder");
    EXPECT_EQ(folderNames(place()), Names{"file"});
    EXPECT_EQ(readFile(place() / "file"), "mine");
}

TEST_F(FinishedFolderTest, NothingIsMovedWhenOneEntryCannotBe) {
    fs::create_directory(place());
    std::string refusal;
    {
        const EnforcedPermissions permissions;
        refusal = refusalOf(place(), [](const fs::path& folder) {
            fs::create_directory(folder / "a");
            fs::create_directory(folder / "b");
            // A folder that changes its place changes its "..", so it must be writable itself.
            fs::permissions(folder / "b", fs::perms::owner_read | fs::perms::owner_exec);
        });
    }
    EXPECT_EQ(refusal, "cannot make " + place().string() + ": Permission denied");
    EXPECT_EQ(folderNames(place()), Names{});
}

TEST_F(FinishedFolderTest, EmptyFolderThatAnotherProcessFillsIsRefused) {
    fs::create_directory(place());
    const kit::FolderLock lock(place());
    expectHolderNamed(refusalOf(place()), place());
    EXPECT_EQ(folderNames(place()), Names{});
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
    for (const fs::path& path : {fs::path("/proc/none"), above()}) {
        EXPECT_EQ(
            refusalOf(place(), [&](const fs::path&) { throw kit::KitError("no ", path, " here"); }),
            "no " + path.string() + " here");
    }
    EXPECT_EQ(refusalOf(place(), [](const fs::path&) { throw kit::KitError("no ", "", " here"); }),
              "no \"\" here");
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
    EXPECT_THROW(kit::makeFinishedFolder(place(), "file",
                                         [](const fs::path& folder) {
                                             putFile(folder);
                                             throw std::runtime_error("fill");
                                         }),
                 std::runtime_error);
    EXPECT_EQ(folderNames(above()), Names{"unit"});
    EXPECT_TRUE(fs::is_empty(place()));
}

TEST_F(FinishedFolderTest, LeftoverOfAKilledRunIsRemoved) {
    fs::path first;
    kit::makeFinishedFolder(place(), "file", [&](const fs::path& folder) { first = folder; });
    fs::remove(place());
    fs::create_directory(first); // as left by a killed run with the same process number
    writeFile(first / "file", "half");
    EXPECT_EQ(refusalOf(place()), "");
    expectMade();
    EXPECT_EQ(folderNames(above()), Names{"unit"});
}

TEST_F(FinishedFolderTest, FolderWithNothingButLeftoversIsEmpty) {
    fs::create_directories(place() / ".unit.unfinished-1-0/half");
    EXPECT_EQ(refusalOf(place()), "");
    EXPECT_EQ(folderNames(place()), Names{"file"});
}

TEST_F(FinishedFolderTest, FolderThatAppearsMeanwhileIsNotReplaced) {
    EXPECT_EQ(refusalOf(place(),
                        [this](const fs::path& folder) {
                            putFile(folder);
                            fs::create_directory(place());
                            writeFile(place() / "mine", "kept");
                        }),
              "cannot make " + place().string() + ": File exists");
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

TEST_F(FinishedFolderTest, WorkingDirectoryIsFilledUnderTheFeetOfItsProcess) {
    fs::create_directory(place());
    fs::current_path(place());
    for (const std::string name : {".", "./", "../unit/.", "../unit"}) {
        EXPECT_EQ(refusalOf(name), "");
        EXPECT_EQ(readFile("file"), "content");
        fs::remove("file");
    }
}

TEST_F(FinishedFolderTest, LinkToAnEmptyFolderIsFollowed) {
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
    EXPECT_EQ(refusalOf(""), "cannot make \"\": No such file or directory");
    EXPECT_EQ(refusalOf("/"), "/ is there already and is not an empty folder");
    writeFile(above() / "file", "");
    EXPECT_EQ(refusalOf(above() / "file/unit"),
              "cannot make a folder in " + (above() / "file").string() + ": Not a directory");
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
    EXPECT_EQ(refusal, "cannot make a folder in " + above().string() + ": Permission denied");
}

} // namespace

} // namespace orvane::test
