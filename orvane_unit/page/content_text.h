// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/sparse_content.h"

#include <optional>
#include <string>

namespace orvane::desk {

/// What bytes of the disk hold, in a few words: "zeros", or how many are not zero and the first of
/// them. `content` has their offsets, and is none where they can't be read.
std::string contentText(const std::optional<kit::SparseContent>& content);

} // namespace orvane::desk
