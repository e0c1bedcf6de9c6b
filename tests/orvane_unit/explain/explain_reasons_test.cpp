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
using desk::Outcome;
using desk::Reason;
using kit::UnitDescription;

constexpr char VERSION_FILE[] = "/fs/rwdata/.Version/app.inf";

struct Row {
    Reason reason;
    const char* output; ///< where the reason is expected
    Outcome outcome;
    std::function<void(UnitDescription&)> change;
};

std::function<void(UnitDescription&)> without(const std::string& path) {
    return [path](UnitDescription& unit) {
        unit.files.erase(path);
        unit.absent.push_back(path);
    };
}

std::function<void(UnitDescription&)> empty(const std::string& path) {
    return [path](UnitDescription& unit) { unit.files[path].clear(); };
}

std::function<void(UnitDescription&)> folder(const std::string& path) {
    return [path](UnitDescription& unit) {
        unit.files.erase(path);
        unit.folders.push_back(path);
    };
}

std::function<void(UnitDescription&)> version(const std::string& text) {
    return [text](UnitDescription& unit) {
        unit.files[VERSION_FILE] = "Type=Application\nVersion Number=" + text + "\n";
    };
}

std::function<void(UnitDescription&)> both(const std::function<void(UnitDescription&)>& first,
                                           const std::function<void(UnitDescription&)>& second) {
    return [first, second](UnitDescription& unit) {
        first(unit);
        second(unit);
    };
}

void plain(UnitDescription& /*unit*/) {}

void generatedProfile(UnitDescription& unit) {
    unit.image.params[134] = 0xFFFF;
    unit.disk.tuning[3].fields["qwaAECSwitch"] = std::string("qwaOn");
}

const std::vector<Row>& rows() {
    constexpr const char* AIRPLAY_OUT = AIRPLAY_FILE.output;
    constexpr const char* DEVICE_OUT = IAP2_DEVICE_FILE.output;
    constexpr const char* IAP1_OUT = IAP1_FILE.output;
    static const std::vector<Row> ROWS = {
        {Reason::generated, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::profileNotGenerated, TELEPHONY_TUNING_FILE, Outcome::notAsked, plain},
        {Reason::profileUnknown, SPEECHREC_TUNING_FILE, Outcome::notAsked,
         without(CONFIG_SHM_NAME)},
        {Reason::outputNotOpenable, DEVICE_OUT, Outcome::kept, folder(DEVICE_OUT)},
        {Reason::templateMissing, AIRPLAY_OUT, Outcome::stock, without(AIRPLAY_FILE.templateFile)},
        {Reason::templateMissing, IAP1_OUT, Outcome::generated, without(IAP1_FILE.templateFile)},
        {Reason::templateEmpty, DEVICE_OUT, Outcome::generated,
         empty(IAP2_DEVICE_FILE.templateFile)},
        {Reason::templateEmpty, DEVICE_OUT, Outcome::generated,
         folder(IAP2_DEVICE_FILE.templateFile)},
        {Reason::iap2NotOpened, IAP1_OUT, Outcome::stock, folder(IAP2_FILE.output)},
        {Reason::iap2TemplateEmpty, IAP1_OUT, Outcome::stock, empty(IAP2_FILE.templateFile)},
        {Reason::stockMissing, AIRPLAY_OUT, Outcome::empty,
         both(without(AIRPLAY_FILE.templateFile), without(AIRPLAY_FILE.stockFile))},
        {Reason::stockEmpty, AIRPLAY_OUT, Outcome::empty,
         both(without(AIRPLAY_FILE.templateFile), empty(AIRPLAY_FILE.stockFile))},
        {Reason::fixedText, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::fromTemplate, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::fromStock, AIRPLAY_OUT, Outcome::stock, without(AIRPLAY_FILE.templateFile)},
        {Reason::fromImage, AIRPLAY_OUT, Outcome::generated, plain},
        {Reason::imageMissing, AIRPLAY_OUT, Outcome::generated, without(CONFIG_SHM_NAME)},
        {Reason::imageNotMappable, AIRPLAY_OUT, Outcome::generated, folder(CONFIG_SHM_NAME)},
        {Reason::imageNotMappable, AIRPLAY_OUT, Outcome::generated,
         [](UnitDescription& unit) {
             unit.image = {};
             unit.image.size = 0;
         }},
        {Reason::imageTooShort, AIRPLAY_OUT, Outcome::generated,
         [](UnitDescription& unit) {
             unit.image = {};
             unit.image.size = 134; // half of the audio profile
         }},
        {Reason::modelUnknown, DEVICE_OUT, Outcome::generated,
         [](UnitDescription& unit) { unit.image.params[139] = 48; }},
        {Reason::fromRecord, DEVICE_OUT, Outcome::generated, plain},
        {Reason::serialBlank, DEVICE_OUT, Outcome::generated,
         [](UnitDescription& unit) { unit.disk.slots.clear(); }},
        {Reason::diskMissing, DEVICE_OUT, Outcome::generated, without(BOOT_DISK)},
        {Reason::diskTooShort, DEVICE_OUT, Outcome::generated,
         [](UnitDescription& unit) {
             unit.disk = {};
             unit.disk.size = 5000;
         }},
        {Reason::diskUnreadable, DEVICE_OUT, Outcome::generated, folder(BOOT_DISK)},
        {Reason::fromVersionFile, DEVICE_OUT, Outcome::generated, plain},
        {Reason::versionFolderMissing, DEVICE_OUT, Outcome::generated,
         both(without(VERSION_FILE), without("/fs/rwdata/.Version"))},
        {Reason::versionNoApplication, DEVICE_OUT, Outcome::generated, without(VERSION_FILE)},
        {Reason::versionNumberMissing, IAP1_OUT, Outcome::generated, version("ABC_")},
        {Reason::versionNotAvailable, IAP1_OUT, Outcome::generated, version("N/A")},
        {Reason::versionIncomplete, IAP1_OUT, Outcome::generated, version("1.2")},
        {Reason::versionNotNumeric, IAP1_OUT, Outcome::generated, version("1.b.3")},
        {Reason::versionOutOfRange, IAP1_OUT, Outcome::generated, version("1.256.3")},
        {Reason::fromTuningBlock, TELEPHONY_TUNING_FILE, Outcome::generated, generatedProfile},
        {Reason::wordUnknown, TELEPHONY_TUNING_FILE, Outcome::generated, generatedProfile},
    };
    return ROWS;
}

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
    static const Row& row() { return rows().at(GetParam()); }
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
    std::string name = reasonInfo(rows()[row.param].reason).code;
    std::replace(name.begin(), name.end(), '-', '_');
    return name + "_" + std::to_string(row.param);
}

INSTANTIATE_TEST_SUITE_P(Rows, ExplainReasonsTest, ::testing::Range<std::size_t>(0, rows().size()),
                         rowName);

TEST(ReasonsTest, EveryReasonHasARow) {
    std::set<Reason> laid;
    for (const Row& row : rows()) {
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
