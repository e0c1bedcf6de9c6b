// SPDX-License-Identifier: Apache-2.0
//
// What the system says about the memory of this process. Needs the host's /proc: a test inside a
// unit leaves the unit first.
#pragma once

#include <cstdint>
#include <fstream>
#include <sstream>
#include <string>

namespace orvane::test {

/// The rights of the mapping that holds `address`, as in /proc/self/maps ("r--p": readable,
/// private); "none" without such a mapping, "unreadable" when the system does not say.
inline std::string mappingRights(const volatile void* address) {
    const auto wanted = reinterpret_cast<std::uintptr_t>(address);
    std::ifstream maps("/proc/self/maps");
    if (!maps.is_open()) {
        return "unreadable";
    }
    for (std::string line; std::getline(maps, line);) {
        std::istringstream fields(line);
        std::uintptr_t begin = 0;
        std::uintptr_t end = 0;
        char dash = 0;
        std::string rights;
        fields >> std::hex >> begin >> dash >> end >> rights;
        if (begin <= wanted && wanted < end) {
            return rights;
        }
    }
    return "none";
}

} // namespace orvane::test
