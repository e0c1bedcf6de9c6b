// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/terminal.h"

#include <unistd.h>

#include <cstdlib>

namespace orvane::desk {

namespace {

const char* escapeOf(Colour colour) {
    switch (colour) {
    case Colour::good:
    case Colour::added:
        return "\033[32m";
    case Colour::bad:
    case Colour::removed:
        return "\033[31m";
    case Colour::place:
        return "\033[36m";
    case Colour::faint:
        return "\033[2m";
    case Colour::plain:
        break;
    }
    return "";
}

} // namespace

bool hasColours() {
    const char* noColour = std::getenv("NO_COLOR");
    return (noColour == nullptr || *noColour == '\0') && ::isatty(STDOUT_FILENO) == 1;
}

std::string painted(Colour colour, const std::string& text) {
    static const bool ARE_COLOURS = hasColours();
    return ARE_COLOURS && colour != Colour::plain ? escapeOf(colour) + text + "\033[0m" : text;
}

} // namespace orvane::desk
