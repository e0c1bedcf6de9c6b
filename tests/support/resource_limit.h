// SPDX-License-Identifier: Apache-2.0
//
// Limits of the kernel, for faults that come from outside the product and affect a superuser as
// well.
#pragma once

#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <unistd.h>

#include <csignal>

namespace orvane::test {

/// While it lives, the soft limit of `resource` (RLIMIT_NOFILE, RLIMIT_FSIZE, RLIMIT_AS) is `soft`.
/// A write past RLIMIT_FSIZE fails and raises no signal.
class ResourceLimit {
public:
    ResourceLimit(int resource, rlim_t soft)
        : resource_(resource), formerHandler_(std::signal(SIGXFSZ, SIG_IGN)) {
        if (getrlimit(resource_, &former_) != 0) {
            throw kit::systemError("getrlimit");
        }
        rlimit limit = former_;
        limit.rlim_cur = soft;
        if (setrlimit(resource_, &limit) != 0) {
            throw kit::systemError("setrlimit");
        }
    }
    ~ResourceLimit() {
        setrlimit(resource_, &former_);
        static_cast<void>(std::signal(SIGXFSZ, formerHandler_));
    }
    ResourceLimit(const ResourceLimit&) = delete;
    ResourceLimit& operator=(const ResourceLimit&) = delete;

private:
    int resource_;
    void (*formerHandler_)(int);
    rlimit former_{};
};

/// The RLIMIT_NOFILE that leaves room for `count` (1 to 16) more descriptors at a time.
inline rlim_t roomForDescriptors(int count) {
    int opened[16];
    int last = -1;
    for (int i = 0; i < count; ++i) {
        opened[i] = open("/", O_RDONLY | O_CLOEXEC);
        last = opened[i];
    }
    for (int i = 0; i < count; ++i) {
        close(opened[i]);
    }
    if (last == -1) {
        throw kit::systemError("open /");
    }
    return static_cast<rlim_t>(last) + 1;
}

} // namespace orvane::test
