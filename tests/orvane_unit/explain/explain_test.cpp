// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/description/unit_layout.h"
#include "kit/enter/captured_run.h"
#include "kit/enter/entered_root.h"
#include "kit/enter/run_inside.h"
#include "kit/host/kit_error.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/marker.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/explain/planned_merge.h"
#include "orvane_unit/report/place_text.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/tree_state.h"
#include "tests/support/permissions.h"
#include "tests/support/unit_test.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <sched.h>
#include <sys/mount.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <algorithm>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using desk::Explanation;
using desk::Line;
using desk::Output;
using kit::UnitDescription;

const Output& outputOf(const Explanation& explanation, const std::string& path) {
    const auto found = std::find_if(explanation.begin(), explanation.end(),
                                    [&path](const Output& other) { return other.path == path; });
    if (found == explanation.end()) {
        throw std::runtime_error("no output " + path);
    }
    return *found;
}

const Line& lineOf(const Output& output, const std::string& key) {
    const auto found =
        std::find_if(output.lines.begin(), output.lines.end(),
                     [&key](const Line& line) { return keyText(line.origin.key) == key; });
    if (found == output.lines.end()) {
        throw std::runtime_error("no line of " + key);
    }
    return *found;
}

std::string placeOf(const Output& output, const std::string& key) {
    return desk::placeText(lineOf(output, key).origin);
}

/// The content that the real binary leaves at the outputs of the explanation.
void expectRunLeaves(const DescribedUnit& described, const Explanation& explanation,
                     const std::vector<std::string>& arguments) {
    ASSERT_EQ(kit::runInside(described.root(), {ORVANE_BINARY, arguments}).exitStatus, 0);
    const kit::EnteredRoot entered(described.root());
    for (const Output& output : explanation) {
        if (output.kindAfter == desk::PathKind::file) {
            EXPECT_EQ(readFile(output.path), output.contentAfter) << output.path;
        } else {
            std::error_code ignored; // for a link to itself
            EXPECT_FALSE(fs::is_regular_file(output.path, ignored)) << output.path;
        }
    }
}

TEST(ExplainTest, OutputWithoutAnyLineIsEmpty) {
    const DescribedUnit described;
    const kit::EnteredRoot entered(described.root());
    desk::PlannedFiles files(entered.isRunningSystem());
    desk::PlannedMerge merge(files, AIRPLAY_FILE);
    const std::vector<desk::MergedValue<int>> values = {
        {[](int& value) { ++value; }, {{desk::Reason::fromImage}, kit::paramKey(1), {}}}};
    const Output output = merge.finish(
        0, values, [](std::istream&, std::ostream&, int) { return MergeDecision::generate; });
    EXPECT_EQ(output.outcome, desk::Outcome::empty);
    EXPECT_TRUE(output.lines.empty());
}

/// In a child: mounts that no other process sees.
void enterOwnMounts() {
    const std::string user = "0 " + std::to_string(::geteuid()) + " 1";
    const std::string group = "0 " + std::to_string(::getegid()) + " 1";
    if (::unshare(CLONE_NEWNS) != 0) {
        ASSERT_EQ(::unshare(CLONE_NEWUSER | CLONE_NEWNS), 0);
        writeFile("/proc/self/setgroups", "deny");
        writeFile("/proc/self/uid_map", user);
        writeFile("/proc/self/gid_map", group);
    }
    ASSERT_EQ(::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr), 0);
}

void mountReadOnly(const fs::path& folder) {
    ASSERT_EQ(::mount(folder.c_str(), folder.c_str(), nullptr, MS_BIND, nullptr), 0);
    struct statvfs mount {};
    ASSERT_EQ(::statvfs(folder.c_str(), &mount), 0);
    // A user namespace may not lift these.
    const unsigned long kept = mount.f_flag & (ST_NOSUID | ST_NODEV | ST_NOEXEC | ST_NOATIME);
    ASSERT_EQ(
        ::mount(nullptr, folder.c_str(), nullptr, MS_REMOUNT | MS_BIND | MS_RDONLY | kept, nullptr),
        0);
}

