// SPDX-License-Identifier: Apache-2.0
//
// Which bytes of a text carry which value. Nothing here knows what the text looks like: it is
// rendered again with the value changed, and what differs is the value's.
#pragma once

#include "orvane_unit/explain/explanation.h"

#include <cstddef>
#include <string>
#include <vector>

namespace orvane::desk {

/// The part of a text that carries one value.
struct ValueRegion {
    std::size_t begin = 0;
    std::size_t end = 0; ///< after its last byte; `begin` for a value that leaves its lines out
    Origin origin;
};

/// The bytes of `text` that differ from `changed`, the same text rendered with another value. The
/// other value must begin and end with other bytes than this one. Throws std::logic_error when the
/// two texts are the same: the program is then wrong about the value.
ValueRegion changedBytes(const std::string& text, const std::string& changed, Origin origin);

/// The whole lines in which changedBytes lie. If only `changed` has the value's lines, the empty
/// region where they would begin.
ValueRegion changedLines(const std::string& text, const std::string& changed, Origin origin);

/// Cuts `text` into pieces: each region, and line by line what lies between them. Of regions that
/// overlap, the one that begins first ends where the next begins.
std::vector<Line> cutIntoLines(const std::string& text, std::vector<ValueRegion> regions);

/// A letter that is not in `text`; if every letter is, one that it neither begins nor ends with.
std::string otherText(const std::string& text);

} // namespace orvane::desk
