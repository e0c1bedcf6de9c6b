// SPDX-License-Identifier: Apache-2.0
//
// Units in which something else than a file is at a path that a run opens, through the program's
// command line.
#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/enter/captured_run.h"
#include "kit/host/kit_error.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/orvane_unit_command.h"
#include "tests/support/unit_test.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <nlohmann/json.hpp>
#include <sys/stat.h>
#include <unistd.h>

#include <functional>
#include <tuple>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using Json = nlohmann::json;

constexpr char VERSION_FILE[] = "/fs/rwdata/.Version/app.inf";

class UnitKindsTest : public ::testing::Test {
protected:
    fs::path root() const { return described_.root(); }
    fs::path captured() const { return described_.folder() / "captured"; }
    fs::path at(const std::string& path) const { return root() / path.substr(1); }

    /// Removes what is at `path` and makes an entry of this kind.
    void put(const std::string& path, mode_t kind) const {
        fs::remove_all(at(path));
        ASSERT_EQ(::mknod(at(path).c_str(), kind | 0600U, 0), 0) << path;
    }

    /// Replaces what is at `path` by the host's device /dev/`name`. Where a device can't be made,
    /// the commands that are started later see it there by a mount of their own.
    void putDevice(const std::string& path, const std::string& name) {
        const std::string device = "/dev/" + name;
        struct stat state {};
        ASSERT_EQ(::stat(device.c_str(), &state), 0);
        fs::remove_all(at(path));
        const bool isMade = ::mknod(at(path).c_str(), S_IFCHR | 0666U, state.st_rdev) == 0;
        if (isMade && std::ofstream(at(path), std::ios::app).is_open()) {
            return;
        }
        fs::remove(at(path));
        writeFile(at(path), "");
        prefix_ = inMount(R"(mount --bind "$1" "$2")", {device, at(path)});
    }

    /// The unit mounted on itself, read-only.
    void makeReadOnly() {
        prefix_ =
            inMount(R"(mount --bind "$2" "$2" && mount -o remount,bind,ro "$2")", {"", root()});
    }

    /// Permission bits apply to the commands that are started later, also if they are a
    /// superuser's. In a user namespace of its own a user may do everything with its own files.
    void enforcePermissions() {
        if (::geteuid() == 0) {
            prefix_ = {"setpriv", "--bounding-set", "-dac_override,-dac_read_search"};
        }
    }

    kit::RunResult start(const Words& words) const {
        return runOnHost(prefix_ + Words{"timeout", "100"} + buildCommand(ORVANE_UNIT_BINARY) +
                         words);
    }

    kit::RunResult run() const {
        return start({"run", root(), "--orvane", ORVANE_BINARY, "--", "-a", "-i"});
    }

    /// What explain prints for `unit`; requires that it has an answer.
    Json explained(const fs::path& unit, const Words& more = {}) const {
        const kit::RunResult result = start(Words{"explain", unit, "--json"} + more);
        EXPECT_LE(result.exitStatus, 1) << result.standardError;
        EXPECT_EQ(result.standardError, "");
        return Json::parse(result.standardOutput, nullptr, false);
    }

    /// The outcomes and reasons, and the keys and texts of the lines.
    Json answersFor(const fs::path& unit) const {
        Json outputs = explained(unit).at("outputs");
        for (Json& output : outputs) {
            for (Json& line : output["lines"]) {
                line.erase("detail");
            }
        }
        return outputs;
    }

    void expectRefused(const Words& words, const std::string& complaint) const {
        const kit::RunResult result = start(words);
        EXPECT_EQ(result.exitStatus, 2) << testing::PrintToString(words);
        EXPECT_EQ(result.standardOutput, "");
        EXPECT_EQ(result.standardError, "orvane-unit: " + complaint + "\n");
    }

    /// Explains, runs, and compares what is left at the outputs.
    void expectRunAgrees() const {
        const Json outputs = explained(root(), {"--content"}).at("outputs");
        EXPECT_EQ(run().exitStatus, 0);
        for (const Json& output : outputs) {
            const std::string path = output.at("path");
            if (output.at("left") == "file") {
                EXPECT_EQ(readFile(at(path)), output.at("content")) << path;
            } else if (output.at("left") != "other") { // that may be in a mount
                EXPECT_FALSE(fs::is_regular_file(at(path))) << path;
            }
        }
    }

private:
    /// The words before a command that runs after `script` in mounts of its own.
    static Words inMount(const std::string& script, const Words& arguments) {
        return Words{"unshare", "--mount"} +
               (::geteuid() == 0 ? Words{} : Words{"--user", "--map-root-user"}) +
               Words{"sh", "-c", script + R"( && shift 2 && exec "$@")", "sh"} + arguments;
    }

    DescribedUnit described_;
    Words prefix_;
};

/// An input, and the commands that open it.
struct Input {
    const char* path;
    bool isShown;
};

