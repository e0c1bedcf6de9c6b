// SPDX-License-Identifier: Apache-2.0
//
// Where the values of the outputs come from: for each, its key, reason and raw form. All functions
// read the unit that the process has as its root.
#pragma once

#include "orvane_unit/explain/explanation.h"
#include "orvane_unit/explain/reasons.h"
#include "tuning/dps_block.h"

#include <cstdint>
#include <optional>
#include <string>

namespace orvane::desk {

/// Why the disk can't be read at a place; nothing if it can. Throws kit::KitError where nobody can
/// tell what a run finds there, as do the other functions that read the image or the disk.
std::optional<Reason> diskTrouble(std::int64_t bytesBeforeEnd);

/// Size of the disk in bytes, also of a device; 0 when it can't be opened or measured.
std::uint64_t diskSize();

/// The configuration image as a run finds it.
struct Image {
    Reason reason = Reason::fromImage; ///< or why there is none
    std::uint64_t size = 0;            ///< in bytes
    std::string bytes;                 ///< of the parameters; fewer where the image ends
};

Image readImage();

Origin paramOrigin(const Image& image, std::uint16_t number);

/// The origin of the model's name: an unknown code is a reason of its own.
Origin modelOrigin(const Image& image);

Origin serialOrigin();

/// All tuning blocks as a run finds them.
struct TuningArea {
    Reason reason = Reason::fromTuningBlock; ///< or why all is zero
    std::uint64_t offset = 0;                ///< on the disk, in bytes
    DpsArea blocks{};
};

TuningArea readUnitTuning();

Origin fieldOrigin(const TuningArea& area, std::int32_t blockId, const DpsField& field);

} // namespace orvane::desk
