// SPDX-License-Identifier: Apache-2.0
#include "kit/host/kit_error.h"

#include <cerrno>
#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

KitError::KitError(const std::string& what) : KitError(what, "", "") {}

KitError::KitError(const std::string& before, const fs::path& path, const std::string& after)
    : std::runtime_error(before + path.string() + after), before_(before), path_(path),
      after_(after) {}

KitError KitError::moved(const fs::path& from, const fs::path& to) const {
    const fs::path below = path_.lexically_relative(from);
    if (below.empty() || *below.begin() == "..") {
        return *this;
    }
    return {before_, below == "." ? to : to / below, after_};
}

KitError systemError(const std::string& what) {
    return systemError(what, "");
}

KitError systemError(const std::string& before, const fs::path& path) {
    return {before, path, ": " + std::generic_category().message(errno)};
}

} // namespace orvane::kit
