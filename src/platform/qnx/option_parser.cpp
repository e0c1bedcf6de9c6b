// SPDX-License-Identifier: Apache-2.0
#include "platform/option_parser.h"

#include <unistd.h>

namespace orvane {
namespace platform {

int nextOption(int argc, char* const argv[], const char* letters) {
    return getopt(argc, argv, letters);
}

} // namespace platform
} // namespace orvane
