// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/place_text.h"

#include "kit/host/text.h"
#include "orvane_unit/explain/place.h"

#include <cstdint>
#include <optional>
#include <variant>
#include <vector>

namespace orvane::desk {

namespace {

using kit::ValueKey;

std::string bytesText(const char* where, std::uint64_t offset, const std::string& bytes) {
    return std::string(", ") + where + (bytes.size() == 1 ? " byte " : " bytes from ") +
           std::to_string(offset) + ": " + kit::hexText(bytes);
}

/// The text of each kind of place, after that of the value's holder.
struct PlaceText {
    const ValueKey& key;

    std::string operator()(const NoPlace& /*place*/) const { return holderText(key); }

    std::string operator()(const DefaultStandsIn& /*place*/) const {
        const bool isTuning = key.kind == ValueKey::Kind::tuningField;
        return holderText(key) + " counts as " + (isTuning ? "zeros" : "missing");
    }

    std::string operator()(const ImagePlace& place) const {
        return holderText(key) + bytesText("image", place.offset, place.bytes);
    }

    std::string operator()(const BehindImage& place) const {
        return holderText(key) + ", image byte " + std::to_string(place.offset) + " of " +
               std::to_string(place.imageLength);
    }

    std::string operator()(const DiskPlace& place) const {
        std::string text = holderText(key) + bytesText("disk", place.offset, place.bytes);
        if (place.lowerBit) {
            text += ", bits " + std::to_string(*place.lowerBit) + " and " +
                    std::to_string(*place.lowerBit + 1);
        }
        return text;
    }

    std::string operator()(const FilePlace& place) const { return place.path; }

    std::string operator()(const VersionPlace& place) const {
        if (place.line == 0) {
            return place.path;
        }
        return place.path + ":" + std::to_string(place.line) + ": " + place.key + " is \"" +
               place.value + "\"";
    }

    std::string operator()(const VersionFolderPlace& place) const {
        if (!place.files) {
            return place.path;
        }
        return std::to_string(*place.files) + " version description files in " + place.path;
    }
};

} // namespace

std::string holderText(const ValueKey& key) {
    if (key.kind == ValueKey::Kind::param) {
        return "parameter " + std::to_string(key.number);
    }
    if (key.kind == ValueKey::Kind::slot) {
        return "record slot " + std::to_string(key.number);
    }
    return key.kind == ValueKey::Kind::tuningField ? "block " + std::to_string(key.number) : "";
}

std::string placeText(const Origin& origin) {
    return std::visit(PlaceText{origin.key}, origin.place);
}

bool saysTheSame(const Origin& one, const Origin& other) {
    return one.reasons == other.reasons && placeText(one) == placeText(other);
}

} // namespace orvane::desk
