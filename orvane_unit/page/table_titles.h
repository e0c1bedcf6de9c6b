// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "orvane_unit/page/markup.h"

#include <initializer_list>
#include <string>

namespace orvane::desk {

/// Adds the first row of a table: the titles of its columns.
inline void addTitles(Markup& page, std::initializer_list<std::string> titles) {
    const Element head(page, "thead");
    const Element row(page, "tr");
    for (const std::string& title : titles) {
        page.add("th", title);
    }
}

} // namespace orvane::desk
