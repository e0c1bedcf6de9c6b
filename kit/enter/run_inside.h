// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/enter/captured_run.h"
#include "kit/enter/program_start.h"

#include <filesystem>

namespace orvane::kit {

/// Runs `program` to its end with "/" = `root`, standard input from /dev/null of the host, and
/// returns what it printed. The unit need not contain the binary:
///  - a static binary of this machine is executed by descriptor;
///  - a dynamic one is started through its own loader, and a static 32-bit ARM one through
///    qemu-arm-static, both by paths relative to a working directory that stays on the host. "/" is
///    the unit all the same. The environment is inherited. A dynamic program also sees the host's
///    /proc while it runs, since sanitizers need it: AddressSanitizer reads its options and the
///    bounds of the stack there, LeakSanitizer its threads. If the host allows no mounts, it is
///    missing, and LeakSanitizer ends the program with an error of its own. Throws KitError when
///    the root can't be entered or the program can't be started.
RunResult runInside(const std::filesystem::path& root, const Program& program);

} // namespace orvane::kit
