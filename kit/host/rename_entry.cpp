// SPDX-License-Identifier: Apache-2.0
#include "kit/host/rename_entry.h"

#include <fcntl.h>
#include <stdio.h>

#include <cerrno>

namespace orvane::kit {

namespace {

std::error_code renamed(const std::filesystem::path& from, const std::filesystem::path& to,
                        unsigned int flags) {
    if (::renameat2(AT_FDCWD, from.c_str(), AT_FDCWD, to.c_str(), flags) == 0) {
        return {};
    }
    return {errno, std::generic_category()};
}

} // namespace

std::error_code renameToFree(const std::filesystem::path& from, const std::filesystem::path& to) {
    const std::error_code error = renamed(from, to, RENAME_NOREPLACE);
    const bool isImpossible =
        error == std::errc::invalid_argument || error == std::errc::function_not_supported;
    return isImpossible ? renamed(from, to, 0) : error;
}

std::error_code exchangeNames(const std::filesystem::path& one,
                              const std::filesystem::path& other) {
    return renamed(one, other, RENAME_EXCHANGE);
}

} // namespace orvane::kit
