// SPDX-License-Identifier: Apache-2.0
#include "platform/option_parser.h"

#include <unistd.h>

#include <string>

namespace orvane {
namespace platform {

int nextOption(int argc, char* const argv[], const char* letters) {
    // Without the "+" glibc moves operands behind the options and goes on after them. The libraries
    // of such systems keep so short a string without memory.
    const std::string posixly = std::string("+") + letters;
    return getopt(argc, argv, posixly.c_str());
}

} // namespace platform
} // namespace orvane
