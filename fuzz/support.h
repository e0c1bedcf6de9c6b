// SPDX-License-Identifier: Apache-2.0
//
// What every fuzz target needs: a unit to run the product in, and a way to say what is wrong.
#pragma once

#include "kit/host/descriptor.h"

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>
#include <string_view>

namespace orvane::fuzz {

/// A unit's root folder, made in TMPDIR if that is set, else in memory. Removed at the end of the
/// process, but kept after a finding.
class Unit {
public:
    /// Enters and leaves the unit once: if that needs a user namespace, it must happen before
    /// libFuzzer starts a thread. Throws kit::KitError when it can't be entered.
    Unit();
    ~Unit();
    Unit(const Unit&) = delete;
    Unit& operator=(const Unit&) = delete;

    /// The host's path of the unit's absolute path `path`.
    std::filesystem::path hostPath(const std::string& path) const;

    /// Makes the file `path` of the unit, the folders above it included, and returns it open for
    /// reading and writing. Throws kit::KitError.
    kit::Descriptor makeFile(const std::string& path, std::string_view content = {}) const;

    /// Calls `action` with the unit as "/" and returns what it wrote to standard output and
    /// standard error. Fails when `action` leaves a descriptor open. When a sanitizer or an abort
    /// ends the process inside, the host's root is back before libFuzzer saves the input.
    std::string run(const std::function<void()>& action) const;

private:
    std::filesystem::path root_;
    kit::Descriptor output_; ///< collects the two outputs
};

/// Makes `bytes` the whole content of `file`. Throws kit::KitError.
void setContent(const kit::Descriptor& file, std::string_view bytes);

/// The whole content of the host's file at `path`; aborts when there is none.
std::string contentOf(const std::filesystem::path& path);

/// The input of one run, as text.
std::string_view inputText(const std::uint8_t* data, std::size_t size);

/// Removes the first `count` bytes of `input`, or all if there are fewer, and returns them.
std::string_view take(std::string_view& input, std::size_t count);

/// Prints all three, unprintable bytes escaped, and aborts: a finding.
[[noreturn]] void fail(const std::string& what, std::string_view expected, std::string_view found);

/// Fails unless both are equal.
void requireEqual(const char* what, std::string_view expected, std::string_view found);

/// The same for numbers, under another name so that no number is taken for a text.
void requireSame(const char* what, std::int64_t expected, std::int64_t found);

} // namespace orvane::fuzz
