// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/kit_error.h"

#include <linux/capability.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <array>

namespace orvane::test {

/// While it lives, permission bits apply to this process even if it is a superuser, or the
/// superuser of its own user namespace.
class EnforcedPermissions {
public:
    EnforcedPermissions() {
        if (syscall(SYS_capget, &header_, former_.data()) != 0) {
            throw kit::systemError("capget");
        }
        Sets reduced = former_;
        reduced[0].effective &= ~((1U << CAP_DAC_OVERRIDE) | (1U << CAP_DAC_READ_SEARCH));
        if (syscall(SYS_capset, &header_, reduced.data()) != 0) {
            throw kit::systemError("capset");
        }
    }
    ~EnforcedPermissions() { syscall(SYS_capset, &header_, former_.data()); }
    EnforcedPermissions(const EnforcedPermissions&) = delete;
    EnforcedPermissions& operator=(const EnforcedPermissions&) = delete;

private:
    using Sets = std::array<__user_cap_data_struct, _LINUX_CAPABILITY_U32S_3>;

    __user_cap_header_struct header_{_LINUX_CAPABILITY_VERSION_3, 0};
    Sets former_{};
};

} // namespace orvane::test
