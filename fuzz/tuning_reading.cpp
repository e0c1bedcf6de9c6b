// SPDX-License-Identifier: Apache-2.0
#include "fuzz/tuning_reading.h"

#include "fuzz/support.h"

#include <algorithm>
#include <cstdlib>
#include <optional>
#include <string>

namespace orvane::fuzz {

namespace {

/// How a value is stored.
enum class Storage { twoBits, byte, half };

/// Whether the line of a row shows a word, and which.
enum class Words { none, ofSwitch, ofMode };

struct Row {
    const char* key;
    int offset;
    Storage storage;
    Words words;
    int lowerBit; ///< of two bits
    int elements; ///< of a list; 0 for any other field
};

constexpr Row bits(const char* key, int offset, int lowerBit, Words words = Words::ofSwitch) {
    return {key, offset, Storage::twoBits, words, lowerBit, 0};
}
constexpr Row byte(const char* key, int offset, Words words = Words::none) {
    return {key, offset, Storage::byte, words, 0, 0};
}
constexpr Row half(const char* key, int offset, Words words = Words::none) {
    return {key, offset, Storage::half, words, 0, 0};
}
constexpr Row list(const char* key, int offset, int elements) {
    return {key, offset, Storage::half, Words::none, 0, elements};
}

constexpr std::array<Row, 44> ROWS = {
    bits("qwaAECSwitch", 0, 0),
    bits("qwaAGCSwitch", 0, 2),
    bits("qwaDiagSwitch", 0, 4),
    bits("qwaHFESwitch", 0, 6),
    bits("qwaMixFiltSwitch", 1, 0),
    bits("qwaMixSwitch", 1, 2),
    bits("qwaNRSwitch", 1, 4),
    bits("qwaRECSwitch", 2, 0),
    bits("qwaRecvAGCSwitch", 2, 2),
    bits("qwaRecvBWESwitch", 2, 4),
    bits("qwaRecvDLCSwitch", 2, 6),
    bits("qwaRecvDTFSwitch", 3, 0),
    bits("qwaRecvENSSwitch", 3, 2),
    bits("qwaRecvEQSwitch", 3, 4),
    bits("qwaSendDynEQSwitch", 4, 0),
    bits("qwaSendEQSwitch", 4, 2),
    bits("qwaWNDBMode", 4, 6, Words::ofMode),
    byte("qwaWNDBSwitch", 5, Words::ofSwitch),
    half("qwaAECFiltLen", 6),
    half("qwaLFRSwitch", 8, Words::ofSwitch),
    byte("qwaHFEExtent", 10),
    list("qwaNCParams", 13, 5),
    half("qwaNRAtten", 23),
    byte("qwaRECSuppress", 25),
    list("qwaRecvAGCAmpTgts", 26, 2),
    list("qwaRecvAGCGainVals", 30, 3),
    list("qwaRecvAGCMaxRates", 36, 2),
    half("qwaRecvGain", 40),
    half("qwaRecvLimitThresh", 42),
    list("qwaRecvParamEQNodes", 44, 15),
    half("qwaRefDelay", 76),
    half("qwaRefMaxDelay", 78),
    list("qwaSendAGCMaxRates", 84, 2),
    list("qwaSendAGCAmpTgts", 88, 2),
    list("qwaSendAGCGainVals", 92, 3),
    list("qwaSendDynEQMinMaxSNR", 98, 2),
    half("qwaSendGain", 102),
    half("qwaSendLimitThresh", 104),
    list("qwaSendParamEQ2Nodes", 106, 15),
    list("qwaSendParamEQNodes", 136, 15),
    byte("qwaWNDBSuppress", 166),
    half("qwaDNSEnable", 167),
    half("qwaIVOSwitch", 169, Words::ofSwitch),
    list("qwaMEQEnable", 171, 4),
};

/// Removes the part of `text` up to and including the first `end`, and returns it without `end`.
std::string_view takeUntil(std::string_view& text, char end, const char* what) {
    const std::size_t size = text.find(end);
    if (size == std::string_view::npos) {
        fail(what, std::string(1, end), text);
    }
    const std::string_view taken = text.substr(0, size);
    text.remove_prefix(size + 1);
    return taken;
}

/// The number in `text`, which must be plain decimal and nothing else.
int numberOf(const char* what, std::string_view text) {
    const std::string digits(text);
    const auto number = static_cast<int>(std::strtol(digits.c_str(), nullptr, 10));
    requireEqual(what, std::to_string(number), text);
    return number;
}

/// The code of `word`; none for the empty text, which stands for every code without a word.
std::optional<int> codeOf(const Row& row, std::string_view word) {
    const bool isMode = row.words == Words::ofMode;
    if (word.empty()) {
        return std::nullopt;
    }
    if (word == (isMode ? "qwaSingleChannel" : "qwaOff")) {
        return 1;
    }
    if (word == (isMode ? "qwaMultiChannel" : "qwaOn")) {
        return 2;
    }
    requireEqual(row.key, isMode ? "qwaCombined" : "qwaIdle", word);
    return 3;
}

/// The bytes that hold `value`, low byte first. Two bits count as a byte.
std::string bytesOf(const Row& row, int value) {
    if (row.storage != Storage::half) {
        requireSame(row.key, std::clamp(value, 0, 0xFF), value);
        return {static_cast<char>(value)};
    }
    requireSame(row.key, std::clamp(value, -0x8000, 0x7FFF), value);
    const int pattern = value < 0 ? value + 0x10000 : value;
    return {static_cast<char>(pattern % 0x100), static_cast<char>(pattern / 0x100)};
}

/// The bytes of `block` that `row` is about.
std::string bytesIn(const Block& block, const Row& row) {
    const std::uint8_t* first = block.data() + row.offset;
    switch (row.storage) {
    case Storage::twoBits:
        return {static_cast<char>(*first >> row.lowerBit & 3)};
    case Storage::byte:
        return std::string(inputText(first, 1));
    case Storage::half:
        break;
    }
    return std::string(inputText(first, 2 * static_cast<std::size_t>(std::max(row.elements, 1))));
}

void requireWord(const Row& row, std::string_view word, const std::string& held) {
    const std::optional<int> code = codeOf(row, word);
    if (code) {
        requireEqual(row.key, held, bytesOf(row, *code));
        return;
    }
    for (const int codeOfWord : {1, 2, 3}) {
        if (held == bytesOf(row, codeOfWord)) {
            fail(row.key, "the word of code " + std::to_string(codeOfWord), word);
        }
    }
}

/// The bytes that the decimal numbers in `value` stand for.
std::string bytesShown(const Row& row, std::string_view value) {
    if (row.elements == 0) {
        return bytesOf(row, numberOf(row.key, value));
    }
    std::string bytes;
    for (int left = row.elements; left > 0; --left) {
        bytes += bytesOf(row, numberOf(row.key, takeUntil(value, ' ', row.key)));
    }
    requireEqual(row.key, "", value); // nothing after the last element's blank
    return bytes;
}

} // namespace

void requireTuningOf(const Block& block, int id, std::string_view text) {
    requireEqual("header", "; Genereated config from DPS (blockId " + std::to_string(id) + ")",
                 takeUntil(text, '\n', "header"));
    for (const Row& row : ROWS) {
        std::string_view value = takeUntil(text, '\n', row.key);
        requireEqual("key", row.key, takeUntil(value, ' ', row.key));
        if (row.words == Words::none) {
            requireEqual(row.key, bytesIn(block, row), bytesShown(row, value));
        } else {
            requireWord(row, value, bytesIn(block, row));
        }
    }
    requireEqual("after the last line", "", text);
}

} // namespace orvane::fuzz
