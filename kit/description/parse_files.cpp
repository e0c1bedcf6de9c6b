// SPDX-License-Identifier: Apache-2.0
#include "kit/description/description_reading.h"
#include "kit/description/description_values.h"
#include "kit/description/toml_library.h"
#include "kit/description/toml_values.h"
#include "kit/description/unit_checks.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"
#include "kit/host/bytes.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/text.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <limits>
#include <map>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

namespace orvane::kit {

namespace {

/// Most bytes of a repeated text or of a host's file: a slip of the finger shall not fill the disk.
constexpr std::uint64_t CONTENT_LIMIT = std::uint64_t{1} << 30;

constexpr char CONTENT_FORMS[] = "hex, or repeat and count, or path, or size and bytes";

/// A path of the unit, as a text or after "hex:".
std::string unitPathOf(const Place& place, std::string_view text) {
    return at(place, [text] {
        std::string path = textOrHexBytes(text);
        checkUnitPath(path);
        return path;
    });
}

Bytes repeatedContent(const toml::node& repeat, const toml::node& count, const std::string& what) {
    const toml::table* hex = repeat.as_table();
    if (hex != nullptr && (hex->size() != 1 || hex->get("hex") == nullptr)) {
        failAt(hex->source(), "repeat in " + what + " must be a text or { hex = \"...\" }");
    }
    const Bytes part = hex != nullptr ? hexOf(*hex->get("hex"), "repeat in " + what)
                                      : textOf(repeat, "repeat in " + what);
    const std::uint64_t times = numberUpTo(
        count, CONTENT_LIMIT / std::max<std::uint64_t>(1, part.size()), "count in " + what);
    Bytes content;
    content.reserve(part.size() * static_cast<std::size_t>(times));
    for (std::uint64_t i = 0; i < times && !part.empty(); ++i) {
        content += part;
    }
    return content;
}

Bytes hostContent(const toml::node& node, const std::string& what,
                  const std::filesystem::path& folder) {
    const std::filesystem::path file = folder / textOf(node, "path in " + what);
    return at(node.source(), what, [&file] { return readRegularFile(file, CONTENT_LIMIT); });
}

SparseFile sparseContent(const toml::table& table, const std::string& path,
                         DescriptionReading& reading) {
    SparseFile file;
    file.size = numberUpTo(*table.get("size"), std::numeric_limits<std::int64_t>::max(),
                           "size in the content of " + path);
    if (const toml::node* bytes = table.get("bytes")) {
        if (!bytes->is_table()) {
            failAt(bytes->source(), "bytes in the content of " + path +
                                        " must be a table of hex by offset, not " + shown(*bytes));
        }
        readBytes(*bytes->as_table(), file.bytes, reading,
                  [&path](std::uint64_t offset) { return fileBytesKey(path, offset); });
    }
    return file;
}

/// The ways to give a file's content besides a text.
void readContentTable(const toml::key& key, const toml::table& table, const std::string& path,
                      DescriptionReading& reading) {
    const std::string what = "the content of " + path;
    for (const auto& [part, value] : table) {
        if (part != "hex" && part != "repeat" && part != "count" && part != "path" &&
            part != "size" && part != "bytes") {
            failUnknown(part, what, CONTENT_FORMS);
        }
    }
    const toml::node* hex = table.get("hex");
    const toml::node* repeat = table.get("repeat");
    const toml::node* count = table.get("count");
    const toml::node* host = table.get("path");
    UnitDescription& unit = reading.unit;
    if (hex != nullptr && table.size() == 1) {
        putOnce(unit.files, key, path, hexOf(*hex, "hex in " + what), path);
    } else if (repeat != nullptr && count != nullptr && table.size() == 2) {
        putOnce(unit.files, key, path, repeatedContent(*repeat, *count, what), path);
    } else if (host != nullptr && table.size() == 1) {
        putOnce(unit.files, key, path, hostContent(*host, what, reading.folder), path);
    } else if (table.get("size") != nullptr &&
               table.size() == (table.get("bytes") != nullptr ? 2 : 1)) {
        putOnce(unit.sparseFiles, key, path, sparseContent(table, path, reading), path);
    } else {
        failAt(table.source(), what + " must be given in one way: " + CONTENT_FORMS);
    }
}

} // namespace

void readFiles(const toml::table& table, DescriptionReading& reading) {
    for (const auto& [key, value] : table) {
        const std::string path = unitPathOf(key.source(), key.str());
        if (const toml::table* content = value.as_table()) {
            readContentTable(key, *content, path, reading);
        } else if (value.is_string()) {
            putOnce(reading.unit.files, key, path, value.as_string()->get(), path);
        } else {
            failAt(value.source(), "the content of " + path + " must be a text, or a table of " +
                                       CONTENT_FORMS + ", not " + shown(value));
        }
        reading.places[fileKey(path)] = key.source();
    }
}

void readLinks(const toml::table& table, DescriptionReading& reading) {
    for (const auto& [key, value] : table) {
        const std::string path = unitPathOf(key.source(), key.str());
        const std::string what = "the target of " + path;
        const std::string& text = textOf(value, what);
        const std::string target = at(value.source(), what, [&text] {
            std::string bytes = textOrHexBytes(text);
            checkLinkTarget(bytes);
            return bytes;
        });
        putOnce(reading.unit.links, key, path, target, path);
        reading.places[linkKey(path)] = key.source();
    }
}

std::vector<std::string> readPaths(const toml::key& key, const toml::node& node,
                                   ValueKey (*keyOf)(std::string), DescriptionReading& reading) {
    const toml::array* array = node.as_array();
    if (array == nullptr) {
        failAt(node.source(), inQuotes(key.str()) + " must be a list of paths, not " + shown(node));
    }
    std::vector<std::string> paths;
    for (const toml::node& element : *array) {
        const std::string& text = textOf(element, "a path in " + inQuotes(key.str()));
        paths.push_back(unitPathOf(element.source(), text));
        reading.places[keyOf(paths.back())] = element.source();
    }
    return paths;
}

} // namespace orvane::kit
