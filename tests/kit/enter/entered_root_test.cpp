// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"
#include "kit/enter/entered_root.h"
#include "kit/host/kit_error.h"
#include "tests/kit/host/open_descriptors.h"
#include "tests/support/permissions.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <linux/capability.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <filesystem>
#include <set>
#include <stdexcept>
#include <string>
#include <thread>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// A folder by its identity in the kernel, whatever the root is.
struct FolderIdentity {
    dev_t device;
    ino_t inode;
    bool operator==(const FolderIdentity& other) const {
        return device == other.device && inode == other.inode;
    }
};

FolderIdentity identityOf(const char* path) {
    struct stat state {};
    EXPECT_EQ(stat(path, &state), 0) << path;
    return {state.st_dev, state.st_ino};
}

/// The open descriptors, found without /proc.
std::set<int> descriptorNumbers() {
    std::set<int> numbers;
    for (int number = 0; number < 1024; ++number) {
        if (fcntl(number, F_GETFD) != -1) {
            numbers.insert(number);
        }
    }
    return numbers;
}

/// The refusal to enter `root`; empty when there is none.
std::string refusalOf(const fs::path& root) {
    try {
        const kit::EnteredRoot entered(root);
    } catch (const kit::KitError& error) {
        return error.what();
    }
    return "";
}

/// For a child process: this thread may no longer change its root, and no thread may enter a user
/// namespace, since the kernel refuses that to a process with a second thread.
void forbidChangeOfRoot() {
    std::thread([] { pause(); }).detach();
    __user_cap_header_struct header{_LINUX_CAPABILITY_VERSION_3, 0};
    __user_cap_data_struct sets[_LINUX_CAPABILITY_U32S_3] = {};
    if (syscall(SYS_capset, &header, sets) != 0) {
        throw std::runtime_error("capset");
    }
}

class EnteredRootTest : public ::testing::Test {
protected:
    EnteredRootTest()
        : hostRoot_(identityOf("/")), hostCwd_(identityOf(".")), hostCwdPath_(fs::current_path()) {
        writeFile(root() / "marker", "of the unit");
        fs::create_directory(root() / "inner");
    }
    ~EnteredRootTest() override { fs::current_path(hostCwdPath_); }

    const fs::path& root() const { return folder_.path(); }

    void expectHost() const {
        EXPECT_TRUE(identityOf("/") == hostRoot_);
        EXPECT_TRUE(identityOf(".") == hostCwd_);
        EXPECT_TRUE(fs::exists(root() / "marker")); // a path of the host
    }

    /// For a child process, whose expectations nobody would see.
    void expectHostRootAt(const char* workingDirectory) const {
        if (!(identityOf("/") == hostRoot_) || fs::current_path() != workingDirectory) {
            throw std::runtime_error("elsewhere");
        }
    }

    static void expectInside() {
        EXPECT_EQ(fs::current_path(), "/");
        EXPECT_EQ(readFile("/marker"), "of the unit");
        EXPECT_EQ(readFile("marker"), "of the unit");
        EXPECT_TRUE(identityOf("/..") == identityOf("/"));
    }

private:
    TemporaryFolder folder_;
    FolderIdentity hostRoot_;
    FolderIdentity hostCwd_;
    fs::path hostCwdPath_;
};

TEST_F(EnteredRootTest, RootAndWorkingDirectoryAreTheUnitsWhileEntered) {
    const FolderIdentity unit = identityOf(root().c_str());
    const kit::EnteredRoot entered(root());
    EXPECT_TRUE(identityOf("/") == unit);
    EXPECT_TRUE(identityOf(".") == unit);
    expectInside();
}

TEST_F(EnteredRootTest, RootAndWorkingDirectoryAreTheHostsAfterwards) {
    { const kit::EnteredRoot entered(root()); }
    expectHost();
}

TEST_F(EnteredRootTest, AbsoluteLinkStaysInsideTheUnit) {
    fs::create_symlink("/marker", root() / "inner/link");
    const kit::EnteredRoot entered(root());
    EXPECT_EQ(readFile("/inner/link"), "of the unit");
}

TEST_F(EnteredRootTest, ChangeOfTheWorkingDirectoryInsideEndsWithTheUnit) {
    {
        const kit::EnteredRoot entered(root());
        fs::current_path("/inner");
    }
    expectHost();
}

TEST_F(EnteredRootTest, HostsWorkingDirectoryCanBeEntered) {
    fs::current_path(root());
    const FolderIdentity before = identityOf(".");
    {
        const kit::EnteredRoot entered(".");
        expectInside();
    }
    EXPECT_TRUE(identityOf(".") == before);
}

