// SPDX-License-Identifier: Apache-2.0
#include "kit/host/scratch_folder.h"

#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <string>
#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

ScratchFolder::ScratchFolder() try : folder_(temporaryFolder(), "orvane-unit", 0700) {
} catch (const fs::filesystem_error& failure) {
    throw KitError("cannot make ", failure.path1(), ": " + failure.code().message());
}

} // namespace orvane::kit
