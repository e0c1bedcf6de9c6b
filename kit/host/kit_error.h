// SPDX-License-Identifier: Apache-2.0
//
// The kit's one kind of failure.
#pragma once

#include <stdexcept>
#include <string>

namespace orvane::kit {

/// What the kit throws for wrong use, a bad root or a refusing system: one clear line without a
/// newline at its end.
struct KitError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/// The error for a system call that has just failed: `what`, a colon, and the text of errno.
KitError systemError(const std::string& what);

} // namespace orvane::kit
