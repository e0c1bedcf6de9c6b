// SPDX-License-Identifier: Apache-2.0
#include "identity/model_names.h"

#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <string>

namespace orvane::test {
namespace {

std::string nameOfCode(std::size_t code) {
    return ModelNameTable.at(code - 1);
}

bool isSecondBrand(std::size_t code) {
    static const std::set<std::size_t> codes = {25, 26, 27, 28, 29, 30, 46};
    return codes.count(code) == 1;
}

TEST(ModelNamesTest, CodesOneTo47HaveAnEntry) {
    EXPECT_EQ(MODEL_CODE_COUNT, 47U);
    EXPECT_EQ(ModelNameTable.size(), 47U);
    for (const char* name : ModelNameTable) {
        EXPECT_NE(name, nullptr);
    }
}

TEST(ModelNamesTest, NamesAreSevenToTwentyCharacters) {
    for (std::size_t code = 1; code <= 47; ++code) {
        SCOPED_TRACE(code);
        EXPECT_GE(nameOfCode(code).size(), 7U);
        EXPECT_LE(nameOfCode(code).size(), 20U);
    }
}

TEST(ModelNamesTest, NamesArePlainAscii) {
    for (std::size_t code = 1; code <= 47; ++code) {
        SCOPED_TRACE(nameOfCode(code));
        for (const char c : nameOfCode(code)) {
            EXPECT_TRUE((c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || c == ' ') << c;
        }
    }
}

TEST(ModelNamesTest, BrandWordOfEachNameFollowsTheCode) {
    for (std::size_t code = 1; code <= 47; ++code) {
        SCOPED_TRACE(nameOfCode(code));
        const std::string brand = isSecondBrand(code) ? "Quarion " : "Marl ";
        EXPECT_EQ(nameOfCode(code).substr(0, brand.size()), brand);
    }
}

TEST(ModelNamesTest, EachNameHasAModelAfterTheBrandWord) {
    for (std::size_t code = 1; code <= 47; ++code) {
        SCOPED_TRACE(nameOfCode(code));
        const std::string model = nameOfCode(code).substr(nameOfCode(code).find(' ') + 1);
        ASSERT_FALSE(model.empty());
        EXPECT_TRUE(model.front() >= 'A' && model.front() <= 'Z');
        EXPECT_NE(model.back(), ' ');
        EXPECT_EQ(model.find("  "), std::string::npos);
    }
}

// Rules: VEH-03
TEST(ModelNamesTest, Code32HasTheNameOfCodeOne) {
    EXPECT_EQ(nameOfCode(32), nameOfCode(1));
}

TEST(ModelNamesTest, AllOtherNamesDiffer) {
    std::set<std::string> names;
    for (std::size_t code = 1; code <= 47; ++code) {
        const bool isNew = names.insert(nameOfCode(code)).second;
        EXPECT_EQ(isNew, code != 32) << code << ' ' << nameOfCode(code);
    }
    EXPECT_EQ(names.size(), 46U);
}

// Rules: VEH-02
TEST(ModelNamesTest, NamesMatchTheirCodes) {
    EXPECT_EQ(nameOfCode(1), "Marl Tulvari");
    EXPECT_EQ(nameOfCode(26), "Quarion Velmira");
    EXPECT_EQ(nameOfCode(47), "Marl Quillon");
}

/// The product data as a separate list, which the model reads as well.
// Rules: VEH-02
TEST(ModelNamesTest, NamesMatchTheProductData) {
    std::ifstream list(ORVANE_MODEL_NAMES);
    std::size_t code = 0;
    for (std::string name; std::getline(list, name);) {
        ASSERT_LT(code, ModelNameTable.size());
        EXPECT_EQ(name, ModelNameTable.at(code)) << "model code " << code + 1;
        ++code;
    }
    EXPECT_EQ(code, 47U);
}

} // namespace
} // namespace orvane::test
