// SPDX-License-Identifier: Apache-2.0
#include "kit/host/finished_folder.h"

#include "kit/host/kit_error.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <string>
#include <system_error>
#include <utility>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

/// Leaves room in a name of 255 bytes for what is added.
constexpr std::size_t NAME_KEPT = 200;

/// The place of `folder` in an existing folder, without links, ending with a name.
fs::path finalPlace(const fs::path& folder, bool isThere) {
    if (isThere) {
        return fs::canonical(folder);
    }
    const fs::path plain = folder.has_filename() ? folder : folder.parent_path();
    const fs::path above = plain.parent_path();
    return fs::canonical(above.empty() ? "." : above) / plain.filename();
}

/// Makes an empty folder next to `place`.
fs::path makeBeside(const fs::path& place) {
    const std::string stem = "." + place.filename().string().substr(0, NAME_KEPT) + ".unfinished-" +
                             std::to_string(::getpid()) + "-";
    for (int number = 0;; ++number) {
        fs::path beside = place.parent_path() / (stem + std::to_string(number));
        if (fs::create_directory(beside)) {
            return beside;
        }
    }
}

/// Removes the unfinished folder, unless it has been renamed.
class Cleaner {
public:
    explicit Cleaner(fs::path beside) : beside_(std::move(beside)) {}
    ~Cleaner() {
        std::error_code ignored;
        fs::remove_all(beside_, ignored);
    }
    Cleaner(const Cleaner&) = delete;
    Cleaner& operator=(const Cleaner&) = delete;

private:
    fs::path beside_;
};

/// If making a link failed, the second of the two paths is the link.
KitError errorOf(const fs::filesystem_error& failure) {
    const fs::path& path = failure.path2().empty() ? failure.path1() : failure.path2();
    return {"cannot make ", path, ": " + failure.code().message()};
}

/// For a failure without a path inside the folder: the system's own text.
[[noreturn]] void failAtFolder(const fs::path& folder, const std::error_code& error) {
    throw KitError("cannot make ", folder, ": " + error.message());
}

} // namespace

void makeFinishedFolder(const fs::path& folder, const std::function<void(const fs::path&)>& fill) {
    std::error_code error;
    const fs::file_status status = fs::status(folder, error);
    const bool isThere = fs::exists(status);
    if (isThere && (!fs::is_directory(status) || !fs::is_empty(folder, error) || error)) {
        throw KitError("", folder, " is there already and is not an empty folder");
    }
    if (folder.empty()) {
        failAtFolder(folder, std::make_error_code(std::errc::no_such_file_or_directory));
    }
    if (!isThere && fs::is_symlink(fs::symlink_status(folder, error))) {
        failAtFolder(folder, std::make_error_code(std::errc::file_exists));
    }
    fs::path place;
    fs::path beside;
    try {
        place = finalPlace(folder, isThere);
        beside = makeBeside(place);
    } catch (const fs::filesystem_error& failure) {
        failAtFolder(folder, failure.code());
    }
    const Cleaner cleaner(beside);
    try {
        fill(beside);
    } catch (const fs::filesystem_error& failure) {
        throw errorOf(failure).moved(beside, folder);
    } catch (const KitError& failure) {
        throw failure.moved(beside, folder);
    }
    if (isThere) {
        fs::permissions(beside, status.permissions(), error);
    }
    if (std::rename(beside.c_str(), place.c_str()) != 0) {
        failAtFolder(folder, std::error_code(errno, std::generic_category()));
    }
}

} // namespace orvane::kit
