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

using desk::CaseUpdate;

TEST(CheckTextTest, EachCaseIsALineWithItsFaultsBelow) {
    desk::CheckReport report;
    report.cases = {{"one", {}, {}, {}, "", CaseUpdate::none},
                    {"second",
                     {"/tmp/x differs", "/tmp/\xff is missing"},
                     {"/tmp/y"},
                     {},
                     "",
                     CaseUpdate::none},
                    {"\u009bx", {}, {"/tmp/z"}, {}, "", CaseUpdate::none},
                    {"four", {}, {}, {}, "no such file", CaseUpdate::none}};
    EXPECT_EQ(printed(report), "one        ok\n"
                               "second     differs\n"
                               "    /tmp/x differs\n    /tmp/\\xff is missing\n    /tmp/y\n"
                               "\\xc2\\x9bx  differs\n    /tmp/z\n"
                               "four       not checked\n"
                               "4 units, 3 not as expected\n"
                               "reasons reached: 33 of 33\n");
}

TEST(CheckTextTest, UpdateSaysWhatHasBecomeOfEachCase) {
    desk::CheckReport report;
    report.isUpdate = true;
    report.cases = {{"one", {}, {}, {}, "", CaseUpdate::done},
                    {"two", {}, {}, {}, "", CaseUpdate::needless},
                    {"three", {"exit status 1"}, {"/tmp/z"}, {}, "", CaseUpdate::refused},
                    {"four", {}, {}, {}, "no such file", CaseUpdate::refused}};
    EXPECT_EQ(printed(report), "one    updated\n"
                               "two    unchanged\n"
                               "three  not updated\n    exit status 1\n    /tmp/z\n"
                               "four   not updated\n"
                               "4 units, 1 updated, 1 unchanged, 2 not updated\n"
                               "reasons reached: 33 of 33\n");
}

TEST(CheckTextTest, UnreachedReasonsAreNamed) {
    desk::CheckReport report;
    report.cases = {{"one", {}, {}, {}, "", CaseUpdate::none}};
    report.unreached = {"disk-missing", "serial-blank"};
    EXPECT_EQ(printed(report),
              "one  ok\n"
              "1 unit, 0 not as expected\n"
              "reasons reached: 31 of 33; not reached: disk-missing, serial-blank\n");
}

} // namespace

} // namespace orvane::test
