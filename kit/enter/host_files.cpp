// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/host_files.h"

#include "kit/enter/change_root.h"
#include "kit/host/kit_error.h"

#include <sys/mount.h>

#include <cstdlib>
#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

HostFiles::HostFiles(const fs::path& root) {
    std::string name = root / ".program.unfinished-XXXXXX";
    if (::mkdtemp(name.data()) == nullptr) {
        throw systemError("cannot make ", name);
    }
    folder_ = name;
}

HostFiles::~HostFiles() {
    ::umount2(folder_.c_str(), MNT_DETACH); // visible here only in a changed root (change_root.h)
    std::error_code ignored;
    fs::remove_all(folder_, ignored);
}

std::string HostFiles::pathInUnit() const {
    return "/" + folder_.filename().string();
}

void HostFiles::fill(const std::vector<std::string>& files) const {
    mountMemory(folder_);
    for (const std::string& file : files) {
        const fs::path copy = folder_ / file;
        std::error_code error;
        fs::create_directories(copy.parent_path(), error);
        fs::copy_file("/" + file, copy, fs::copy_options::overwrite_existing, error);
        if (error) {
            throw KitError("cannot copy /" + file + " into the unit: " + error.message());
        }
    }
}

} // namespace orvane::kit
