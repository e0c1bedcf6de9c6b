// SPDX-License-Identifier: Apache-2.0
#include "config/boot_disk.h"
#include "kit/unit/describe_inputs.h"
#include "kit/unit/unit_values.h"
#include "tests/kit/unit/described_unit.h"

#include <gtest/gtest.h>

#include <functional>
#include <map>
#include <utility>

namespace orvane::test {

namespace {

using kit::UnitDescription;
using kit::UnitValues;
using kit::ValueChange;

/// Both sides of each value that differs, by its key.
using Changes = std::map<std::string, std::pair<std::string, std::string>>;

Changes changesOf(const std::function<void(UnitDescription&)>& change) {
    const DescribedUnit first;
    const DescribedUnit second(change);
    Changes changes;
    for (const ValueChange& value :
         kit::differingValues(kit::unitValues(kit::describeInputs(first.root())),
                              kit::unitValues(kit::describeInputs(second.root())))) {
        changes[keyText(value.key)] = {value.before, value.after};
    }
    return changes;
}

TEST(UnitValuesTest, EveryKindHasItsKey) {
    EXPECT_EQ(
        changesOf([](UnitDescription& unit) {
            unit.image.size = 200;
            unit.image.bytes[190] = "\x07";
            unit.image.params[9] = 5;
            unit.disk.slots[0] = "\xff";
            unit.disk.slots[16] = "hex:";
            unit.disk.aux = "bench 2";
            unit.disk.tuning[5].raw = std::string(11, '\0') + '\x7f';
            unit.disk.tuning[4].fields["qwaMEQEnable"] = std::vector<std::int64_t>{1, 2, 3, 255};
            unit.disk.tuning[4].fields["qwaAECSwitch"] = std::string("qwaIdle");
        }),
        (Changes{{"image.size", {"179", "200"}},
                 {"image.bytes.190", {"(missing)", "hex:07"}},
                 {"param.9", {"0", "5"}},
                 {"slot.0", {"", "hex:ff"}},
                 {"slot.16", {"", "hex:6865783a"}},
                 {"aux", {"", "bench 2"}},
                 {"tuning.5.raw", {"", "hex:00000000000000000000007f"}},
                 {"tuning.4.qwaMEQEnable", {"0,0,0,0", "1,2,3,255"}},
                 {"tuning.4.qwaAECSwitch", {"0", "qwaIdle"}}}));
}

TEST(UnitValuesTest, FilesAreComparedBySizeAndChecksum) {
    // Computed with zlib: "map\n", "map 3743\n" and "airplay template\n".
    EXPECT_EQ(
        changesOf([](UnitDescription& unit) {
            unit.files["/fs/rwdata/.Version/map.inf"] = "map\n";
            unit.files["/fs/rwdata/.Version/maps.inf"] = "map 3743\n";
            unit.files.erase("/fs/mp/etc/airplay_static.conf");
            unit.folders.push_back("/fs/mp/etc/airplay_static.conf");
        }),
        (Changes{
            {"file./fs/rwdata/.Version/map.inf", {"(missing)", "4 bytes, CRC-32 6ef7c13d"}},
            {"file./fs/rwdata/.Version/maps.inf", {"(missing)", "9 bytes, CRC-32 0001c449"}},
            {"file./fs/mp/etc/airplay_static.conf", {"17 bytes, CRC-32 d057ba0d", "(missing)"}},
            {"folder./fs/mp/etc/airplay_static.conf", {"(missing)", "a folder"}}}));
}

TEST(UnitValuesTest, OffsetInASparseFileIsNotTheEndOfAFileName) {
    UnitDescription first;
    first.sparseFiles["/fs/x"] = {5000, {{5, "x"}}};
    UnitDescription second = first;
    second.files["/fs/x.5"] = "map\n";
    const std::vector<ValueChange> changes =
        kit::differingValues(kit::unitValues(first), kit::unitValues(second));
    ASSERT_EQ(changes.size(), 1U);
    EXPECT_TRUE(changes[0].key == kit::fileKey("/fs/x.5"));
    EXPECT_EQ(changes[0].before, "(missing)");
    EXPECT_EQ(changes[0].after, "4 bytes, CRC-32 6ef7c13d");
}

TEST(UnitValuesTest, UnreadInputIsNotADifference) {
    EXPECT_EQ(changesOf([](UnitDescription& unit) {
                  unit.files["/fs/rwdata/notes"] = "not read\n";
                  unit.files["/fs/rwdata/.Version/readme.txt"] = "no version file\n";
                  unit.files["/tmp/iap1.cfg"] = "of an earlier run\n";
                  unit.disk.bytes[5] = "A"; // before the last mebibyte
              }),
              Changes{});
}

TEST(UnitValuesTest, MissingDiskChangesAllItsValues) {
    const Changes changes =
        changesOf([](UnitDescription& unit) { unit.absent.push_back(BOOT_DISK); });
    // 17 slots, the auxiliary area, ten blocks of 44 fields and the bytes that no field reads.
    EXPECT_EQ(changes.size(), 17U + 1 + 10 * (44 + 1) + 1);
    EXPECT_EQ(changes.at("slot.9").second, "(missing)");
    EXPECT_EQ(changes.at("tuning.0.qwaNRAtten").second, "(missing)");
    EXPECT_EQ(changes.at(std::string("absent.") + BOOT_DISK).first, "(missing)");
}

TEST(UnitValuesTest, DifferencesAreInTheOrderOfTheFirstThenTheSecond) {
    const auto key = kit::paramKey;
    const UnitValues before = {{key(3), "1"}, {key(1), "1"}, {key(2), "1"}};
    const UnitValues after = {{key(4), "2"}, {key(2), "2"}, {key(3), "1"}};
    std::vector<std::string> found;
    for (const ValueChange& change : kit::differingValues(before, after)) {
        found.push_back(keyText(change.key) + ": " + change.before + " " + change.after);
    }
    EXPECT_EQ(found, (std::vector<std::string>{"param.1: 1 (missing)", "param.2: 1 2",
                                               "param.4: (missing) 2"}));
}

} // namespace

} // namespace orvane::test
