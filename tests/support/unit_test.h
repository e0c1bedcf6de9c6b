// SPDX-License-Identifier: Apache-2.0
//
// The fixture of every test that touches the unit: it makes a root and enters it. Inside a test all
// absolute paths are the unit's, for the product and for the test alike.
#pragma once

#include "kit/enter/entered_root.h"
#include "tests/support/temporary_folder.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

namespace orvane::test {

constexpr char IMAGE_PATH[] = "/fs/tmpfs/VS_DIAG_SERVICE_CONFIG_SHARED_MEM";
constexpr char DISK_PATH[] = "/dev/hd0";
constexpr std::uint64_t MEBIBYTE = std::uint64_t{1024} * 1024;

/// Files of the unit, as bytes. Parents must exist. An error fails the test.
std::string readFile(const std::string& path);
void writeFile(const std::string& path, const std::string& content);
bool exists(const std::string& path);

/// Starts every test inside a new unit: the folders, an image of 179 zero bytes, a disk of 2 MiB of
/// zeros, nothing else. The unit is removed afterwards, but kept and named when the test failed.
class UnitTest : public ::testing::Test {
protected:
    UnitTest();
    ~UnitTest() override;

    /// Replaces the configuration image by these bytes.
    static void writeImage(const std::string& bytes);
    /// Sets bytes of the image from `offset` on.
    static void setImage(std::uint32_t offset, const std::string& bytes);
    /// Makes the disk `size` bytes long, all zero.
    static void resetDisk(std::uint64_t size);
    /// Sets / gives bytes of the disk, counted back from its end.
    static void setDiskFromEnd(std::uint64_t bytesBeforeEnd, const std::string& bytes);
    static std::string diskFromEnd(std::uint64_t bytesBeforeEnd, std::size_t length);
    /// Replaces whatever is at `path` by a folder.
    static void putFolder(const std::string& path);
    static void remove(const std::string& path);

    /// Number of descriptors that this process has open.
    static int openDescriptors();

    /// Where the unit is on the host, for a program that is run in it from outside (leave first).
    const std::filesystem::path& hostRoot() const { return folder_.path(); }
    /// Leaves the unit for the rest of the test: absolute paths are then the host's.
    void leave();

private:
    TemporaryFolder folder_;
    std::unique_ptr<kit::EnteredRoot> entered_;
};

} // namespace orvane::test
