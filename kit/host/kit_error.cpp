// SPDX-License-Identifier: Apache-2.0
#include "kit/host/kit_error.h"

#include <cerrno>
#include <system_error>

namespace orvane::kit {

KitError systemError(const std::string& what) {
    return KitError(what + ": " + std::generic_category().message(errno));
}

} // namespace orvane::kit
