// SPDX-License-Identifier: Apache-2.0
//
// Faults of a description that show only between its parts, each of them right by itself: two
// entries in one place, a value behind the end of an image or disk.
#pragma once

#include "kit/description/unit_description.h"
#include "kit/description/unit_layout.h"

#include <cstdint>
#include <optional>
#include <string>

namespace orvane::kit {

/// The part at fault, by its name below, and what is wrong with it.
struct Misfit {
    std::string part;
    std::string what;
};

/// A path is named twice, or lies below a file or link. The part is the path.
std::optional<Misfit> findPathMisfit(const UnitDescription& unit);

/// A value of image, disk or sparse file does not fit into it. What `layout` has no place for is
/// not looked at.
std::optional<Misfit> findSizeMisfit(const UnitDescription& unit, const Layout& layout);

/// The names of parts that are no paths.
std::string paramPart(std::uint64_t number);
std::string imageBytesPart(std::uint64_t offset);
std::string slotPart(std::uint64_t slot);
std::string tuningPart(std::uint64_t blockId);
std::string diskBytesPart(std::uint64_t offset);
std::string fileBytesPart(const std::string& path, std::uint64_t offset);
constexpr char AUX_PART[] = "aux";

/// The fewest bytes of a disk that a slot, an existing one, or a fixed area takes.
std::uint64_t leastDiskForSlot(std::uint32_t slot);
std::uint64_t leastDiskForTuning();
std::uint64_t leastDiskForAux();

/// "`what` does not fit on a disk of `size` bytes", and that `least` are needed.
std::string tooSmallDisk(const std::string& what, std::uint64_t size, std::uint64_t least);

/// "`what` ends at byte ... of `whole` of `size` bytes", or empty where it ends within.
std::string pastTheEnd(const std::string& what, std::uint64_t offset, std::uint64_t length,
                       std::uint64_t size, const char* whole);

/// Where parameter `number`, an existing one, lies in the image.
struct ParamPlace {
    std::uint32_t offset; ///< bytes
    std::uint32_t size;   ///< bytes, 1 or 2
};
ParamPlace paramPlace(std::uint16_t number);

} // namespace orvane::kit
