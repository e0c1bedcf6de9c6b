// SPDX-License-Identifier: Apache-2.0
#include "kit/tuning/tuning_encode.h"

#include "kit/host/bytes.h"
#include "kit/host/kit_error.h"
#include "kit/host/little_endian.h"
#include "kit/host/sparse_content.h"
#include "kit/host/text.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <map>
#include <utility>
#include <variant>
#include <vector>

namespace orvane::kit {

namespace {

bool hasWords(const DpsField& field) {
    return field.kind == DpsKind::switchWord || field.kind == DpsKind::modeWord;
}

std::string rangeText(const DpsField& field) {
    return std::to_string(leastOf(field)) + " to " + std::to_string(greatestOf(field));
}

/// The code of `word` in the field's own table.
std::int64_t codeOf(const DpsField& field, const std::string& word) {
    if (!hasWords(field)) {
        throw KitError(std::string(field.key) + " takes numbers, not the word " +
                       inQuotes(printable(word)));
    }
    std::string known;
    for (const QwaWord& row : fieldWords(field)) {
        if (word == row.word) {
            return row.code;
        }
        known += std::string(row.word) + ", ";
    }
    throw KitError(std::string(field.key) + " has no word " + inQuotes(printable(word)) +
                   ": it takes " + known + "or a code " + rangeText(field));
}

/// The value as a list of numbers.
std::vector<std::int64_t> numbersOf(const DpsField& field, const TuningValue& value) {
    if (const auto* list = std::get_if<std::vector<std::int64_t>>(&value)) {
        if (field.kind != DpsKind::list) {
            throw KitError(std::string(field.key) + " takes one value, not a list");
        }
        return *list;
    }
    if (const auto* word = std::get_if<std::string>(&value)) {
        return {codeOf(field, *word)};
    }
    if (field.kind == DpsKind::list) {
        throw KitError(std::string(field.key) + " takes a list of " + std::to_string(field.count) +
                       " numbers, not " + std::to_string(std::get<std::int64_t>(value)));
    }
    return {std::get<std::int64_t>(value)};
}

/// Requires that `number` is in range.
void putNumber(DpsBlock& block, const DpsField& field, std::size_t element, std::int64_t number) {
    const std::size_t size = dpsElementSize(field.encoding);
    const std::size_t at = field.offset + element * size;
    auto bits = static_cast<std::uint64_t>(number); // two's complement
    if (field.encoding == DpsEncoding::code2) {
        bits = (block.bytes[at] & ~(3U << field.bit)) | bits << field.bit;
    }
    const Bytes bytes = littleEndian(bits, size);
    std::copy(bytes.begin(), bytes.end(), block.bytes.begin() + static_cast<std::ptrdiff_t>(at));
}

} // namespace

bool isTuningField(const std::string& key) {
    return std::any_of(DPS_LAYOUT.begin(), DPS_LAYOUT.end(),
                       [&key](const DpsField& row) { return key == row.key; });
}

const DpsField& tuningField(const std::string& key) {
    const auto* field = std::find_if(DPS_LAYOUT.begin(), DPS_LAYOUT.end(),
                                     [&key](const DpsField& row) { return key == row.key; });
    if (field == DPS_LAYOUT.end()) {
        throw KitError("there is no tuning field \"" + key + "\"");
    }
    return *field;
}

void encodeTuningField(DpsBlock& block, const std::string& key, const TuningValue& value) {
    const DpsField& field = tuningField(key);
    const std::vector<std::int64_t> numbers = numbersOf(field, value);
    if (numbers.size() != field.count) {
        throw KitError(key + " takes " + std::to_string(field.count) + " numbers, not " +
                       std::to_string(numbers.size()));
    }
    for (const std::int64_t number : numbers) {
        if (number < leastOf(field) || number > greatestOf(field)) {
            throw KitError(key + " takes " + rangeText(field) + ": " + std::to_string(number) +
                           " does not fit");
        }
    }
    for (std::size_t i = 0; i < numbers.size(); ++i) {
        putNumber(block, field, i, numbers[i]);
    }
}

DpsBlock encodeTuningBlock(const TuningDescription& description) {
    if (description.raw.size() > DPS_BLOCK_SIZE) {
        throw KitError("a tuning block has " + std::to_string(DPS_BLOCK_SIZE) + " bytes, not " +
                       std::to_string(description.raw.size()));
    }
    DpsBlock block{};
    std::copy(description.raw.begin(), description.raw.end(), block.bytes.begin());
    for (const auto& [key, value] : description.fields) {
        encodeTuningField(block, key, value);
    }
    return block;
}

std::int64_t leastOf(const DpsField& field) {
    return field.encoding == DpsEncoding::i16 ? -32768 : 0;
}

std::int64_t greatestOf(const DpsField& field) {
    switch (field.encoding) {
    case DpsEncoding::code2:
        return 3;
    case DpsEncoding::u8:
        return 255;
    case DpsEncoding::i16:
        break;
    }
    return 32767;
}

DpsBlock withoutFields(DpsBlock block) {
    for (const DpsField& field : DPS_LAYOUT) {
        for (std::size_t element = 0; element < field.count; ++element) {
            putNumber(block, field, element, 0);
        }
    }
    return block;
}

TuningDescription describeTuningBlock(const DpsBlock& block) {
    TuningDescription description;
    for (const DpsField& field : DPS_LAYOUT) {
        std::vector<std::int64_t> numbers;
        for (std::size_t element = 0; element < field.count; ++element) {
            numbers.push_back(decodeField(block, field, element));
        }
        TuningValue& value = description.fields[field.key];
        if (field.kind == DpsKind::list) {
            value = std::move(numbers);
            continue;
        }
        const std::string word =
            hasWords(field) ? fieldWord(field, static_cast<std::int32_t>(numbers.front())) : "";
        value = word.empty() ? TuningValue(numbers.front()) : TuningValue(word);
    }
    const DpsBlock rest = withoutFields(block);
    description.raw = withoutTrailingZeros(Bytes(rest.bytes.begin(), rest.bytes.end()));
    return description;
}

} // namespace orvane::kit
