// SPDX-License-Identifier: Apache-2.0
//
// The keys of a unit's values, as `orvane-unit` takes and prints them.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace orvane::kit {

/// The key of one value of a unit. The default is the empty key, which no value has.
struct ValueKey {
    enum class Kind {
        none,        ///< the empty text
        imageSize,   ///< image.size
        param,       ///< param.NUMBER
        imageBytes,  ///< image.bytes.OFFSET
        slot,        ///< slot.NUMBER
        slotByte,    ///< slot.NUMBER.OFFSET
        aux,         ///< aux
        tuningBlock, ///< tuning.NUMBER
        tuningField, ///< tuning.NUMBER.NAME
        tuningRaw,   ///< tuning.NUMBER.raw: the bits that no field reads
        diskBytes,   ///< disk.bytes.OFFSET
        file,        ///< file.NAME
        fileBytes,   ///< file.bytes.OFFSET.NAME, which no path can be mistaken for
        link,        ///< link.NAME
        folder,      ///< folder.NAME
        absent,      ///< absent.NAME
    };

    Kind kind = Kind::none;
    std::uint64_t number = 0; ///< of the parameter, slot or tuning block
    std::uint64_t offset = 0; ///< bytes
    std::string name;         ///< of the tuning field; the path where there is one

    bool isEmpty() const { return kind == Kind::none; }
};

/// Ordered by kind, then number, offset and name.
bool operator==(const ValueKey& one, const ValueKey& other);
bool operator!=(const ValueKey& one, const ValueKey& other);
bool operator<(const ValueKey& one, const ValueKey& other);

ValueKey imageSizeKey();
ValueKey paramKey(std::uint64_t number);
ValueKey imageBytesKey(std::uint64_t offset);
ValueKey slotKey(std::uint64_t slot);
ValueKey slotByteKey(std::uint64_t slot, std::uint64_t offset);
ValueKey auxKey();
ValueKey tuningBlockKey(std::uint64_t block);
ValueKey tuningFieldKey(std::uint64_t block, std::string field);
ValueKey tuningRawKey(std::uint64_t block);
ValueKey diskBytesKey(std::uint64_t offset);
ValueKey fileKey(std::string path);
ValueKey fileBytesKey(std::string path, std::uint64_t offset);
ValueKey linkKey(std::string path);
ValueKey folderKey(std::string path);
ValueKey absentKey(std::string path);

/// The key as a text, its numbers decimal.
std::string keyText(const ValueKey& key);

struct ParsedKey {
    ValueKey key;      ///< of the text; where there is a fault, only its kind, or none
    std::string fault; ///< what is wrong with the text and what would be right; empty for a key
};

/// The inverse of keyText. Numbers may also be hexadecimal, after "0x". The parameter, slot, byte,
/// tuning block or field must exist, and a path must begin with a slash.
ParsedKey parseKey(std::string_view text);

} // namespace orvane::kit
