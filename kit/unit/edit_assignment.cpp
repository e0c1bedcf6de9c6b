// SPDX-License-Identifier: Apache-2.0
#include "kit/unit/edit_assignment.h"

#include "config/param_catalogue.h"
#include "config/record_slots.h"
#include "kit/description/description_values.h"
#include "kit/description/unit_checks.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/tuning/tuning_text.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <limits>
#include <map>
#include <optional>
#include <string_view>
#include <system_error>
#include <utility>

namespace orvane::kit {

namespace {

constexpr std::uint32_t SERIAL_SLOT = 9;
constexpr std::uint32_t SLOT_OF_SLOTS = 15;                            ///< slots 1 to 9 once more
constexpr std::uint64_t LONGEST_TUNING_FILE = std::uint64_t{1} << 20U; ///< bytes

/// Takes `prefix` from the front of `text`, if it is there.
bool takePrefix(std::string_view& text, std::string_view prefix) {
    if (text.substr(0, prefix.size()) != prefix) {
        return false;
    }
    text.remove_prefix(prefix.size());
    return true;
}

/// A whole number, decimal or in hex; nothing for any other text.
std::optional<std::int64_t> numberIn(std::string_view text) {
    const bool isNegative = takePrefix(text, "-");
    const bool isHex = takePrefix(text, "0x");
    const char* const last = text.data() + text.size();
    std::uint64_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), last, number, isHex ? 16 : 10);
    if (error == std::errc::invalid_argument || end != last) {
        return {};
    }
    // What is greater fits nowhere either.
    constexpr std::uint64_t GREATEST = std::numeric_limits<std::int64_t>::max();
    const auto magnitude =
        static_cast<std::int64_t>(error == std::errc{} ? std::min(number, GREATEST) : GREATEST);
    return isNegative ? -magnitude : magnitude;
}

std::int64_t requireNumber(const std::string& what, std::string_view text) {
    const std::optional<std::int64_t> number = numberIn(text);
    if (!number) {
        throw KitError(what + " takes a whole number, not " + inQuotes(text));
    }
    return *number;
}

ParamEdit readParam(std::string_view name, std::string_view value) {
    const auto number =
        static_cast<std::uint16_t>(keyNumber(name, {1, PARAM_COUNT}, "a parameter number"));
    const std::int64_t content = requireNumber("parameter " + std::to_string(number), value);
    checkParam(number, content);
    return {number, static_cast<std::uint16_t>(content)};
}

SlotEdit readSlot(std::uint32_t slot, std::string_view value) {
    SlotEdit edit{slot, textOrHexBytes(value)};
    checkSlot(slot, edit.bytes);
    return edit;
}

AuxEdit readAux(std::string_view value) {
    AuxEdit edit{textOrHexBytes(value)};
    checkAux(edit.bytes);
    return edit;
}

std::vector<std::int64_t> numbersIn(const std::string& key, std::string_view text) {
    std::vector<std::int64_t> numbers;
    std::size_t begin = 0;
    while ((begin = text.find_first_not_of(", ", begin)) != std::string_view::npos) {
        const std::size_t end = std::min(text.find_first_of(", ", begin), text.size());
        numbers.push_back(requireNumber(key, text.substr(begin, end - begin)));
        begin = end;
    }
    return numbers;
}

FieldEdit readField(std::uint32_t blockId, const std::string& key, std::string_view value) {
    const DpsField& field = tuningField(key);
    FieldEdit edit{blockId, key, std::string(value)};
    if (field.kind == DpsKind::list) {
        edit.value = numbersIn(key, value);
    } else if (const std::optional<std::int64_t> number = numberIn(value)) {
        edit.value = *number;
    }
    DpsBlock scratch{};
    encodeTuningField(scratch, key, edit.value);
    return edit;
}

/// What is wrong with the file itself stands at its own places, without the assignment.
struct FaultyFile {
    KitError error;
};

BlockEdit readBlock(std::uint32_t blockId, const std::string& file) {
    const std::string text = readRegularFile(file, LONGEST_TUNING_FILE);
    try {
        return {blockId, parseTuningText(text, file, static_cast<std::int32_t>(blockId))};
    } catch (const KitError& error) {
        throw FaultyFile{error};
    }
}

decltype(Assignment::edit) readEdit(std::string_view key, std::string_view value) {
    std::string_view name = key;
    if (takePrefix(name, "param.")) {
        return readParam(name, value);
    }
    if (takePrefix(name, "slot.")) {
        return readSlot(static_cast<std::uint32_t>(
                            keyNumber(name, {0, RECORD_SLOT_COUNT - 1}, "a slot number")),
                        value);
    }
    if (takePrefix(name, "tuning.")) {
        const std::size_t dot = name.find('.');
        const auto blockId = static_cast<std::uint32_t>(
            keyNumber(name.substr(0, dot), {0, DPS_BLOCK_COUNT - 1}, "a tuning block"));
        if (dot == std::string_view::npos) {
            return readBlock(blockId, std::string(value));
        }
        return readField(blockId, std::string(name.substr(dot + 1)), value);
    }
    if (key == "serial") {
        return readSlot(SERIAL_SLOT, value);
    }
    if (key == "aux") {
        return readAux(value);
    }
    throw KitError("unknown key " + inQuotes(key) +
                   ": it takes param.N, serial, slot.N, aux, tuning.B.FIELD or tuning.B");
}

/// Names of everything that an edit sets, in words for an error.
struct NamesOfSet {
    std::vector<std::string> operator()(const ParamEdit& edit) const {
        return {"parameter " + std::to_string(edit.number)};
    }
    std::vector<std::string> operator()(const SlotEdit& edit) const {
        if (edit.slot != SLOT_OF_SLOTS) {
            return {"slot " + std::to_string(edit.slot)};
        }
        std::vector<std::string> names;
        for (std::uint32_t slot = 1; slot <= SERIAL_SLOT; ++slot) {
            names.push_back("slot " + std::to_string(slot));
        }
        return names;
    }
    std::vector<std::string> operator()(const AuxEdit& /*edit*/) const {
        return {"the auxiliary area"};
    }
    std::vector<std::string> operator()(const FieldEdit& edit) const {
        return {edit.key + " of tuning block " + std::to_string(edit.blockId)};
    }
    std::vector<std::string> operator()(const BlockEdit& edit) const {
        std::vector<std::string> names;
        for (const DpsField& field : DPS_LAYOUT) {
            names.push_back(field.key + std::string(" of tuning block ") +
                            std::to_string(edit.blockId));
        }
        return names;
    }
};

} // namespace

Assignment readAssignment(const std::string& text) {
    const std::size_t equals = text.find('=');
    if (equals == std::string::npos) {
        throw KitError(inQuotes(text) + " is no assignment: it takes KEY=VALUE");
    }
    try {
        return {text, readEdit(std::string_view(text).substr(0, equals),
                               std::string_view(text).substr(equals + 1))};
    } catch (const KitError& error) {
        throw KitError(text + ": " + error.what());
    } catch (const FaultyFile& faulty) {
        throw faulty.error;
    }
}

void requireDistinct(const std::vector<Assignment>& assignments) {
    std::map<std::string, std::string> setBy;
    for (const Assignment& assignment : assignments) {
        for (const std::string& name : std::visit(NamesOfSet(), assignment.edit)) {
            const auto [entry, isNew] = setBy.emplace(name, assignment.text);
            if (!isNew) {
                throw KitError(assignment.text + ": " + name + " is set by " +
                               inQuotes(entry->second) + " already");
            }
        }
    }
}

} // namespace orvane::kit
