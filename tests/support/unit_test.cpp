// SPDX-License-Identifier: Apache-2.0
#include "tests/support/unit_test.h"

#include "kit/enter/entered_root.h"
#include "kit/host/whole_file.h"

#include <fcntl.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iostream>

namespace orvane::test {

namespace fs = std::filesystem;

namespace {

void patchFile(const std::string& path, std::uint64_t offset, const std::string& bytes) {
    std::fstream file(path, std::ios::in | std::ios::out | std::ios::binary);
    file.seekp(static_cast<std::streamoff>(offset));
    file.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    file.flush();
    ASSERT_TRUE(file.good()) << path << " at " << offset;
}

} // namespace

std::string readFile(const std::string& path) {
    return kit::readWholeFile(path);
}

void writeFile(const std::string& path, const std::string& content) {
    std::ofstream file(path, std::ios::binary);
    file << content;
    file.close();
    ASSERT_TRUE(content.empty() || file.good()) << path;
}

bool exists(const std::string& path) {
    return fs::exists(path);
}

UnitTest::UnitTest() {
    for (const char* folder : {"fs/mp/etc/mm", "fs/rwdata/.Version", "fs/tmpfs", "dev", "tmp"}) {
        fs::create_directories(hostRoot() / folder);
    }
    entered_ = std::make_unique<kit::EnteredRoot>(hostRoot());
    writeImage(std::string(179, '\0'));
    resetDisk(2 * MEBIBYTE);
}

UnitTest::~UnitTest() {
    leave();
}

void UnitTest::leave() {
    entered_.reset();
}

void UnitTest::writeImage(const std::string& bytes) {
    writeFile(IMAGE_PATH, bytes);
}

void UnitTest::setImage(std::uint32_t offset, const std::string& bytes) {
    patchFile(IMAGE_PATH, offset, bytes);
}

void UnitTest::resetDisk(std::uint64_t size) {
    writeFile(DISK_PATH, "");
    fs::resize_file(DISK_PATH, size);
}

void UnitTest::setDiskFromEnd(std::uint64_t bytesBeforeEnd, const std::string& bytes) {
    patchFile(DISK_PATH, fs::file_size(DISK_PATH) - bytesBeforeEnd, bytes);
}

std::string UnitTest::diskFromEnd(std::uint64_t bytesBeforeEnd, std::size_t length) {
    std::ifstream disk(DISK_PATH, std::ios::binary);
    disk.seekg(static_cast<std::streamoff>(fs::file_size(DISK_PATH) - bytesBeforeEnd));
    std::string bytes(length, '?');
    disk.read(bytes.data(), static_cast<std::streamsize>(length));
    EXPECT_TRUE(disk.good()) << length << " bytes, " << bytesBeforeEnd << " before the end";
    return bytes;
}

void UnitTest::putFolder(const std::string& path) {
    fs::remove_all(path);
    fs::create_directories(path);
}

void UnitTest::remove(const std::string& path) {
    fs::remove_all(path);
}

int UnitTest::openDescriptors() {
    int count = 0;
    for (int descriptor = 0; descriptor < 1024; ++descriptor) {
        count += fcntl(descriptor, F_GETFD) == -1 ? 0 : 1;
    }
    return count;
}

} // namespace orvane::test
