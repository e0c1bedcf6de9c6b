// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/change_root.h"

#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sched.h>
#include <sys/mount.h>
#include <unistd.h>

#include <cerrno>
#include <string>
#include <system_error>
#include <utility>

namespace orvane::kit {

namespace {

constexpr char REMEDY[] =
    " (run as root with CAP_SYS_CHROOT; or under an emulator with `unshare -r`; or allow user "
    "namespaces: `sysctl user.max_user_namespaces=1000 kernel.unprivileged_userns_clone=1`, with "
    "AppArmor also `kernel.apparmor_restrict_unprivileged_userns=0`)";

/// A mapping file of /proc accepts only one write.
bool writeProcFile(const char* path, const std::string& text) {
    const Descriptor file(::open(path, O_WRONLY | O_CLOEXEC));
    return file.isOpen() &&
           ::write(file.number(), text.data(), text.size()) == static_cast<ssize_t>(text.size());
}

/// The kernel lets an unprivileged process map its own user and group only, and the group only
/// after it has given up setgroups. Tries once in the life of a process.
bool enterUserNamespace() {
    static bool wasTried = false;
    if (std::exchange(wasTried, true)) {
        return false;
    }
    const std::string user = std::to_string(::geteuid());
    const std::string group = std::to_string(::getegid());
    return ::unshare(CLONE_NEWUSER) == 0 && writeProcFile("/proc/self/setgroups", "deny") &&
           writeProcFile("/proc/self/uid_map", "0 " + user + " 1") &&
           writeProcFile("/proc/self/gid_map", "0 " + group + " 1");
}

/// Calls `action`, a system call that returns 0 or -1, and if this process lacks the privilege,
/// again inside a user namespace. errno is EPERM if neither is possible.
template <class Action>
bool succeeds(const Action& action) {
    if (action() == 0) {
        return true;
    }
    if (errno != EPERM) {
        return false;
    }
    if (enterUserNamespace()) {
        return action() == 0;
    }
    errno = EPERM;
    return false;
}

/// Lets what this process mounts be seen by no other but its children. False when the system does
/// not allow it.
bool keepMountsPrivate() {
    if (!succeeds([] { return ::unshare(CLONE_NEWNS); })) {
        return false;
    }
    // A "/" that is itself a changed root is not a mount, and the mount below it can't be made
    // private.
    return ::mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) == 0 || errno == EINVAL;
}

} // namespace

void changeRoot(const std::filesystem::path& root) {
    requireFolder(root);
    if (!succeeds([&root] { return ::chroot(root.c_str()); })) {
        const int error = errno;
        throw KitError("cannot make ", root,
                       " the root directory: " + std::generic_category().message(error) +
                           (error == EPERM ? REMEDY : ""));
    }
}

bool mountMemory(const std::filesystem::path& folder) {
    return keepMountsPrivate() &&
           ::mount("orvane-unit", folder.c_str(), "tmpfs", 0, "mode=0755") == 0;
}

bool showProc(const std::filesystem::path& root) {
    const std::filesystem::path target = root / "proc";
    return keepMountsPrivate() &&
           ::mount("/proc", target.c_str(), nullptr, MS_BIND | MS_REC, nullptr) == 0;
}

} // namespace orvane::kit
