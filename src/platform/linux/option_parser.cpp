// SPDX-License-Identifier: Apache-2.0
#include "platform/option_parser.h"

#include <unistd.h>

#include <string>

namespace orvane {
namespace platform {

int nextOption(int argc, char* const argv[], const char* letters) {
    // Without the "+" glibc moves operands after the options and continues past them. C++ libraries
    // there need no memory for so short a string.
    const std::string posixly = std::string("+") + letters;
    return getopt(argc, argv, posixly.c_str());
}

} // namespace platform
} // namespace orvane
