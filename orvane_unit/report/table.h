// SPDX-License-Identifier: Apache-2.0
//
// Columns of text. Widths count bytes.
#pragma once

#include <cstddef>
#include <iomanip>
#include <ostream>
#include <string>

namespace orvane::desk {

/// A column of a table: titles and values end at its right edge.
struct Column {
    const char* title;
    int width; ///< with the blanks between it and the column before
};

template <std::size_t COUNT>
void printTitles(std::ostream& out, const Column (&columns)[COUNT]) {
    for (const Column& column : columns) {
        out << std::setw(column.width) << column.title;
    }
}

/// Prints a row: a value for each column.
template <std::size_t COUNT, class... Values>
void printCells(std::ostream& out, const Column (&columns)[COUNT], const Values&... values) {
    static_assert(sizeof...(values) == COUNT, "a value for each column");
    std::size_t column = 0;
    ((out << std::setw(columns[column++].width) << values), ...);
}

/// `text`, padded with blanks to at least `width` bytes.
std::string padded(const std::string& text, std::size_t width);

} // namespace orvane::desk
