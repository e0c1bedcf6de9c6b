// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/terminal.h"

#include <unistd.h>

#include <cstdlib>

namespace orvane::desk {

bool hasColours() {
    const char* noColour = std::getenv("NO_COLOR");
    return (noColour == nullptr || *noColour == '\0') && ::isatty(STDOUT_FILENO) == 1;
}

std::string painted(Colour colour, const std::string& text) {
    static const bool ARE_COLOURS = hasColours();
    return ARE_COLOURS ? "\033[" + std::to_string(static_cast<int>(colour)) + "m" + text + "\033[0m"
                       : text;
}

} // namespace orvane::desk
