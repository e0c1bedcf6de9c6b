// SPDX-License-Identifier: Apache-2.0
//
// Byte access to the record area of the raw boot disk. Every operation opens the device, seeks
// relative to its end, transfers once, and closes: nothing is kept between calls, and a short
// transfer counts as success. All return 0 or -1, whatever the cause.
#pragma once

#include <cstdint>

namespace orvane {

/// Reads record slot 0 to 17 into `buffer`. All `length` bytes of the buffer are zeroed first, so a
/// failure leaves zeros; a shorter buffer gets the slot's first bytes, a longer one keeps zeros
/// after them. -1 for a null buffer or length 0 (the buffer is then not touched), an unknown slot,
/// or a device that can't be opened, sought or read.
std::int32_t readRecordSlot(std::uint32_t slot, void* buffer, std::uint32_t length);

/// Writes record slot 0 to 17 whole: `buffer` is padded with zeros when shorter than the slot, its
/// excess dropped when longer. -1 as above.
std::int32_t writeRecordSlot(std::uint32_t slot, const void* buffer, std::uint32_t length);

/// Transfer the first `length` bytes of a fixed area. -1 for a null buffer, length 0 or more than
/// the area's size (the device is not touched then), or a device failure. A failed or short read
/// leaves the rest of `buffer` unchanged.
std::int32_t readTuningArea(void* buffer, std::uint32_t length);
std::int32_t writeTuningArea(const void* buffer, std::uint32_t length);
std::int32_t readAuxArea(void* buffer, std::uint32_t length);
std::int32_t writeAuxArea(const void* buffer, std::uint32_t length);

/// The CRC register over the 136 bytes of slot 15 (slots 1 to 9), without the final complement: the
/// bitwise NOT of their usual CRC-32. All ones on failure; a computed register can also have that
/// value.
std::uint32_t recordAreaCrc();

} // namespace orvane
