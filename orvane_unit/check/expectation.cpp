// SPDX-License-Identifier: Apache-2.0
#include "orvane_unit/check/expectation.h"

#include "kit/description/parse_description.h"
#include "kit/description/unit_description.h"
#include "kit/host/bytes.h"
#include "kit/host/host_file.h"
#include "kit/host/kit_error.h"
#include "kit/host/rename_entry.h"
#include "kit/host/tree_entries.h"
#include "kit/host/unfinished_folder.h"
#include "kit/host/whole_file.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <map>
#include <optional>
#include <set>
#include <sstream>
#include <system_error>
#include <utility>

namespace orvane::desk {

namespace {

namespace fs = std::filesystem;

constexpr char EXPECTED[] = "expected";
constexpr char LIST[] = "tmp.list";
constexpr char TMP[] = "tmp";
constexpr char DESCRIBED[] = "tmp.toml";
constexpr char STANDARD_ERROR[] = "stderr";
constexpr char NO_TMP[] = "(absent)";

std::string listOf(const TmpTree& tree) {
    if (!tree.isThere) {
        return std::string(NO_TMP) + "\n";
    }
    std::string list;
    for (const auto& [path, content] : tree.entries) {
        list += path + "\n";
    }
    return list;
}

std::set<std::string> linesOf(const std::string& text) {
    std::set<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) {
        lines.insert(line);
    }
    return lines;
}

void compareEntries(const std::set<std::string>& found, const std::set<std::string>& expected,
                    std::vector<std::string>& differences) {
    for (const std::string& name : expected) {
        if (found.count(name) == 0) {
            differences.push_back(pathInTmp(name) + " is missing");
        }
    }
    for (const std::string& name : found) {
        if (expected.count(name) == 0) {
            differences.push_back(pathInTmp(name) + " is not expected");
        }
    }
}

/// The files of the table for an outcome: path below `expected`, and content.
std::map<std::string, std::string> tableOf(const RunOutcome& outcome) {
    std::map<std::string, std::string> files = {{LIST, listOf(outcome.tmp)}};
    if (!outcome.end.standardError.empty()) {
        files[STANDARD_ERROR] = outcome.end.standardError;
    }
    for (const auto& [path, content] : outcome.tmp.entries) {
        if (content) {
            files[std::string(TMP) + "/" + path] = *content;
        }
    }
    return files;
}

/// The paths that the present expectation's table has, whether there are such files or not.
std::set<std::string> presentTable(const fs::path& expected) {
    std::set<std::string> paths = {LIST, DESCRIBED, STANDARD_ERROR};
    for (const std::string& name :
         linesOf(kit::readRegularFileIfThere(expected / LIST).value_or(""))) {
        paths.insert(std::string(TMP) + "/" + name);
    }
    return paths;
}

fs::file_type kindIfThere(const fs::path& path) {
    std::error_code ignored; // what can't be looked at can't be written either, which says so
    return fs::symlink_status(path, ignored).type();
}

using DescribedFiles = std::map<std::string, kit::Bytes>;

/// The files that are described, by their paths in the unit.
DescribedFiles describedFiles(const fs::path& expected) {
    const fs::path description = expected / DESCRIBED;
    return kindIfThere(description) == fs::file_type::not_found
               ? DescribedFiles()
               : kit::readDescription(description).files;
}

/// The content of the file at `path` below /tmp; none when it is not given.
std::optional<std::string> expectedContent(const fs::path& expected,
                                           const DescribedFiles& described,
                                           const std::string& path) {
    const auto found = described.find(pathInTmp(path));
    return found != described.end() ? std::optional<std::string>(found->second)
                                    : kit::readRegularFileIfThere(expected / TMP / path);
}

void refuseLink(const fs::path& path) {
    if (kindIfThere(path) == fs::file_type::symlink) {
        throw kit::KitError("cannot update ", path, ": it is a link");
    }
}

/// Whoever follows a link may write outside the case. A link in the place of a file below `tmp` is
/// replaced, and not followed.
void refuseLinks(const fs::path& folder, const std::map<std::string, std::string>& files) {
    const fs::path expected = folder / EXPECTED;
    for (const fs::path& path :
         {folder, expected, expected / LIST, expected / TMP, expected / STANDARD_ERROR}) {
        refuseLink(path);
    }
    for (const auto& [path, content] : files) {
        fs::path above = expected;
        for (const fs::path& name : fs::path(path).parent_path()) {
            above /= name;
            refuseLink(above);
        }
    }
}

/// What can't be emptied later must not be replaced now.
void requireWritable(const fs::path& folder) {
    if (::faccessat(AT_FDCWD, folder.c_str(), W_OK | X_OK, AT_EACCESS) != 0) {
        throw kit::systemError("cannot write ", folder);
    }
}

/// Gives everything in `from` but the paths `left` out a second name in `to`, so that the removal
/// of `from` takes nothing away. A folder that only had such paths is left out, too.
void keepOthers(const fs::path& from, const fs::path& to, const std::set<std::string>& left) {
    requireWritable(from);
    std::vector<fs::path> folders; // each after the one in which it lies
    for (const fs::path& entry : fs::recursive_directory_iterator(from)) {
        const fs::path path = entry.lexically_relative(from);
        if (kit::kindOf(entry) == fs::file_type::directory) {
            requireWritable(entry);
            fs::create_directory(to / path, entry);
            folders.push_back(path);
        } else if (left.count(path.string()) == 0) {
            fs::create_hard_link(entry, to / path);
        }
    }
    std::for_each(folders.rbegin(), folders.rend(), [&](const fs::path& path) {
        if (fs::is_empty(to / path) && !fs::is_empty(from / path)) {
            fs::remove(to / path);
        }
    });
}

void writeTable(const fs::path& expected, const std::map<std::string, std::string>& files) {
    for (const auto& [path, content] : files) {
        const fs::path file = expected / path;
        fs::create_directories(file.parent_path());
        kit::writeAt(kit::makeSparseFile(file, 0), file, 0, content);
    }
}

/// Requires that `unfinished` is complete. It has the old expectation afterwards, if there was one.
void putInPlace(const fs::path& unfinished, const fs::path& expected, bool isThere) {
    const std::error_code error = isThere ? kit::exchangeNames(unfinished, expected)
                                          : kit::renameToFree(unfinished, expected);
    if (error == std::errc::invalid_argument) {
        throw kit::KitError("cannot replace ", expected,
                            " in one step on this file system: remove it and update again");
    }
    if (error) {
        throw kit::KitError("cannot write ", expected, ": " + error.message());
    }
}

} // namespace

