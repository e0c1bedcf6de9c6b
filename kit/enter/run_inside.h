// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/enter/captured_run.h"
#include "kit/enter/program_start.h"

#include <filesystem>

namespace orvane::kit {

/// Runs `program` to its end with "/" = `root`, which is also its working directory, and standard
/// input from /dev/null of the host, and returns what it printed. The program has no other
/// descriptor and no way to the host: there is only a /proc if the unit has one. The unit need not
/// contain the binary:
///  - a static binary of this machine is executed by descriptor;
///  - a dynamic one is started through its own loader, and a static 32-bit ARM one through
///    qemu-arm-static; what these open are copies in a folder of the unit, which is there only
///    while the program runs.
/// The environment is inherited, for a dynamic program without the variables that its loader heeds.
/// Throws KitError when the root can't be entered or the program can't be started.
///
/// In the build that watches the project's own tests with sanitizers (ORVANE_KIT_SHOWS_PROC), a
/// program that is so watched does see the host's /proc while it runs: the sanitizers read the
/// bounds of the stack and the threads there.
RunResult runInside(const std::filesystem::path& root, const Program& program);

} // namespace orvane::kit
