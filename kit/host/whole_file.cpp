// SPDX-License-Identifier: Apache-2.0
#include "kit/host/whole_file.h"

#include <fstream>
#include <sstream>

namespace orvane::kit {

std::optional<std::string> readWholeFile(const std::filesystem::path& path) {
    std::ifstream file(path, std::ios::binary);
    if (!file) {
        return std::nullopt;
    }
    std::ostringstream content;
    content << file.rdbuf(); // an empty file fails the copy, and is one all the same
    return content.str();
}

} // namespace orvane::kit
