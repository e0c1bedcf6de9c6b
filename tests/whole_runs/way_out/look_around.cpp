// SPDX-License-Identifier: Apache-2.0
//
// orvane-look-around: prints what a program finds that looks for a way out of its root directory.
#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstring>
#include <set>
#include <string>

namespace {

bool isSame(const struct stat& one, const struct stat& other) {
    return one.st_dev == other.st_dev && one.st_ino == other.st_ino;
}

void printWorkingDirectory() {
    char path[PATH_MAX] = "";
    std::printf("working directory: %s\n",
                getcwd(path, sizeof path) == nullptr ? std::strerror(errno) : path);
}

void printParents() {
    struct stat root {};
    struct stat above {};
    const bool isRoot = stat("/", &root) == 0 && stat("../../../../../../../..", &above) == 0 &&
                        isSame(root, above);
    std::printf("above it: %s\n", isRoot ? "/" : "another folder");
}

void printFolder(const char* path) {
    DIR* const folder = opendir(path);
    if (folder == nullptr) {
        std::printf("%s: %s\n", path, std::strerror(errno));
        return;
    }
    std::set<std::string> names;
    while (const dirent* const entry = readdir(folder)) {
        names.insert(entry->d_name);
    }
    closedir(folder);
    std::printf("%s:", path);
    for (const std::string& name : names) {
        std::printf(" %s", name.c_str());
    }
    std::printf("\n");
}

void printDescriptors() {
    std::printf("descriptors:");
    for (int number = 0; number < 1024; ++number) {
        if (fcntl(number, F_GETFD) != -1) {
            const int folder = openat(number, ".", O_PATH | O_DIRECTORY | O_CLOEXEC);
            std::printf(" %d%s", number, folder == -1 ? "" : " (a folder)");
            close(folder);
        }
    }
    std::printf("\n");
}

} // namespace

int main() {
    printDescriptors(); // first: a folder that is listed has one
    printWorkingDirectory();
    printParents();
    printFolder("/proc");
    printFolder("/proc/self/cwd/");
    printFolder("/proc/self/root/");
    printFolder("/");
    return 0;
}
