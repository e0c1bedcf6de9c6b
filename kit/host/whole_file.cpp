// SPDX-License-Identifier: Apache-2.0
#include "kit/host/whole_file.h"

#include "kit/host/descriptor.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <array>
#include <cstddef>
#include <string>
#include <system_error>

namespace orvane::kit {

namespace {

/// Waits for the other end of a pipe.
Descriptor openStream(const std::filesystem::path& file) {
    return Descriptor(::open(file.c_str(), O_RDONLY | O_CLOEXEC));
}

KitError readError(const std::filesystem::path& file) {
    return systemError("cannot read ", file);
}

[[noreturn]] void failAsTooLong(const std::filesystem::path& file, std::uint64_t limit) {
    throw KitError("", file,
                   " has more than " + std::to_string(limit) + " bytes, the most allowed");
}

void failIfTooLong(const struct stat& state, const std::filesystem::path& file,
                   std::uint64_t limit) {
    if (S_ISREG(state.st_mode) && static_cast<std::uint64_t>(state.st_size) > limit) {
        failAsTooLong(file, limit);
    }
}

Bytes readToEnd(const Descriptor& descriptor, const std::filesystem::path& file,
                std::uint64_t limit) {
    struct stat state {};
    if (::fstat(descriptor.number(), &state) == 0) {
        failIfTooLong(state, file, limit); // before a long one is read
    }
    Bytes bytes;
    std::array<char, 65536> buffer{};
    ssize_t count = 0;
    while ((count = ::read(descriptor.number(), buffer.data(), buffer.size())) > 0) {
        bytes.append(buffer.data(), static_cast<std::size_t>(count));
        if (bytes.size() > limit) {
            failAsTooLong(file, limit);
        }
    }
    if (count < 0) {
        throw readError(file);
    }
    return bytes;
}

} // namespace

Bytes readWholeFile(const std::filesystem::path& file, std::uint64_t limit) {
    const Descriptor descriptor = openStream(file);
    if (!descriptor.isOpen()) {
        throw readError(file);
    }
    return readToEnd(descriptor, file, limit);
}

void requireShort(const std::filesystem::path& file, std::uint64_t limit) {
    struct stat state {};
    if (::stat(file.c_str(), &state) == 0) {
        failIfTooLong(state, file, limit);
    }
}

Bytes readRegularFile(const std::filesystem::path& file, std::uint64_t limit) {
    const Descriptor descriptor = openForReading(file);
    struct stat state {};
    if (::fstat(descriptor.number(), &state) != 0 || !S_ISREG(state.st_mode)) {
        throw KitError("", file, " is not a regular file");
    }
    failIfTooLong(state, file, limit);
    return readAt(descriptor, file, 0, static_cast<std::uint64_t>(state.st_size));
}

std::optional<Bytes> readRegularFileIfThere(const std::filesystem::path& file) {
    std::error_code error;
    if (std::filesystem::status(file, error).type() == std::filesystem::file_type::not_found) {
        return std::nullopt;
    }
    return readRegularFile(file, LONGEST_READ);
}

} // namespace orvane::kit
