// SPDX-License-Identifier: Apache-2.0
#include "config/record_slots.h"
#include "tests/product/config/area_disk.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>

namespace orvane::test {

TEST(RecordSlotsTest, AreaIsTheLastMebibyte) {
    EXPECT_EQ(1048576, RECORD_AREA_SIZE);
    EXPECT_EQ(18U, RECORD_SLOT_COUNT);
    EXPECT_EQ(136U, RECORD_SLOT_MAX_SIZE);
    EXPECT_EQ(0xFFFFFFFFFFFFFFFFU, NO_SLOT_OFFSET);
}

// Rules: SLT-01 to SLT-18
TEST(RecordSlotsTest, EverySlotHasItsSizeAndOffset) {
    for (const SlotPlace& place : SLOT_PLACES) {
        SCOPED_TRACE(place.slot);
        std::uint32_t size = 0;
        std::uint64_t offset = NO_SLOT_OFFSET;
        recordSlotLayout(place.slot, size, offset);
        EXPECT_EQ(place.size, size);
        EXPECT_EQ(place.offset, offset);
    }
}

TEST(RecordSlotsTest, LongestSlotHasTheMaximumSize) {
    std::uint32_t longest = 0;
    for (std::uint32_t slot = 0; slot < RECORD_SLOT_COUNT; ++slot) {
        std::uint32_t size = 0;
        std::uint64_t offset = 0;
        recordSlotLayout(slot, size, offset);
        longest = std::max(longest, size);
    }
    EXPECT_EQ(RECORD_SLOT_MAX_SIZE, longest);
}

// Rules: SLT-19
TEST(RecordSlotsTest, UnknownSlotKeepsBothOutputs) {
    for (const std::uint32_t slot : UNKNOWN_SLOTS) {
        SCOPED_TRACE(slot);
        std::uint32_t size = 77;
        std::uint64_t offset = 0x123456789ABCDEF0;
        recordSlotLayout(slot, size, offset);
        EXPECT_EQ(77U, size);
        EXPECT_EQ(0x123456789ABCDEF0U, offset);
    }
}

// Rules: SLT-16
TEST(RecordSlotsTest, Slot15CoversSlots1To9) {
    std::uint32_t size = 0;
    std::uint64_t begin = 0;
    recordSlotLayout(15, size, begin);
    const std::uint64_t end = begin + size;
    std::uint64_t next = begin;
    for (std::uint32_t slot = 1; slot <= 9; ++slot) {
        std::uint64_t offset = 0;
        recordSlotLayout(slot, size, offset);
        EXPECT_EQ(next, offset) << slot;
        next = offset + size;
    }
    EXPECT_EQ(end, next);
}

} // namespace orvane::test
