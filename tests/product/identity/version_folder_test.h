// SPDX-License-Identifier: Apache-2.0
//
// For tests of the folder of version description files, and of the order in which the file system
// lists it.
#pragma once

#include "identity/software_version.h"
#include "tests/support/unit_test.h"

#include <dirent.h>

#include <string>
#include <vector>

namespace orvane::test {

/// The folder without the trailing slash of the product's constant.
constexpr char VERSION_FOLDER[] = "/fs/rwdata/.Version";

class VersionFolderTest : public UnitTest {
protected:
    static std::string pathOf(const std::string& name) {
        return std::string(VERSION_FOLDER) + "/" + name;
    }
    static void put(const std::string& name, const std::string& content) {
        writeFile(pathOf(name), content);
    }
    static std::string description(const std::string& type, const std::string& version) {
        return "Type=" + type + "\nVersion Number=" + version + "\n";
    }
    /// The version text that one file with this content gives.
    static std::string versionOf(const std::string& content) {
        put("app.inf", content);
        return findApplicationVersion();
    }

    /// The names of the folder's files, in the order in which the file system lists them.
    static std::vector<std::string> listing() {
        std::vector<std::string> names;
        DIR* folder = opendir(VERSION_FOLDER);
        if (folder == nullptr) {
            ADD_FAILURE() << "no listing";
            return names;
        }
        while (const dirent* entry = readdir(folder)) {
            const std::string name = entry->d_name;
            if (name != "." && name != "..") {
                names.push_back(name);
            }
        }
        closedir(folder);
        return names;
    }

    /// Makes empty files of these names and returns the names in listing order; the test then fills
    /// them in that order.
    static std::vector<std::string> makeFiles(const std::vector<std::string>& names) {
        for (const std::string& name : names) {
            put(name, "");
        }
        std::vector<std::string> listed = listing();
        EXPECT_EQ(listed.size(), names.size());
        return listed;
    }
};

} // namespace orvane::test
