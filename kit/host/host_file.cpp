// SPDX-License-Identifier: Apache-2.0
#include "kit/host/host_file.h"

#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace orvane::kit {

Descriptor makeSparseFile(const std::filesystem::path& file, std::uint64_t size) {
    Descriptor descriptor(::open(file.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666));
    if (!descriptor.isOpen() || ::ftruncate(descriptor.number(), static_cast<off_t>(size)) != 0) {
        throw systemError("cannot make ", file);
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
            errno = count == 0 ? ENOSPC : errno; // written nothing, and said nothing
            throw systemError("cannot write ", file);
        }
        done += static_cast<std::size_t>(count);
    }
}

Descriptor openForReading(const std::filesystem::path& file) {
    Descriptor descriptor(::open(file.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    if (!descriptor.isOpen()) {
        throw systemError("cannot read ", file);
    }
    return descriptor;
}

std::uint64_t sizeOf(const Descriptor& descriptor, const std::filesystem::path& file) {
    const off_t size = ::lseek(descriptor.number(), 0, SEEK_END);
    if (size < 0) {
        throw systemError("cannot measure ", file);
    }
    return static_cast<std::uint64_t>(size);
}

Bytes readAt(const Descriptor& descriptor, const std::filesystem::path& file, std::uint64_t offset,
             std::uint64_t length) {
    Bytes bytes(static_cast<std::size_t>(length), '\0');
    std::size_t done = 0;
    while (done < bytes.size()) {
        const ssize_t count = ::pread(descriptor.number(), bytes.data() + done, bytes.size() - done,
                                      static_cast<off_t>(offset + done));
        if (count < 0) {
            throw systemError("cannot read ", file);
        }
        if (count == 0) {
            bytes.resize(done);
        }
        done += static_cast<std::size_t>(count);
    }
    return bytes;
}

Bytes readWhole(const Descriptor& descriptor, const std::filesystem::path& file) {
    return readAt(descriptor, file, 0, sizeOf(descriptor, file));
}

void requireFolder(const std::filesystem::path& folder) {
    struct stat state {};
    if (::stat(folder.c_str(), &state) != 0) {
        throw systemError("cannot read ", folder);
    }
    if (!S_ISDIR(state.st_mode)) {
        throw KitError("", folder, " is not a folder");
    }
}

std::filesystem::path temporaryFolder() {
    const char* const wanted = std::getenv("TMPDIR");
    std::filesystem::path folder = wanted == nullptr || *wanted == '\0' ? P_tmpdir : wanted;
    try {
        requireFolder(folder);
    } catch (const KitError& error) {
        throw KitError("no folder for temporary files (TMPDIR): " + error.text());
    }
    return folder;
}

bool isRootDirectory(const std::filesystem::path& folder) {
    struct stat own {};
    struct stat other {};
    return ::stat("/", &own) == 0 && ::stat(folder.c_str(), &other) == 0 &&
           own.st_dev == other.st_dev && own.st_ino == other.st_ino;
}

} // namespace orvane::kit
