// SPDX-License-Identifier: Apache-2.0
//
// A simulated unit is a folder that stands for the unit's "/". The product opens absolute paths
// only, so the one honest way to lend it a unit is to change the root directory of the process.
// chroot(2) does that: directly when the process may, else inside a user namespace of its own.
#pragma once

#include "kit/host/descriptor.h"

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::kit {

/// While it lives, "/" of this process is `root`, and so is the working directory. The destructor
/// restores both. Works in a single-threaded process only (a user namespace needs that); nests not.
/// Throws KitError when `root` is not a folder or the system allows neither way, the remedy in its
/// text; the root is then unchanged. A user namespace, once entered, stays for the process's life.
/// Where `root` is "/" already, only the working directory changes, which takes no privilege.
class EnteredRoot {
public:
    explicit EnteredRoot(const std::filesystem::path& root);
    ~EnteredRoot();
    EnteredRoot(const EnteredRoot&) = delete;
    EnteredRoot& operator=(const EnteredRoot&) = delete;

private:
    Descriptor outerRoot_; ///< the former "/"; closed when it is the present one, too
    Descriptor outerCwd_;  ///< the former working directory
};

/// How a program ended inside a unit.
struct RunResult {
    int exitStatus = -1; ///< exit status, or 128 + signal number
    std::string standardOutput;
    std::string standardError;
};

/// How to start a program whose root directory will be the unit.
struct Program {
    std::filesystem::path path;         ///< the binary, on the host
    std::vector<std::string> arguments; ///< without argv[0], which is the binary's file name
};

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
