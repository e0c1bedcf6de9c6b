// SPDX-License-Identifier: Apache-2.0
//
// Version description files of any content. The input is the text of "a.inf"; after a file
// separator (0x1C) comes "b.inf.old", which counts as well, and after a second one "c.txt", which
// does not.
#include "fuzz/inf_reading.h"
#include "fuzz/support.h"
#include "identity/inf_file.h"
#include "identity/software_version.h"
#include "kit/host/descriptor.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace orvane::fuzz {

namespace {

constexpr char FILE_SEPARATOR = '\x1C';
constexpr std::array<const char*, 3> FILE_NAMES = {"a.inf", "b.inf.old", "c.txt"};

struct VersionFile {
    std::string name;
    kit::Descriptor file;
    std::string text;
};

struct Target {
    Unit unit;
    std::vector<VersionFile> files; ///< in the order of the folder's listing

    Target() {
        for (const char* name : FILE_NAMES) {
            unit.makeFile(std::string(VERSION_DIR) + name);
        }
        for (const auto& entry : std::filesystem::directory_iterator(unit.hostPath(VERSION_DIR))) {
            const std::string name = entry.path().filename();
            files.push_back({name, unit.makeFile(VERSION_DIR + name), ""});
        }
    }

    void setTexts(std::string_view input) {
        for (const char* name : FILE_NAMES) {
            const std::string_view text = take(input, input.find(FILE_SEPARATOR));
            take(input, 1);
            for (VersionFile& file : files) {
                if (file.name == name && file.text != text) {
                    file.text = text;
                    setContent(file.file, file.text);
                }
            }
        }
    }
};

Target& target() {
    static Target instance;
    return instance;
}

/// Every function on text alone, with a text as a file may hold it.
void checkText(const std::string& text) {
    requireEqual("trimSpaces", plainTrim(text), trimSpaces(text));
    requireEqual("formatVersionByte", plainFormatByte(text), formatVersionByte(text));
    requireEqual("formatVersion", plainFormat(text), formatVersion(text));
}

void checkRecord(const PlainRecord& expected, const Inf_Data& found) {
    std::string expectedText;
    for (const auto& [key, value] : expected) {
        expectedText.append(key).append("=").append(value).append("\n");
        requireEqual("infValue", value, infValue(found, key));
        requireEqual("infValue of a longer key", plainValue(expected, key + " "),
                     infValue(found, key + " "));
        checkText(value);
    }
    std::string foundText;
    for (const auto& [key, value] : found) {
        foundText.append(key).append("=").append(value).append("\n");
    }
    requireEqual("the entries, in their order", expectedText, foundText);
    requireSame("the number of entries", static_cast<std::int64_t>(expected.size()),
                static_cast<std::int64_t>(found.size()));
    for (const char* key : {"", "Type", "Version Number", "no such key"}) {
        requireEqual("infValue", plainValue(expected, key), infValue(found, key));
    }
}

void checkFiles() {
    std::vector<Inf_Data> records(target().files.size());
    std::string version;
    std::string formatted;
    const std::string said = target().unit.run([&] {
        for (std::size_t index = 0; index < records.size(); ++index) {
            readInfFile(VERSION_DIR + target().files[index].name, records[index]);
        }
        version = findApplicationVersion();
        formatted = softwareVersion();
    });
    requireEqual("said", "", said);

    std::vector<PlainRecord> listed;
    for (std::size_t index = 0; index < records.size(); ++index) {
        const VersionFile& file = target().files[index];
        const PlainRecord expected = plainRead(file.text);
        checkRecord(expected, records[index]);
        if (file.name.find(".inf") != std::string::npos) {
            listed.push_back(expected);
        }
    }
    requireEqual("findApplicationVersion", plainSelect(listed), version);
    requireEqual("softwareVersion", plainFormat(plainSelect(listed)), formatted);
}

/// A scan remembers nothing of the files' earlier content.
void checkEmptied() {
    target().setTexts("");
    std::string version;
    const std::string said = target().unit.run([&] { version = findApplicationVersion(); });
    requireEqual("said", "", said);
    requireEqual("findApplicationVersion in empty files", "", version);
}

} // namespace

} // namespace orvane::fuzz

extern "C" int LLVMFuzzerInitialize(int* /*argc*/, char*** /*argv*/) {
    orvane::fuzz::target();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view input = orvane::fuzz::inputText(data, size);
    orvane::fuzz::checkText(std::string(input));
    orvane::fuzz::target().setTexts(input);
    orvane::fuzz::checkFiles();
    orvane::fuzz::checkEmptied();
    return 0;
}