std::vector<std::string> differencesFromExpected(const fs::path& folder,
                                                 const RunOutcome& outcome) {
    const fs::path expected = folder / EXPECTED;
    std::vector<std::string> differences;
    if (outcome.end.standardError !=
        kit::readRegularFileIfThere(expected / STANDARD_ERROR).value_or("")) {
        differences.emplace_back("standard error differs");
    }
    const std::optional<std::string> list = kit::readRegularFileIfThere(expected / LIST);
    if (!list) {
        differences.push_back(std::string(EXPECTED) + "/" + LIST + " is missing");
        return differences;
    }
    const std::set<std::string> wanted = linesOf(*list);
    compareEntries(linesOf(listOf(outcome.tmp)), wanted, differences);
    const DescribedFiles described = describedFiles(expected);
    for (const auto& [path, content] : outcome.tmp.entries) {
        if (content && wanted.count(path) != 0 &&
            *content != expectedContent(expected, described, path)) {
            differences.push_back(pathInTmp(path) + " differs");
        }
    }
    return differences;
}

void replaceExpected(const fs::path& folder, const RunOutcome& outcome) {
    const std::map<std::string, std::string> files = tableOf(outcome);
    refuseLinks(folder, files);
    const fs::path expected = folder / EXPECTED;
    const bool isThere = kindIfThere(expected) != fs::file_type::not_found;
    std::set<std::string> left = presentTable(expected);
    for (const auto& [path, content] : files) {
        left.insert(path);
    }
    const kit::UnfinishedFolder unfinished(folder, EXPECTED, 0777);
    unfinished.fill(expected, [&](const fs::path& made) {
        if (isThere) {
            keepOthers(expected, made, left);
            fs::permissions(made, fs::status(expected).permissions());
        }
        writeTable(made, files);
    });
    putInPlace(unfinished.path(), expected, isThere);
}

} // namespace orvane::desk
