// SPDX-License-Identifier: Apache-2.0
//
// Every reason, in a unit made to give it; the real binary runs in the same unit.
#include "config/boot_disk.h"
#include "config/config_store.h"
#include "kit/description/value_key.h"
#include "kit/enter/run_inside.h"
#include "kit/unit/capture_unit.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/unit_values.h"
#include "orvane_unit/explain/explain.h"
#include "orvane_unit/report/place_text.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/orvane_unit/explain/reason_units.h"
#include "tests/support/unit_test.h"
#include "writers/airplay_writer.h"
#include "writers/iap_writer.h"

#include <algorithm>
#include <functional>
#include <iterator>
#include <regex>
#include <set>

namespace orvane::test {

namespace {

namespace fs = std::filesystem;
using desk::Reason;
using kit::UnitDescription;

bool has(const desk::Output& output, Reason reason) {
    const auto holds = [reason](const std::vector<Reason>& reasons) {
        return std::find(reasons.begin(), reasons.end(), reason) != reasons.end();
    };
    return holds(output.reasons) ||
           std::any_of(output.lines.begin(), output.lines.end(),
                       [&holds](const desk::Line& line) { return holds(line.origin.reasons); });
}

class ExplainReasonsTest : public ::testing::TestWithParam<std::size_t> {
protected:
    static const ReasonUnit& row() { return reasonUnits().at(GetParam()); }
};

TEST_P(ExplainReasonsTest, FaultGivesItsReasonAtItsOutput) {
    const DescribedUnit described(row().change);
    const desk::Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
    const auto output =
        std::find_if(explanation.begin(), explanation.end(),
                     [](const desk::Output& other) { return other.path == row().output; });
    ASSERT_NE(output, explanation.end());
    EXPECT_TRUE(has(*output, row().reason)) << reasonInfo(row().reason).code;
    EXPECT_EQ(output->outcome, row().outcome);
    EXPECT_EQ(isIntended(*output) || reasonInfo(row().reason).isIntended,
              reasonInfo(row().reason).isIntended);
}

TEST_P(ExplainReasonsTest, RunAgreesWithTheExplanation) {
    const DescribedUnit described(row().change);
    const desk::Explanation explanation = desk::explainUnit(described.root(), {"-ai"});
    ASSERT_EQ(kit::runInside(described.root(), {ORVANE_BINARY, {"-a", "-i"}}).exitStatus, 0);
    for (const desk::Output& output : explanation) {
        const fs::path file = described.root() / output.path.substr(1);
        std::string written;
        for (const desk::Line& line : output.lines) {
            written += line.text;
        }
        switch (output.kindAfter) {
        case desk::PathKind::file:
            EXPECT_EQ(readFile(file), output.contentAfter) << output.path;
            EXPECT_EQ(written, output.contentAfter) << output.path;
            break;
        case desk::PathKind::folder:
            EXPECT_TRUE(fs::is_directory(file)) << output.path;
            break;
        case desk::PathKind::nothing:
        case desk::PathKind::other:
            EXPECT_FALSE(fs::exists(file)) << output.path;
            break;
        }
    }
}

/// Everything that an explanation says, without places on the disk: a captured disk is shorter.
std::string answersOf(const desk::Explanation& explanation) {
    static const std::regex DISK_PLACE("disk bytes? (from )?[0-9]+");
    std::string text;
    for (const desk::Output& output : explanation) {
        text += output.path + " " + std::to_string(static_cast<int>(output.outcome)) + " left " +
                std::to_string(static_cast<int>(output.kindAfter)) + " " + output.contentAfter;
        for (const Reason reason : output.reasons) {
            text += std::string(" ") + reasonInfo(reason).code;
        }
        for (const kit::ValueKey& key : output.keys) {
            text += " " + keyText(key);
        }
        for (const desk::Line& line : output.lines) {
            text += "\n" + line.text + keyText(line.origin.key) + " " +
                    std::regex_replace(desk::placeText(line.origin), DISK_PLACE, "disk");
            for (const Reason reason : line.origin.reasons) {
                text += std::string(" ") + reasonInfo(reason).code;
            }
        }
        text += "\n";
    }
    return text;
}

void expectCaptureExplainsTheSame(const DescribedUnit& described) {
    const fs::path captured = described.folder() / "captured";
    kit::captureUnit(described.root(), captured, false);
    EXPECT_EQ(answersOf(desk::explainUnit(captured, {"-ai"})),
              answersOf(desk::explainUnit(described.root(), {"-ai"})));
}

TEST_P(ExplainReasonsTest, CapturedUnitHasTheSameExplanation) {
    expectCaptureExplainsTheSame(DescribedUnit(row().change));
}

/// More of what may be missing, empty or something else.
TEST(CapturedReasonsTest, AbsenceIsCapturedEverywhere) {
    const std::function<void(UnitDescription&)> changes[] = {
        without("/tmp"),
        without("/dev"),
        without("/fs/tmpfs"),
        both(without(VERSION_FILE), without("/fs/rwdata")),
        [](UnitDescription& unit) {
            unit.files.clear();
            unit.absent = {"/fs/mp/etc/mm"};
        },
        [](UnitDescription& unit) {
            unit.files.clear();
            unit.absent = {"/fs", "/dev"};
        },
        [](UnitDescription& unit) {
            unit.files.erase(VERSION_FILE);
            unit.files["/fs/rwdata/.Version"] = "no folder";
        },
        [](UnitDescription& unit) { unit.files["/tmp"] = "no folder"; },
        [](UnitDescription& unit) { unit.links["/tmp"] = "/none"; },
        [](UnitDescription& unit) { unit.links["/tmp"] = "/fs/tmpfs"; },
        [](UnitDescription& unit) { unit.links["/fs/rwdata/.Version/b.inf"] = "/none/at/all"; },
        both(without(IAP2_FILE.templateFile), empty(IAP2_FILE.stockFile)),
        both(without(IAP1_FILE.templateFile), folder(IAP2_FILE.output)),
        both(folder(IAP1_FILE.stockFile), empty(IAP2_FILE.templateFile)),
        folder("/fs/rwdata/.Version/b.inf"),
        empty("/fs/rwdata/.Version/a.inf"),
    };
    for (std::size_t i = 0; i < std::size(changes); ++i) {
        SCOPED_TRACE(i);
        expectCaptureExplainsTheSame(DescribedUnit(changes[i]));
    }
}

TEST(CapturedReasonsTest, PathsThatAreOneFileStayOneFile) {
    struct Link {
        const char* from;
        const char* to;
    };
    const Link links[] = {
        {IAP2_DEVICE_FILE.output, IAP1_FILE.output},
        {IAP1_FILE.output, IAP2_FILE.output},
        {TELEPHONY_TUNING_FILE, AIRPLAY_FILE.output},
        {AIRPLAY_FILE.output, IAP2_FILE.templateFile},
        {IAP2_DEVICE_FILE.output, IAP2_FILE.templateFile},
        {IAP2_FILE.output, IAP1_FILE.stockFile},
        {IAP2_FILE.templateFile, AIRPLAY_FILE.output}, // missing, until the run has made it
        {IAP2_FILE.templateFile, IAP1_FILE.stockFile}, // no output
        {AIRPLAY_FILE.output, "fresh"},
    };
    for (const bool hasOutput : {false, true}) {
        for (const Link& link : links) {
            const DescribedUnit described([&](UnitDescription& unit) {
                generatedProfile(unit);
                unit.files.erase(link.from);
                unit.links[link.from] = link.to;
                if (hasOutput) {
                    unit.files[AIRPLAY_FILE.output] = "of an earlier run\n";
                    unit.files.erase(link.from);
                }
            });
            SCOPED_TRACE(std::string(link.from) + " -> " + link.to);
            expectCaptureExplainsTheSame(described);
            const fs::path captured = described.folder() / "captured";
            EXPECT_TRUE(kit::differingValues(kit::unitValues(kit::describeInputs(described.root())),
                                             kit::unitValues(kit::describeInputs(captured)))
                            .empty());
        }
    }
}

TEST(CapturedReasonsTest, HardLinksStayOneFile) {
    const DescribedUnit described;
    fs::create_hard_link(described.root() / (IAP2_FILE.templateFile + 1),
                         described.root() / (IAP2_DEVICE_FILE.output + 1));
    expectCaptureExplainsTheSame(described);
}

std::string rowName(const ::testing::TestParamInfo<std::size_t>& row) {
    std::string name = reasonInfo(reasonUnits()[row.param].reason).code;
    std::replace(name.begin(), name.end(), '-', '_');
    return name + "_" + std::to_string(row.param);
}

INSTANTIATE_TEST_SUITE_P(Rows, ExplainReasonsTest,
                         ::testing::Range<std::size_t>(0, reasonUnits().size()), rowName);

TEST(ReasonsTest, EveryReasonHasARow) {
    std::set<Reason> laid;
    for (const ReasonUnit& row : reasonUnits()) {
        laid.insert(row.reason);
    }
    for (const desk::ReasonInfo& info : desk::reasons()) {
        EXPECT_EQ(laid.count(info.reason), 1U) << info.code;
    }
}

TEST(ReasonsTest, CodesAreDifferentWordsAndSentencesHaveNoFullStop) {
    std::set<std::string> codes;
    for (const desk::ReasonInfo& info : desk::reasons()) {
        const std::string code = info.code;
        EXPECT_TRUE(codes.insert(code).second) << code;
        EXPECT_EQ(code.find_first_not_of("abcdefghijklmnopqrstuvwxyz0123456789-"),
                  std::string::npos)
            << code;
        EXPECT_NE(std::string(info.sentence).back(), '.') << code;
    }
}

TEST(ReasonsTest, EveryCodeIsInTheGuide) {
    const std::string guide = readFile(std::string(ORVANE_DOCS_DIR) + "/orvane-unit.md");
    for (const desk::ReasonInfo& info : desk::reasons()) {
        const std::string row = "| `" + std::string(info.code) + "` |";
        EXPECT_NE(guide.find(row), std::string::npos) << info.code;
    }
}

} // namespace

} // namespace orvane::test
