// SPDX-License-Identifier: Apache-2.0
#include "platform/option_parser.h"

#include <unistd.h>

#include <array>
#include <cstdio>

namespace orvane::platform {

int nextOption(int argc, char* const argv[], const char* letters) {
    // Without the "+" glibc moves operands behind the options and goes on after them.
    std::array<char, 16> posixly{};
    std::snprintf(posixly.data(), posixly.size(), "+%s", letters);
    return getopt(argc, argv, posixly.data());
}

} // namespace orvane::platform
