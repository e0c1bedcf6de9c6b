// SPDX-License-Identifier: Apache-2.0
//
// The reports, parsed by a JSON library.
#include "kit/enter/captured_run.h"
#include "kit/unit/describe_inputs.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/report/json.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/support/host_command.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace orvane::test {

namespace {

using nlohmann::json;

json parsed(const std::string& text, const char* command) {
    EXPECT_EQ(text.find('\n'), std::string::npos);
    json report = json::parse(text);
    EXPECT_EQ(report.at("format"), 1);
    EXPECT_EQ(report.at("command"), command);
    return report;
}

TEST(JsonTest, ExplanationHasItsLinesAndOnlyThenItsContent) {
    const DescribedUnit described([](kit::UnitDescription& unit) { unit.disk.slots[9] = "A\xff"; });
    const desk::Explanation explanation = desk::explainUnit(described.root(), {"-i"});
    const json report = parsed(desk::explanationJson("R", "i", explanation, true), "explain");
    EXPECT_EQ(report.at("root"), "R");
    EXPECT_EQ(report.at("letters"), "i");
    EXPECT_EQ(report.at("isIntended"), true);
    const json& device = report.at("outputs").at(0);
    EXPECT_EQ(device.at("path"), "/tmp/iap2_device.cfg");
    EXPECT_EQ(device.at("outcome"), "generated");
    EXPECT_EQ(device.at("reasons"), json::array({"generated"}));
    EXPECT_EQ(device.at("left"), "file");
    EXPECT_EQ(
        device.at("lines").at(5),
        (json{{"text", {{"hex", "73657269616c3d41ff0a"}}},
              {"reasons", {"from-record"}},
              {"key", "slot.9"},
              {"detail", "record slot 9, disk bytes from 1048705: 41 ff 00 00 00 00 00 00"}}));
    EXPECT_EQ(device.at("lines").at(0).at("key"), nullptr);
    EXPECT_TRUE(device.at("content").contains("hex"));
    const json brief = parsed(desk::explanationJson("R", "i", explanation, false), "explain");
    EXPECT_FALSE(brief.at("outputs").at(0).contains("content"));
}

TEST(JsonTest, DecodedUnitHasThePartsThatAreAskedFor) {
    const DescribedUnit described;
    const desk::DecodedUnit unit = desk::decodeUnit(described.root());
    const json all = parsed(desk::decodedUnitJson("R", unit, ""), "show");
    for (const std::string& part : desk::partNames()) {
        EXPECT_TRUE(all.contains(part)) << part;
        EXPECT_EQ(parsed(desk::decodedUnitJson("R", unit, part), "show").size(), 4U) << part;
    }
    EXPECT_EQ(all.at("params").at("rows").at(138).at("raw"), 26);
    EXPECT_EQ(all.at("records").at("slots").at(9).at("bytes"), "53 4e 30 30 34 32 31 37");
    EXPECT_EQ(all.at("records").at("crcVerdict"), "computed");
    EXPECT_EQ(all.at("tuning").at("blocks").size(), 10U);
    EXPECT_EQ(all.at("tuning").at("blocks").at(3).at("qwaWNDBMode"),
              (json{{"code", 0}, {"word", ""}}));
    EXPECT_EQ(all.at("versions").at("files").at(0).at("isChosen"), true);
    EXPECT_EQ(all.at("files").at(0).at("kind"), "file");
}

TEST(JsonTest, RunShowsTheContentBefore) {
    desk::TmpTree before;
    desk::TmpTree after;
    before.entries = {{"old", "1"}};
    after.entries = {{"folder/", std::nullopt}, {"new", "\xff"}, {"old", "2"}};
    const json report = parsed(desk::runJson("R", {3, "out", "err"}, before, after), "run");
    EXPECT_EQ(report.at("exitStatus"), 3);
    EXPECT_EQ(report.at("standardError"), "err");
    EXPECT_EQ(report.at("files"),
              (json{{{"path", "/tmp/folder/"}, {"before", nullptr}, {"after", nullptr}},
                    {{"path", "/tmp/new"}, {"before", nullptr}, {"after", {{"hex", "ff"}}}},
                    {{"path", "/tmp/old"}, {"before", "1"}, {"after", "2"}}}));
}

TEST(JsonTest, DifferencesNameValueOutputAndLine) {
    const DescribedUnit first;
    const DescribedUnit second([](kit::UnitDescription& unit) { unit.image.params[22] = 0; });
    const json report =
        parsed(desk::consequencesJson(
                   "A", "B",
                   desk::consequences(
                       kit::differingValues(kit::unitValues(kit::describeInputs(first.root())),
                                            kit::unitValues(kit::describeInputs(second.root()))),
                       desk::outputDifferences(desk::explainUnit(first.root(), {"-a"}),
                                               desk::explainUnit(second.root(), {"-a"})))),
               "diff");
    EXPECT_EQ(
        report.at("values"),
        (json::array(
            {{{"key", "param.22"},
              {"first", "1"},
              {"second", "0"},
              {"outputs",
               json::array({{{"path", "/tmp/airplay.conf"},
                             {"first", "generated"},
                             {"second", "generated"},
                             {"lines",
                              {{{"side", "first"}, {"line", 23}, {"text", "rightHandDrive = 1\n"}},
                               {{"side", "second"},
                                {"line", 23},
                                {"text", "rightHandDrive = 0\n"}}}}}})}}})));
}

TEST(JsonTest, ImpactsAndChecksHaveTheirFields) {
    const json impacts =
        parsed(desk::impactsJson("R", {{kit::paramKey(22), 13, 12, {{"/tmp/airplay.conf", 23}}}}),
               "impact");
    EXPECT_EQ(impacts.at("inputs"), (json::array({{{"key", "param.22"},
                                                   {"tried", 13},
                                                   {"moving", 12},
                                                   {"lines", {"/tmp/airplay.conf:23"}}}})));
    desk::CheckReport check;
    check.cases = {{"one", {"differs"}, {}, {desk::Reason::generated}, "", desk::CaseUpdate::none},
                   {"two", {}, {}, {}, "no such file", desk::CaseUpdate::refused}};
    check.unreached = {"disk-missing"};
    const json report = parsed(desk::checkJson("F", check), "check");
    EXPECT_EQ(report.at("cases").at(0), (json{{"name", "one"},
                                              {"differences", {"differs"}},
                                              {"surprises", json::array()},
                                              {"fault", nullptr},
                                              {"update", nullptr},
                                              {"reasons", {"generated"}}}));
    EXPECT_EQ(report.at("cases").at(1).at("fault"), "no such file");
    EXPECT_EQ(report.at("cases").at(1).at("update"), "not-updated");
    EXPECT_EQ(report.at("unreached"), json::array({"disk-missing"}));
}

TEST(JsonTest, TextThatIsNotUtf8IsHexEverywhere) {
    desk::CheckReport check;
    check.cases = {{"\xff", {"/tmp/\xfe is missing"}, {"\x80"}, {}, "", desk::CaseUpdate::none}};
    const json report = parsed(desk::checkJson("\xc0", check), "check");
    EXPECT_EQ(report.at("folder"), (json{{"hex", "c0"}}));
    EXPECT_EQ(report.at("cases").at(0).at("name"), (json{{"hex", "ff"}}));
    EXPECT_EQ(report.at("cases").at(0).at("differences"),
              (json::array({{{"hex", "2f746d702ffe206973206d697373696e67"}}})));
    EXPECT_EQ(report.at("cases").at(0).at("surprises"), (json::array({{{"hex", "80"}}})));
    EXPECT_EQ(parsed(desk::impactsJson("\xff", {}), "impact").at("root"), (json{{"hex", "ff"}}));
    EXPECT_EQ(parsed(desk::consequencesJson("A", "\xff", {}), "diff").at("second"),
              (json{{"hex", "ff"}}));
    const DescribedUnit described([](kit::UnitDescription& unit) {
        unit.files["/fs/rwdata/.Version/\xff.inf"] = "Type=\xfe\n\xfd=1\n";
    });
    const json shown =
        parsed(desk::decodedUnitJson("R", desk::decodeUnit(described.root()), "versions"), "show");
    EXPECT_NE(shown.dump().find(R"({"key":"Type","value":{"hex":"fe"}})"), std::string::npos);
    EXPECT_NE(shown.dump().find(R"({"key":{"hex":"fd"},"value":"1"})"), std::string::npos);
}

TEST(JsonTest, WhatATerminalObeysIsEscapedAndReadBackTheSame) {
    const std::string obeyed = "\x1b\x7f\u009b\u202e\u202c\u2028\ufeff\U000e0001 caf\u00e9 \"\\\n";
    const std::string text = desk::consequencesJson(obeyed, "B", {});
    EXPECT_NE(
        text.find("\\u001b\\u007f\\u009b\\u202e\\u202c\\u2028\\ufeff\\udb40\\udc01 caf\u00e9"),
        std::string::npos)
        << text;
    EXPECT_EQ(parsed(text, "diff").at("first"), obeyed);
}

/// The report of the program itself: one line on standard output, and nothing else.
json started(const std::vector<std::string>& words, int exitStatus) {
    std::vector<std::string> command = buildCommand(ORVANE_UNIT_BINARY);
    command.insert(command.end(), words.begin(), words.end());
    const kit::RunResult result = runOnHost(command);
    EXPECT_EQ(result.exitStatus, exitStatus);
    EXPECT_EQ(result.standardError, "");
    EXPECT_EQ(result.standardOutput.empty() ? ' ' : result.standardOutput.back(), '\n');
    return parsed(result.standardOutput.substr(0, result.standardOutput.size() - 1),
                  words.front().c_str());
}

TEST(JsonTest, EveryReportOfTheProgramIsOneLine) {
    const DescribedUnit described;
    const DescribedUnit other([](kit::UnitDescription& unit) { unit.image.params[139] = 0; });
    const std::string root = described.root();
    EXPECT_EQ(started({"show", root, "--json", "--only", "files"}, 0).at("root"), root);
    EXPECT_EQ(started({"explain", root, "--json"}, 0).at("letters"), "ai");
    EXPECT_EQ(started({"explain", root, "--json", "-i", "-a", "-ii"}, 0).at("letters"), "iaii");
    EXPECT_EQ(started({"explain", other.root(), "--json"}, 1).at("isIntended"), false);
    EXPECT_EQ(started({"diff", root, root, "--json"}, 0).at("values"), json::array());
    EXPECT_EQ(started({"diff", root, other.root(), "--json", "-a"}, 1).at("values").size(), 1U);
    EXPECT_EQ(started({"impact", root, "param.22", "--json"}, 0).at("inputs").size(), 1U);
    EXPECT_EQ(started({"run", root, "--json", "--", "-a"}, 0).at("files").size(), 1U);
    std::filesystem::create_directory(described.folder() / "one");
    writeFile(described.folder() / "one/unit.toml", "");
    const json check = started({"check", described.folder(), "--json"}, 1);
    EXPECT_EQ(check.at("cases").at(0).at("name"), "one");
    EXPECT_EQ(check.at("isUpdate"), false);
}

} // namespace

} // namespace orvane::test
