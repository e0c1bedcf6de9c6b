// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/enter/captured_run.h"
#include "kit/enter/program_start.h"

#include <filesystem>

namespace orvane::kit {

/// Runs `program` to its end with "/" = `root`, standard input from /dev/null of the host, and
/// returns what it said. The unit need not hold the binary:
///  - a static binary of this machine is executed by descriptor;
///  - a dynamic one is started through its own loader, and a static 32-bit ARM one through
///    qemu-arm-static, both by paths relative to a working directory that stays on the host. "/" is
///    the unit all the same.
/// The environment is inherited. A dynamic program sees the host's /proc as well, for the time of
/// its run, since sanitizers need it: AddressSanitizer takes its options and the bounds of the
/// stack from there, LeakSanitizer its threads. Where the host allows no mounts they go without,
/// and LeakSanitizer then ends the program with an error of its own. Throws KitError when the root
/// can't be entered or the program can't be started.
RunResult runInside(const std::filesystem::path& root, const Program& program);

} // namespace orvane::kit
