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

/// A unit's root folder, made in TMPDIR if that is set, else in memory, and removed at the end of
/// the process. A finding leaves it behind.
class Unit {
public:
    /// Enters and leaves the unit once: where that takes a user namespace, it must happen before
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

    /// Calls `action` with "/" = the unit and returns what came on standard output and standard
    /// error meanwhile. Fails when `action` leaves a descriptor open. When a sanitizer or an abort
    /// ends the process inside, the host's root is back before libFuzzer saves the input that did
    /// it.
    std::string run(const std::function<void()>& action) const;

private:
    std::filesystem::path root_;
    kit::Descriptor said_; ///< collects the two outputs
};

/// Makes `bytes` the whole content of `file`. Throws kit::KitError.
void setContent(const kit::Descriptor& file, std::string_view bytes);

/// The whole content of the file of the host at `path`; aborts when there is none.
std::string contentOf(const std::filesystem::path& path);

/// The input of one run, as text.
std::string_view inputText(const std::uint8_t* data, std::size_t size);

/// Takes the first `count` bytes from the front of `input`, fewer when there are fewer, and returns
/// them.
std::string_view take(std::string_view& input, std::size_t count);

/// Prints all three, unprintable bytes escaped, and aborts: a finding.
[[noreturn]] void fail(const std::string& what, std::string_view expected, std::string_view found);

/// Fails unless both are equal.
void requireEqual(const char* what, std::string_view expected, std::string_view found);

/// The same for numbers. A name of its own, so that no number is taken for a text.
void requireSame(const char* what, std::int64_t expected, std::int64_t found);

} // namespace orvane::fuzz
