// SPDX-License-Identifier: Apache-2.0
#include "identity/inf_file.h"

#include <fstream>

namespace orvane {

void readInfFile(const std::string& path, Inf_Data& record) {
    constexpr char SEPARATOR = '=';
    std::ifstream file(path);
    std::string line;
    while (std::getline(file, line)) {
        const std::size_t separator = line.find(SEPARATOR);
        if (separator == std::string::npos || separator + 1 == line.size()) {
            continue;
        }
        record[trimSpaces(line.substr(0, separator))] = trimSpaces(line.substr(separator + 1));
    }
}

std::string infValue(const Inf_Data& record, const std::string& key) {
    const auto found = record.find(key);
    return found == record.end() ? std::string() : found->second;
}

std::string trimSpaces(const std::string& text) {
    const std::size_t first = text.find_first_not_of(' ');
    if (first == std::string::npos) {
        return {};
    }
    return text.substr(first, text.find_last_not_of(' ') - first + 1);
}

} // namespace orvane
