// SPDX-License-Identifier: Apache-2.0
//
// The kit's one kind of failure.
#pragma once

#include <filesystem>
#include <stdexcept>
#include <string>

namespace orvane::kit {

/// Thrown for wrong use, a bad root or a refusal of the system. It is one sentence, whatever bytes
/// its paths and values have.
class KitError : public std::runtime_error {
public:
    explicit KitError(const std::string& what);
    /// An error about `path`: its text is `before`, the path ("" in quotes if it is empty) and
    /// `after`.
    KitError(const std::string& before, const std::filesystem::path& path,
             const std::string& after);

    /// The whole text. what() ends at the first zero byte.
    const std::string& text() const { return text_; }

    /// Whether it is about a path at or below `place`.
    bool isAbout(const std::filesystem::path& place) const;

    /// The same error with `to` in place of `from`, if its path is at or below that.
    KitError moved(const std::filesystem::path& from, const std::filesystem::path& to) const;

private:
    std::string text_;
    std::string before_; ///< all of the text where the error is about no path
    std::filesystem::path path_;
    std::string after_;
};

/// The error for a system call that has just failed: `what`, a colon, and the text of errno.
KitError systemError(const std::string& what);

/// The same about `path`: `before`, the path, a colon, and the text of errno.
KitError systemError(const std::string& before, const std::filesystem::path& path);

/// The same for a failure that the standard library reports. Of two paths it names the second,
/// which is that of the new entry.
KitError systemError(const std::string& before, const std::filesystem::filesystem_error& failure);

} // namespace orvane::kit
