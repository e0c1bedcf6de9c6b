// SPDX-License-Identifier: Apache-2.0
//
// The text of a tuning file, read back into a block. For an accepted text, the tool writes the same
// text from that block; any other text is refused with the place of the first fault. If the first
// byte of the input is 0, the rest is the text. Otherwise the text is a whole tuning file in which
// the rest of the input replaces the line that the first byte chooses.
#include "fuzz/support.h"
#include "kit/host/kit_error.h"
#include "kit/tuning/tuning_text.h"
#include "tuning/dps_block.h"
#include "tuning/tuning_file.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <sstream>
#include <string>
#include <string_view>

namespace orvane::fuzz {

namespace {

constexpr char NAME[] = "a.txt";
constexpr std::size_t LINES = 1 + DPS_FIELD_COUNT;

std::string textOf(const DpsBlock& block, std::int32_t id) {
    std::ostringstream text;
    writeTuningText(text, id, block);
    return text.str();
}

/// The tuning file of zeros with `line` in place of one of its lines and that line's end.
std::string withLine(std::size_t number, std::string_view line) {
    std::string text = textOf({}, 3);
    std::size_t begin = 0;
    for (; number > 0; --number) {
        begin = text.find('\n', begin) + 1;
    }
    return text.replace(begin, text.find('\n', begin) + 1 - begin, line);
}

/// Whether the tool writes `text` for `block`, with any block id.
bool isWritten(const std::string& text, const DpsBlock& block) {
    for (std::int32_t id = 0; isTuningBlock(id); ++id) {
        if (textOf(block, id) == text) {
            return true;
        }
    }
    return false;
}

/// Requires "a.txt:LINE:COLUMN: " and no second line, for a text of this many lines.
void requirePlace(std::string_view line, std::size_t lines) {
    std::string_view rest = line;
    bool isPlace = take(rest, sizeof NAME) == std::string(NAME) + ":";
    const std::string lineNumber(take(rest, rest.find(':')));
    isPlace = isPlace && take(rest, 1) == ":";
    const std::string column(take(rest, rest.find(':')));
    for (const std::string& number : {lineNumber, column}) {
        isPlace = isPlace && !number.empty() && number.size() < 9 && number.front() != '0' &&
                  number.find_first_not_of("0123456789") == std::string::npos;
    }
    if (!isPlace || take(rest, 2) != ": " || rest.empty() ||
        rest.find('\n') != std::string_view::npos || std::stoul(lineNumber) > lines + 1) {
        fail("a refusal", "a.txt:LINE:COLUMN: ...", line);
    }
}

std::optional<DpsBlock> parse(const std::string& text) {
    try {
        return kit::parseTuningText(text, NAME, 3);
    } catch (const kit::KitError& error) {
        const auto ends = std::count(text.begin(), text.end(), '\n');
        requirePlace(error.what(), static_cast<std::size_t>(ends) + 1);
        return {};
    }
}

} // namespace

} // namespace orvane::fuzz

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using namespace orvane::fuzz;
    std::string_view input = inputText(data, size);
    const std::size_t kind = size == 0 ? 0 : *data % (LINES + 1);
    take(input, 1);
    const std::string text = kind == 0 ? std::string(input) : withLine(kind - 1, input);
    const auto block = parse(text);
    if (block && !isWritten(text, *block)) {
        fail("the text of the block that was read", text, textOf(*block, 3));
    }
    return 0;
}