TEST(ExplainTest, ValuesNameTheirKeysAndPlaces) {
    const DescribedUnit described;
    const Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
    const Output& airplay = outputOf(explanation, AIRPLAY_FILE.output);
    EXPECT_EQ(lineOf(airplay, "param.139").text, "model = Quarion Velmira\n");
    EXPECT_EQ(placeOf(airplay, "param.139"), "parameter 139, image byte 139: 1a");
    EXPECT_EQ(lineOf(airplay, "param.36").text, "oemIconPath = /fs/mp/etc/QUARION/oemIcon.png\n");
    EXPECT_EQ(lineOf(airplay, "param.134").text, "audioProfile = 3\n");
    EXPECT_EQ(placeOf(airplay, "param.134"), "parameter 134, image bytes from 133: 03 00");
    EXPECT_EQ(lineOf(airplay, "param.22").text, "rightHandDrive = 1\n");
    EXPECT_EQ(lineOf(airplay, "file./fs/mp/etc/airplay_static.conf").text, "airplay template\n");

    const Output& iap1 = outputOf(explanation, IAP1_FILE.output);
    EXPECT_EQ(lineOf(iap1, "slot.9").text, "serial=SN004217\n");
    // 2 MiB minus 1 MiB, plus 129 for slot 9.
    EXPECT_EQ(placeOf(iap1, "slot.9"),
              "record slot 9, disk bytes from 1048705: 53 4e 30 30 34 32 31 37");
    EXPECT_EQ(lineOf(iap1, "file./fs/rwdata/.Version/app.inf").text, "firmware_version=030a02\n");
    EXPECT_EQ(placeOf(iap1, "file./fs/rwdata/.Version/app.inf"),
              "/fs/rwdata/.Version/app.inf:2: Version Number is \"ABC_3.10.2_rc\"");
    EXPECT_TRUE(isIntended(explanation));
}

TEST(ExplainTest, VersionLineIsTheLastOneOfItsKey) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/app.inf"] =
            "Version Number=1.1.1\nno line\nType=Application\nVersion Number = 2.2.2\n";
    });
    const Explanation explanation = desk::explainUnit(described.root(), {"-i"});
    EXPECT_EQ(placeOf(outputOf(explanation, IAP2_FILE.output), "file./fs/rwdata/.Version/app.inf"),
              "/fs/rwdata/.Version/app.inf:4: Version Number is \"2.2.2\"");
}

