// SPDX-License-Identifier: Apache-2.0
//
// Standard input, output and error of this process.
#pragma once

#include <string>

namespace orvane::desk {

/// Opens those that are closed, so that no file which is opened later takes their place: reading
/// from them and writing to them fails. From then on, writing to a pipe without a reader fails,
/// too, and does not end the process. Throws kit::KitError.
void prepareStandardStreams();

/// Writes all of `text` to standard output. Throws kit::KitError when not all of it could be
/// written.
void writeStandardOutput(const std::string& text);

} // namespace orvane::desk