const Input INPUTS[] = {{CONFIG_SHM_NAME, true},
                        {BOOT_DISK, true},
                        {VERSION_FILE, true},
                        {AIRPLAY_FILE.templateFile, false},
                        {IAP1_FILE.templateFile, false},
                        {IAP2_FILE.stockFile, false},
                        {AIRPLAY_FILE.output, false},
                        {IAP1_FILE.output, false}};

TEST_F(UnitKindsTest, NobodyWaitsAtAPipe) {
    for (const Input& input : INPUTS) {
        SCOPED_TRACE(input.path);
        const DescribedUnit described;
        const fs::path place = described.root() / (input.path + 1);
        fs::remove(described.root() / (IAP2_FILE.templateFile + 1)); // so the stock file counts
        fs::remove(place);
        ASSERT_EQ(::mkfifo(place.c_str(), 0600), 0);
        const std::string root = described.root();
        const std::string complaint =
            std::string(input.path) + " is a pipe: a run waits there for its other end";
        expectRefused({"explain", root}, complaint);
        expectRefused({"capture", root, captured()}, complaint);
        expectRefused({"diff", root, root}, complaint);
        expectRefused({"impact", root}, complaint);
        expectRefused({"describe", root},
                      place.string() + " is a pipe, not a file, a folder or a link");
        if (input.isShown) {
            expectRefused({"show", root}, complaint);
        } else {
            EXPECT_EQ(start({"show", root}).exitStatus, 0);
        }
        EXPECT_FALSE(exists(captured()));
    }
}

TEST_F(UnitKindsTest, PipeThatIsNotOpenedDoesNotMatter) {
    put(AIRPLAY_FILE.output, S_IFIFO);
    put(AIRPLAY_FILE.stockFile, S_IFIFO);
    EXPECT_EQ(start({"explain", root(), "-i"}).exitStatus, 0);
    fs::remove(at(AIRPLAY_FILE.output));
    EXPECT_EQ(start({"explain", root()}).exitStatus, 0);
}

TEST_F(UnitKindsTest, PipeThatALinkLeadsToIsAPipe) {
    put("/fs/rwdata/pipe", S_IFIFO);
    fs::remove(at(VERSION_FILE));
    fs::create_symlink("../pipe", at(VERSION_FILE));
    expectRefused({"explain", root(), "-i"},
                  std::string(VERSION_FILE) + " is a pipe: a run waits there for its other end");
}

TEST_F(UnitKindsTest, PipeAsAProgramIsNotStarted) {
    put("/program", S_IFIFO);
    expectRefused({"run", root(), "--orvane", at("/program")},
                  at("/program").string() + " is a pipe, not a program");
}

TEST_F(UnitKindsTest, SocketCannotBeOpenedSoItIsLikeNothing) {
    for (const char* path : {CONFIG_SHM_NAME, BOOT_DISK, AIRPLAY_FILE.templateFile,
                             IAP2_FILE.templateFile, IAP2_FILE.stockFile}) {
        SCOPED_TRACE(path);
        fs::remove(at(path));
        const Json without = explained(root());
        put(path, S_IFSOCK);
        EXPECT_EQ(explained(root()), without);
        fs::remove_all(captured());
        EXPECT_EQ(start({"capture", root(), captured()}).exitStatus, 0);
        EXPECT_EQ(answersFor(captured()), answersFor(root()));
        EXPECT_FALSE(exists(captured() / (path + 1)));
    }
    expectRunAgrees();
}

TEST_F(UnitKindsTest, VersionFileThatCannotBeOpenedIsStillListed) {
    put(VERSION_FILE, S_IFSOCK);
    const std::string shown = start({"explain", root(), "-i"}).standardOutput;
    EXPECT_NE(shown.find("1 version description files in"), std::string::npos) << shown;
    EXPECT_EQ(start({"capture", root(), captured()}).exitStatus, 0);
    EXPECT_EQ(answersFor(captured()), answersFor(root()));
    const std::string again = start({"explain", captured(), "-i"}).standardOutput;
    EXPECT_NE(again.find("1 version description files in"), std::string::npos) << again;
}

TEST_F(UnitKindsTest, SocketInPlaceOfAnOutputIsKept) {
    put(IAP2_FILE.output, S_IFSOCK);
    EXPECT_EQ(explained(root(), {"-i"}).at("outputs").at(1).at("outcome"), "kept");
    expectRunAgrees();
}

TEST_F(UnitKindsTest, DeviceThatIsNoMemoryIsNoImage) {
    putDevice(CONFIG_SHM_NAME, "zero");
    const std::string shown = start({"explain", root(), "-a"}).standardOutput;
    EXPECT_NE(shown.find("image-not-mappable"), std::string::npos) << shown;
    expectRunAgrees();
    EXPECT_EQ(start({"capture", root(), captured()}).exitStatus, 0);
    EXPECT_EQ(answersFor(captured()), answersFor(root()));
}

