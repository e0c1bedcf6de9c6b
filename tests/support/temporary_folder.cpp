// SPDX-License-Identifier: Apache-2.0
#include "tests/support/temporary_folder.h"

#include "kit/host/kit_error.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <iostream>
#include <string>

namespace orvane::test {

namespace fs = std::filesystem;

TemporaryFolder::TemporaryFolder() {
    std::string name = (fs::temp_directory_path() / "orvane test-XXXXXX").string();
    if (mkdtemp(name.data()) == nullptr) {
        throw kit::systemError("no temporary folder " + name);
    }
    path_ = fs::canonical(name); // as the system reports the working directory
}

TemporaryFolder::~TemporaryFolder() {
    if (::testing::Test::HasFailure()) {
        std::cout << "kept: " << path_.string() << '\n';
        return;
    }
    std::error_code ignored;
    fs::remove_all(path_, ignored);
}

} // namespace orvane::test
