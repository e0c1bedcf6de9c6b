// SPDX-License-Identifier: Apache-2.0
//
// Whatever a unit holds, and whatever the words of a command line are, nothing that a terminal
// obeys is printed.
#include "kit/enter/captured_run.h"
#include "kit/host/text.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/orvane_unit_command.h"
#include "tests/support/unicode.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;

/// Erases the screen by each of two means, then ends lines and reverses what follows.
const std::string OBEYED =
    "\x1b[2J\u009b2J\x7f\r\b\u200e\u2028\u202e\u202c\u2066\u2069\u061c\ufeff\U000e0001";
/// The same and a byte that is no text.
const std::string BYTES = OBEYED + "\xff";

void expectPrintable(const std::string& output) {
    ASSERT_TRUE(kit::isUtf8(output));
    kit::forEachCharacter(output, [](char32_t character, std::string_view bytes) {
        EXPECT_TRUE(!isControlOrFormat(character) || character == U'\n' || character == U'\t')
            << kit::hexText(bytes);
    });
}

/// A unit whose folder, files, links and values have these bytes.
class HostileUnit {
public:
    explicit HostileUnit(const std::string& bytes)
        : described_([&bytes](kit::UnitDescription& unit) {
              unit.disk.slots[9] = bytes.substr(0, 8);
              unit.disk.slots[8] = "A";
              unit.disk.aux = bytes;
              unit.files["/fs/rwdata/.Version/app.inf"] = "Type=Application" + bytes + "\n" +
                                                          bytes + "=" + bytes +
                                                          "\nVersion Number=ABC_" + bytes + "\n";
              unit.files["/fs/rwdata/.Version/" + bytes + ".inf"] = bytes + "\n";
              unit.files["/fs/mp/etc/airplay_static.conf"] = bytes + "\n";
              unit.files["/tmp/" + bytes] = bytes;
              unit.files["/tmp/airplay.conf"] = bytes + "\n";
              unit.links["/tmp/link" + bytes] = bytes;
              unit.folders.push_back("/new" + bytes);
          }),
          root_(described_.folder() / ("unit" + bytes)) {
        fs::rename(described_.root(), root_);
        fs::create_directories(cases() / ("case" + bytes));
        writeFile(cases() / ("case" + bytes) / "unit.toml", "[files]\n\"/tmp/\\u009b\" = \"x\"\n");
    }

    const fs::path& root() const { return root_; }
    fs::path cases() const { return described_.folder() / "cases"; }
    fs::path folder() const { return described_.folder(); }

private:
    DescribedUnit described_;
    fs::path root_;
};

class TerminalOutputTest : public ::testing::TestWithParam<std::string> {};

TEST_P(TerminalOutputTest, NoReportHasWhatATerminalObeys) {
    const HostileUnit hostile(GetParam());
    const DescribedUnit plain;
    const std::string root = hostile.root();
    const Words commands[] = {
        {"describe", root},
        {"show", root},
        {"explain", root, "--all"},
        {"diff", root, plain.root()},
        {"diff", plain.root(), root},
        {"impact", root, "slot.9.0", "param.134"},
        {"check", hostile.cases()},
        {"run", root, "--", "-a", "-i"},
        {"run", root, "--brief", "--", "-a"},
        {"run", root, "--orvane", "/bin/sh", "--", "-c",
         "printf '" + GetParam() + "'; printf '" + GetParam() + "\n\tnext\n' >&2"},
    };
    for (const Words& words : commands) {
        SCOPED_TRACE(words[0]);
        const kit::RunResult result = runOrvaneUnit(words);
        EXPECT_LE(result.exitStatus, 1) << result.standardError;
        expectPrintable(result.standardOutput);
        expectPrintable(result.standardError);
    }
}

/// The complaint after a message of the tool that has no line end begins a line, and so does the
/// list of changes.
TEST(TerminalOutputLinesTest, WhatFollowsTheToolsOutputBeginsALine) {
    const DescribedUnit unit;
    const kit::RunResult result =
        runOrvaneUnit({"run", unit.root(), "--brief", "--orvane", "/bin/sh", "--", "-c",
                       "printf out; printf message >&2; >/tmp/made; exit 3"});
    EXPECT_EQ(result.standardError, "message\norvane-unit: orvane ended with exit status 3\n");
    EXPECT_EQ(result.standardOutput, "out\nmade /tmp/made, 0 bytes\n");
}

