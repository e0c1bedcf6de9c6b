// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/description/parse_description.h"
#include "kit/host/kit_error.h"

#include <gtest/gtest.h>

#include <string>

namespace orvane::test {

/// A text that is not a description, and the whole message about it.
struct DescriptionRefusal {
    const char* text;
    const char* message;
};

inline void expectRefused(const DescriptionRefusal& refusal) {
    SCOPED_TRACE(refusal.text);
    try {
        kit::parseDescription(refusal.text, "unit.toml");
        ADD_FAILURE() << "accepted";
    } catch (const kit::KitError& error) {
        EXPECT_STREQ(error.what(), refusal.message);
    }
}

} // namespace orvane::test
