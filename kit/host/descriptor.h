// SPDX-License-Identifier: Apache-2.0
//
// The owner of one file descriptor.
#pragma once

#include <unistd.h>

#include <utility>

namespace orvane::kit {

/// Closes its descriptor on destruction, or earlier by close(), which is safe to repeat.
class Descriptor {
public:
    Descriptor() = default;
    explicit Descriptor(int number) : number_(number) {}
    ~Descriptor() { close(); }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    Descriptor(Descriptor&& other) noexcept : number_(std::exchange(other.number_, -1)) {}
    Descriptor& operator=(Descriptor&& other) noexcept {
        std::swap(number_, other.number_);
        return *this;
    }

    /// The descriptor, or -1 when closed or never opened.
    int number() const { return number_; }
    bool isOpen() const { return number_ >= 0; }
    void close() {
        if (isOpen()) {
            ::close(number_);
            number_ = -1;
        }
    }

private:
    int number_ = -1;
};

} // namespace orvane::kit
