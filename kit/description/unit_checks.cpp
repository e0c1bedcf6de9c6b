// SPDX-License-Identifier: Apache-2.0
#include "kit/description/unit_checks.h"

#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/description/unit_layout.h"
#include "kit/description/value_key.h"
#include "kit/description/value_places.h"
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_encode.h"
#include "tuning/dps_block.h"

#include <filesystem>
#include <map>
#include <optional>
#include <vector>

namespace orvane::kit {

namespace {

void checkLength(const std::string& what, const Bytes& bytes, std::uint32_t size) {
    if (bytes.empty() || bytes.size() > size) {
        throw KitError(what + " takes 1 to " + std::to_string(size) + " bytes, not " +
                       std::to_string(bytes.size()));
    }
}

} // namespace

void checkParam(std::uint16_t number, std::int64_t value) {
    ParamInfo info{};
    const std::string name = valueName(paramKey(number));
    if (describeParam(number, info) != 0) {
        throw KitError("there is no " + name + ", only 1 to " + std::to_string(PARAM_COUNT));
    }
    if (value < 0 || value >= std::int64_t{1} << (8 * info.size)) {
        throw KitError(name + (info.size == 1 ? " is one byte: " : " is two bytes: ") +
                       std::to_string(value) + " does not fit");
    }
}

void checkSlot(std::uint32_t slot, const Bytes& bytes) {
    const std::string name = valueName(slotKey(slot));
    if (slot >= RECORD_SLOT_COUNT) {
        throw KitError("there is no " + name + ", only 0 to " +
                       std::to_string(RECORD_SLOT_COUNT - 1));
    }
    checkLength(name, bytes, slotPlace(slot).size);
}

void checkAux(const Bytes& bytes) {
    checkLength(valueName(auxKey()), bytes, AUX_AREA_SIZE);
}

void checkTuning(std::uint32_t id, const TuningDescription& block) {
    if (id >= DPS_BLOCK_COUNT) {
        throw KitError("there is no " + valueName(tuningBlockKey(id)) + ", only 0 to " +
                       std::to_string(DPS_BLOCK_COUNT - 1));
    }
    encodeTuningBlock(block); // throws for a value that does not fit
}

void checkUnitPath(const std::string& path) {
    const std::filesystem::path asPath(path);
    const bool isPlain = asPath.is_absolute() && asPath.has_filename() &&
                         path.find('\0') == std::string::npos &&
                         asPath.lexically_normal().string() == path;
    if (!isPlain) {
        throw KitError("a path must be absolute and have no \".\", \"..\" or needless \"/\", and "
                       "no zero byte, unlike \"" +
                       path + "\"");
    }
    const std::string mark = std::string("/") + MARKER_NAME;
    if (isAtOrBelow(path, mark)) {
        throw KitError("a path must not be " + mark + ", which is the kit's own mark: \"" + path +
                       "\"");
    }
}

void checkLinkTarget(const std::string& target) {
    if (target.empty() || target.find('\0') != std::string::npos) {
        throw KitError("a link's target must have at least one byte, and none that is zero");
    }
}

void checkUnit(const UnitDescription& unit) {
    for (const auto& [number, value] : unit.image.params) {
        checkParam(number, value);
    }
    for (const auto& [slot, bytes] : unit.disk.slots) {
        checkSlot(slot, bytes);
    }
    if (unit.disk.aux) {
        checkAux(*unit.disk.aux);
    }
    for (const auto& [id, block] : unit.disk.tuning) {
        checkTuning(id, block);
    }
    for (const auto& [path, content] : unit.files) {
        checkUnitPath(path);
    }
    for (const auto& [path, content] : unit.sparseFiles) {
        checkUnitPath(path);
    }
    for (const auto& [path, target] : unit.links) {
        checkUnitPath(path);
        checkLinkTarget(target);
    }
    for (const std::string& path : unit.folders) {
        checkUnitPath(path);
    }
    for (const std::string& path : unit.absent) {
        checkUnitPath(path);
    }
}

} // namespace orvane::kit
