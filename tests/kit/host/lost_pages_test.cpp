// SPDX-License-Identifier: Apache-2.0
#include "kit/enter/captured_run.h"
#include "kit/host/descriptor.h"
#include "kit/host/kit_error.h"
#include "kit/host/lost_pages.h"
#include "tests/support/temporary_folder.h"

#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include <csignal>
#include <cstddef>
#include <string>

namespace orvane::test {

namespace {

/// A file of two pages of "p", mapped, and then cut off after `left` bytes.
class CutFile {
public:
    explicit CutFile(off_t left)
        : size_(2 * static_cast<std::size_t>(::sysconf(_SC_PAGESIZE))),
          file_(::open((folder_.path() / "file").c_str(), O_RDWR | O_CREAT, 0600)) {
        const std::string text(size_, 'p');
        EXPECT_EQ(::write(file_.number(), text.data(), size_), static_cast<ssize_t>(size_));
        mapped_ = ::mmap(nullptr, size_, PROT_READ, MAP_PRIVATE, file_.number(), 0);
        EXPECT_NE(mapped_, MAP_FAILED);
        EXPECT_EQ(::ftruncate(file_.number(), left), 0);
    }
    ~CutFile() { ::munmap(mapped_, size_); }
    CutFile(const CutFile&) = delete;
    CutFile& operator=(const CutFile&) = delete;

    char first() const { return *bytes(); }
    char last() const { return bytes()[size_ - 1]; }

private:
    const volatile char* bytes() const { return static_cast<const volatile char*>(mapped_); }

    TemporaryFolder folder_;
    std::size_t size_;
    kit::Descriptor file_;
    void* mapped_ = nullptr;
};

std::string complaint(const kit::LostPages& lost) {
    try {
        lost.requireNone("/the/image");
        return "";
    } catch (const kit::KitError& error) {
        return error.what();
    }
}

TEST(LostPagesTest, LostPageReadsAsZerosAndIsNoted) {
    const CutFile file(1);
    const kit::LostPages lost;
    EXPECT_EQ(file.first(), 'p');
    EXPECT_EQ(complaint(lost), "");
    EXPECT_EQ(file.last(), '\0');
    EXPECT_EQ(complaint(lost).compare(0, 23, "cannot read /the/image:"), 0) << complaint(lost);
}

TEST(LostPagesTest, EachPageIsReplaced) {
    const CutFile file(0);
    const kit::LostPages lost;
    EXPECT_EQ(file.first(), '\0');
    EXPECT_EQ(file.last(), '\0');
    EXPECT_NE(complaint(lost), "");
}

TEST(LostPagesTest, LaterOneForgetsEarlierPages) {
    const CutFile file(0);
    {
        const kit::LostPages lost;
        EXPECT_EQ(file.first(), '\0');
    }
    EXPECT_EQ(complaint(kit::LostPages()), "");
}

/// How a process ends that does this.
template <class Action>
int endOf(const Action& action) {
    return kit::runCaptured([&action] {
               static_cast<void>(std::signal(SIGBUS, SIG_DFL)); // a sanitizer may have its own
               action();
           })
        .exitStatus;
}

TEST(LostPagesTest, LostPageEndsTheProcessAgainAfterwards) {
    const CutFile file(0);
    EXPECT_EQ(endOf([&file] {
                  { const kit::LostPages lost; }
                  static_cast<void>(file.first());
              }),
              128 + SIGBUS);
}

TEST(LostPagesTest, SignalOfAnotherProcessStillEndsThisOne) {
    EXPECT_EQ(endOf([] {
                  const kit::LostPages lost;
                  ::kill(::getpid(), SIGBUS);
              }),
              128 + SIGBUS);
}

} // namespace

} // namespace orvane::test
