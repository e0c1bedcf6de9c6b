// SPDX-License-Identifier: Apache-2.0
#include "kit/host/unfinished_file.h"

#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"

#include <string>
#include <system_error>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

/// `file`, or the file to which it is a link. A device that is replaced by a file is a loss for
/// the whole system, so only a file is.
fs::path replaceable(const fs::path& file) {
    std::error_code error;
    const fs::file_type kind = fs::status(file, error).type();
    if (kind == fs::file_type::not_found) {
        return file;
    }
    if (kind == fs::file_type::none) {
        throw KitError("cannot write ", file, ": " + error.message());
    }
    if (kind != fs::file_type::regular) {
        throw KitError("cannot write ", file, ": it is there and not a regular file");
    }
    return fs::canonical(file);
}

fs::path folderOf(const fs::path& file) {
    return file.has_parent_path() ? file.parent_path() : fs::path(".");
}

UnfinishedFolder folderNextTo(const fs::path& file) {
    try {
        return UnfinishedFolder(folderOf(file), file.filename().string(), 0700);
    } catch (const KitError& error) {
        throw KitError("cannot write ", file, ": " + error.text());
    }
}

} // namespace

UnfinishedFile::UnfinishedFile(const fs::path& file)
    : file_(replaceable(file)), folder_(folderNextTo(file_)) {}

void UnfinishedFile::finish(const Bytes& bytes) const {
    const fs::path unfinished = folder_.path() / "file";
    try {
        writeAt(makeSparseFile(unfinished, 0), unfinished, 0, bytes);
    } catch (const KitError& error) {
        throw error.moved(unfinished, file_);
    }
    std::error_code error;
    fs::rename(unfinished, file_, error);
    if (error) {
        throw KitError("cannot write ", file_, ": " + error.message());
    }
}

} // namespace orvane::kit
