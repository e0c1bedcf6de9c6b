// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/bytes.h"
#include "kit/unit/describe_inputs.h"

#include <filesystem>
#include <string>

namespace orvane::kit {

/// Replaces the serial in record slot 9 by as many "X", and what follows it in the slot by zeros.
/// Without the blanks around it, it is also replaced wherever else it stands on the disk, in the
/// image, in a file or in the name of a version file. Other names belong to the unit itself and
/// stay, as does a name that would no longer be a version file's or would be another one's:
/// requireNowhere finds those. Returns the bytes that must not stand anywhere; nothing when there
/// is no serial, or only blanks or "X". Throws KitError for a serial of less than four bytes.
Bytes redactSerial(UnitInputs& inputs);

/// `text` with `serial`, as redactSerial returns it, covered wherever it stands.
std::string withoutSerial(const Bytes& serial, std::string text);

/// Throws KitError, with the path, when the bytes stand below `folder`: in a name, a link's target
/// or a file. They may not be empty or contain a zero.
void requireNowhere(const Bytes& serial, const std::filesystem::path& folder);

} // namespace orvane::kit
