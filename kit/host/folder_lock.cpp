// SPDX-License-Identifier: Apache-2.0
#include "kit/host/folder_lock.h"

#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>

#include <cerrno>
#include <chrono>
#include <fstream>
#include <iomanip>
#include <sstream>
#include <string>
#include <thread>

namespace orvane::kit {

namespace {

constexpr int MOST_TRIES = 100;
constexpr std::chrono::milliseconds BETWEEN_TRIES(20);

/// How /proc/locks names the file that `descriptor` has open: the device in hex, the inode in
/// decimal, as in "fe:00:456".
std::string nameInLocks(const Descriptor& descriptor) {
    struct stat state {};
    ::fstat(descriptor.number(), &state);
    std::ostringstream name;
    name << std::hex << std::setfill('0') << std::setw(2) << major(state.st_dev) << ':'
         << std::setw(2) << minor(state.st_dev) << ':' << std::dec << state.st_ino;
    return name.str();
}

/// "process 123", or what can be said where /proc does not tell. Its lines look like
/// "1: FLOCK  ADVISORY  WRITE 123 fe:00:456 0 EOF".
std::string holderOf(const Descriptor& descriptor) {
    const std::string sought = nameInLocks(descriptor);
    std::ifstream locks("/proc/locks");
    std::string number;
    std::string kind;
    std::string isAdvisory;
    std::string access;
    std::string process;
    std::string file;
    for (std::string range; locks >> number >> kind >> isAdvisory >> access >> process >> file &&
                            std::getline(locks, range);) {
        if (kind == "FLOCK" && file == sought) {
            return "process " + process;
        }
    }
    return "another process";
}

} // namespace

LockState tryLock(const Descriptor& descriptor) {
    if (::flock(descriptor.number(), LOCK_EX | LOCK_NB) == 0) {
        return LockState::taken;
    }
    return errno == EWOULDBLOCK ? LockState::heldByAnother : LockState::impossible;
}

FolderLock::FolderLock(const std::filesystem::path& folder)
    : descriptor_(::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC)) {
    if (!descriptor_.isOpen()) {
        throw systemError("cannot lock ", folder);
    }
    for (int tries = 1; tryLock(descriptor_) == LockState::heldByAnother; ++tries) {
        if (tries == MOST_TRIES) {
            throw KitError("", folder, " is being changed by " + holderOf(descriptor_));
        }
        std::this_thread::sleep_for(BETWEEN_TRIES);
    }
}

} // namespace orvane::kit