/// What such a device yields to who looks, a run need not find there.
TEST_F(UnitKindsTest, DeviceWithoutPositionsIsNoDisk) {
    const std::string complaint = std::string(BOOT_DISK) +
                                  " is a device without positions: only a run can tell what it "
                                  "yields";
    const DescribedUnit other;
    for (const char* device : {"zero", "null", "full", "urandom"}) {
        SCOPED_TRACE(device);
        putDevice(BOOT_DISK, device);
        for (const Words& words :
             {Words{"explain", root(), "-i"}, Words{"show", root()},
              Words{"show", root(), "--json"}, Words{"impact", root()},
              Words{"diff", root(), other.root()}, Words{"diff", other.root(), root()},
              Words{"capture", root(), captured()}}) {
            expectRefused(words, complaint);
        }
        expectRefused({"describe", root()},
                      at(BOOT_DISK).string() + " is a device, not a file, a folder or a link");
        EXPECT_FALSE(exists(captured()));
    }
}

TEST_F(UnitKindsTest, DeviceThatTakesNoSeekIsNoDisk) {
    putDevice(BOOT_DISK, "tty");
    const kit::RunResult result = start({"explain", root(), "-i"});
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.standardError.find("orvane-unit: "), 0U);
    EXPECT_NE(result.standardError.find(BOOT_DISK), std::string::npos) << result.standardError;
}

TEST_F(UnitKindsTest, DeviceInPlaceOfAFileThatIsReadIsNamed) {
    for (const char* path :
         {AIRPLAY_FILE.templateFile, IAP2_FILE.stockFile, static_cast<const char*>(VERSION_FILE)}) {
        SCOPED_TRACE(path);
        const DescribedUnit fresh;
        fs::remove(at(IAP2_FILE.templateFile));
        const std::string complaint =
            std::string(path) + " is a device: only a run can tell what it yields";
        const std::string former = fs::is_regular_file(at(path)) ? readFile(at(path)) : "";
        putDevice(path, "zero");
        expectRefused({"explain", root()}, complaint);
        expectRefused({"capture", root(), captured()}, complaint);
        fs::remove(at(path));
        writeFile(at(path), former);
    }
}

TEST_F(UnitKindsTest, DeviceInPlaceOfAnOutputTakesWhatIsWritten) {
    for (const char* device : {"null", "full"}) {
        SCOPED_TRACE(device);
        putDevice("/dev/other", device);
        fs::remove(at(AIRPLAY_FILE.output));
        fs::create_symlink("/dev/other", at(AIRPLAY_FILE.output));
        const Json output = explained(root()).at("outputs").at(2);
        EXPECT_EQ(output.at("path"), AIRPLAY_FILE.output);
        EXPECT_EQ(output.at("outcome"), "generated");
        EXPECT_EQ(output.at("left"), "other");
        expectRunAgrees();
    }
}

TEST_F(UnitKindsTest, DeviceThatMayRefuseIap2LeavesIap1Unknown) {
    putDevice(IAP2_FILE.output, "full");
    const std::string complaint =
        "/tmp/iap2.cfg is a device: only a run can tell whether it takes what is written, on "
        "which /tmp/iap1.cfg depends";
    expectRefused({"explain", root(), "-i"}, complaint);
    EXPECT_EQ(start({"explain", root(), "-a"}).exitStatus, 0);
    writeFile(at(IAP2_FILE.templateFile), ""); // then it fails whatever the device does
    EXPECT_EQ(explained(root(), {"-i"}).at("outputs").at(2).at("outcome"), "stock");
    expectRunAgrees();
    fs::remove(at(IAP2_FILE.templateFile)); // then nothing is written to the first stream
    expectRunAgrees();
}

TEST_F(UnitKindsTest, ReadOnlyMountOfAUnitSaysNothingAboutItsOutputs) {
    const Json writable = explained(root());
    makeReadOnly();
    EXPECT_EQ(explained(root()), writable);
    EXPECT_EQ(start({"capture", root(), captured()}).exitStatus, 0);
    EXPECT_TRUE(fs::is_empty(captured() / "tmp"));
    const kit::RunResult diff = start({"diff", root(), captured()});
    EXPECT_EQ(diff.exitStatus, 0) << diff.standardOutput;
    EXPECT_EQ(answersFor(captured()), answersFor(root()));
}

TEST_F(UnitKindsTest, OutputsThatTheCallerMayNotWriteAreWrittenOnTheUnit) {
    writeFile(at(IAP1_FILE.output), "of an earlier run\n");
    const Json writable = explained(root());
    fs::permissions(at(IAP1_FILE.output), fs::perms::owner_read);
    fs::permissions(at("/tmp"), fs::perms::owner_read | fs::perms::owner_exec);
    enforcePermissions();
    EXPECT_EQ(explained(root()), writable);
    EXPECT_EQ(start({"capture", root(), captured()}).exitStatus, 0);
    EXPECT_TRUE(fs::is_empty(captured() / "tmp"));
    fs::permissions(at("/tmp"), fs::perms::owner_all);
}

} // namespace

} // namespace orvane::test
