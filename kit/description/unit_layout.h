// SPDX-License-Identifier: Apache-2.0
//
// The entries that a description makes: its own, and the standard ones that they leave room for.
#pragma once

#include "kit/description/unit_description.h"

#include <functional>
#include <map>
#include <string>

namespace orvane::kit {

/// The kit's own mark at the top of a unit, which is not part of its description.
constexpr char MARKER_NAME[] = ".orvane-unit";

enum class EntryKind { folder, file, sparseFile, link, image, disk };

/// All entries of a unit by path, each folder before what it contains.
using Layout = std::map<std::string, EntryKind>;

/// The layout that `unit` asks for, the folders above each entry included. Image, disk and standard
/// folders give way to whatever `unit` names at their path, and to anything but a folder above it.
/// Requires that findPathConflict finds nothing.
Layout layoutOf(const UnitDescription& unit);

/// Adds to `unit` as absent the entries of `layout` that are not there. What lies below an absent
/// one is not looked at.
void addAbsent(const Layout& layout,
               const std::function<bool(const std::string& path, EntryKind kind)>& isThere,
               UnitDescription& unit);

/// The path without its last name: "/tmp" for "/tmp/x", empty for "/tmp".
std::string pathAbove(const std::string& path);

/// Whether the path `entry` is `ancestor` or lies below it.
bool isAtOrBelow(const std::string& entry, const std::string& ancestor);

/// Whether every unit has the folder `path`, unless something else takes its place.
bool isStandardFolder(const std::string& path);

} // namespace orvane::kit
