// SPDX-License-Identifier: Apache-2.0
//
// Makes one read or write of a process a short one, for tests:
//
//   short_transfer REPORT NAME NUMBER BYTES COMMAND [ARGUMENT...]
//
// Runs COMMAND and makes its NUMBER-th call of NAME (read, write or writev, counted
// from 1 and from the start of the process) ask for only BYTES bytes, so that the
// kernel really moves no more. REPORT then holds one line, the result of that call,
// and is empty if the call never came. The exit status is COMMAND's, or 125 when the
// command could not be run or followed. x86-64 only.

#include <sys/ptrace.h>
#include <sys/syscall.h>
#include <sys/uio.h>
#include <sys/user.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string_view>

namespace {

constexpr int FAILED = 125;

struct Wanted {
    unsigned long long call;
    unsigned long number;
    unsigned long long bytes;
};

// The only changed word of the process, to restore after the call.
struct ChangedWord {
    std::uintptr_t address = 0;
    long before = 0;
};

int fail(const char* what) {
    static_cast<void>(std::fprintf(stderr, "short_transfer: %s: %s\n", what, std::strerror(errno)));
    return FAILED;
}

bool callOfName(std::string_view name, unsigned long long& call) {
    call = name == "read" ? SYS_read : name == "write" ? SYS_write : SYS_writev;
    return call != SYS_writev || name == "writev";
}

// Shortens a gathered write at the piece in which the bytes run out: it drops the
// pieces after it and changes that piece's length in the process.
ChangedWord shortenPieces(pid_t process, user_regs_struct& registers, unsigned long long bytes) {
    ChangedWord changed;
    for (unsigned long long piece = 0; piece < registers.rdx; ++piece) {
        const std::uintptr_t address =
            registers.rsi + piece * sizeof(iovec) + offsetof(iovec, iov_len);
        const long length = ptrace(PTRACE_PEEKDATA, process, address, nullptr);
        if (static_cast<unsigned long long>(length) >= bytes) {
            changed = {address, length};
            ptrace(PTRACE_POKEDATA, process, address, bytes);
            registers.rdx = piece + 1;
            break;
        }
        bytes -= static_cast<unsigned long long>(length);
    }
    return changed;
}

// Called at the entry of the wanted call. Returns when the call has ended.
bool shorten(pid_t process, const Wanted& wanted, std::FILE* report) {
    user_regs_struct registers{};
    if (ptrace(PTRACE_GETREGS, process, nullptr, &registers) == -1) {
        return false;
    }
    const unsigned long long asked = registers.rdx;
    ChangedWord changed;
    if (wanted.call == SYS_writev) {
        changed = shortenPieces(process, registers, wanted.bytes);
    } else {
        registers.rdx = wanted.bytes;
    }
    int status = 0;
    if (ptrace(PTRACE_SETREGS, process, nullptr, &registers) == -1 ||
        ptrace(PTRACE_SYSCALL, process, nullptr, nullptr) == -1 ||
        waitpid(process, &status, 0) == -1 || !WIFSTOPPED(status) ||
        ptrace(PTRACE_GETREGS, process, nullptr, &registers) == -1) {
        return false;
    }
    static_cast<void>(std::fprintf(report, "%lld\n", static_cast<long long>(registers.rax)));
    registers.rdx = asked;
    if (changed.address != 0) {
        ptrace(PTRACE_POKEDATA, process, changed.address, changed.before);
    }
    return ptrace(PTRACE_SETREGS, process, nullptr, &registers) != -1;
}

int follow(pid_t process, const Wanted& wanted, std::FILE* report) {
    unsigned long count = 0;
    bool entry = true;
    int status = 0;
    // The first stop is at the end of exec; from there on each call stops twice.
    while (waitpid(process, &status, 0) != -1 && WIFSTOPPED(status)) {
        const int signal = WSTOPSIG(status);
        const bool isCall = signal == (SIGTRAP | 0x80);
        if (isCall && entry) {
            user_regs_struct registers{};
            if (ptrace(PTRACE_GETREGS, process, nullptr, &registers) == -1) {
                return fail("registers");
            }
            if (registers.orig_rax == wanted.call && ++count == wanted.number) {
                if (!shorten(process, wanted, report)) {
                    return fail("call");
                }
                entry = false;
            }
        }
        if (isCall) {
            entry = !entry;
        }
        const int deliver = isCall || signal == SIGTRAP ? 0 : signal;
        ptrace(PTRACE_SETOPTIONS, process, nullptr, PTRACE_O_TRACESYSGOOD | PTRACE_O_EXITKILL);
        if (ptrace(PTRACE_SYSCALL, process, nullptr, deliver) == -1) {
            return fail("ptrace");
        }
    }
    return WIFEXITED(status) ? WEXITSTATUS(status) : FAILED;
}

} // namespace

int main(int argc, char** argv) {
    Wanted wanted{};
    if (argc < 6 || !callOfName(argv[2], wanted.call)) {
        static_cast<void>(std::fprintf(
            stderr, "usage: short_transfer REPORT read|write|writev NUMBER BYTES COMMAND...\n"));
        return FAILED;
    }
    wanted.number = std::strtoul(argv[3], nullptr, 10);
    wanted.bytes = std::strtoull(argv[4], nullptr, 10);
    std::FILE* report = std::fopen(argv[1], "we");
    if (report == nullptr) {
        return fail(argv[1]);
    }
    const pid_t process = fork();
    if (process == 0) {
        ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
        execv(argv[5], argv + 5);
        _exit(fail(argv[5]));
    }
    const int status = process == -1 ? fail("fork") : follow(process, wanted, report);
    return std::fclose(report) == 0 ? status : fail(argv[1]);
}
