// SPDX-License-Identifier: Apache-2.0
#include "kit/host/changed_file.h"

#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>

#include <cerrno>
#include <string>
#include <utility>

namespace orvane::kit {

ChangedFile::ChangedFile(std::filesystem::path path)
    : path_(std::move(path)), descriptor_(::open(path_.c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC)) {
    if (!descriptor_.isOpen()) {
        throw systemError("cannot change ", path_);
    }
    struct stat state {};
    if (::fstat(descriptor_.number(), &state) != 0 || !S_ISREG(state.st_mode)) {
        throw KitError("", path_, " is not a regular file");
    }
}

std::uint64_t ChangedFile::size() const {
    return sizeOf(descriptor_, path_);
}

Bytes ChangedFile::read(std::uint64_t offset, std::uint64_t length) const {
    return readAt(descriptor_, path_, offset, length);
}

void ChangedFile::reserve(std::uint64_t offset, std::uint64_t length) const {
    rlimit limit{};
    const bool isLimited = ::getrlimit(RLIMIT_FSIZE, &limit) == 0 &&
                           limit.rlim_cur != RLIM_INFINITY && offset + length > limit.rlim_cur;
    errno = isLimited ? EFBIG
                      : ::posix_fallocate(descriptor_.number(), static_cast<off_t>(offset),
                                          static_cast<off_t>(length));
    if (errno != 0) {
        throw systemError("cannot write ", path_);
    }
}

void ChangedFile::write(std::uint64_t offset, const Bytes& bytes) const {
    writeAt(descriptor_, path_, offset, bytes);
}

} // namespace orvane::kit
