// SPDX-License-Identifier: Apache-2.0
//
// Where the values of a unit's image and disk lie.
#pragma once

#include "config/param_catalogue.h"
#include "kit/description/value_key.h"
#include "kit/host/bytes.h"

#include <cstdint>
#include <string>
#include <vector>

namespace orvane::kit {

/// The catalogue's row of parameter `number`, which must exist.
ParamDescriptor paramRow(std::uint16_t number);

/// Where an existing parameter lies in the image.
struct ParamPlace {
    std::uint32_t offset; ///< bytes
    std::uint32_t size;   ///< bytes, 1 or 2
};
ParamPlace paramPlace(std::uint16_t number);

/// Where an existing slot lies in the record area.
struct SlotPlace {
    std::uint64_t offset; ///< from the area's base, in bytes
    std::uint32_t size;   ///< bytes
};
SlotPlace slotPlace(std::uint32_t slot);

/// The other slots that lie within slot `slot`: none, except for the slot that repeats them.
std::vector<std::uint32_t> slotsWithin(std::uint32_t slot);

/// Where a value of the image or the disk lies.
struct ValuePlace {
    bool isOnDisk = false;
    std::uint64_t offset = 0; ///< in the image, or in the record area of the disk
    Bytes mask;               ///< the value's bits; as long as the place
    /// The least size of the image or disk, in bytes. The beginning of the whole slot or of the
    /// tuning area must be on it, since the tool reads and writes them only as a whole.
    std::uint64_t leastSize = 0;

    /// The offset in an image or disk of `size` bytes.
    std::uint64_t offsetIn(std::uint64_t size) const;
};

/// The place of a parameter, a slot or one byte of it, the auxiliary area, a tuning block (without
/// the bits that no field reads) or one of its fields. Other kinds of keys have none.
ValuePlace valuePlace(const ValueKey& key);

/// The value in words, for an error: "parameter 139", "qwaNRAtten of tuning block 3"; the path of
/// anything else.
std::string valueName(const ValueKey& key);

/// Why the value of `key` does not fit in an image or on a disk of `size` bytes; empty if it does.
std::string placeFault(const ValueKey& key, std::uint64_t size);

/// "`what` ends at byte ... of `whole` of `size` bytes", or empty where it ends within.
std::string pastTheEnd(const std::string& what, std::uint64_t offset, std::uint64_t length,
                       std::uint64_t size, const char* whole);

} // namespace orvane::kit
