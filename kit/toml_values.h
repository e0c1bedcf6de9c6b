// SPDX-License-Identifier: Apache-2.0
//
// Typed values out of a TOML tree, each refusal with its place in the text. For description.cpp
// alone: compiling the parser takes a while.
#pragma once

#include "kit/kit_error.h"

#define TOML_HEADER_ONLY 1
#include <toml++/toml.h>

#include <cstdint>
#include <string>
#include <utility>

namespace orvane::kit {

using Place = toml::source_region;

/// Throws KitError with "name:line:column:" in front.
[[noreturn]] inline void failAt(const Place& place, const std::string& what) {
    throw KitError(*place.path + ":" + std::to_string(place.begin.line) + ":" +
                   std::to_string(place.begin.column) + ": " + what);
}

/// Does `action` and adds the place to what it throws.
template <class Action>
auto at(const Place& place, const Action& action) {
    try {
        return action();
    } catch (const KitError& error) {
        failAt(place, error.what());
    }
}

/// Throws for a key that `where` does not know; `known` lists those that it does.
[[noreturn]] inline void failUnknown(const toml::key& key, const char* where, const char* known) {
    failAt(key.source(),
           "unknown key \"" + std::string(key.str()) + "\" in " + where + ": it takes " + known);
}

/// The node as a table, a text, a whole number, and a number from 0 to `greatest`. Each throws with
/// the node's place when it is anything else; `what` names it there.
inline const toml::table& tableOf(const toml::key& key, const toml::node& node) {
    const toml::table* table = node.as_table();
    if (table == nullptr) {
        failAt(node.source(), "\"" + std::string(key.str()) + "\" must be a table");
    }
    return *table;
}

inline const std::string& textOf(const toml::node& node, const char* what) {
    const auto* text = node.as_string();
    if (text == nullptr) {
        failAt(node.source(), std::string(what) + " must be a text in quotes");
    }
    return text->get();
}

inline std::int64_t numberOf(const toml::node& node, const std::string& what) {
    const auto* number = node.as_integer();
    if (number == nullptr) {
        failAt(node.source(), what + " must be a whole number");
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

/// Enters a value under a number that may be written in two ways.
template <class Map, class Value>
void putOnce(Map& map, const toml::key& key, std::uint64_t number, Value value) {
    if (!map.emplace(static_cast<typename Map::key_type>(number), std::move(value)).second) {
        failAt(key.source(), "number " + std::to_string(number) + " is given twice");
    }
}

} // namespace orvane::kit
