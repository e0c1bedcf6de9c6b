// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/parse_description.h"
#include "kit/description/unit_description.h"
#include "kit/unit/make_unit.h"
#include "tests/support/temporary_folder.h"

#include <filesystem>
#include <string>

namespace orvane::test {

/// Files that most units need, so that nothing falls back.
constexpr char WHOLE_UNIT[] = R"(
[image.params]
22 = 1
36 = 2
134 = 3
139 = 26
[disk.slots]
9 = "SN004217"
[files]
"/fs/rwdata/.Version/app.inf" = "Type=Application\nVersion Number=ABC_3.10.2_rc\n"
"/fs/mp/etc/airplay_static.conf" = "airplay template\n"
"/fs/mp/etc/airplay.conf" = "airplay stock\n"
"/fs/mp/etc/iap2_device_static.cfg" = "device template\n"
"/fs/mp/etc/iap2_device.cfg" = "device stock\n"
"/fs/mp/etc/mm/iap2_static.cfg" = "iap2 template\n"
"/fs/mp/etc/mm/iap2.cfg" = "iap2 stock\n"
"/fs/mp/etc/mm/iap1_static.cfg" = "iap1 template\n"
"/fs/mp/etc/mm/iap1.cfg" = "iap1 stock\n"
)";

/// A unit in its own temporary folder, made from the description of WHOLE_UNIT after `change`.
class DescribedUnit {
public:
    template <class Change>
    explicit DescribedUnit(const Change& change) {
        kit::UnitDescription unit = kit::parseDescription(WHOLE_UNIT, "whole unit");
        change(unit);
        kit::makeUnit(unit, root());
    }
    DescribedUnit() : DescribedUnit([](kit::UnitDescription&) {}) {}

    std::filesystem::path root() const { return folder_.path() / "unit"; }
    const std::filesystem::path& folder() const { return folder_.path(); }

private:
    TemporaryFolder folder_;
};

} // namespace orvane::test
