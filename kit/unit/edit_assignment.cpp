// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/edit_assignment.h"

#include "identity/vehicle_identity.h"
#include "kit/description/description_values.h"
#include "kit/description/unit_checks.h"
#include "kit/description/value_places.h"
#include "kit/host/kit_error.h"
#include "kit/host/little_endian.h"
#include "kit/host/text.h"
#include "kit/host/whole_file.h"
#include "kit/tuning/tuning_description.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/tuning/tuning_text.h"
#include "tuning/dps_block.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <limits>
#include <map>
#include <optional>
#include <string_view>
#include <utility>
#include <variant>

namespace orvane::kit {

namespace {

using Kind = ValueKey::Kind;

constexpr char SERIAL[] = "serial"; ///< another name for its slot
constexpr std::uint64_t LONGEST_TUNING_FILE = std::uint64_t{1} << 20U; ///< bytes

/// A whole number, decimal or in hex, negative after "-"; nothing for any other text. One that is
/// too great becomes the greatest, which fits nowhere.
std::optional<std::int64_t> numberIn(std::string_view text) {
    const bool isNegative = text.substr(0, 1) == "-";
    const std::optional<std::uint64_t> number = wholeNumber(text.substr(isNegative ? 1 : 0));
    if (!number) {
        return std::nullopt;
    }
    constexpr std::uint64_t GREATEST = std::numeric_limits<std::int64_t>::max();
    const auto magnitude = static_cast<std::int64_t>(std::min(*number, GREATEST));
    return isNegative ? -magnitude : magnitude;
}

std::int64_t requireNumber(const std::string& what, std::string_view text) {
    const std::optional<std::int64_t> number = numberIn(text);
    if (!number) {
        throw KitError(what + " takes a whole number, not " + inQuotes(text));
    }
    return *number;
}

std::vector<std::int64_t> numbersIn(const std::string& what, std::string_view text) {
    std::vector<std::int64_t> numbers;
    std::size_t begin = 0;
    while ((begin = text.find_first_not_of(", ", begin)) != std::string_view::npos) {
        const std::size_t end = std::min(text.find_first_of(", ", begin), text.size());
        numbers.push_back(requireNumber(what, text.substr(begin, end - begin)));
        begin = end;
    }
    return numbers;
}

/// The bytes for a key's place, or the faults of the tuning file that the value names, with their
/// places.
struct ReadValue {
    Bytes bytes;
    std::string fileFaults;
};

/// Each reader throws KitError for a value that its key can't have.
ReadValue readParam(const ValueKey& key, std::string_view text) {
    const std::int64_t value = requireNumber(valueName(key), text);
    checkParam(static_cast<std::uint16_t>(key.number), value);
    return {littleEndian(static_cast<std::uint64_t>(value), valuePlace(key).mask.size()), ""};
}

/// `bytes`, padded with zeros to the size of the key's place.
ReadValue padded(const ValueKey& key, Bytes bytes) {
    bytes.resize(valuePlace(key).mask.size());
    return {std::move(bytes), ""};
}

ReadValue readSlot(const ValueKey& key, std::string_view text) {
    const Bytes bytes = textOrHexBytes(text);
    checkSlot(static_cast<std::uint32_t>(key.number), bytes);
    return padded(key, bytes);
}

ReadValue readAux(const ValueKey& key, std::string_view text) {
    const Bytes bytes = textOrHexBytes(text);
    checkAux(bytes);
    return padded(key, bytes);
}

ReadValue readField(const ValueKey& key, std::string_view text) {
    const DpsField& field = tuningField(key.name);
    TuningValue value = std::string(text);
    if (field.kind == DpsKind::list) {
        value = numbersIn(key.name, text);
    } else if (const std::optional<std::int64_t> number = numberIn(text)) {
        value = *number;
    }
    DpsBlock block{};
    encodeTuningField(block, key.name, value);
    const Bytes bytes(block.bytes.begin(), block.bytes.end());
    return {bytes.substr(field.offset, valuePlace(key).mask.size()), ""};
}

ReadValue readBlock(const ValueKey& key, std::string_view fileName) {
    const std::string file(fileName);
    const std::string text = readRegularFile(file, LONGEST_TUNING_FILE);
    try {
        const DpsBlock block = parseTuningText(text, file, static_cast<std::int32_t>(key.number));
        return {Bytes(block.bytes.begin(), block.bytes.end()), ""};
    } catch (const KitError& error) {
        return {"", error.text()};
    }
}

/// A kind of value that can be set.
struct SettableKind {
    Kind kind;
    ReadValue (*read)(const ValueKey& key, std::string_view text);
};

constexpr SettableKind SETTABLE_KINDS[] = {
    {Kind::param, readParam},       {Kind::slot, readSlot},         {Kind::aux, readAux},
    {Kind::tuningField, readField}, {Kind::tuningBlock, readBlock},
};

const SettableKind& settableKind(Kind kind, std::string_view key) {
    const auto* const found =
        std::find_if(std::begin(SETTABLE_KINDS), std::end(SETTABLE_KINDS),
                     [kind](const SettableKind& settable) { return settable.kind == kind; });
    if (found == std::end(SETTABLE_KINDS)) {
        throw KitError("unknown key " + inQuotes(key) +
                       ": it takes param.N, serial, slot.N, aux, tuning.B.FIELD or tuning.B");
    }
    return *found;
}

/// The values that an assignment to `key` sets: those inside it, if there are any, else its own.
std::vector<ValueKey> valuesIn(const ValueKey& key) {
    std::vector<ValueKey> keys;
    if (key.kind == Kind::slot) {
        for (const std::uint32_t slot : slotsWithin(static_cast<std::uint32_t>(key.number))) {
            keys.push_back(slotKey(slot));
        }
    } else if (key.kind == Kind::tuningBlock) {
        for (const DpsField& field : DPS_LAYOUT) {
            keys.push_back(tuningFieldKey(key.number, field.key));
        }
    }
    return keys.empty() ? std::vector<ValueKey>{key} : keys;
}

} // namespace

Assignment readAssignment(const std::string& text) {
    const std::size_t equals = text.find('=');
    if (equals == std::string::npos) {
        throw KitError(inQuotes(text) + " is not of the form KEY=VALUE");
    }
    const std::string key = text.substr(0, equals);
    const ParsedKey parsed =
        key == SERIAL ? ParsedKey{slotKey(SERIAL_RECORD_SLOT), ""} : parseKey(key);
    ReadValue value;
    try {
        const SettableKind& kind = settableKind(parsed.key.kind, key);
        if (!parsed.fault.empty()) {
            throw KitError(parsed.fault);
        }
        value = kind.read(parsed.key, std::string_view(text).substr(equals + 1));
    } catch (const KitError& error) {
        throw KitError(text + ": " + error.text());
    }
    if (!value.fileFaults.empty()) {
        throw KitError(value.fileFaults);
    }
    return {text, parsed.key, std::move(value.bytes)};
}

void requireDistinct(const std::vector<Assignment>& assignments) {
    std::map<ValueKey, std::string> setBy;
    for (const Assignment& assignment : assignments) {
        for (const ValueKey& key : valuesIn(assignment.key)) {
            const auto [entry, isNew] = setBy.emplace(key, assignment.text);
            if (!isNew) {
                throw KitError(assignment.text + ": " + valueName(key) + " is already set by " +
                               inQuotes(entry->second));
            }
        }
    }
}

} // namespace orvane::kit
