// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/entered_root.h"

#include "kit/enter/change_root.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <memory>

namespace orvane::kit {

namespace {

/// Must not fail: the process would go on in the unit as if it were the host.
void leaveRoot(const Descriptor& outerRoot, const Descriptor& outerCwd) {
    const bool isRootBack =
        !outerRoot.isOpen() || (::fchdir(outerRoot.number()) == 0 && ::chroot(".") == 0);
    if (!isRootBack || ::fchdir(outerCwd.number()) != 0) {
        std::perror("cannot leave the unit");
        std::abort();
    }
}

} // namespace

EnteredRoot::EnteredRoot(const std::filesystem::path& root)
    : outerRoot_(::open("/", O_PATH | O_DIRECTORY | O_CLOEXEC)),
      outerCwd_(::open(".", O_PATH | O_DIRECTORY | O_CLOEXEC)) {
    if (!outerRoot_.isOpen() || !outerCwd_.isOpen()) {
        throw systemError("cannot keep the present root and working directory");
    }
    if (isRootDirectory(root)) {
        outerRoot_.close();
    } else {
        changeRoot(root);
    }
    if (::chdir("/") != 0) {
        const int error = errno;
        leaveRoot(outerRoot_, outerCwd_);
        errno = error;
        throw systemError("cannot enter ", root);
    }
}

EnteredRoot::~EnteredRoot() {
    leaveRoot(outerRoot_, outerCwd_);
}

} // namespace orvane::kit
