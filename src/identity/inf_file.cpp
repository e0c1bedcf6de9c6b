// SPDX-License-Identifier: Apache-2.0
#include "identity/inf_file.h"

#include <cstddef>
#include <fstream>
#include <utility>

namespace orvane {

bool parseInfLine(const std::string& line, std::string& key, std::string& value) {
    constexpr char SEPARATOR = '=';
    const std::size_t separator = line.find(SEPARATOR);
    if (separator == std::string::npos || separator + 1 == line.size()) {
        return false;
    }
    key = trimSpaces(line.substr(0, separator));
    value = trimSpaces(line.substr(separator + 1));
    return true;
}

void addInfLine(const std::string& line, Inf_Data& record) {
    std::string key;
    std::string value;
    if (parseInfLine(line, key, value)) {
        record[key] = value;
    }
}

void readInfFile(const std::string& path, Inf_Data& record) {
    std::ifstream file(path);
    std::string line;
    while (std::getline(file, line)) {
        addInfLine(line, record);
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
