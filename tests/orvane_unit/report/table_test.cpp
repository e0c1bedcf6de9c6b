// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/table.h"

#include <gtest/gtest.h>

#include <sstream>

namespace orvane::test {

namespace {

TEST(TableTest, TitlesAndValuesAreAlignedRight) {
    constexpr desk::Column COLUMNS[] = {{"a", 2}, {"name", 6}, {"n", 4}};
    std::ostringstream out;
    printTitles(out, COLUMNS);
    out << '\n';
    printCells(out, COLUMNS, 1, "x", std::string("long text"));
    EXPECT_EQ(out.str(), " a  name   n\n 1     xlong text");
}

TEST(TableTest, PaddedTextIsNeverCut) {
    EXPECT_EQ(desk::padded("ab", 4), "ab  ");
    EXPECT_EQ(desk::padded("ab", 2), "ab");
    EXPECT_EQ(desk::padded("abc", 2), "abc");
}

} // namespace

} // namespace orvane::test
