// SPDX-License-Identifier: Apache-2.0
//
// Calls the library's functions on the unit that it runs in: one call for each line of standard
// input, one line of standard output for what came of it. Whatever an output has before the call is
// given with it, so that it shows what the function left as it was.
#include "config/config_store.h"
#include "config/crc32.h"
#include "config/param_access.h"
#include "config/param_catalogue.h"
#include "config/record_area.h"
#include "config/record_slots.h"
#include "identity/vehicle_identity.h"
#include "tuning/tuning_file.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <exception>
#include <fstream>
#include <iostream>
#include <iterator>
#include <sstream>
#include <string>
#include <vector>

namespace {

using namespace orvane;

/// The bytes of an output before a call, and how many there are after those that it may write.
constexpr char BEFORE = '#';
constexpr std::size_t BEHIND = 4;

std::string toHex(const std::string& bytes) {
    constexpr char DIGITS[] = "0123456789abcdef";
    std::string hex;
    for (const char byte : bytes) {
        const auto value = static_cast<unsigned char>(byte);
        hex += {DIGITS[value / 16], DIGITS[value % 16]};
    }
    return hex;
}

std::string fromHex(const std::string& hex) {
    std::string bytes;
    for (std::size_t at = 0; at + 1 < hex.size(); at += 2) {
        bytes += static_cast<char>(std::stoi(hex.substr(at, 2), nullptr, 16));
    }
    return bytes;
}

std::uint32_t lengthOf(const std::string& bytes) {
    return static_cast<std::uint32_t>(bytes.size());
}

/// The words of one line.
class Words {
public:
    explicit Words(const std::string& line) : text_(line) {}

