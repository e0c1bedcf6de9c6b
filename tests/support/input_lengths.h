// SPDX-License-Identifier: Apache-2.0
//
// Inputs around the lengths at which the product has to read again.
#pragma once

#include "writers/template_merge.h"

#include <cstddef>
#include <string>

namespace orvane::test {

/// One byte below, at and above what one read of a copied file gives, twice that, and beyond.
constexpr std::size_t INPUT_LENGTHS[] = {131071, 131072, 131073, 131074,
                                         262143, 262144, 262145, 300000};
constexpr std::size_t LONGER_THAN_ANY_BUFFER = std::size_t{10} * 1024 * 1024;

// One read gives the whole buffer, or one byte less where the library keeps one back.
static_assert(INPUT_LENGTHS[1] == INPUT_BUFFER_SIZE - 1, "the lengths lie around one read");
static_assert(INPUT_LENGTHS[2] == INPUT_BUFFER_SIZE, "the lengths lie around one read");
static_assert(INPUT_LENGTHS[5] == 2 * (INPUT_BUFFER_SIZE - 1), "the lengths lie around two reads");
static_assert(INPUT_LENGTHS[7] > 2 * INPUT_BUFFER_SIZE, "the longest takes three reads");

/// A text of this length that says at each place how far from its start it is: it shows when a part
/// is missing, or comes twice or too early.
inline std::string markedText(std::size_t length) {
    std::string text;
    text.reserve(length + 8);
    while (text.size() < length) {
        text += std::to_string(text.size()) + " ................................................\n";
    }
    text.resize(length);
    return text;
}

} // namespace orvane::test
