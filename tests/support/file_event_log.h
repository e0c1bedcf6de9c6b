// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "kit/host/descriptor.h"
#include "kit/host/kit_error.h"

#include <sys/inotify.h>
#include <unistd.h>

#include <array>
#include <cstdint>
#include <cstring>
#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace orvane::test {

/// What happens to some files, in the order that the kernel reports.
class FileEventLog {
public:
    /// Logs one kind of event from now on: IN_OPEN, IN_CLOSE, or IN_MODIFY, which is a write or a
    /// truncation. The files must exist.
    ///
    /// The kernel merges an event with an equal one before it. Also watching the folder puts an
    /// event between any two of a file.
    FileEventLog(std::uint32_t event, const std::vector<std::string>& paths)
        : events_(inotify_init1(IN_NONBLOCK | IN_CLOEXEC)) {
        for (const std::string& path : paths) {
            watch(std::filesystem::path(path).parent_path(), event);
            files_[watch(path, event)] = path;
        }
    }

    /// The path of each event since the last call.
    std::vector<std::string> take() {
        std::vector<std::string> paths;
        std::array<char, 4096> buffer{};
        ssize_t length = 0;
        while ((length = read(events_.number(), buffer.data(), buffer.size())) > 0) {
            for (std::size_t at = 0; at < static_cast<std::size_t>(length);) {
                inotify_event event{};
                std::memcpy(&event, buffer.data() + at, sizeof(event));
                if (const auto file = files_.find(event.wd); file != files_.end()) {
                    paths.push_back(file->second);
                }
                at += sizeof(event) + event.len;
            }
        }
        return paths;
    }

private:
    int watch(const std::string& path, std::uint32_t event) const {
        const int number = inotify_add_watch(events_.number(), path.c_str(), event);
        if (number == -1) {
            throw kit::systemError("cannot watch " + path);
        }
        return number;
    }

    kit::Descriptor events_;
    std::map<int, std::string> files_; ///< by the number of the watch
};

} // namespace orvane::test
