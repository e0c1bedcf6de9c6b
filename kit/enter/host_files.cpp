// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/host_files.h"

#include "kit/enter/change_root.h"
#include "kit/host/kit_error.h"

#include <sys/mount.h>

#include <system_error>

namespace orvane::kit {

namespace fs = std::filesystem;

HostFiles::HostFiles(const fs::path& root) try : folder_(root, "program", 0700) {
} catch (const KitError& failure) {
    throw KitError("a dynamic or emulated program needs a folder in the unit while it runs: " +
                   failure.text());
}

HostFiles::~HostFiles() {
    // A mount that is visible here: only in a changed root (change_root.h).
    ::umount2(folder_.path().c_str(), MNT_DETACH);
}

std::string HostFiles::pathInUnit() const {
    return "/" + folder_.path().filename().string();
}

void HostFiles::fill(const std::vector<std::string>& files) const {
    mountMemory(folder_.path());
    for (const std::string& file : files) {
        const fs::path copy = folder_.path() / file;
        std::error_code error;
        fs::create_directories(copy.parent_path(), error);
        fs::copy_file("/" + file, copy, fs::copy_options::overwrite_existing, error);
        if (error) {
            throw KitError("cannot copy /" + file + " into the unit: " + error.message());
        }
    }
}

} // namespace orvane::kit
