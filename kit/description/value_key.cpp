// SPDX-License-Identifier: Apache-2.0
#include "kit/description/value_key.h"

#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/description/description_values.h"
#include "kit/description/value_places.h"
#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "kit/tuning/tuning_encode.h"
#include "tuning/dps_block.h"

#include <cstddef>
#include <limits>
#include <tuple>
#include <utility>

namespace orvane::kit {

namespace {

using Kind = ValueKey::Kind;

/// A part of a key that differs from value to value.
enum class Part { none, param, slot, byteOfSlot, block, field, offset, path };

struct Form {
    Kind kind;
    Part first;
    Part second;
    std::string_view begin;   ///< before the first part
    std::string_view between; ///< after it; empty if it is the last
};

/// All forms of keys. A text that fits two of them has the first one.
constexpr Form FORMS[] = {
    {Kind::imageSize, Part::none, Part::none, "image.size", ""},
    {Kind::param, Part::param, Part::none, "param.", ""},
    {Kind::imageBytes, Part::offset, Part::none, "image.bytes.", ""},
    {Kind::slotByte, Part::slot, Part::byteOfSlot, "slot.", "."},
    {Kind::slot, Part::slot, Part::none, "slot.", ""},
    {Kind::aux, Part::none, Part::none, "aux", ""},
    {Kind::tuningRaw, Part::block, Part::none, "tuning.", ".raw"},
    {Kind::tuningField, Part::block, Part::field, "tuning.", "."},
    {Kind::tuningBlock, Part::block, Part::none, "tuning.", ""},
    {Kind::diskBytes, Part::offset, Part::none, "disk.bytes.", ""},
    {Kind::fileBytes, Part::offset, Part::path, "file.bytes.", "."},
    {Kind::file, Part::path, Part::none, "file.", ""},
    {Kind::link, Part::path, Part::none, "link.", ""},
    {Kind::folder, Part::path, Part::none, "folder.", ""},
    {Kind::absent, Part::path, Part::none, "absent.", ""},
};

std::string partText(Part part, const ValueKey& key) {
    switch (part) {
    case Part::none:
        break;
    case Part::param:
    case Part::slot:
    case Part::block:
        return std::to_string(key.number);
    case Part::byteOfSlot:
    case Part::offset:
        return std::to_string(key.offset);
    case Part::field:
    case Part::path:
        return key.name;
    }
    return {};
}

/// Sets `part` of `key` from `text`. Throws KitError.
void readPart(Part part, std::string_view text, ValueKey& key) {
    constexpr std::uint64_t GREATEST = std::numeric_limits<std::int64_t>::max();
    switch (part) {
    case Part::none:
        break;
    case Part::param:
        key.number = keyNumber(text, {1, PARAM_COUNT}, "a parameter number");
        break;
    case Part::slot:
        key.number = keyNumber(text, {0, RECORD_SLOT_COUNT - 1}, "a slot number");
        break;
    case Part::byteOfSlot:
        key.offset =
            keyNumber(text, {0, slotPlace(static_cast<std::uint32_t>(key.number)).size - 1},
                      "a byte of slot " + std::to_string(key.number));
        break;
    case Part::block:
        key.number = keyNumber(text, {0, DPS_BLOCK_COUNT - 1}, "a tuning block");
        break;
    case Part::field:
        key.name = tuningField(std::string(text)).key;
        break;
    case Part::offset:
        key.offset = keyNumber(text, {0, GREATEST}, "an offset");
        break;
    case Part::path:
        if (text.empty() || text.front() != '/') {
            throw KitError("a path must be absolute, unlike " + inQuotes(text));
        }
        key.name = text;
        break;
    }
}

/// Finds the two parts of `form` in `text`; false when the text has another form.
bool splitParts(const Form& form, std::string_view text, std::string_view& first,
                std::string_view& second) {
    if (text.substr(0, form.begin.size()) != form.begin) {
        return false;
    }
    first = text.substr(form.begin.size());
    second = {};
    if (!form.between.empty()) {
        const std::size_t end = first.find('.');
        if (end == std::string_view::npos ||
            first.substr(end, form.between.size()) != form.between) {
            return false;
        }
        second = first.substr(end + form.between.size());
        first = first.substr(0, end);
    }
    return (form.first != Part::none || first.empty()) &&
           (form.second != Part::none || second.empty());
}

} // namespace

bool operator==(const ValueKey& one, const ValueKey& other) {
    return std::tie(one.kind, one.number, one.offset, one.name) ==
           std::tie(other.kind, other.number, other.offset, other.name);
}

bool operator!=(const ValueKey& one, const ValueKey& other) {
    return !(one == other);
}

bool operator<(const ValueKey& one, const ValueKey& other) {
    return std::tie(one.kind, one.number, one.offset, one.name) <
           std::tie(other.kind, other.number, other.offset, other.name);
}

ValueKey imageSizeKey() {
    return {Kind::imageSize, 0, 0, ""};
}

ValueKey paramKey(std::uint64_t number) {
    return {Kind::param, number, 0, ""};
}

ValueKey imageBytesKey(std::uint64_t offset) {
    return {Kind::imageBytes, 0, offset, ""};
}

ValueKey slotKey(std::uint64_t slot) {
    return {Kind::slot, slot, 0, ""};
}

ValueKey slotByteKey(std::uint64_t slot, std::uint64_t offset) {
    return {Kind::slotByte, slot, offset, ""};
}

ValueKey auxKey() {
    return {Kind::aux, 0, 0, ""};
}

ValueKey tuningBlockKey(std::uint64_t block) {
    return {Kind::tuningBlock, block, 0, ""};
}

ValueKey tuningFieldKey(std::uint64_t block, std::string field) {
    return {Kind::tuningField, block, 0, std::move(field)};
}

ValueKey tuningRawKey(std::uint64_t block) {
    return {Kind::tuningRaw, block, 0, ""};
}

ValueKey diskBytesKey(std::uint64_t offset) {
    return {Kind::diskBytes, 0, offset, ""};
}

ValueKey fileKey(std::string path) {
    return {Kind::file, 0, 0, std::move(path)};
}

ValueKey fileBytesKey(std::string path, std::uint64_t offset) {
    return {Kind::fileBytes, 0, offset, std::move(path)};
}

ValueKey linkKey(std::string path) {
    return {Kind::link, 0, 0, std::move(path)};
}

ValueKey folderKey(std::string path) {
    return {Kind::folder, 0, 0, std::move(path)};
}

ValueKey absentKey(std::string path) {
    return {Kind::absent, 0, 0, std::move(path)};
}

std::string keyText(const ValueKey& key) {
    for (const Form& form : FORMS) {
        if (form.kind == key.kind) {
            return std::string(form.begin) + partText(form.first, key) + std::string(form.between) +
                   partText(form.second, key);
        }
    }
    return {};
}

ParsedKey parseKey(std::string_view text) {
    if (text.empty()) {
        return {};
    }
    for (const Form& form : FORMS) {
        std::string_view first;
        std::string_view second;
        if (!splitParts(form, text, first, second)) {
            continue;
        }
        ValueKey key;
        key.kind = form.kind;
        try {
            readPart(form.first, first, key);
            readPart(form.second, second, key);
        } catch (const KitError& error) {
            return {{form.kind, 0, 0, ""}, error.text()};
        }
        return {key, ""};
    }
    return {{}, "unknown key " + inQuotes(text)};
}

} // namespace orvane::kit
