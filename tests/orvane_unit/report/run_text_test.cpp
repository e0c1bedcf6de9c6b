// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/run_text.h"

#include <gtest/gtest.h>

#include <sstream>

namespace orvane::test {

namespace {

std::string printed(bool isBrief) {
    desk::TmpTree before;
    before.entries = {{"gone", "1\n"}, {"old", "1\n"}, {"same", "x"}};
    desk::TmpTree after;
    after.entries = {{"folder/", std::nullopt}, {"new\x01", "a"}, {"old", "2\n"}, {"same", "x"}};
    std::ostringstream out;
    desk::printTmpChanges(out, before, after, isBrief);
    return out.str();
}

TEST(RunTextTest, NewAndChangedFilesHaveADiff) {
    EXPECT_EQ(printed(false), "--- /dev/null\n+++ /tmp/new\\x01\n@@ -0,0 +1,1 @@\n+a\n"
                              "\\ No newline at end of file\n"
                              "--- /tmp/old\n+++ /tmp/old\n@@ -1,1 +1,1 @@\n-1\n+2\n");
}

TEST(RunTextTest, BriefReportOnlyNamesThem) {
    EXPECT_EQ(printed(true), "made /tmp/new\\x01, 1 byte\nchanged /tmp/old, 2 bytes\n");
}

} // namespace

} // namespace orvane::test
