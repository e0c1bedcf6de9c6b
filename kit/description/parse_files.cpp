// SPDX-License-Identifier: Apache-2.0
#include "kit/description/description_reading.h"
#include "kit/description/description_values.h"
#include "kit/description/toml_library.h"
#include "kit/description/toml_values.h"
#include "kit/description/unit_checks.h"
#include "kit/description/unit_description.h"
#include "kit/description/value_key.h"
#include "kit/host/bytes.h"
#include "kit/host/kit_error.h"
#include "kit/host/text.h"
#include "kit/host/whole_file.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <iterator>
#include <limits>
#include <map>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

namespace orvane::kit {

namespace {

/// A path of the unit, as text or in hex after "hex:".
std::string unitPathOf(const Place& place, std::string_view text) {
    return at(place, [text] {
        std::string path = textOrHexBytes(text);
        checkUnitPath(path);
        return path;
    });
}

/// The content of one file, while its table is read.
struct ContentReading {
    const toml::table& table;
    const std::string& path; ///< on the unit
    std::string what;        ///< "the content of" that path
    DescriptionReading& reading;

    /// The value of `key`, which must be there.
    const toml::node& valueOf(const char* key) const { return *table.get(key); }
    std::string nameOf(const char* key) const { return key + (" in " + what); }
};

using Content = std::variant<Bytes, SparseFile>;

Content hexContent(const ContentReading& content) {
    return hexOf(content.valueOf("hex"), content.nameOf("hex"));
}

Content repeatedContent(const ContentReading& content) {
    const toml::node& repeat = content.valueOf("repeat");
    const std::string name = content.nameOf("repeat");
    const toml::table* hex = repeat.as_table();
    if (hex != nullptr && (hex->size() != 1 || hex->get("hex") == nullptr)) {
        failAt(hex->source(), name + " must be a text or { hex = \"...\" }");
    }
    const Bytes part = hex != nullptr ? hexOf(*hex->get("hex"), name) : textOf(repeat, name);
    std::uint64_t& left = content.reading.contentLeft;
    const std::uint64_t size = std::max<std::uint64_t>(1, part.size());
    const std::uint64_t times =
        numberUpTo(content.valueOf("count"), left / size, content.nameOf("count"));
    left -= times * part.size();
    Bytes bytes;
    bytes.reserve(part.size() * static_cast<std::size_t>(times));
    for (std::uint64_t i = 0; i < times && !part.empty(); ++i) {
        bytes += part;
    }
    return bytes;
}

Content hostContent(const ContentReading& content) {
    const toml::node& path = content.valueOf("path");
    const std::string& name = textOf(path, content.nameOf("path"));
    if (name.empty() || name.find('\0') != std::string::npos) {
        failAt(path.source(),
               content.nameOf("path") + " must have at least one byte, and none that is zero");
    }
    const std::filesystem::path file = content.reading.folder / name;
    std::uint64_t& left = content.reading.contentLeft;
    Bytes bytes =
        at(path.source(), content.what, [&file, left] { return readRegularFile(file, left); });
    left -= bytes.size();
    return bytes;
}

Content sparseContent(const ContentReading& content) {
    SparseFile file;
    file.size = numberUpTo(content.valueOf("size"), std::numeric_limits<std::int64_t>::max(),
                           content.nameOf("size"));
    if (const toml::node* bytes = content.table.get("bytes")) {
        if (!bytes->is_table()) {
            failAt(bytes->source(), content.nameOf("bytes") +
                                        " must be a table of hex by offset, not " + shown(*bytes));
        }
        readBytes(
            *bytes->as_table(), file.bytes,
            [&content](std::uint64_t offset) { return fileBytesKey(content.path, offset); },
            content.reading);
    }
    return file;
}

/// A form of a file's content other than text: the keys of its table, and its reader.
struct ContentForm {
    std::string_view key;
    std::string_view otherKey; ///< empty if there is only one key
    Content (*read)(const ContentReading& content);
};

constexpr ContentForm CONTENT_FORMS[] = {
    {"hex", "", hexContent},     {"repeat", "count", repeatedContent}, {"path", "", hostContent},
    {"size", "", sparseContent}, {"size", "bytes", sparseContent},
};
constexpr char CONTENT_FORMS_TEXT[] = "hex, or repeat and count, or path, or size and bytes";

bool hasKey(const ContentForm& form, std::string_view key) {
    return !key.empty() && (form.key == key || form.otherKey == key);
}

/// Whether `table` has the keys of `form`, and no others.
bool isOfForm(const toml::table& table, const ContentForm& form) {
    const std::size_t count = form.otherKey.empty() ? 1 : 2;
    return table.size() == count &&
           std::all_of(table.begin(), table.end(),
                       [&form](const auto& entry) { return hasKey(form, entry.first.str()); });
}

Content readContentTable(const ContentReading& content) {
    for (const auto& [key, value] : content.table) {
        const bool isKnown =
            std::any_of(std::begin(CONTENT_FORMS), std::end(CONTENT_FORMS),
                        [&k = key](const ContentForm& form) { return hasKey(form, k.str()); });
        if (!isKnown) {
            failUnknown(key, content.what, CONTENT_FORMS_TEXT);
        }
    }
    const ContentForm* const form =
        std::find_if(std::begin(CONTENT_FORMS), std::end(CONTENT_FORMS),
                     [&content](const ContentForm& row) { return isOfForm(content.table, row); });
    if (form == std::end(CONTENT_FORMS)) {
        failAt(content.table.source(),
               content.what + " must be given in one way: " + CONTENT_FORMS_TEXT);
    }
    return form->read(content);
}

/// A content that is given as one text or table. `what` names it in an error.
Content readOneContent(const toml::node& value, const std::string& path, const std::string& what,
                       DescriptionReading& reading) {
    if (const toml::table* table = value.as_table()) {
        return readContentTable({*table, path, what, reading});
    }
    if (value.is_string()) {
        return value.as_string()->get();
    }
    failAt(value.source(),
           what + " must be a text, or a table of " + CONTENT_FORMS_TEXT + ", not " + shown(value));
}

/// A content that is given in parts, one after the other.
Content readParts(const toml::array& parts, const std::string& path, const std::string& what,
                  DescriptionReading& reading) {
    Bytes whole;
    for (const toml::node& part : parts) {
        const Content content = readOneContent(part, path, "a part of " + what, reading);
        const Bytes* const bytes = std::get_if<Bytes>(&content);
        if (bytes == nullptr) {
            failAt(part.source(), what + " is given in parts: none may be of size and bytes");
        }
        whole += *bytes;
    }
    return whole;
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

} // namespace

void readFiles(const toml::key& tableKey, const toml::node& node, DescriptionReading& reading) {
    UnitDescription& unit = reading.unit;
    for (const auto& [key, value] : tableOf(tableKey, node)) {
        const std::string path = unitPathOf(key.source(), key.str());
        const std::string what = "the content of " + path;
        const toml::array* const parts = value.as_array();
        Content content = parts != nullptr ? readParts(*parts, path, what, reading)
                                           : readOneContent(value, path, what, reading);
        if (auto* const sparse = std::get_if<SparseFile>(&content)) {
            putOnce(unit.sparseFiles, key, path, std::move(*sparse), path);
        } else {
            putOnce(unit.files, key, path, std::get<Bytes>(std::move(content)), path);
        }
        reading.places[fileKey(path)] = key.source();
    }
}

void readLinks(const toml::key& tableKey, const toml::node& node, DescriptionReading& reading) {
    for (const auto& [key, value] : tableOf(tableKey, node)) {
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

void readFolders(const toml::key& key, const toml::node& node, DescriptionReading& reading) {
    reading.unit.folders = readPaths(key, node, folderKey, reading);
}

void readAbsent(const toml::key& key, const toml::node& node, DescriptionReading& reading) {
    reading.unit.absent = readPaths(key, node, absentKey, reading);
}

} // namespace orvane::kit
