// SPDX-License-Identifier: Apache-2.0
#include "kit/host/unfinished_folder.h"

#include "kit/host/folder_lock.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <system_error>
#include <utility>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

constexpr char MIDDLE[] = ".unfinished-";

/// Leaves room in a name of 255 bytes for what is added.
constexpr std::size_t STEM_KEPT = 200;

Descriptor openFolder(const fs::path& folder) {
    return Descriptor(
        ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC | O_NONBLOCK));
}

/// Whether `path` names the folder that `descriptor` has open.
bool isFolderAt(const fs::path& path, const Descriptor& descriptor) {
    struct stat opened {};
    struct stat named {};
    return ::fstat(descriptor.number(), &opened) == 0 && ::lstat(path.c_str(), &named) == 0 &&
           opened.st_dev == named.st_dev && opened.st_ino == named.st_ino;
}

bool isOwn(const Descriptor& descriptor) {
    struct stat state {};
    return ::fstat(descriptor.number(), &state) == 0 && state.st_uid == ::geteuid();
}

[[noreturn]] void fail(const fs::path& folder) {
    throw fs::filesystem_error("cannot make a folder", folder,
                               std::error_code(errno, std::generic_category()));
}

/// Locks a folder that has just been made. Until then another process may take it for a leftover:
/// nothing is opened if that has happened.
Descriptor lockNew(const fs::path& path) {
    Descriptor folder = openFolder(path);
    if (!folder.isOpen() && errno != ENOENT) {
        const int error = errno;
        ::rmdir(path.c_str());
        errno = error;
        fail(path);
    }
    const bool isKept =
        folder.isOpen() && tryLock(folder) != LockState::heldByAnother && isFolderAt(path, folder);
    return isKept ? std::move(folder) : Descriptor();
}

} // namespace

bool isUnfinishedName(const std::string& name) {
    const std::size_t middle = name.rfind(MIDDLE);
    if (name.compare(0, 1, ".") != 0 || middle == std::string::npos) {
        return false;
    }
    constexpr char DIGITS[] = "0123456789";
    const std::size_t process = middle + sizeof MIDDLE - 1;
    const std::size_t hyphen = name.find_first_not_of(DIGITS, process);
    return hyphen != std::string::npos && hyphen > process && name[hyphen] == '-' &&
           hyphen + 1 < name.size() &&
           name.find_first_not_of(DIGITS, hyphen + 1) == std::string::npos;
}

void removeLeftovers(const fs::path& above) {
    std::error_code error;
    for (fs::directory_iterator entry(above, error); !error && entry != fs::directory_iterator();
         entry.increment(error)) {
        if (!isUnfinishedName(entry->path().filename().string())) {
            continue;
        }
        const Descriptor folder = openFolder(entry->path());
        if (folder.isOpen() && isOwn(folder) && tryLock(folder) == LockState::taken &&
            isFolderAt(entry->path(), folder)) {
            std::error_code ignored;
            fs::remove_all(entry->path(), ignored);
        }
    }
}

UnfinishedFolder::UnfinishedFolder(const fs::path& above, const std::string& stem, mode_t mode) {
    removeLeftovers(above);
    const std::string begin =
        "." + stem.substr(0, STEM_KEPT) + MIDDLE + std::to_string(::getpid()) + "-";
    for (int number = 0; !lock_.isOpen(); ++number) {
        path_ = above / (begin + std::to_string(number));
        if (::mkdir(path_.c_str(), mode) == 0) {
            lock_ = lockNew(path_);
        } else if (errno != EEXIST) {
            fail(path_);
        }
    }
}

UnfinishedFolder::~UnfinishedFolder() {
    std::error_code ignored;
    fs::remove_all(path_, ignored);
}

} // namespace orvane::kit
