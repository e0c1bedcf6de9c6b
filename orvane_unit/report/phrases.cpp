// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/phrases.h"

#include "identity/software_version.h"
#include "kit/description/value_places.h"
#include "kit/host/text.h"
#include "orvane_unit/explain/version_choice.h"
#include "tuning/dps_block.h"

#include <optional>
#include <vector>

namespace orvane::desk {

std::string hexNumber(std::uint32_t number, unsigned digits) {
    return "0x" + kit::hexDigits(number, digits);
}

std::string repeatedSlots(std::uint32_t slot) {
    const std::vector<std::uint32_t> slots = kit::slotsWithin(slot);
    return slots.empty()
               ? ""
               : "slots " + std::to_string(slots.front()) + " to " + std::to_string(slots.back());
}

std::string purposeOf(std::int32_t blockId) {
    return blockId == DPS_BLOCK_TELEPHONY   ? "telephony"
           : blockId == DPS_BLOCK_SPEECHREC ? "speech recognition"
                                            : "";
}

std::string lineText(const OutputLine& line) {
    return line.number == 0 ? line.path : line.path + ":" + std::to_string(line.number);
}

std::string choiceText(const VersionFiles& versions, std::size_t index) {
    if (versions.chosen == index) {
        return "chosen: the first application in the order of the listing";
    }
    if (versions.files.at(index).isApplication) {
        return "not chosen: an application, but not the first one";
    }
    return std::string("not chosen: its type does not contain \"") + APPLICATION_TYPE + "\"";
}

} // namespace orvane::desk
