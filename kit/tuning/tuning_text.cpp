// SPDX-License-Identifier: Apache-2.0
#include "kit/tuning/tuning_text.h"

#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "kit/tuning/tuning_encode.h"
#include "kit/tuning/tuning_line.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <string_view>
#include <utility>

namespace orvane::kit {

namespace {

constexpr std::string_view HEADER_BEGIN = "; Genereated config from DPS (blockId ";
constexpr std::string_view HEADER_END = ")";

bool isHeader(std::string_view line) {
    const std::size_t digit = HEADER_BEGIN.size();
    return line.size() == digit + 1 + HEADER_END.size() && line.substr(0, digit) == HEADER_BEGIN &&
           line[digit] >= '0' && line[digit] <= '9' && line.substr(digit + 1) == HEADER_END;
}

class TuningReader {
public:
    explicit TuningReader(std::string name) : name_(std::move(name)) {}

    DpsBlock read(std::string_view text, std::int32_t blockId) {
        while (!text.empty()) {
            ++lineNumber_;
            const std::size_t end = std::min(text.find('\n'), text.size());
            readLine(text.substr(0, end), end < text.size(), blockId);
            text.remove_prefix(std::min(end + 1, text.size()));
        }
        ++lineNumber_;
        if (lineNumber_ == 1) {
            failHeader(blockId);
        }
        findMissing();
        if (!faults_.empty()) {
            throw KitError(faults_);
        }
        return block_;
    }

private:
    void readLine(std::string_view line, bool hasEnd, std::int32_t blockId) {
        const std::size_t faultsBefore = faults_.size();
        const std::string key(line.substr(0, line.find(' ')));
        const std::size_t carriageReturn = line.find('\r');
        if (lineNumber_ == 1 && !isTuningField(key)) {
            if (carriageReturn != std::string_view::npos) {
                fail(carriageReturn, "a line ends with a line feed alone, not a carriage return");
            } else if (!isHeader(line)) {
                failHeader(blockId);
            }
        } else {
            if (lineNumber_ == 1) {
                failHeader(blockId);
            }
            readField(line, key);
        }
        if (!hasEnd && faults_.size() == faultsBefore) {
            fail(line.size(), "the last line has no line end");
        }
    }

    void readField(std::string_view line, std::string key) {
        const std::size_t carriageReturn = line.find('\r');
        if (key.find('\r') != std::string::npos) {
            key.erase(key.find('\r'));
        }
        if (!isTuningField(key)) {
            fail(0, "unknown key " + inQuotes(printable(key)));
            return;
        }
        const DpsField& field = tuningField(key);
        const auto index = static_cast<std::size_t>(&field - DPS_LAYOUT.data());
        const bool isRepeated = isSeen_.at(index);
        isSeen_.at(index) = true;
        if (isRepeated) {
            fail(0, key + " is there already");
        } else if (index < last_) {
            fail(0, key + " must stand before " + DPS_LAYOUT.at(last_).key);
        } else {
            last_ = index;
            if (carriageReturn != std::string_view::npos) {
                fail(carriageReturn, "a line ends with a line feed alone, not a carriage return");
                return;
            }
            const LineFault fault = readTuningLine(line, field, block_);
            if (!fault.what.empty()) {
                fail(fault.column, fault.what);
            }
        }
    }

    void findMissing() {
        std::string missing;
        for (std::size_t index = 0; index < DPS_FIELD_COUNT; ++index) {
            if (!isSeen_.at(index)) {
                missing += (missing.empty() ? "" : ", ") + std::string(DPS_LAYOUT.at(index).key);
            }
        }
        if (!missing.empty()) {
            fail(0, "there is no line of " + missing);
        }
    }

    void failHeader(std::int32_t blockId) {
        fail(0, "the first line must be \"" + std::string(HEADER_BEGIN) + std::to_string(blockId) +
                    std::string(HEADER_END) + "\", or that of another block from 0 to 9");
    }

    void fail(std::size_t column, const std::string& what) {
        faults_ += (faults_.empty() ? "" : "\n") + name_ + ":" +
                   std::to_string(std::max<std::size_t>(1, lineNumber_)) + ":" +
                   std::to_string(column + 1) + ": " + what;
    }

    std::string name_;
    std::size_t lineNumber_ = 0;
    std::size_t last_ = 0; ///< index of the last field that stood in its place
    std::array<bool, DPS_FIELD_COUNT> isSeen_{};
    DpsBlock block_{};
    std::string faults_;
};

} // namespace

DpsBlock parseTuningText(const std::string& text, const std::string& name, std::int32_t blockId) {
    return TuningReader(name).read(text, blockId);
}

} // namespace orvane::kit
