// SPDX-License-Identifier: Apache-2.0
//
// The layout of the record area, the last mebibyte of the boot disk. All positions are relative to
// the end of the device, so it holds on disks of any size.
#pragma once

#include <cstdint>

namespace orvane {

/// The area's base: bytes before the end of the device.
constexpr std::int64_t RECORD_AREA_SIZE = 0x100000;

/// Where the fixed areas begin, in bytes before the end of the device, and their sizes.
constexpr std::int64_t AUX_AREA_START = 0xFF400;
constexpr std::int64_t TUNING_AREA_START = 0xFF000;
constexpr std::uint32_t AUX_AREA_SIZE = 1024;
constexpr std::uint32_t TUNING_AREA_SIZE = 4096;
static_assert(RECORD_AREA_SIZE - AUX_AREA_START == 3072, "begins 3072 bytes past the base");
static_assert(RECORD_AREA_SIZE - TUNING_AREA_START == 4096, "begins 4096 bytes past the base");

/// The CRC is taken over CRC_RECORD_SLOT, which begins one byte past the base.
constexpr std::int64_t CRC_RANGE_START = 0xFFFFF;
static_assert(RECORD_AREA_SIZE - CRC_RANGE_START == 1, "begins one byte past the base");

constexpr std::uint32_t RECORD_SLOT_COUNT = 18;
/// Slots 1 to 9 again as one block, the range of the CRC.
constexpr std::uint32_t CRC_RECORD_SLOT = 15;
/// The longest slot, slot 15, in bytes.
constexpr std::uint32_t RECORD_SLOT_MAX_SIZE = 136;
/// "No offset": what a caller of recordSlotLayout starts from.
constexpr std::uint64_t NO_SLOT_OFFSET = ~std::uint64_t{0};

/// Gives the size of slot 0 to 17 in bytes and its offset from the area's base. Leaves both outputs
/// unchanged for an unknown slot.
void recordSlotLayout(std::uint32_t slot, std::uint32_t& size, std::uint64_t& offset);

} // namespace orvane
