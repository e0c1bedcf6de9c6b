// SPDX-License-Identifier: Apache-2.0
//
// The binary tuning blocks ("DPS" blocks) at the start of the disk's tuning area: ten blocks of 188
// bytes, back to back, with no header, version or checksum. A block is found by its id alone.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace orvane {

constexpr std::size_t DPS_BLOCK_SIZE = 188; ///< bytes
constexpr std::int32_t DPS_BLOCK_COUNT = 10;
constexpr std::size_t DPS_AREA_SIZE = 1880; ///< bytes

constexpr std::int32_t DPS_BLOCK_SPEECHREC = 2;
constexpr std::int32_t DPS_BLOCK_TELEPHONY = 3;

/// One packed block; 16-bit fields may begin at odd offsets. Any content is accepted.
struct DpsBlock {
    std::array<std::uint8_t, DPS_BLOCK_SIZE> bytes;
};

/// All blocks, by id.
using DpsArea = std::array<DpsBlock, DPS_BLOCK_COUNT>;
static_assert(sizeof(DpsArea) == DPS_AREA_SIZE, "blocks lie back to back");

/// How a value is stored. Multi-byte values are little-endian.
enum class DpsEncoding : std::uint8_t {
    code2, ///< two bits of one byte, 0 to 3
    u8,    ///< one byte, 0 to 255
    i16,   ///< two bytes, two's complement
};

/// What a value becomes in a tuning file.
enum class DpsKind : std::uint8_t {
    switchWord, ///< a word of qwaSwitchWords, or nothing
    modeWord,   ///< a word of qwaModeWords, or nothing
    number,     ///< in decimal
    list,       ///< every element in decimal, each followed by one space
};

/// One field of a block, which becomes one line of a tuning file.
struct DpsField {
    const char* key;
    std::uint8_t offset; ///< of the first byte in the block
    std::uint8_t bit;    ///< code2: the lower bit of the pair, 0 for the least significant; else 0
    DpsEncoding encoding;
    DpsKind kind;
    std::uint8_t count; ///< elements; 1 except for lists
};

/// Bytes of one element; a code2 is part of one.
constexpr std::size_t dpsElementSize(DpsEncoding encoding) {
    return encoding == DpsEncoding::i16 ? 2 : 1;
}

constexpr std::size_t DPS_FIELD_COUNT = 44;
/// The length of a field's longest possible line in a tuning file, with its line end.
constexpr std::size_t DPS_LINE_MAX = 127;

/// All fields of a block in ascending order of their positions, the order of a tuning file's lines.
extern const std::array<DpsField, DPS_FIELD_COUNT> DPS_LAYOUT;

/// The value of element `element` (0 to count - 1) of `field` in `block`: -32768 to 32767.
std::int32_t decodeField(const DpsBlock& block, const DpsField& field, std::size_t element);

/// A code and the word that a tuning file has for it.
struct QwaWord {
    std::int32_t code;
    const char* word;
};

/// The words of the switches, whatever their width, and those of the one mode.
extern const std::array<QwaWord, 3> qwaSwitchWords;
extern const std::array<QwaWord, 3> qwaModeWords;

/// The word for `code`, or the empty text when there is none.
const char* qwaWord(const std::array<QwaWord, 3>& words, std::int32_t code);

/// The words of `field`, a switch or a mode.
const std::array<QwaWord, 3>& fieldWords(const DpsField& field);

/// The word that a tuning file has for `code` in `field`, a switch or a mode; empty as above.
const char* fieldWord(const DpsField& field, std::int32_t code);

} // namespace orvane
