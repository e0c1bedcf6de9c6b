// SPDX-License-Identifier: Apache-2.0
//
// Where a value of an output lies in the unit, or what was found in its place.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <variant>

namespace orvane::desk {

/// Nothing to add to the value's key.
struct NoPlace {};

/// The source is missing, and a default replaces the value.
struct DefaultStandsIn {};

struct ImagePlace {
    std::uint32_t offset = 0; ///< of the first byte
    std::string bytes;
};

/// The image ends before the value does.
struct BehindImage {
    std::uint32_t offset = 0;      ///< where the value would begin
    std::uint64_t imageLength = 0; ///< bytes
};

struct DiskPlace {
    std::uint64_t offset = 0; ///< of the first byte
    std::string bytes;
    std::optional<unsigned> lowerBit; ///< of a value of two bits
};

/// A whole file.
struct FilePlace {
    std::string path;
};

/// The line of a version description file that counts.
struct VersionPlace {
    std::string path;
    std::size_t line = 0; ///< from 1; 0 when no line has the key
    std::string key;
    std::string value;
};

/// The folder of the version description files, none of which is the application's.
struct VersionFolderPlace {
    std::string path;
    std::optional<std::size_t> files; ///< their number; none when the folder can't be read
};

using Place = std::variant<NoPlace, DefaultStandsIn, ImagePlace, BehindImage, DiskPlace, FilePlace,
                           VersionPlace, VersionFolderPlace>;

} // namespace orvane::desk
