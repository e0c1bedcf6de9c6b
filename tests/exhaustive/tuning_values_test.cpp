// SPDX-License-Identifier: Apache-2.0
//
// Every value of every field of a tuning block, and of every element of a list, as text.
#include "tests/product/tuning/expected_layout.h"
#include "tuning/tuning_file.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <sstream>
#include <string>
#include <vector>

namespace orvane::test {
namespace {

constexpr std::uint32_t ROUNDS = 65536;

/// The number that 16 bits stand for, as text: a table, since every text of a
/// block has a hundred of them.
const std::string& numberText(std::uint32_t bits) {
    static const std::vector<std::string> texts = [] {
        std::vector<std::string> made;
        for (int value = 0; value < 65536; ++value) {
            made.push_back(std::to_string(value < 32768 ? value : value - 65536));
        }
        return made;
    }();
    return texts[bits];
}

const char* word(DpsKind kind, std::uint32_t code) {
    const bool isMode = kind == DpsKind::modeWord;
    switch (code) {
    case 1:
        return isMode ? "qwaSingleChannel" : "qwaOff";
    case 2:
        return isMode ? "qwaMultiChannel" : "qwaOn";
    case 3:
        return isMode ? "qwaCombined" : "qwaIdle";
    default:
        return "";
    }
}

/// One block and its text. Every element of every field has another value, and in ROUNDS rounds
/// each has had every value. Bits that belong to no field change, too.
class Round {
public:
    explicit Round(std::uint32_t round)
        : blockId_(static_cast<std::int32_t>(round % 10)), value_(round) {
        for (std::uint8_t& byte : block_.bytes) {
            byte = static_cast<std::uint8_t>(round * 7);
        }
        text_ = "; Genereated config from DPS (blockId " + std::to_string(blockId_) + ")\n";
        for (const DpsField& field : EXPECTED_LAYOUT) {
            text_ += field.key;
            text_ += ' ';
            for (unsigned element = 0; element < field.count; ++element) {
                put(field, element);
            }
            text_ += '\n';
        }
    }

    std::int32_t blockId() const { return blockId_; }
    const DpsBlock& block() const { return block_; }
    const std::string& text() const { return text_; }

private:
    void put(const DpsField& field, unsigned element) {
        value_ = (value_ + 809) % 65536; // neighbours differ in both bytes
        if (field.encoding == DpsEncoding::i16) {
            const std::size_t place = field.offset + 2U * element;
            block_.bytes.at(place) = static_cast<std::uint8_t>(value_ % 256);
            block_.bytes.at(place + 1) = static_cast<std::uint8_t>(value_ / 256);
            putText(field.kind, value_);
        } else if (field.encoding == DpsEncoding::u8) {
            block_.bytes.at(field.offset) = static_cast<std::uint8_t>(value_ % 256);
            putText(field.kind, value_ % 256);
        } else {
            const unsigned code = value_ % 4;
            std::uint8_t& byte = block_.bytes.at(field.offset);
            byte = static_cast<std::uint8_t>((byte & ~(3U << field.bit)) | code << field.bit);
            putText(field.kind, code);
        }
    }

    void putText(DpsKind kind, std::uint32_t value) {
        if (kind == DpsKind::number || kind == DpsKind::list) {
            text_ += numberText(value);
            text_ += kind == DpsKind::list ? " " : "";
        } else {
            text_ += word(kind, value);
        }
    }

    std::int32_t blockId_;
    std::uint32_t value_;
    DpsBlock block_{};
    std::string text_;
};

TEST(EveryTuningValueTest, IsWritten) {
    for (std::uint32_t count = 0; count < ROUNDS; ++count) {
        const Round round(count);
        std::ostringstream written;
        writeTuningText(written, round.blockId(), round.block());
        ASSERT_EQ(written.str(), round.text()) << "round " << count;
    }
}

} // namespace
} // namespace orvane::test
