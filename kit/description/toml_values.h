// SPDX-License-Identifier: Apache-2.0
//
// Typed values from a TOML tree. Each refusal has its place in the text, what was there, and what
// would be right. Only for the readers of descriptions: the parser takes long to compile.
#pragma once

#include "kit/description/description_values.h"
#include "kit/description/toml_library.h"
#include "kit/host/kit_error.h"
#include "kit/host/text.h"

#include <cstdint>
#include <sstream>
#include <string>
#include <utility>

namespace orvane::kit {

using Place = toml::source_region;

/// Throws KitError with "name:line:column:" in front.
[[noreturn]] inline void failAt(const Place& place, const std::string& what) {
    throw KitError((place.path ? *place.path : "") + ":" + std::to_string(place.begin.line) + ":" +
                   std::to_string(place.begin.column) + ": " + what);
}

/// Calls `action` and adds the place to its errors.
template <class Action>
auto at(const Place& place, const Action& action) {
    try {
        return action();
    } catch (const KitError& error) {
        failAt(place, error.text());
    }
}

/// Calls `action` and adds the place and `what` to its errors.
template <class Action>
auto at(const Place& place, const std::string& what, const Action& action) {
    try {
        return action();
    } catch (const KitError& error) {
        failAt(place, what + ": " + error.text());
    }
}

/// The node for an error: a single value as in TOML, cut short if it is long.
inline std::string shown(const toml::node& node) {
    constexpr std::size_t LONGEST = 40;
    if (node.is_table()) {
        return "a table";
    }
    if (node.is_array()) {
        return "a list";
    }
    std::string text;
    if (node.is_string()) {
        text = inQuotes(node.as_string()->get());
    } else {
        std::ostringstream out;
        node.visit([&out](const auto& value) {
            if constexpr (toml::is_value<decltype(value)>) {
                out << value;
            }
        });
        text = out.str();
    }
    return text.size() <= LONGEST ? text : text.substr(0, LONGEST) + "...";
}

/// Throws for a key that `where` does not know; `known` lists those that it knows.
[[noreturn]] inline void failUnknown(const toml::key& key, const std::string& where,
                                     const std::string& known) {
    failAt(key.source(),
           "unknown key " + inQuotes(key.str()) + " in " + where + ": it takes " + known);
}

/// The node as a table, a text, a whole number, and a number from 0 to `greatest`. Each throws with
/// the node's place if the node is anything else; `what` names it in the error.
inline const toml::table& tableOf(const toml::key& key, const toml::node& node) {
    const toml::table* table = node.as_table();
    if (table == nullptr) {
        failAt(node.source(), inQuotes(key.str()) + " must be a table, not " + shown(node));
    }
    return *table;
}

inline const std::string& textOf(const toml::node& node, const std::string& what) {
    const auto* text = node.as_string();
    if (text == nullptr) {
        failAt(node.source(), what + " must be a text in quotes, not " + shown(node));
    }
    return text->get();
}

inline std::int64_t numberOf(const toml::node& node, const std::string& what) {
    const auto* number = node.as_integer();
    if (number == nullptr) {
        failAt(node.source(), what + " must be a whole number, not " + shown(node));
    }
    return number->get();
}

inline std::uint64_t numberUpTo(const toml::node& node, std::uint64_t greatest,
                                const std::string& what) {
    const std::int64_t number = numberOf(node, what);
    if (number < 0 || static_cast<std::uint64_t>(number) > greatest) {
        failAt(node.source(), what + " must be from 0 to " + std::to_string(greatest) + ": " +
                                  std::to_string(number) + " does not fit");
    }
    return static_cast<std::uint64_t>(number);
}

/// The bytes of a text in hex.
inline Bytes hexOf(const toml::node& node, const std::string& what) {
    const std::string& text = textOf(node, what);
    return at(node.source(), what, [&text] { return hexBytes(text); });
}

/// The number in a key, as keyNumber reads it.
inline std::uint64_t numberOf(const toml::key& key, KeyRange range, const std::string& what) {
    return at(key.source(), [&] { return keyNumber(key.str(), range, what); });
}

/// Adds a value. Throws if its key is there already, which may be written in two ways; `what` names
/// it.
template <class Map, class Key, class Value>
void putOnce(Map& map, const toml::key& key, const Key& mapKey, Value value,
             const std::string& what) {
    if (!map.emplace(static_cast<typename Map::key_type>(mapKey), std::move(value)).second) {
        failAt(key.source(), what + " is given twice");
    }
}

} // namespace orvane::kit