    std::string word() {
        std::string next;
        text_ >> next;
        return next;
    }
    std::uint32_t number() { return static_cast<std::uint32_t>(std::stoul(word())); }
    std::uint16_t parameter() { return static_cast<std::uint16_t>(number()); }

private:
    std::istringstream text_;
};

void tellCatalogue() {
    for (std::size_t at = 0; at < sizeof ParamCatalogue; at += sizeof(std::uint32_t)) {
        std::uint32_t word = 0;
        std::memcpy(&word, reinterpret_cast<const char*>(&ParamCatalogue) + at, sizeof word);
        std::cout << word << ' ';
    }
}

void lookUp(std::uint16_t number) {
    std::int32_t index = BEFORE;
    ParamDescriptor row = {BEFORE, BEFORE, BEFORE, BEFORE, BEFORE, BEFORE, BEFORE};
    const std::uint32_t status = lookupParam(number, index, row);
    std::cout << status << ' ' << index << ' ' << row.number << ' ' << row.type << ' ' << row.group
              << ' ' << row.offset << ' ' << row.id << ' ' << row.defaultValue << ' ' << row.mask;
}

void describe(std::uint16_t number) {
    ParamInfo info = {BEFORE, BEFORE, BEFORE, BEFORE};
    const std::uint32_t status = describeParam(number, info);
    std::cout << status << ' ' << info.number << ' ' << info.type << ' ' << info.size << ' '
              << info.group;
}

void tellState(const ConfigStore& store) {
    std::cout << (store.descriptor != -1) << ' ' << (store.data != nullptr) << ' ' << store.length;
}

/// Output for a getter.
class Value {
public:
    template <typename Type>
    Type* as() {
        return reinterpret_cast<Type*>(bytes_.data());
    }
    void tell(ParamStatus status) const {
        std::cout << status << ' ' << toHex({bytes_.begin(), bytes_.end()});
    }

private:
    alignas(std::uint16_t) std::array<char, 2 + BEHIND> bytes_ = {BEFORE, BEFORE, BEFORE,
                                                                  BEFORE, BEFORE, BEFORE};
};

void readAll(ConfigStore& store, std::uint32_t count) {
    std::vector<std::uint16_t> values(PARAM_COUNT + 1 + BEHIND, BEFORE);
    std::cout << readAllParams(store, values.data(), count);
    for (const std::uint16_t value : values) {
        std::cout << ' ' << value;
    }
}

void tellLayout(std::uint32_t slot) {
    std::uint32_t size = BEFORE;
    std::uint64_t offset = BEFORE;
    recordSlotLayout(slot, size, offset);
    std::cout << size << ' ' << offset;
}

template <typename Read>
void readInto(std::uint32_t length, Read read) {
    std::string buffer(length + BEHIND, BEFORE);
    const std::int32_t status = read(buffer.data(), length);
    std::cout << status << ' ' << toHex(buffer);
}

void callWithoutBuffer(std::uint32_t slot, std::uint32_t length) {
    std::cout << readRecordSlot(slot, nullptr, length) << ' '
              << writeRecordSlot(slot, nullptr, length) << ' ' << readTuningArea(nullptr, length)
              << ' ' << writeTuningArea(nullptr, length) << ' ' << readAuxArea(nullptr, length)
              << ' ' << writeAuxArea(nullptr, length);
}

/// Tells what the file is then, which may come from an earlier call.
void writeTuningFile(std::int32_t blockId) {
    constexpr char PATH[] = "/tmp/tuning.txt";
    generateTuningFile(blockId, PATH);
    std::ifstream file(PATH, std::ios::binary);
    std::cout << "file " << toHex({std::istreambuf_iterator<char>(file), {}});
}

/// Whether there is such a call of the catalogue or of an image.
bool callOnImage(const std::string& name, Words& words, ConfigStore& store) {
    if (name == "type-size") {
        std::cout << paramTypeSize(words.number());
    } else if (name == "catalogue") {
        tellCatalogue();
    } else if (name == "lookup") {
        lookUp(words.parameter());
    } else if (name == "group") {
        std::cout << paramGroup(words.parameter());
    } else if (name == "describe") {
        describe(words.parameter());
    } else if (name == "init") {
        store.init();
        tellState(store);
    } else if (name == "open") {
        std::cout << store.open() << ' ';
        tellState(store);
    } else if (name == "close") {
        store.close();
        tellState(store);
    } else if (name == "get-u8") {
        Value value;
        value.tell(getParamU8(store, words.parameter(), value.as<std::uint8_t>()));
    } else if (name == "get-u16") {
        Value value;
        value.tell(getParamU16(store, words.parameter(), value.as<std::uint16_t>()));
    } else if (name == "get") {
        Value value;
        value.tell(getParam(store, words.parameter(), value.as<char>()));
    } else if (name == "get-all") {
        readAll(store, words.number());
    } else if (name == "fuel-type") {
        std::string fuelType;
        getFuelType(fuelType);
        std::cout << fuelType;
    } else {
        return false;
    }
    return true;
}

/// Whether there is such a call of the record area.
bool callOnDisk(const std::string& name, Words& words) {
    if (name == "slot-place") {
        tellLayout(words.number());
    } else if (name == "read-slot") {
        const std::uint32_t slot = words.number();
        readInto(words.number(), [slot](void* buffer, std::uint32_t length) {
            return readRecordSlot(slot, buffer, length);
        });
    } else if (name == "write-slot") {
        const std::uint32_t slot = words.number();
        const std::string bytes = fromHex(words.word());
        std::cout << writeRecordSlot(slot, bytes.data(), lengthOf(bytes));
    } else if (name == "read-tuning") {
        readInto(words.number(), readTuningArea);
    } else if (name == "read-aux") {
        readInto(words.number(), readAuxArea);
    } else if (name == "write-tuning") {
        const std::string bytes = fromHex(words.word());
        std::cout << writeTuningArea(bytes.data(), lengthOf(bytes));
    } else if (name == "write-aux") {
        const std::string bytes = fromHex(words.word());
        std::cout << writeAuxArea(bytes.data(), lengthOf(bytes));
    } else if (name == "tuning-file") {
        writeTuningFile(std::stoi(words.word()));
    } else if (name == "without-buffer") {
        const std::uint32_t slot = words.number();
        callWithoutBuffer(slot, words.number());
    } else if (name == "crc") {
        std::cout << recordAreaCrc();
    } else if (name == "crc-step") {
        const std::uint32_t crc = words.number();
        std::cout << crc32Step(crc, static_cast<std::uint8_t>(words.number()));
    } else {
        return false;
    }
    return true;
}

void callAll() {
    ConfigStore store;
    for (std::string line; std::getline(std::cin, line);) {
        Words words(line);
        const std::string name = words.word();
        if (!callOnImage(name, words, store) && !callOnDisk(name, words)) {
            std::cout << "unknown";
        }
        std::cout << '\n';
    }
}

} // namespace

int main() {
    try {
        callAll();
    } catch (const std::exception& failure) {
        std::cerr << "orvane-library-calls: " << failure.what() << '\n';
        return 1;
    }
    return 0;
}
