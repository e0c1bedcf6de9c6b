// SPDX-License-Identifier: Apache-2.0
//
// A unit in, its /tmp out: tests/golden/CASE holds the unit, the arguments and what must be left.
#include "kit/root.h"
#include "kit/unit.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <set>
#include <sstream>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

std::vector<std::string> goldenCases() {
    std::vector<std::string> names;
    for (const fs::directory_entry& entry : fs::directory_iterator(ORVANE_GOLDEN_DIR)) {
        names.push_back(entry.path().filename().string());
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::vector<std::string> readLines(const fs::path& file) {
    std::istringstream text(readFile(file));
    std::vector<std::string> lines;
    for (std::string line; std::getline(text, line);) {
        lines.push_back(line);
    }
    return lines;
}

/// Every entry of a unit's /tmp, folders with a slash behind, or "(absent)".
std::set<std::string> listTmp(const fs::path& tmp) {
    if (!fs::exists(tmp)) {
        return {"(absent)"};
    }
    std::set<std::string> names;
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(tmp)) {
        names.insert(entry.path().lexically_relative(tmp).string() +
                     (entry.is_directory() ? "/" : ""));
    }
    return names;
}

class GoldenTest : public ::testing::TestWithParam<std::string> {
protected:
    static fs::path caseFolder() { return fs::path(ORVANE_GOLDEN_DIR) / GetParam(); }
};

TEST_P(GoldenTest, LeavesWhatIsExpected) {
    const TemporaryFolder folder;
    const fs::path root = folder.path() / "unit";
    kit::makeUnit(kit::readDescription(caseFolder() / "unit.toml"), root);

    const kit::RunResult result =
        kit::runInside(root, {ORVANE_BINARY, readLines(caseFolder() / "arguments")});

    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.standardOutput, "");
    const fs::path expectedError = caseFolder() / "expected/stderr";
    EXPECT_EQ(result.standardError, fs::exists(expectedError) ? readFile(expectedError) : "");

    const std::vector<std::string> list = readLines(caseFolder() / "expected/tmp.list");
    EXPECT_EQ(listTmp(root / "tmp"), std::set<std::string>(list.begin(), list.end()));
    for (const std::string& name : list) {
        if (name != "(absent)" && name.back() != '/') {
            EXPECT_EQ(readFile(root / "tmp" / name), readFile(caseFolder() / "expected/tmp" / name))
                << name;
        }
    }
}

/// An expected file that no list names would never be compared.
TEST_P(GoldenTest, ComparesEveryExpectedFile) {
    const std::vector<std::string> list = readLines(caseFolder() / "expected/tmp.list");
    EXPECT_TRUE(std::is_sorted(list.begin(), list.end()));
    if (fs::exists(caseFolder() / "expected/tmp")) {
        for (const std::string& name : listTmp(caseFolder() / "expected/tmp")) {
            EXPECT_EQ(std::count(list.begin(), list.end(), name), 1) << name;
        }
    }
}

std::string caseName(const ::testing::TestParamInfo<std::string>& parameter) {
    std::string name = parameter.param;
    std::replace(name.begin(), name.end(), '-', '_');
    return name;
}

INSTANTIATE_TEST_SUITE_P(Golden, GoldenTest, ::testing::ValuesIn(goldenCases()), caseName);

TEST(GoldenCases, AreThere) {
    EXPECT_GE(goldenCases().size(), 25U);
}

} // namespace

} // namespace orvane::test
