// SPDX-License-Identifier: Apache-2.0
//
// The lines of an explanation, joined, are the file that the golden unit expects.
#include "kit/description/parse_description.h"
#include "kit/unit/make_unit.h"
#include "orvane_unit/check/case_check.h"
#include "orvane_unit/explain/explain.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/support/unit_test.h"

#include <set>
#include <sstream>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using desk::Outcome;
using desk::Output;

std::vector<std::string> argumentsOf(const fs::path& folder) {
    std::istringstream text(readFile(folder / "arguments"));
    std::vector<std::string> arguments;
    for (std::string line; std::getline(text, line);) {
        arguments.push_back(line);
    }
    return arguments;
}

/// What the case expects at `path`: a file of its own, or one that is described.
std::string expectedFile(const fs::path& folder, const std::string& path) {
    const fs::path description = folder / "expected/tmp.toml";
    if (fs::exists(description)) {
        const kit::UnitDescription described = kit::readDescription(description);
        const auto found = described.files.find(path);
        if (found != described.files.end()) {
            return {found->second.begin(), found->second.end()};
        }
    }
    return readFile(folder / ("expected" + path));
}

/// Returns how many lines were compared.
std::size_t compareLines(const fs::path& folder) {
    const TemporaryFolder made;
    kit::makeUnit(kit::readDescription(folder / "unit.toml"), made.path() / "unit");
    const desk::Explanation explanation =
        desk::explainUnit(made.path() / "unit", argumentsOf(folder));
    std::size_t compared = 0;
    for (const Output& output : explanation) {
        if (output.outcome == Outcome::kept || output.outcome == Outcome::notAsked) {
            EXPECT_TRUE(output.lines.empty()) << output.path;
            continue;
        }
        std::string written;
        for (const desk::Line& line : output.lines) {
            written += line.text;
            EXPECT_FALSE(line.origin.reasons.empty()) << output.path << ": " << line.text;
            ++compared;
        }
        EXPECT_EQ(written, expectedFile(folder, output.path)) << output.path;
        EXPECT_EQ(output.outcome == Outcome::empty, written.empty()) << output.path;
    }
    return compared;
}

TEST(GoldenLinesTest, LinesMakeUpTheExpectedFiles) {
    std::size_t compared = 0;
    for (const fs::directory_entry& entry : fs::directory_iterator(ORVANE_GOLDEN_DIR)) {
        SCOPED_TRACE(entry.path().filename().string());
        compared += compareLines(entry.path());
    }
    EXPECT_GT(compared, 1000U);
}

} // namespace

} // namespace orvane::test