TEST_P(TerminalOutputTest, NoJsonHasWhatATerminalObeys) {
    const HostileUnit hostile(GetParam());
    const DescribedUnit plain;
    const std::string root = hostile.root();
    const Words commands[] = {
        {"show", root, "--json"},
        {"explain", root, "--json", "--content"},
        {"diff", root, plain.root(), "--json"},
        {"impact", root, "slot.9.0", "--json"},
        {"check", hostile.cases(), "--json"},
        {"run", root, "--json", "--orvane", "/bin/sh", "--", "-c",
         "printf '" + GetParam() + "'; printf '" + GetParam() + "' >&2"},
    };
    for (const Words& words : commands) {
        SCOPED_TRACE(words[0]);
        const kit::RunResult result = runOrvaneUnit(words);
        EXPECT_LE(result.exitStatus, 1) << result.standardError;
        EXPECT_EQ(result.standardError, "");
        expectPrintable(result.standardOutput);
        EXPECT_TRUE(nlohmann::json::accept(result.standardOutput));
    }
}

TEST_P(TerminalOutputTest, NoComplaintHasWhatATerminalObeys) {
    const HostileUnit hostile(GetParam());
    const std::string root = hostile.root();
    const std::string bytes = GetParam();
    const std::string description = hostile.folder() / "bad.toml";
    writeFile(description, "[image.params]\n\"" + GetParam() + "\" = 1\n");
    const std::string escaped = hostile.folder() / "escaped.toml";
    writeFile(escaped, "[files]\n\"/\\u001b\\u202e\\u0000\" = 1\n");
    const Words commands[] = {
        {bytes},
        {"new", root},
        {"new", root, bytes},
        {"new", root + "2", "--from", bytes},
        {"new", root + "2", "--from", description},
        {"new", root + "2", "--from", escaped},
        {"describe", bytes},
        {"set", root, bytes},
        {"set", root, bytes + "=1"},
        {"set", root, "param.1=" + bytes},
        {"set", root, "tuning.2=" + bytes},
        {"show", root, "--" + bytes},
        {"show", root, "--only", bytes},
        {"explain", bytes},
        {"run", bytes},
        {"run", root, "--orvane", bytes},
        {"diff", root, bytes},
        {"impact", root, bytes},
        {"capture", bytes, root},
        {"check", bytes},
        {"check", hostile.cases(), "--orvane", bytes},
    };
    for (const Words& words : commands) {
        SCOPED_TRACE(words[0]);
        const kit::RunResult result = runOrvaneUnit(words);
        EXPECT_EQ(result.exitStatus, 2);
        EXPECT_EQ(result.standardOutput, "");
        expectPrintable(result.standardError);
        const std::size_t end = result.standardError.find('\n');
        EXPECT_EQ(end + 1, result.standardError.size()) << result.standardError;
    }
}

INSTANTIATE_TEST_SUITE_P(Bytes, TerminalOutputTest, ::testing::Values(OBEYED, BYTES),
                         [](const ::testing::TestParamInfo<std::string>& bytes) {
                             return bytes.index == 0 ? "OfUtf8" : "OfOtherBytes";
                         });

/// The description that is printed makes the same unit.
TEST(DescribedTerminalOutputTest, EscapesAreReadBack) {
    const HostileUnit hostile(BYTES);
    const kit::RunResult result = runOrvaneUnit({"describe", hostile.root()});
    ASSERT_EQ(result.exitStatus, 0) << result.standardError;
    writeFile(hostile.folder() / "unit.toml", result.standardOutput);
    const std::string again = hostile.folder() / "again";
    EXPECT_EQ(runOrvaneUnit({"new", again, "--from", hostile.folder() / "unit.toml"}).exitStatus,
              0);
    EXPECT_EQ(runOnHost({"diff", "-r", "--no-dereference", hostile.root(), again}).exitStatus, 0);
}

} // namespace

} // namespace orvane::test
