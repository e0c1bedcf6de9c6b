// SPDX-License-Identifier: Apache-2.0
#include "kit/host/tree_entries.h"

#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/sparse_content.h"

#include <algorithm>
#include <cstddef>
#include <map>
#include <system_error>
#include <utility>

namespace orvane::kit {

namespace {

namespace fs = std::filesystem;

/// A shorter file is not worth a table of its own. In bytes.
constexpr std::uint64_t LEAST_SPARSE = 4096;
/// What an entry of such a table takes besides its bytes, in bytes.
constexpr std::uint64_t RUN_COST = 32;

/// Throws what the system says of `path`.
void check(const std::error_code& error, const fs::path& path) {
    if (error) {
        throw KitError("cannot read " + path.string() + ": " + error.message());
    }
}

} // namespace

std::vector<fs::directory_entry> listFolder(const fs::path& folder) {
    std::error_code error;
    std::vector<fs::directory_entry> entries;
    for (fs::directory_iterator entry(folder, error); entry != fs::directory_iterator();
         entry.increment(error)) {
        check(error, folder);
        entries.push_back(*entry);
    }
    check(error, folder);
    std::sort(entries.begin(), entries.end());
    return entries;
}

fs::file_type kindOf(const fs::path& entry) {
    std::error_code error;
    const fs::file_status status = fs::symlink_status(entry, error);
    check(error, entry);
    return status.type();
}

std::string targetOf(const fs::path& link) {
    std::error_code error;
    std::string target = fs::read_symlink(link, error).string();
    check(error, link);
    return target;
}

void describeFile(const Descriptor& descriptor, const fs::path& file, const std::string& path,
                  UnitDescription& unit) {
    const std::uint64_t size = sizeOf(descriptor, file);
    Runs runs = nonZeroRuns(descriptor, file, size);
    std::uint64_t cost = 0;
    for (const auto& [offset, bytes] : runs) {
        cost += RUN_COST + bytes.size();
    }
    if (size >= LEAST_SPARSE && cost <= size / 2) {
        unit.sparseFiles[path] = {size, std::move(runs)};
        return;
    }
    Bytes content(static_cast<std::size_t>(size), '\0');
    for (const auto& [offset, bytes] : runs) {
        content.replace(static_cast<std::size_t>(offset), bytes.size(), bytes);
    }
    unit.files[path] = std::move(content);
}

} // namespace orvane::kit
