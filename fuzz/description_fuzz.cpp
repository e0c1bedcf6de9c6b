// SPDX-License-Identifier: Apache-2.0
//
// The text of a unit's description. A refusal names its place. An accepted text makes a unit that
// is the same, to the byte, when its own text is parsed again.
#include "fuzz/support.h"
#include "kit/description/description_text.h"
#include "kit/description/parse_description.h"
#include "kit/description/unit_description.h"
#include "kit/host/kit_error.h"
#include "tests/kit/description/description_equality.h"

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace orvane::fuzz {

namespace {

constexpr char NAME[] = "unit.toml";

bool isNumberCharacter(char c) {
    return std::isxdigit(static_cast<unsigned char>(c)) != 0 || c == '_' || c == 'x' || c == 'o';
}

/// Whether the text may ask for so much repeated content that the run would spend all its time on
/// it.
bool repeatsMuch(std::string_view text) {
    constexpr std::ptrdiff_t LONG_NUMBER = 6;
    if (text.find("repeat") == std::string_view::npos) {
        return false;
    }
    for (const auto* begin = text.begin(); begin != text.end();) {
        begin = std::find_if(begin, text.end(), isNumberCharacter);
        const auto* const end = std::find_if_not(begin, text.end(), isNumberCharacter);
        if (end - begin >= LONG_NUMBER) {
            return true;
        }
        begin = end;
    }
    return false;
}

/// Requires "unit.toml:LINE:COLUMN: " and a text after it, on one line.
void requirePlace(std::string_view message, std::string_view input) {
    std::string_view rest = message;
    bool isPlace = take(rest, sizeof NAME - 1) == NAME;
    for (int number = 0; number < 2; ++number) {
        isPlace = isPlace && take(rest, 1) == ":";
        const std::string_view digits = take(rest, rest.find_first_not_of("0123456789"));
        isPlace = isPlace && !digits.empty() && digits != "0";
    }
    if (!isPlace || take(rest, 2) != ": " || rest.empty()) {
        fail("a refusal of \"" + std::string(input) + "\"", "unit.toml:LINE:COLUMN: ...", message);
    }
}

std::optional<kit::UnitDescription> parse(const std::string& text) {
    try {
        return kit::parseDescription(text, NAME);
    } catch (const kit::KitError& error) {
        requirePlace(error.text(), text);
        return {};
    }
}

} // namespace

} // namespace orvane::fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace orvane::fuzz;
    const std::string text(inputText(data, size));
    // A run with host files could not be repeated.
    if (repeatsMuch(text) || text.find("path") != std::string::npos) {
        return 0;
    }
    const auto unit = parse(text);
    if (unit) {
        const std::string again = orvane::kit::descriptionText(*unit);
        const auto reread = parse(again);
        if (!reread || !(*reread == *unit)) {
            fail("the unit of a description's text", text, again);
        }
        requireEqual("the text of that unit", again, orvane::kit::descriptionText(*reread));
    }
    return 0;
}
