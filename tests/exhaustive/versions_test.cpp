// SPDX-License-Identifier: Apache-2.0
//
// Every component of a version from LEAST to -LEAST: all remainders, of numbers of one digit to
// five.
#include "identity/software_version.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

namespace orvane::test {
namespace {

constexpr int LEAST = -70000;

struct Component {
    std::string text;
    std::string digits;
};

std::string twoDigits(int value) {
    constexpr char HEX[] = "0123456789abcdef";
    const auto byte = static_cast<unsigned>(value);
    return {HEX[byte / 16], HEX[byte % 16]};
}

/// Counts away from zero in steps of one, and starts again at each 256th: no division.
std::vector<Component> componentsFromZero(int step, int last) {
    std::vector<Component> components;
    int remainder = 0;
    for (int number = 0; number != last + step; number += step) {
        components.push_back({std::to_string(number), remainder < 0
                                                          ? "ffffff" + twoDigits(remainder + 256)
                                                          : twoDigits(remainder)});
        remainder = remainder + step == step * 256 ? 0 : remainder + step;
    }
    return components;
}

/// From LEAST to -LEAST.
std::vector<Component> everyComponent() {
    std::vector<Component> components = componentsFromZero(-1, LEAST);
    std::reverse(components.begin(), components.end());
    const std::vector<Component> above = componentsFromZero(1, -LEAST);
    components.insert(components.end(), above.begin() + 1, above.end());
    return components;
}

TEST(EveryVersionComponentTest, BecomesItsDigits) {
    for (const Component& component : everyComponent()) {
        ASSERT_EQ(formatVersionByte(component.text), component.digits) << component.text;
    }
}

/// Each number in each place, beside two others.
TEST(EveryVersionComponentTest, BecomesItsDigitsInEachPlace) {
    const std::vector<Component> components = everyComponent();
    ASSERT_EQ(components.size(), 140001U);
    for (std::size_t place = 0; place < components.size(); ++place) {
        const Component& first = components[place];
        const Component& second = components[components.size() - 1 - place];
        const Component& third = components[(place + 12345) % components.size()];
        const std::string text = first.text + "." + second.text + "." + third.text;
        ASSERT_EQ(formatVersion(text), first.digits + second.digits + third.digits) << text;
    }
}

} // namespace
} // namespace orvane::test
