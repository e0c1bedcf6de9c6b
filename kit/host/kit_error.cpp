// SPDX-License-Identifier: Apache-2.0
#include "kit/host/kit_error.h"

#include <cerrno>
#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

namespace {

std::string nameOf(const fs::path& path) {
    return path.empty() ? "\"\"" : path.string();
}

} // namespace

KitError::KitError(const std::string& what)
    : std::runtime_error(what), text_(what), before_(what) {}

KitError::KitError(const std::string& before, const fs::path& path, const std::string& after)
    : std::runtime_error(before + nameOf(path) + after), text_(before + nameOf(path) + after),
      before_(before), path_(path), after_(after) {}

bool KitError::isAbout(const fs::path& place) const {
    const fs::path below = path_.lexically_relative(place);
    return !path_.empty() && !below.empty() && *below.begin() != "..";
}

KitError KitError::moved(const fs::path& from, const fs::path& to) const {
    if (!isAbout(from)) {
        return *this;
    }
    const fs::path below = path_.lexically_relative(from);
    return {before_, below == "." ? to : to / below, after_};
}

KitError systemError(const std::string& what) {
    return KitError(what + ": " + std::generic_category().message(errno));
}

KitError systemError(const std::string& before, const fs::path& path) {
    return {before, path, ": " + std::generic_category().message(errno)};
}

KitError systemError(const std::string& before, const fs::filesystem_error& failure) {
    const fs::path& path = failure.path2().empty() ? failure.path1() : failure.path2();
    return {before, path, ": " + failure.code().message()};
}

} // namespace orvane::kit