TEST(ExplainTest, ReadsArgumentsAsTheRealBinaryDoes) {
    using Arguments = std::vector<std::string>;
    const DescribedUnit described;
    const Arguments airplay = {TELEPHONY_TUNING_FILE, SPEECHREC_TUNING_FILE, AIRPLAY_FILE.output};
    const Arguments iap = {IAP2_DEVICE_FILE.output, IAP2_FILE.output, IAP1_FILE.output};
    struct Row {
        Arguments arguments;
        std::string expected; ///< a letter for each writer
    };
    const Row rows[] = {
        {{}, ""},
        {{"-a", "-i"}, "ai"},
        {{"-xia", "-a"}, "iaa"},
        {{"-a", "--", "-i"}, "a"},
        {{"word", "-a"}, ""},
        {{"-i", "-", "-a"}, "i"},
        {{"", "-a"}, ""},
        {{"--a", "-i"}, "ai"},
        {{"-a-i"}, "ai"},
        {{"-x", "-i"}, "i"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(testing::PrintToString(row.arguments));
        Arguments expected;
        for (const char letter : row.expected) {
            const Arguments& paths = letter == 'a' ? airplay : iap;
            expected.insert(expected.end(), paths.begin(), paths.end());
        }
        Arguments found;
        for (const Output& output : desk::explainUnit(described.root(), row.arguments)) {
            found.push_back(output.path);
        }
        EXPECT_EQ(found, expected);

        const DescribedUnit fresh;
        ASSERT_EQ(kit::runInside(fresh.root(), {ORVANE_BINARY, row.arguments}).exitStatus, 0);
        for (const char* path : {AIRPLAY_FILE.output, IAP1_FILE.output}) {
            const bool isExplained = std::find(found.begin(), found.end(), path) != found.end();
            EXPECT_EQ(fs::exists(fresh.root() / (path + 1)), isExplained) << path;
        }
    }
}

TEST(ExplainTest, IgnoresUnknownOptions) {
    const DescribedUnit described;
    testing::internal::CaptureStderr();
    EXPECT_EQ(desk::explainUnit(described.root(), {"-xi", "-a"}).size(), 6U);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
}

TEST(ExplainTest, SerialWithLineEndsAndZeroBytesIsOnePiece) {
    for (const std::string& serial : {std::string("A\nB\n\nC"), std::string("\n"),
                                      std::string("AB\0CD", 5), std::string("\xff\nserial")}) {
        const DescribedUnit described(
            [&serial](UnitDescription& unit) { unit.disk.slots[9] = serial; });
        const Explanation explanation = desk::explainUnit(described.root(), {"-i"});
        const std::string text = serial.substr(0, serial.find('\0'));
        EXPECT_EQ(lineOf(outputOf(explanation, IAP2_FILE.output), "slot.9").text,
                  "serial=" + text + "\n");
        expectRunLeaves(described, explanation, {"-i"});
    }
}

TEST(ExplainTest, OutputsThatAreLinksAgreeWithARun) {
    struct Link {
        const char* from;
        const char* to;
    };
    const Link links[] = {
        {IAP2_DEVICE_FILE.output, IAP1_FILE.output},       // an output that is written later
        {IAP1_FILE.output, IAP2_FILE.output},              // one that is written before
        {IAP2_DEVICE_FILE.output, IAP2_FILE.templateFile}, // another file's template
        {IAP2_FILE.output, IAP1_FILE.stockFile},
        {AIRPLAY_FILE.output, "fresh"}, // a file that does not exist yet
        {AIRPLAY_FILE.output, "/none/at/all"},
        {AIRPLAY_FILE.output, AIRPLAY_FILE.output},
    };
    for (const Link& link : links) {
        const DescribedUnit described(
            [&link](UnitDescription& unit) { unit.links[link.from] = link.to; });
        const Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
        SCOPED_TRACE(std::string(link.from) + " -> " + link.to);
        expectRunLeaves(described, explanation, {"-a", "-i"});
    }
}

TEST(ExplainTest, OutputsThatAreHardLinksAgreeWithARun) {
    struct Link {
        const char* from;
        const char* to;
    };
    const Link links[] = {
        {IAP2_DEVICE_FILE.output, IAP1_FILE.output},
        {IAP1_FILE.output, IAP2_FILE.output},
        {AIRPLAY_FILE.output, IAP1_FILE.output},
        {IAP2_DEVICE_FILE.output, IAP2_FILE.templateFile},
        {IAP2_FILE.output, IAP1_FILE.stockFile},
    };
    for (const Link& link : links) {
        const DescribedUnit described(
            [&link](UnitDescription& unit) { unit.files[link.to] = "one file\n"; });
        fs::create_hard_link(described.root() / (link.to + 1), described.root() / (link.from + 1));
        const Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
        SCOPED_TRACE(std::string(link.from) + " = " + link.to);
        expectRunLeaves(described, explanation, {"-a", "-i"});
    }
}

TEST(ExplainTest, OutputThatIsItsOwnStockFileIsEmptied) {
    for (const AccessoryFile& file : {AIRPLAY_FILE, IAP2_FILE}) {
        const DescribedUnit described([&file](UnitDescription& unit) {
            unit.files.erase(file.templateFile);
            unit.links[file.output] = file.stockFile;
        });
        SCOPED_TRACE(file.output);
        const Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
        EXPECT_EQ(outputOf(explanation, file.output).outcome, desk::Outcome::empty);
        expectRunLeaves(described, explanation, {"-a", "-i"});
    }
}

TEST(ExplainTest, OutputThatIsAlsoReadIsRefused) {
    struct Link {
        const char* from;
        const char* to;
    };
    const Link links[] = {
        {AIRPLAY_FILE.output, AIRPLAY_FILE.templateFile},
        {IAP1_FILE.output, IAP1_FILE.templateFile},
        {IAP2_DEVICE_FILE.output, CONFIG_SHM_NAME},
        {AIRPLAY_FILE.output, BOOT_DISK},
        {IAP2_FILE.output, "/fs/rwdata/.Version/app.inf"},
    };
    for (const Link& link : links) {
        const DescribedUnit described(
            [&link](UnitDescription& unit) { unit.links[link.from] = link.to; });
        SCOPED_TRACE(link.from);
        try {
            desk::explainUnit(described.root(), {"-ai"});
            ADD_FAILURE() << "not refused";
        } catch (const kit::KitError& error) {
            EXPECT_EQ(error.text(), std::string(link.from) + " and " + link.to +
                                        " are one file: only a run can tell what it reads there");
        }
    }
}

TEST(ExplainTest, ChainsOfLinksAgreeWithARun) {
    for (const int length : {20, 41, 60}) { // up to 20 the kernel may count all of them twice
        const DescribedUnit described([length](UnitDescription& unit) {
            for (const char* path : {AIRPLAY_FILE.output, IAP2_FILE.templateFile}) {
                unit.files.erase(path);
                std::string from = path;
                for (int i = 1; i < length; ++i) {
                    const std::string to = "/fs/rwdata/" + from.substr(from.rfind('/') + 1) + "x";
                    unit.links[from] = to;
                    from = to;
                }
                unit.links[from] = "/fs/rwdata/end";
            }
            unit.files["/fs/rwdata/end"] = "at the end\n";
        });
        SCOPED_TRACE(length);
        const Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
        EXPECT_EQ(outputOf(explanation, AIRPLAY_FILE.output).outcome,
                  length > 40 ? desk::Outcome::kept : desk::Outcome::generated);
        expectRunLeaves(described, explanation, {"-a", "-i"});
    }
}

TEST(ExplainTest, UnitThatMayNotBeWrittenHereIsWrittenOnTheUnit) {
    const DescribedUnit described(
        [](UnitDescription& unit) { unit.files[IAP1_FILE.output] = "of an earlier run\n"; });
    fs::permissions(described.root() / (IAP1_FILE.output + 1), fs::perms::owner_read);
    fs::permissions(described.root() / "tmp", fs::perms::owner_read | fs::perms::owner_exec);
    desk::explainUnit(described.root(), {}); // enters a user namespace where it has to
    const EnforcedPermissions permissions;
    for (const Output& output : desk::explainUnit(described.root(), {"-i"})) {
        EXPECT_EQ(output.outcome, desk::Outcome::generated) << output.path;
    }
    EXPECT_TRUE(kit::describeInputs(described.root()).folders.empty());
    fs::permissions(described.root() / "tmp", fs::perms::owner_all);
}

TEST(ExplainTest, ReadOnlyMountMattersOnTheSystemThatRuns) {
    const DescribedUnit described;
    const kit::RunResult result = kit::runCaptured([&described] {
        enterOwnMounts();
        mountReadOnly(described.root());
        const kit::EnteredRoot entered(described.root());
        const bool isKept = outputOf(desk::explainUnit("/", {"-i"}), IAP1_FILE.output).outcome ==
                            desk::Outcome::kept;
        const bool isFolder = kit::describeInputs("/").folders.size() == 6;
        _exit((isKept ? 1 : 0) + (isFolder ? 2 : 0));
    });
    EXPECT_EQ(result.exitStatus, 3);
}

/// The complaint about what this process may not read, as the unit's own tool may.
std::string complaintAbout(const DescribedUnit& described, const std::string& path,
                           const std::vector<std::string>& arguments) {
    const fs::path place = described.root() / path.substr(1);
    const fs::perms former = fs::status(place).permissions();
    desk::explainUnit(described.root(), {}); // enters a user namespace where it has to
    fs::permissions(place, fs::perms::none);
    std::string said;
    {
        const EnforcedPermissions permissions;
        try {
            desk::explainUnit(described.root(), arguments);
        } catch (const kit::KitError& error) {
            said = error.what();
        }
    }
    fs::permissions(place, former);
    return said;
}

TEST(ExplainTest, InputThatMayNotBeReadHereIsNotMissing) {
    const DescribedUnit described([](UnitDescription& unit) {
        unit.files.erase(IAP2_FILE.templateFile); // so its stock file is read
        unit.files[TELEPHONY_TUNING_FILE] = "of an earlier run\n";
    });
    for (const char* path : {CONFIG_SHM_NAME, BOOT_DISK, "/fs/rwdata/.Version/app.inf",
                             IAP1_FILE.templateFile, IAP2_FILE.stockFile}) {
        EXPECT_EQ(complaintAbout(described, path, {"-i"}),
                  std::string("cannot read ") + path + ": Permission denied");
    }
    EXPECT_EQ(complaintAbout(described, "/fs/rwdata/.Version", {"-i"}),
              "cannot read /fs/rwdata/.Version/: Permission denied");
    EXPECT_EQ(complaintAbout(described, "/fs/mp", {"-a"}),
              "cannot read /fs/mp/etc: Permission denied");
    EXPECT_EQ(complaintAbout(described, TELEPHONY_TUNING_FILE, {"-a"}),
              std::string("cannot read ") + TELEPHONY_TUNING_FILE + ": Permission denied");
    // What a run does not read does not matter.
    EXPECT_EQ(complaintAbout(described, BOOT_DISK, {"-a"}), "");
    EXPECT_EQ(complaintAbout(described, AIRPLAY_FILE.stockFile, {"-a"}), "");
    EXPECT_EQ(complaintAbout(described, IAP1_FILE.templateFile, {"-a"}), "");
}

TEST(ExplainTest, OutputThatIsNotWrittenKeepsItsContent) {
    const DescribedUnit described(
        [](UnitDescription& unit) { unit.files[TELEPHONY_TUNING_FILE] = "of an earlier run\n"; });
    const Explanation explanation = desk::explainUnit(described.root(), {"-a"});
    const Output& output = outputOf(explanation, TELEPHONY_TUNING_FILE);
    EXPECT_EQ(output.outcome, desk::Outcome::notAsked);
    EXPECT_EQ(output.kindAfter, desk::PathKind::file);
    EXPECT_EQ(output.contentAfter, "of an earlier run\n");
    EXPECT_TRUE(output.lines.empty());
}

TEST(ExplainTest, MissingTmpKeepsAllOutputs) {
    const DescribedUnit described([](UnitDescription& unit) { unit.absent.push_back("/tmp"); });
    for (const Output& output : desk::explainUnit(described.root(), {"-i"})) {
        EXPECT_EQ(output.outcome, desk::Outcome::kept) << output.path;
        EXPECT_EQ(output.kindAfter, desk::PathKind::nothing) << output.path;
    }
}

TEST(ExplainTest, UnitIsOnlyReadAndNeedsNoMark) {
    const DescribedUnit described([](UnitDescription& unit) { unit.image.params[134] = 0xFFFF; });
    fs::remove(described.root() / kit::MARKER_NAME);
    const auto before = treeStates(described.root());
    letTimePass();
    EXPECT_EQ(desk::explainUnit(described.root(), {"-aia"}).size(), 9U);
    EXPECT_EQ(treeStates(described.root()), before);
}

} // namespace

} // namespace orvane::test
