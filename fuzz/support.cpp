// SPDX-License-Identifier: Apache-2.0
#include "fuzz/support.h"

#include "kit/enter/entered_root.h"
#include "kit/host/kit_error.h"

#include <fcntl.h>
#include <sanitizer/asan_interface.h>
#include <sys/mman.h>
#include <unistd.h>

#include <array>
#include <cctype>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <optional>
#include <system_error>

namespace orvane::fuzz {

namespace {

/// The unit that the process is in, and the outputs from before it entered.
struct Inside {
    std::optional<kit::EnteredRoot> root;
    int outerOutput = -1;
    int outerError = -1;
};

Inside& inside() {
    static Inside state;
    return state;
}

/// Safe at any time. Before this call, the files that libFuzzer writes would end up in the unit.
void leaveUnit() {
    Inside& state = inside();
    if (state.root) {
        ::dup2(state.outerOutput, STDOUT_FILENO);
        ::dup2(state.outerError, STDERR_FILENO);
        state.root.reset();
    }
}

struct sigaction& libFuzzerAbortAction() {
    static struct sigaction action;
    return action;
}

/// Hands over to libFuzzer: the signal is still blocked, and arrives again when this returns.
void onAbort(int signal) {
    leaveUnit();
    ::sigaction(signal, &libFuzzerAbortAction(), nullptr);
    (void)std::raise(signal);
}

/// Must be called after libFuzzer has installed its own handlers: from the first run on.
void leaveUnitOnAbort() {
    static const bool once = [] {
        struct sigaction action = {};
        action.sa_handler = onAbort;
        return ::sigaction(SIGABRT, &action, &libFuzzerAbortAction()) == 0;
    }();
    (void)once;
}

/// The number that the next descriptor will get: it shows whether one was left open.
int nextDescriptor() {
    return kit::Descriptor(::dup(STDOUT_FILENO)).number();
}

std::filesystem::path parentOfUnits() {
    constexpr char MEMORY[] = "/dev/shm";
    if (std::getenv("TMPDIR") != nullptr || !std::filesystem::is_directory(MEMORY)) {
        return std::filesystem::temp_directory_path();
    }
    return MEMORY;
}

std::filesystem::path makeUnitFolder() {
    std::string name = parentOfUnits() / "orvane-fuzz-XXXXXX";
    if (::mkdtemp(name.data()) == nullptr) {
        throw kit::systemError("cannot make " + name);
    }
    return name;
}

std::string escaped(std::string_view text) {
    std::string result;
    for (const char character : text) {
        const auto byte = static_cast<unsigned char>(character);
        if (std::isprint(byte) != 0 && character != '\\') {
            result += character;
        } else {
            std::array<char, sizeof "\\xff"> hex{};
            (void)std::snprintf(hex.data(), hex.size(), "\\x%02x", unsigned{byte});
            result += hex.data();
        }
    }
    return result;
}

} // namespace

Unit::Unit() : root_(makeUnitFolder()), output_(::memfd_create("outputs", MFD_CLOEXEC)) {
    Inside& state = inside();
    state.outerOutput = ::fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    state.outerError = ::fcntl(STDERR_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
    if (!output_.isOpen() || state.outerOutput == -1 || state.outerError == -1) {
        throw kit::systemError("cannot collect the outputs");
    }
    const kit::EnteredRoot once(root_);
}

Unit::~Unit() {
    std::error_code error;
    std::filesystem::remove_all(root_, error);
}

std::filesystem::path Unit::hostPath(const std::string& path) const {
    return root_ / path.substr(1);
}

kit::Descriptor Unit::makeFile(const std::string& path, std::string_view content) const {
    const std::filesystem::path file = hostPath(path);
    std::filesystem::create_directories(file.parent_path());
    kit::Descriptor descriptor(::open(file.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0644));
    if (!descriptor.isOpen()) {
        throw kit::systemError("cannot make " + file.string());
    }
    setContent(descriptor, content);
    return descriptor;
}

std::string Unit::run(const std::function<void()>& action) const {
    leaveUnitOnAbort();
    ::dup2(output_.number(), STDOUT_FILENO);
    ::dup2(output_.number(), STDERR_FILENO);
    inside().root.emplace(root_);
    const int next = nextDescriptor();
    action();
    requireSame("the next free descriptor", next, nextDescriptor());
    leaveUnit();

    std::string written(static_cast<std::size_t>(::lseek(output_.number(), 0, SEEK_CUR)), '\0');
    if (!written.empty()) {
        const ssize_t got = ::pread(output_.number(), written.data(), written.size(), 0);
        requireSame("bytes of the outputs", static_cast<std::int64_t>(written.size()), got);
        ::lseek(output_.number(), 0, SEEK_SET);
    }
    return written;
}

void setContent(const kit::Descriptor& file, std::string_view bytes) {
    if (::ftruncate(file.number(), 0) != 0 || ::pwrite(file.number(), bytes.data(), bytes.size(),
                                                       0) != static_cast<ssize_t>(bytes.size())) {
        throw kit::systemError("cannot write a file of the unit");
    }
}

std::string contentOf(const std::filesystem::path& path) {
    const kit::Descriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
    const off_t size = ::lseek(file.number(), 0, SEEK_END);
    if (size < 0) {
        fail("an expected file", path.string(), "none");
    }
    std::string content(static_cast<std::size_t>(size), '\0');
    requireSame("bytes read", size, ::pread(file.number(), content.data(), content.size(), 0));
    return content;
}

std::string_view inputText(const std::uint8_t* data, std::size_t size) {
    return {reinterpret_cast<const char*>(data), size};
}

std::string_view take(std::string_view& input, std::size_t count) {
    const std::string_view taken = input.substr(0, count);
    input.remove_prefix(taken.size());
    return taken;
}

void fail(const std::string& what, std::string_view expected, std::string_view found) {
    leaveUnit();
    (void)std::fprintf(stderr, "%s\nexpected: \"%s\"\nfound:    \"%s\"\n", what.c_str(),
                       escaped(expected).c_str(), escaped(found).c_str());
    std::abort();
}

void requireEqual(const char* what, std::string_view expected, std::string_view found) {
    if (expected != found) {
        fail(what, expected, found);
    }
}

void requireSame(const char* what, std::int64_t expected, std::int64_t found) {
    if (expected != found) {
        fail(what, std::to_string(expected), std::to_string(found));
    }
}

} // namespace orvane::fuzz

/// The sanitizers' runtimes call this before a report.
void __asan_on_error() { // NOLINT(readability-identifier-naming): the runtime's name
    orvane::fuzz::leaveUnit();
}

extern "C" void
__ubsan_on_report();       // NOLINT(bugprone-reserved-identifier,cert-dcl37-c,cert-dcl51-cpp)
void __ubsan_on_report() { // NOLINT(bugprone-reserved-identifier,cert-dcl37-c,cert-dcl51-cpp)
    orvane::fuzz::leaveUnit();
}
