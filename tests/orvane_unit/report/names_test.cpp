// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/report/names.h"

#include <gtest/gtest.h>

#include <stdexcept>

namespace orvane::test {

namespace {

using desk::CaseUpdate;
using desk::CrcVerdict;
using desk::Outcome;
using desk::PathKind;

TEST(NamesTest, EveryValueHasItsPublishedName) {
    EXPECT_STREQ(nameOf(Outcome::generated), "generated");
    EXPECT_STREQ(nameOf(Outcome::stock), "stock");
    EXPECT_STREQ(nameOf(Outcome::empty), "empty");
    EXPECT_STREQ(nameOf(Outcome::kept), "kept");
    EXPECT_STREQ(nameOf(Outcome::notAsked), "not-asked");
    EXPECT_STREQ(nameOf(CrcVerdict::computed), "computed");
    EXPECT_STREQ(nameOf(CrcVerdict::blank), "blank");
    EXPECT_STREQ(nameOf(CrcVerdict::ambiguous), "ambiguous");
    EXPECT_STREQ(nameOf(CrcVerdict::unreadable), "unreadable");
    EXPECT_STREQ(nameOf(CaseUpdate::done), "updated");
    EXPECT_STREQ(nameOf(CaseUpdate::needless), "unchanged");
    EXPECT_STREQ(nameOf(CaseUpdate::refused), "not-updated");
    EXPECT_STREQ(nameOf(PathKind::nothing), "nothing");
    EXPECT_STREQ(nameOf(PathKind::file), "file");
    EXPECT_STREQ(nameOf(PathKind::folder), "folder");
    EXPECT_STREQ(nameOf(PathKind::other), "other");
}

TEST(NamesTest, PathsHaveWordsForPeople) {
    EXPECT_STREQ(wordOf(PathKind::nothing), "missing");
    EXPECT_STREQ(wordOf(PathKind::file), "file");
    EXPECT_STREQ(wordOf(PathKind::folder), "folder");
    EXPECT_STREQ(wordOf(PathKind::other), "device");
}

TEST(NamesTest, ValueWithoutANameIsAProgramError) {
    EXPECT_THROW(nameOf(static_cast<Outcome>(99)), std::logic_error);
}

} // namespace

} // namespace orvane::test
