// SPDX-License-Identifier: Apache-2.0
#include "kit/host/output_place.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <memory>

namespace orvane::kit {

namespace {

std::optional<std::string> canonical(const std::string& path) {
    const std::unique_ptr<char, decltype(&std::free)> real(::realpath(path.c_str(), nullptr),
                                                           &std::free);
    return real ? std::optional<std::string>(real.get()) : std::nullopt;
}

std::optional<OutputPlace> placeThatIsThere(const std::string& path) {
    const std::optional<std::string> real = canonical(path);
    struct stat state {};
    if (!real || ::stat(real->c_str(), &state) != 0) {
        return std::nullopt;
    }
    return OutputPlace{*real, state.st_mode & S_IFMT};
}

std::string linkTarget(const std::string& path) {
    std::string target(PATH_MAX, '\0');
    const ssize_t length = ::readlink(path.c_str(), target.data(), target.size());
    target.resize(length < 0 ? 0 : static_cast<std::size_t>(length));
    return target;
}

} // namespace

std::optional<OutputPlace> findOutputPlace(std::string path) {
    constexpr int MOST_LINKS = 40; // the kernel's own limit
    for (int links = 0; links <= MOST_LINKS; ++links) {
        const std::size_t slash = path.rfind('/');
        const std::string name = path.substr(slash + 1);
        if (name.empty() || name == "." || name == "..") {
            return placeThatIsThere(path);
        }
        const std::optional<std::string> folder = canonical(path.substr(0, slash) + "/");
        if (!folder) {
            return std::nullopt;
        }
        const std::string base = *folder == "/" ? "/" : *folder + "/";
        path = base + name;
        struct stat state {};
        if (::lstat(path.c_str(), &state) != 0) {
            return errno == ENOENT ? std::optional<OutputPlace>(OutputPlace{path, 0})
                                   : std::nullopt;
        }
        if (!S_ISLNK(state.st_mode)) {
            return OutputPlace{path, state.st_mode & S_IFMT};
        }
        const std::string target = linkTarget(path);
        path = target.compare(0, 1, "/") == 0 ? target : base + target;
    }
    return std::nullopt;
}

bool canBeWritten(const OutputPlace& place) {
    if (place.kind == S_IFDIR || place.kind == S_IFSOCK) {
        return false;
    }
    if (place.kind != 0) {
        return ::access(place.path.c_str(), W_OK) == 0;
    }
    const std::string folder = place.path.substr(0, place.path.rfind('/') + 1);
    return ::access(folder.c_str(), W_OK | X_OK) == 0;
}

bool canBeWritten(const std::string& path) {
    const std::optional<OutputPlace> place = findOutputPlace(path);
    return place && canBeWritten(*place);
}

} // namespace orvane::kit
