// SPDX-License-Identifier: Apache-2.0
#include "tests/support/trace.h"

#include "kit/enter/captured_run.h"
#include "tests/support/host_command.h"
#include "tests/support/temporary_folder.h"
#include "tests/support/unit_test.h"

#include <fstream>
#include <map>
#include <regex>

namespace orvane::test {

namespace fs = std::filesystem;

namespace {

/// One line of strace: name(arguments) = result.
struct Call {
    std::string name;
    std::vector<std::string> arguments;
    long result = -1;
    std::string text; ///< the result as printed: an address does not fit a number everywhere
};

bool parseCall(const std::string& line, Call& call) {
    static const std::regex shape(R"re((\w+)\((.*)\)\s+= (\S+).*)re");
    static const std::regex argument(R"re("(?:[^"\\]|\\.)*"(?:\.\.\.)?|[^,\s][^,]*)re");
    std::smatch parts;
    if (!std::regex_match(line, parts, shape)) {
        return false;
    }
    call.name = parts[1];
    const std::string list = parts[2];
    call.arguments.clear();
    for (std::sregex_iterator at(list.begin(), list.end(), argument), end; at != end; ++at) {
        call.arguments.push_back(at->str());
    }
    call.text = parts[3];
    call.result = call.text.rfind("0x", 0) == 0 ? 0 : std::stol(call.text);
    return true;
}

std::vector<std::string> readTraceLines(const fs::path& file) {
    std::ifstream text(file);
    std::vector<std::string> lines;
    for (std::string line; std::getline(text, line);) {
        lines.push_back(line);
    }
    return lines;
}

/// The lines of the process that changed its root, starting with the program that it then executed.
std::vector<std::string> productLines(const fs::path& folder) {
    for (const fs::directory_entry& entry : fs::directory_iterator(folder)) {
        const std::vector<std::string> lines = readTraceLines(entry.path());
        bool isInside = false;
        for (std::size_t at = 0; at < lines.size(); ++at) {
            isInside = isInside || lines[at].rfind("chroot(", 0) == 0;
            if (isInside && lines[at].rfind("execve", 0) == 0) {
                return {lines.begin() + static_cast<std::ptrdiff_t>(at) + 1, lines.end()};
            }
        }
    }
    ADD_FAILURE() << "strace saw no process enter the unit and execute the product";
    return {};
}

std::string openVerb(const std::string& flags) {
    const auto has = [&flags](const char* flag) { return flags.find(flag) != std::string::npos; };
    if (has("O_DIRECTORY")) {
        return "list ";
    }
    if (has("O_WRONLY") && has("O_CREAT") && has("O_TRUNC")) {
        return "create ";
    }
    return has("O_RDONLY") ? "read " : "open " + flags + " ";
}

class Recorder {
public:
    void record(const Call& call) {
        if (call.name == "open" || call.name == "openat") {
            recordOpen(call);
        } else if (call.name == "mmap" || call.name == "mmap2") {
            recordMap(call);
        } else if (call.name == "munmap") {
            recordUnmap(call.arguments.at(0));
        } else if (const auto file = files_.find(call.arguments.at(0)); file != files_.end()) {
            recordOnFile(call, file->second);
        }
    }

    Trace finish() {
        for (const auto& [descriptor, path] : files_) {
            trace_.leftOpen.push_back(path);
        }
        return trace_;
    }

private:
    void recordOpen(const Call& call) {
        const std::size_t at = call.name == "open" ? 0 : 1;
        const std::string quoted = call.arguments.at(at);
        const std::string path = quoted.substr(1, quoted.size() - 2);
        if (path.rfind("/fs/", 0) != 0 && path.rfind("/tmp", 0) != 0 && path != DISK_PATH) {
            return;
        }
        const std::string verb = openVerb(call.arguments.at(at + 1));
        trace_.operations.push_back(verb + path + (call.result < 0 ? " failed" : ""));
        if (call.result >= 0) {
            files_[call.text] = path;
        }
    }

    void recordMap(const Call& call) {
        const auto file = files_.find(call.arguments.at(4));
        if (file != files_.end()) {
            trace_.operations.push_back("map " + file->second + " " + call.arguments.at(1));
            mappings_[call.text] = file->second;
        } else if (call.arguments.at(2) == "PROT_NONE") {
            recordUnmap(call.arguments.at(0)); // how an emulator gives guest memory back
        }
    }

    void recordUnmap(const std::string& address) {
        const auto mapping = mappings_.find(address);
        if (mapping != mappings_.end()) {
            trace_.operations.push_back("unmap " + mapping->second);
            mappings_.erase(mapping);
        }
    }

    void recordOnFile(const Call& call, const std::string& path) {
        const bool isRaw = path == IMAGE_PATH || path == DISK_PATH;
        if (call.name == "lseek" && isRaw) {
            trace_.operations.push_back("seek " + path + " " + call.arguments.at(1) + " " +
                                        call.arguments.at(2));
        } else if (call.name == "read" && isRaw) {
            trace_.operations.push_back("get " + path + " " + call.arguments.at(2));
        } else if (call.name == "write" || call.name == "writev") {
            trace_.operations.push_back("put " + path + " " + call.text);
        } else if (call.name == "close") {
            trace_.operations.push_back("close " + path);
            files_.erase(call.arguments.at(0));
        }
    }

    Trace trace_;
    std::map<std::string, std::string> files_;    ///< by descriptor
    std::map<std::string, std::string> mappings_; ///< by address
};

/// For strace.
constexpr char CALLS[] = "trace=chroot,execve,execveat,open,openat,lseek,mmap,munmap,read,write,"
                         "writev,close,exit_group";

} // namespace

Trace traceRun(const fs::path& root, const std::vector<std::string>& arguments) {
    const TemporaryFolder folder;
    std::vector<std::string> command = {"strace",
                                        "-E", // LeakSanitizer would trace the process as well
                                        "ASAN_OPTIONS=detect_leaks=0",
                                        "-ff",
                                        "-qq",
                                        "-o",
                                        (folder.path() / "process").string(),
                                        "-e",
                                        CALLS};
    for (const std::string& word : buildCommand(ORVANE_ENTER_BINARY)) {
        command.push_back(word);
    }
    command.insert(command.end(), {root.string(), std::string(ORVANE_BINARY)});
    command.insert(command.end(), arguments.begin(), arguments.end());
    fs::create_directory(root / "proc"); // a sanitized product needs the host's there
    const kit::RunResult result = runOnHost(command);
    EXPECT_EQ(result.exitStatus, 0) << result.standardError;

    std::vector<std::string> calls = productLines(folder.path());
    // Without it, the trace was cut, and what is missing in it proves nothing.
    EXPECT_TRUE(!calls.empty() && calls.back().rfind("exit_group(0)", 0) == 0)
        << (calls.empty() ? "no call" : calls.back());
    if (!calls.empty()) {
        calls.pop_back();
    }
    Recorder recorder;
    Call call;
    for (const std::string& line : calls) {
        if (parseCall(line, call)) {
            recorder.record(call);
        }
    }
    return recorder.finish();
}

} // namespace orvane::test
