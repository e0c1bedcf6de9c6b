// SPDX-License-Identifier: Apache-2.0
//
// The commands that only read, on a unit that orvane-unit has not made, like a real one.
#include "kit/description/unit_layout.h"
#include "kit/enter/captured_run.h"
#include "kit/unit/marker.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/tree_state.h"
#include "tests/support/host_command.h"
#include "tests/support/unit_test.h"

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using Words = std::vector<std::string>;

/// The unit asks for every tuning file and every output, and already has one of them.
void everythingWritten(kit::UnitDescription& unit) {
    unit.image.params[134] = 0xFFFF;
    unit.files["/tmp/iap2.cfg"] = "of an earlier run\n";
    unit.links["/tmp/airplay.conf"] = "/fs/mp/etc/airplay.conf";
}

class ReadOnlyTest : public ::testing::TestWithParam<Words> {
protected:
    ReadOnlyTest() : described_(everythingWritten) {
        fs::remove(described_.root() / kit::MARKER_NAME);
    }

    fs::path root() const { return described_.root(); }

    /// Runs the words, in which ROOT stands for the unit and NEW for a folder that does not exist.
    kit::RunResult start(const Words& words) const {
        Words command = buildCommand(ORVANE_UNIT_BINARY);
        for (const std::string& word : words) {
            command.push_back(word == "ROOT"  ? root().string()
                              : word == "NEW" ? (described_.folder() / "new").string()
                                              : word);
        }
        return runOnHost(command);
    }

private:
    DescribedUnit described_;
};

TEST_P(ReadOnlyTest, NothingBelowTheRootChanges) {
    const auto before = treeStates(root());
    letTimePass();
    const kit::RunResult result = start(GetParam());
    EXPECT_LE(result.exitStatus, 1) << result.standardError;
    EXPECT_EQ(result.standardError, "");
    EXPECT_EQ(treeStates(root()), before);
}

std::string commandName(const ::testing::TestParamInfo<Words>& words) {
    return words.param[0] + "_" + std::to_string(words.index);
}

INSTANTIATE_TEST_SUITE_P(Commands, ReadOnlyTest,
                         ::testing::Values(Words{"show", "ROOT"}, Words{"show", "ROOT", "--json"},
                                           Words{"explain", "ROOT", "-a", "-i", "-a"},
                                           Words{"explain", "ROOT", "--json", "--content"},
                                           Words{"diff", "ROOT", "ROOT"},
                                           Words{"impact", "ROOT", "param.134", "slot.9.0"},
                                           Words{"capture", "ROOT", "NEW"}),
                         commandName);

TEST(ReadOnlyCommandTest, DescribeChangesNothingInAUnitOfOurs) {
    const DescribedUnit described(everythingWritten);
    const auto before = treeStates(described.root());
    letTimePass();
    Words command = buildCommand(ORVANE_UNIT_BINARY);
    command.insert(command.end(), {"describe", described.root()});
    EXPECT_EQ(runOnHost(command).exitStatus, 0);
    EXPECT_EQ(treeStates(described.root()), before);
}

/// The state that the tests above compare does show a write.
TEST(TreeStateTest, WriteOfTheSameBytesIsSeen) {
    const DescribedUnit described;
    const auto before = treeStates(described.root());
    letTimePass();
    const std::string file = described.root() / "fs/mp/etc/airplay.conf";
    const fs::file_time_type time = fs::last_write_time(file);
    writeFile(file, readFile(file));
    fs::last_write_time(file, time);
    EXPECT_NE(treeStates(described.root()), before);
}

} // namespace

} // namespace orvane::test
