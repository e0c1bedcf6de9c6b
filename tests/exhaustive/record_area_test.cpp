// SPDX-License-Identifier: Apache-2.0
//
// Every slot and both fixed areas by every length, against a shadow: the bytes that the disk's area
// must hold after each operation.
#include "config/record_area.h"
#include "tests/product/config/area_disk.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace orvane::test {
namespace {

constexpr std::uint32_t SLOT_COUNT = 18;
constexpr std::uint32_t LONGEST_SLOT_BUFFER = 200;
constexpr std::uint32_t LONGEST_AREA_BUFFER = 4097;
/// Bytes from the area's base to the end of the last fixed area.
constexpr std::size_t LAID_OUT = 8192;

struct FixedArea {
    std::int32_t (*read)(void*, std::uint32_t);
    std::int32_t (*write)(const void*, std::uint32_t);
    std::size_t offset; ///< from the area's base
    std::uint32_t size; ///< bytes
};
constexpr FixedArea AUXILIARY = {readAuxArea, writeAuxArea, 3072, 1024};
constexpr FixedArea TUNING = {readTuningArea, writeTuningArea, 4096, 4096};

class EveryLengthTest : public AreaDiskTest {
protected:
    /// What no read may leave behind the end of its buffer.
    static std::string untouched(std::size_t length) { return std::string(length + 8, '\xEE'); }

    /// `length` bytes, others at every call and at every place. More bytes follow, none of them
    /// zero, so that a write beyond them does not look like padding.
    std::string_view fresh(std::size_t length) {
        return std::string_view(area()).substr(++calls_ % 1021, length);
    }

    void expectLaidOutPart() const {
        ASSERT_TRUE(diskFromEnd(BASE_FROM_END, LAID_OUT) == shadow_.substr(0, LAID_OUT));
    }
    void expectWholeDisk() const { expectArea(shadow_); }

    static void expectRead(const FixedArea& fixed) {
        for (std::uint32_t length = 0; length <= LONGEST_AREA_BUFFER && !HasFailure(); ++length) {
            SCOPED_TRACE(length);
            const bool fits = length != 0 && length <= fixed.size;
            std::string right = untouched(length);
            if (fits) {
                right.replace(0, length, area(), fixed.offset, length);
            }
            std::string buffer = untouched(length);
            EXPECT_EQ(fixed.read(buffer.data(), length), fits ? 0 : -1);
            EXPECT_TRUE(buffer == right);
        }
    }

    void expectWritten(const FixedArea& fixed) {
        for (std::uint32_t length = 0; length <= LONGEST_AREA_BUFFER && !HasFailure(); ++length) {
            SCOPED_TRACE(length);
            const std::string_view content = fresh(length);
            const bool fits = length != 0 && length <= fixed.size;
            if (fits) {
                shadow_.replace(fixed.offset, length, content);
            }
            EXPECT_EQ(fixed.write(content.data(), length), fits ? 0 : -1);
            expectLaidOutPart();
        }
        expectWholeDisk();
    }

    std::string shadow_ = area();

private:
    std::size_t calls_ = 0;
};

TEST_F(EveryLengthTest, OfASlotIsRead) {
    for (std::uint32_t slot = 0; slot <= SLOT_COUNT; ++slot) {
        for (std::uint32_t length = 0; length <= LONGEST_SLOT_BUFFER; ++length) {
            const bool isRead = slot < SLOT_COUNT && length != 0;
            std::string right = untouched(length).replace(0, length, length, '\0');
            if (isRead) {
                const SlotPlace& place = SLOT_PLACES.at(slot);
                const std::size_t count = std::min(length, place.size);
                right.replace(0, count, area(), place.offset, count);
            }
            std::string buffer = untouched(length);
            ASSERT_EQ(readRecordSlot(slot, buffer.data(), length), isRead ? 0 : -1)
                << slot << ", " << length;
            ASSERT_EQ(buffer, right) << slot << ", " << length;
        }
    }
    expectWholeDisk();
}

TEST_F(EveryLengthTest, OfASlotIsWritten) {
    for (std::uint32_t slot = 0; slot <= SLOT_COUNT; ++slot) {
        for (std::uint32_t length = 0; length <= LONGEST_SLOT_BUFFER && !HasFailure(); ++length) {
            SCOPED_TRACE(std::to_string(slot) + ", " + std::to_string(length));
            const std::string_view content = fresh(length);
            const bool isWritten = slot < SLOT_COUNT && length != 0;
            if (isWritten) {
                const SlotPlace& place = SLOT_PLACES.at(slot);
                std::string whole(content);
                whole.resize(place.size, '\0');
                shadow_.replace(place.offset, place.size, whole);
            }
            EXPECT_EQ(writeRecordSlot(slot, content.data(), length), isWritten ? 0 : -1);
            expectLaidOutPart();
        }
    }
    expectWholeDisk();
}

TEST_F(EveryLengthTest, OfTheAuxiliaryAreaIsRead) {
    expectRead(AUXILIARY);
}

TEST_F(EveryLengthTest, OfTheAuxiliaryAreaIsWritten) {
    expectWritten(AUXILIARY);
}

TEST_F(EveryLengthTest, OfTheTuningAreaIsRead) {
    expectRead(TUNING);
}

TEST_F(EveryLengthTest, OfTheTuningAreaIsWritten) {
    expectWritten(TUNING);
}

} // namespace
} // namespace orvane::test
