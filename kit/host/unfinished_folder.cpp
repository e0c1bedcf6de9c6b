// SPDX-License-Identifier: Apache-2.0
#include "kit/host/unfinished_folder.h"

#include "kit/host/folder_lock.h"
#include "kit/host/kit_error.h"

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

/// Where the folder can't be made says more than its name, which nobody has chosen.
[[noreturn]] void failIn(const fs::path& above) {
    throw systemError("cannot make a folder in ", above);
}

/// Locks a folder that has just been made. Until then another process may take it for a leftover:
/// nothing is opened if that has happened.
Descriptor lockNew(const fs::path& path) {
    Descriptor folder = openFolder(path);
    if (!folder.isOpen() && errno != ENOENT) {
        const int error = errno;
        ::rmdir(path.c_str());
        errno = error;
        failIn(path.parent_path());
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
            failIn(above);
        }
    }
}

UnfinishedFolder::~UnfinishedFolder() {
    std::error_code ignored;
    fs::remove_all(path_, ignored);
}

void UnfinishedFolder::fill(const fs::path& future,
                            const std::function<void(const fs::path&)>& fillIt) const {
    try {
        fillIt(path_);
    } catch (const fs::filesystem_error& failure) {
        throw systemError("cannot make ", failure).moved(path_, future);
    } catch (const KitError& failure) {
        throw failure.moved(path_, future);
    }
}

} // namespace orvane::kit
