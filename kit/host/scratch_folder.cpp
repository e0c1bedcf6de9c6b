// SPDX-License-Identifier: Apache-2.0
#include "kit/host/scratch_folder.h"

#include "kit/host/host_file.h"

#include <string>

namespace orvane::kit {

ScratchFolder::ScratchFolder() : folder_(temporaryFolder(), "orvane-unit", 0700) {}

} // namespace orvane::kit
