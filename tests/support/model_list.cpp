// SPDX-License-Identifier: Apache-2.0
#include "tests/support/model_list.h"

#include <fstream>
#include <string>
#include <vector>

namespace orvane::test {

static std::vector<std::string> readModelList() {
    std::vector<std::string> names;
    std::ifstream list(ORVANE_MODEL_NAMES);
    for (std::string name; std::getline(list, name);) {
        names.push_back(name);
    }
    return names;
}

std::string listedModel(int code) {
    static const std::vector<std::string> names = readModelList();
    return names.at(static_cast<std::size_t>(code) - 1);
}

// The first call, outside of any unit. NOLINTNEXTLINE(cert-err58-cpp): a missing list ends the
// tests
static const std::string FIRST_LISTED_MODEL = listedModel(1);

} // namespace orvane::test
