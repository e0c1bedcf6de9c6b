// SPDX-License-Identifier: Apache-2.0
#include "kit/host/scratch_folder.h"

#include "kit/host/kit_error.h"

#include <cstdlib>
#include <string>
#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

ScratchFolder::ScratchFolder() {
    std::string name = fs::temp_directory_path() / "orvane-unit-XXXXXX";
    if (::mkdtemp(name.data()) == nullptr) {
        throw systemError("cannot make " + name);
    }
    path_ = name;
}

ScratchFolder::~ScratchFolder() {
    std::error_code ignored;
    fs::remove_all(path_, ignored);
}

} // namespace orvane::kit
