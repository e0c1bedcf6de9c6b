// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/find_orvane.h"

#include "kit/host/kit_error.h"

#include <cstdlib>
#include <sstream>
#include <system_error>

namespace orvane::desk {

namespace fs = std::filesystem;

fs::path findOrvane(const std::string& wanted) {
    if (!wanted.empty()) {
        return wanted;
    }
    constexpr char NAME[] = "orvane";
    std::error_code error;
    const fs::path own = fs::read_symlink("/proc/self/exe", error);
    if (!error && fs::is_regular_file(own.parent_path() / NAME, error)) {
        return own.parent_path() / NAME;
    }
    const char* const path = std::getenv("PATH");
    std::istringstream folders(path == nullptr ? "" : path);
    for (std::string folder; std::getline(folders, folder, ':');) {
        if (fs::is_regular_file(fs::path(folder) / NAME, error)) {
            return fs::path(folder) / NAME;
        }
    }
    throw kit::KitError("orvane is neither beside orvane-unit nor on PATH: name it with --orvane");
}

} // namespace orvane::desk
