// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/unit_description.h"
#include "kit/host/kit_error.h"
#include "kit/unit/describe_unit.h"
#include "kit/unit/edit.h"
#include "kit/unit/make_unit.h"
#include "tests/kit/unit/unit_tree.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

/// A unit with something everywhere.
class EditTest : public ::testing::Test {
protected:
    EditTest() { make(wholeUnit()); }

    std::filesystem::path root() const { return folder_.path() / "unit"; }
    std::filesystem::path hostFile() const { return folder_.path() / "tuning.txt"; }

    static kit::UnitDescription wholeUnit() {
        kit::UnitDescription unit;
        unit.image.params = {{22, 1}, {134, 0xABCD}, {135, 7}};
        unit.disk.slots = {{8, "eight"}, {9, "SN004217"}, {10, "A"}};
        unit.disk.aux = "auxiliary text";
        unit.disk.tuning[3].raw = std::string(188, '\xFF');
        unit.disk.tuning[4].raw = std::string(188, '\x11');
        unit.disk.bytes = {{5, "before"}};
        return unit;
    }

    /// Replaces the present unit.
    void make(const kit::UnitDescription& unit) const {
        std::filesystem::remove_all(root());
        kit::makeUnit(unit, root());
    }

    void set(const std::vector<std::string>& assignments) const {
        kit::setValues(root(), assignments);
    }

    kit::UnitDescription found() const { return kit::describeUnit(root()); }

    /// The refusal of these assignments; requires that the whole unit is unchanged.
    std::string refusalOf(const std::vector<std::string>& assignments) const {
        const auto before = treeOf(root());
        std::string refusal;
        try {
            set(assignments);
        } catch (const kit::KitError& error) {
            refusal = error.what();
        }
        EXPECT_EQ(differenceOf(before, treeOf(root())), "");
        return refusal;
    }

private:
    TemporaryFolder folder_;
};

} // namespace orvane::test
