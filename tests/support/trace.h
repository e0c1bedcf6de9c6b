// SPDX-License-Identifier: Apache-2.0
//
// What the real binary asks of the system, seen from outside.
#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace orvane::test {

/// The file operations of one run, in order, one text each:
///
///   read PATH, list PATH, create PATH, open PATH FLAGS  an open for reading, of a folder, with
///                                                       create and truncate, or with other flags;
///                                                       " failed" is added if it failed
///   seek PATH OFFSET WHENCE, get PATH LENGTH            of the image and of the disk
///   map PATH LENGTH, unmap PATH                         of the image
///   put PATH LENGTH                                     one write to any file
///   close PATH
///
/// Only files with absolute paths count, not what a loader or an emulator does for itself.
struct Trace {
    std::vector<std::string> operations;
    std::vector<std::string> leftOpen; ///< paths that were never closed
};

/// Runs the product in the unit at `root` under strace.
Trace traceRun(const std::filesystem::path& root, const std::vector<std::string>& arguments);

} // namespace orvane::test