TEST_F(EnteredRootTest, RelativePathStartsAtTheHostsWorkingDirectory) {
    fs::current_path(root().parent_path());
    const kit::EnteredRoot entered(root().filename());
    expectInside();
}

TEST_F(EnteredRootTest, LinkToAFolderIsEntered) {
    const TemporaryFolder other;
    fs::create_symlink(root(), other.path() / "unit");
    const kit::EnteredRoot entered(other.path() / "unit");
    expectInside();
}

TEST_F(EnteredRootTest, ExceptionInsideLeavesTheUnit) {
    try {
        const kit::EnteredRoot entered(root());
        throw std::runtime_error("inside");
    } catch (const std::runtime_error&) {
        expectHost();
    }
}

TEST_F(EnteredRootTest, AnythingButAFolderIsRefusedByName) {
    fs::create_symlink("missing", root() / "dangling");
    const std::string folder = root().string() + "/";
    EXPECT_EQ(refusalOf(folder + "marker"), folder + "marker is not a folder");
    for (const char* name : {"missing", "dangling"}) {
        EXPECT_EQ(refusalOf(folder + name),
                  "cannot read " + folder + name + ": No such file or directory");
        expectHost();
    }
    EXPECT_EQ(refusalOf(folder + "marker/below"),
              "cannot read " + folder + "marker/below: Not a directory");
    EXPECT_EQ(refusalOf(""), "cannot read \"\": No such file or directory");
}

TEST_F(EnteredRootTest, FolderWithoutPermissionIsRefusedWithTheReason) {
    const fs::path locked = root() / "inner";
    refusalOf(root()); // permissions apply to the last user namespace that is entered
    fs::permissions(locked, fs::perms::owner_read);
    std::string refusal;
    {
        const EnforcedPermissions permissions;
        refusal = refusalOf(locked);
    }
    EXPECT_EQ(refusal, "cannot make " + locked.string() + " the root directory: Permission denied");
    expectHost();
}

TEST_F(EnteredRootTest, RefusalOfBothWaysNamesTheRemedy) {
    try {
        kit::runCaptured([this] {
            forbidChangeOfRoot();
            const kit::EnteredRoot entered(root());
        });
        ADD_FAILURE() << "entered";
    } catch (const kit::KitError& error) {
        const std::string said = error.what();
        EXPECT_EQ(said.rfind("cannot make " + root().string() +
                                 " the root directory: Operation not permitted (run as root",
                             0),
                  0U)
            << said;
        EXPECT_NE(said.find("user.max_user_namespaces"), std::string::npos) << said;
        EXPECT_EQ(said.find('\n'), std::string::npos) << said;
    }
}

TEST_F(EnteredRootTest, CurrentRootNeedsNoPrivilegeAndChangesTheWorkingDirectory) {
    fs::create_directory_symlink("/", root() / "up");
    const kit::RunResult result = kit::runCaptured([this] {
        forbidChangeOfRoot();
        fs::current_path(root());
        for (const fs::path& path : {fs::path("/"), fs::path("up"), root() / "inner/../up"}) {
            const std::size_t before = openDescriptors();
            {
                const kit::EnteredRoot entered(path);
                expectHostRootAt("/");
            }
            if (fs::current_path() != root() || openDescriptors() != before) {
                throw std::runtime_error("not as before");
            }
        }
        ::_exit(0);
    });
    EXPECT_EQ(result.exitStatus, 0);
    expectHost();
}

TEST_F(EnteredRootTest, ManyUnitsInARowLeaveNoDescriptorOpen) {
    const std::size_t before = openDescriptors();
    for (int round = 0; round < 500; ++round) {
        const kit::EnteredRoot entered(root());
        ASSERT_TRUE(exists("/marker")) << round;
    }
    EXPECT_EQ(openDescriptors(), before);
    expectHost();
}

TEST_F(EnteredRootTest, RefusalLeavesNoDescriptorOpen) {
    const std::size_t before = openDescriptors();
    EXPECT_NE(refusalOf(root() / "missing"), "");
    EXPECT_NE(refusalOf(root() / "marker"), "");
    EXPECT_EQ(openDescriptors(), before);
}

TEST_F(EnteredRootTest, ProgramStartedInsideGetsNoWayOut) {
    const std::set<int> before = descriptorNumbers();
    const kit::EnteredRoot entered(root());
    for (const int number : descriptorNumbers()) {
        if (before.count(number) == 0) {
            EXPECT_EQ(fcntl(number, F_GETFD), FD_CLOEXEC) << number;
        }
    }
}

} // namespace

} // namespace orvane::test
