// SPDX-License-Identifier: Apache-2.0
#include "kit/description/parse_description.h"
#include "kit/description/sample.h"
#include "kit/host/kit_error.h"
#include "kit/unit/describe_unit.h"
#include "kit/unit/make_unit.h"
#include "orvane_unit/compare/impact.h"
#include "orvane_unit/report/phrases.h"
#include "tests/kit/description/description_equality.h"
#include "tests/kit/unit/described_unit.h"
#include "tests/support/temporary_folder.h"

#include <gtest/gtest.h>

#include <map>

namespace orvane::test {

namespace {

using desk::Impact;
using Lines = std::vector<std::string>;

/// The lines as text, in their order.
Lines linesOf(const Impact& impact) {
    Lines lines;
    for (const desk::OutputLine& line : impact.lines) {
        lines.push_back(lineText(line));
    }
    return lines;
}

std::map<std::string, Impact> impactsOf(const std::filesystem::path& root,
                                        const std::vector<std::string>& prefixes = {}) {
    std::map<std::string, Impact> impacts;
    std::size_t last = 0;
    for (const Impact& impact :
         desk::findImpacts(root, prefixes, [&last](std::size_t done, std::size_t all) {
             EXPECT_EQ(done, last + 1);
             EXPECT_LE(done, all);
             last = done;
         })) {
        EXPECT_TRUE(impacts.emplace(keyText(impact.key), impact).second);
        EXPECT_GE(impact.tried, 3U) << keyText(impact.key);
        EXPECT_EQ(impact.changing == 0, impact.lines.empty()) << keyText(impact.key);
    }
    EXPECT_EQ(last, impacts.size());
    return impacts;
}

TEST(ImpactTest, FourParametersTheSerialAndTwoBlocksChangeTheSample) {
    const TemporaryFolder folder;
    const std::filesystem::path root = folder.path() / "unit";
    kit::makeUnit(kit::parseDescription(kit::sampleDescriptionText(), "sample"), root);
    const kit::UnitDescription before = kit::describeUnit(root);
    // All of them would take long in an instrumented build; the guide shows a run of all.
    const std::map<std::string, Impact> impacts =
        impactsOf(root, {"param.22", "param.36", "param.5", "param.134", "param.139", "param.140",
                         "slot.0", "slot.8", "slot.9", "slot.16", "tuning.1.qwaN", "tuning.2.qwaN",
                         "tuning.3.qwaM", "tuning.4.qwaN"});
    // The prefixes also match parameters 5 and 50 to 59; slots of 1, 16, 8 and 24 bytes; three
    // fields that begin with qwaN, and three with qwaM.
    EXPECT_EQ(impacts.size(), 16U + (1 + 16 + 8 + 24) + 4 * 3);
    for (const auto& [key, impact] : impacts) {
        const bool isRead = key == "param.22" || key == "param.36" || key == "param.134" ||
                            key == "param.139" || key.compare(0, 7, "slot.9.") == 0 ||
                            key.compare(0, 9, "tuning.2.") == 0 ||
                            key.compare(0, 9, "tuning.3.") == 0;
        EXPECT_EQ(!impact.lines.empty(), isRead) << key;
    }
    EXPECT_EQ(linesOf(impacts.at("param.22")), Lines{"/tmp/airplay.conf:23"});
    EXPECT_EQ(linesOf(impacts.at("slot.9.0")),
              (Lines{"/tmp/iap1.cfg:6", "/tmp/iap2.cfg:6", "/tmp/iap2_device.cfg:6"}));
    EXPECT_EQ(linesOf(impacts.at("tuning.3.qwaMEQEnable")), Lines{"/tmp/telephony_FFFF.txt:45"});
    EXPECT_EQ(
        linesOf(impacts.at("param.134")),
        (Lines{"/tmp/airplay.conf:20", "/tmp/speechrec_FFFF.txt", "/tmp/telephony_FFFF.txt"}));
    EXPECT_EQ(kit::describeUnit(root), before);
}

TEST(ImpactTest, BytesAfterTheSerialAndUnusedBlocksChangeNothing) {
    const DescribedUnit described(
        [](kit::UnitDescription& unit) { unit.disk.slots[9] = std::string("AB\0CD", 5); });
    const std::map<std::string, Impact> impacts =
        impactsOf(described.root(), {"slot.9", "tuning.3.qwaNRAtten"});
    EXPECT_FALSE(impacts.at("slot.9.2").lines.empty()); // the zero byte itself
    EXPECT_TRUE(impacts.at("slot.9.3").lines.empty());
    EXPECT_TRUE(impacts.at("slot.9.7").lines.empty());
    EXPECT_TRUE(impacts.at("tuning.3.qwaNRAtten").lines.empty());
}

TEST(ImpactTest, WithoutImageAndDiskNothingIsTried) {
    const DescribedUnit described([](kit::UnitDescription& unit) {
        unit.absent = {"/dev/hd0", "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM"};
    });
    EXPECT_TRUE(impactsOf(described.root()).empty());
}

TEST(ImpactTest, PrefixOfNoKeyIsBadInput) {
    const DescribedUnit described;
    EXPECT_THROW(impactsOf(described.root(), {"param.172"}), kit::KitError);
    EXPECT_THROW(impactsOf(described.root(), {"param.139", "param.172"}), kit::KitError);
}

TEST(ImpactTest, MissingRootIsBadInput) {
    EXPECT_THROW(desk::findImpacts("/none/at/all", {}, [](std::size_t, std::size_t) {}),
                 kit::KitError);
}

} // namespace

} // namespace orvane::test
