// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/check_text.h"

#include <gtest/gtest.h>

#include <sstream>

namespace orvane::test {

namespace {

std::string printed(const desk::CheckReport& report) {
    std::ostringstream out;
    desk::printCheck(out, report);
    return out.str();
}

TEST(CheckTextTest, EachCaseIsALineWithItsFaultsBelow) {
    desk::CheckReport report;
    report.cases = {{"one", {}, {}, {}},
                    {"second", {"/tmp/x differs", "/tmp/\xff is missing"}, {"/tmp/y"}, {}},
                    {"three", {}, {"/tmp/z"}, {}}};
    EXPECT_EQ(printed(report), "one     ok\n"
                               "second  differs\n"
                               "    /tmp/x differs\n    /tmp/\\xff is missing\n    /tmp/y\n"
                               "three   differs\n    /tmp/z\n"
                               "3 units, 2 not as expected\n"
                               "reasons reached: 33 of 33\n");
}

TEST(CheckTextTest, UnreachedReasonsAreNamed) {
    desk::CheckReport report;
    report.cases = {{"one", {}, {}, {}}};
    report.unreached = {"disk-missing", "serial-blank"};
    report.isUpdate = true;
    EXPECT_EQ(printed(report),
              "one  ok\n"
              "1 unit, 0 not as expected; expectations updated\n"
              "reasons reached: 31 of 33; not reached: disk-missing, serial-blank\n");
}

} // namespace

} // namespace orvane::test
