// SPDX-License-Identifier: Apache-2.0
#include "kit/description/value_places.h"
#include "tuning/dps_block.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

namespace orvane::test {

namespace {

constexpr std::uint64_t DISK_SIZE = 2U << 20U;
constexpr std::uint64_t BASE = 1U << 20U; ///< offset of the record area on such a disk
constexpr std::uint64_t BLOCK = 188;      ///< bytes of a tuning block

TEST(ValuePlacesTest, EveryKindOfValueHasItsPlace) {
    struct Row {
        kit::ValueKey key;
        std::uint64_t offset;
        std::string mask;
        std::uint64_t leastSize;
    };
    const Row ROWS[] = {
        {kit::paramKey(1), 0, "\xFF", 1},
        {kit::paramKey(134), 133, "\xFF\xFF", 135},
        {kit::slotKey(9), BASE + 129, std::string(8, '\xFF'), BASE - 129},
        {kit::slotKey(16), BASE + 2190, std::string(24, '\xFF'), BASE - 2190},
        {kit::slotByteKey(9, 7), BASE + 136, "\xFF", BASE - 129},
        {kit::auxKey(), BASE + 3072, std::string(1024, '\xFF'), BASE - 3072},
        {kit::tuningFieldKey(0, "qwaHFESwitch"), BASE + 4096, "\xC0", BASE - 4096},
        {kit::tuningFieldKey(3, "qwaNRAtten"), BASE + 4096 + 3 * BLOCK + 23, "\xFF\xFF",
         BASE - 4096},
        {kit::tuningFieldKey(9, "qwaNCParams"), BASE + 4096 + 9 * BLOCK + 13,
         std::string(10, '\xFF'), BASE - 4096},
    };
    for (const Row& row : ROWS) {
        const kit::ValuePlace place = kit::valuePlace(row.key);
        EXPECT_EQ(place.offsetIn(DISK_SIZE), row.offset) << kit::keyText(row.key);
        EXPECT_EQ(place.mask, row.mask) << kit::keyText(row.key);
        EXPECT_EQ(place.leastSize, row.leastSize) << kit::keyText(row.key);
    }
}

TEST(ValuePlacesTest, BlockIsAllOfItsFields) {
    const kit::ValuePlace block = kit::valuePlace(kit::tuningBlockKey(3));
    EXPECT_EQ(block.offsetIn(DISK_SIZE), BASE + 4096 + 3 * BLOCK);
    std::string mask(188, '\0');
    for (const DpsField& field : DPS_LAYOUT) {
        const kit::ValuePlace place = kit::valuePlace(kit::tuningFieldKey(3, field.key));
        for (std::size_t i = 0; i < place.mask.size(); ++i) {
            char& byte = mask.at(place.offset - block.offset + i);
            byte = static_cast<char>(byte | place.mask[i]);
        }
    }
    EXPECT_EQ(block.mask, mask);
}

TEST(ValuePlacesTest, OneSlotRepeatsNineOthers) {
    EXPECT_EQ(kit::slotsWithin(15), (std::vector<std::uint32_t>{1, 2, 3, 4, 5, 6, 7, 8, 9}));
    for (const std::uint32_t slot : {0U, 1U, 9U, 10U, 14U, 16U, 17U}) {
        EXPECT_TRUE(kit::slotsWithin(slot).empty()) << slot;
    }
}

TEST(ValuePlacesTest, ValueThatDoesNotFitIsNamedWithTheSizeItNeeds) {
    EXPECT_EQ(kit::placeFault(kit::paramKey(134), 135), "");
    EXPECT_EQ(kit::placeFault(kit::paramKey(134), 134),
              "parameter 134 ends at byte 135 of an image of 134 bytes");
    EXPECT_EQ(kit::placeFault(kit::slotKey(9), 1048447), "");
    EXPECT_EQ(kit::placeFault(kit::slotKey(9), 1048446),
              "slot 9 does not fit on a disk of 1048446 bytes: it needs 1048447");
    EXPECT_EQ(kit::placeFault(kit::tuningFieldKey(3, "qwaNRAtten"), 9),
              "the tuning area does not fit on a disk of 9 bytes: it needs 1044480");
}

} // namespace

} // namespace orvane::test
