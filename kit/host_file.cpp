// SPDX-License-Identifier: Apache-2.0
#include "kit/host_file.h"

#include "kit/kit_error.h"

#include <fcntl.h>
#include <unistd.h>

namespace orvane::kit {

Descriptor makeSparseFile(const std::filesystem::path& file, std::uint64_t size) {
    Descriptor descriptor(::open(file.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666));
    if (!descriptor.isOpen() || ::ftruncate(descriptor.number(), static_cast<off_t>(size)) != 0) {
        throw systemError("cannot make " + file.string());
    }
    return descriptor;
}

void writeAt(const Descriptor& descriptor, const std::filesystem::path& file, std::uint64_t offset,
             const Bytes& bytes) {
    std::size_t done = 0;
    while (done < bytes.size()) {
        const ssize_t count = ::pwrite(descriptor.number(), bytes.data() + done,
                                       bytes.size() - done, static_cast<off_t>(offset + done));
        if (count <= 0) {
            throw systemError("cannot write " + file.string());
        }
        done += static_cast<std::size_t>(count);
    }
}

} // namespace orvane::kit
