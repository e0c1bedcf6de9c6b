// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/page/markup.h"

#include <string>

namespace orvane::desk {

/// A table that is open while this exists. Where it is too wide, it scrolls in a box of its own,
/// and the page does not.
class WideTable {
public:
    WideTable(Markup& page, const std::string& className)
        : box_(page, "div", {{"class", "scroll"}}), table_(page, "table", {{"class", className}}) {}

private:
    Element box_;
    Element table_;
};

} // namespace orvane::desk
