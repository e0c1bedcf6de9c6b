// SPDX-License-Identifier: Apache-2.0
#include "config/record_area.h"

#include "config/boot_disk.h"
#include "config/crc32.h"
#include "config/record_slots.h"

#include <fcntl.h>

#include <algorithm>
#include <array>
#include <cstring>

namespace orvane {

namespace {

constexpr std::int32_t SUCCESS = 0;
constexpr std::int32_t FAILURE = -1;

struct SlotPlace {
    std::uint32_t size = 0;
    std::uint64_t offset = NO_SLOT_OFFSET;

    explicit SlotPlace(std::uint32_t slot) { recordSlotLayout(slot, size, offset); }
    /// No slot has a size without an offset.
    bool isKnown() const { return size != 0; }
    std::int64_t bytesBeforeEnd() const {
        return RECORD_AREA_SIZE - static_cast<std::int64_t>(offset);
    }
};

std::int32_t readArea(std::int64_t bytesBeforeEnd, std::uint32_t maxLength, void* buffer,
                      std::uint32_t length) {
    if (buffer == nullptr || length == 0 || length > maxLength) {
        return FAILURE;
    }
    const BootDisk disk(O_RDONLY);
    return disk.seekFromEnd(bytesBeforeEnd) && disk.read(buffer, length) ? SUCCESS : FAILURE;
}

std::int32_t writeArea(std::int64_t bytesBeforeEnd, std::uint32_t maxLength, const void* buffer,
                       std::uint32_t length) {
    if (buffer == nullptr || length == 0 || length > maxLength) {
        return FAILURE;
    }
    const BootDisk disk(O_WRONLY);
    return disk.seekFromEnd(bytesBeforeEnd) && disk.write(buffer, length) ? SUCCESS : FAILURE;
}

} // namespace

std::int32_t readRecordSlot(std::uint32_t slot, void* buffer, std::uint32_t length) {
    if (buffer == nullptr || length == 0) {
        return FAILURE;
    }
    std::memset(buffer, 0, length); // before anything can fail: a failed read leaves zeros
    const BootDisk disk(O_RDONLY);  // before the slot is looked up
    const SlotPlace place(slot);
    if (!place.isKnown() || !disk.seekFromEnd(place.bytesBeforeEnd())) {
        return FAILURE;
    }
    return disk.read(buffer, std::min(length, place.size)) ? SUCCESS : FAILURE;
}

std::int32_t writeRecordSlot(std::uint32_t slot, const void* buffer, std::uint32_t length) {
    if (buffer == nullptr || length == 0) {
        return FAILURE;
    }
    const BootDisk disk(O_WRONLY); // before the slot is looked up
    const SlotPlace place(slot);
    if (!place.isKnown()) {
        return FAILURE;
    }
    std::array<std::uint8_t, RECORD_SLOT_MAX_SIZE> padded{};
    if (length < place.size) {
        std::memcpy(padded.data(), buffer, length);
        buffer = padded.data();
    }
    return disk.seekFromEnd(place.bytesBeforeEnd()) && disk.write(buffer, place.size) ? SUCCESS
                                                                                      : FAILURE;
}

std::int32_t readTuningArea(void* buffer, std::uint32_t length) {
    return readArea(TUNING_AREA_START, TUNING_AREA_SIZE, buffer, length);
}

std::int32_t writeTuningArea(const void* buffer, std::uint32_t length) {
    return writeArea(TUNING_AREA_START, TUNING_AREA_SIZE, buffer, length);
}

std::int32_t readAuxArea(void* buffer, std::uint32_t length) {
    return readArea(AUX_AREA_START, AUX_AREA_SIZE, buffer, length);
}

std::int32_t writeAuxArea(const void* buffer, std::uint32_t length) {
    return writeArea(AUX_AREA_START, AUX_AREA_SIZE, buffer, length);
}

std::uint32_t recordAreaCrc() {
    std::array<std::uint8_t, RECORD_SLOT_MAX_SIZE> block{};
    if (readArea(CRC_RANGE_START, RECORD_SLOT_MAX_SIZE, block.data(), RECORD_SLOT_MAX_SIZE) !=
        SUCCESS) {
        return 0xFFFFFFFFU;
    }
    std::uint32_t crc = CRC32_INITIAL;
    for (const std::uint8_t byte : block) {
        crc = crc32Step(crc, byte);
    }
    // Without the final complement of the usual CRC-32, on purpose: the register is the value.
    return crc;
}

} // namespace orvane
