// SPDX-License-Identifier: Apache-2.0
//
// Does something between two system calls of a program, for tests:
//
//   at_call REPORT NUMBER ACTION LAUNCHER [ARGUMENT...]
//
// LAUNCHER becomes the program by its first exec. When the program is about to make its NUMBER-th
// system call, counted from 1, it is held while the shell runs ACTION, with the program's process
// as $1; with the number 0, nothing is done. REPORT then holds the number of calls that the program
// made. The exit status is the program's, 128 more than the signal that ended it, or 125 when the
// command could not be run or followed.

#include <sys/ptrace.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

constexpr int FAILED = 125;

int fail(const char* what) {
    static_cast<void>(std::fprintf(stderr, "at_call: %s: %s\n", what, std::strerror(errno)));
    return FAILED;
}

bool act(const char* action, pid_t process) {
    const std::string number = std::to_string(process);
    const pid_t shell = fork();
    if (shell == 0) {
        execl("/bin/sh", "sh", "-e", "-c", action, "at_call", number.c_str(), nullptr);
        _exit(FAILED);
    }
    int status = 0;
    return shell != -1 && waitpid(shell, &status, 0) == shell && WIFEXITED(status) &&
           WEXITSTATUS(status) == 0;
}

/// The status of the process at its end. `count` becomes the number of calls of the program.
int follow(pid_t process, unsigned long wanted, const char* action, unsigned long& count) {
    bool isProgram = false;
    bool isEntry = true; // each call stops twice
    int status = 0;
    // The first stop is at the end of the launcher's own exec.
    while (waitpid(process, &status, 0) != -1 && WIFSTOPPED(status)) {
        const int signal = WSTOPSIG(status);
        const bool isCall = signal == (SIGTRAP | 0x80);
        if (status >> 8 == (SIGTRAP | PTRACE_EVENT_EXEC << 8)) {
            isProgram = true; // next is the end of the exec
        } else if (isCall) {
            if (isEntry && isProgram && ++count == wanted && !act(action, process)) {
                return fail("action");
            }
            isEntry = !isEntry;
        }
        const int deliver = isCall || signal == SIGTRAP ? 0 : signal;
        ptrace(PTRACE_SETOPTIONS, process, nullptr,
               PTRACE_O_TRACESYSGOOD | PTRACE_O_EXITKILL | PTRACE_O_TRACEEXEC);
        // A process that the action killed is gone already, which the next wait says.
        if (ptrace(PTRACE_SYSCALL, process, nullptr, deliver) == -1 && errno != ESRCH) {
            return fail("ptrace");
        }
    }
    return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 5) {
        static_cast<void>(
            std::fprintf(stderr, "usage: at_call REPORT NUMBER ACTION LAUNCHER [ARGUMENT...]\n"));
        return FAILED;
    }
    std::FILE* report = std::fopen(argv[1], "we");
    if (report == nullptr) {
        return fail(argv[1]);
    }
    const pid_t process = fork();
    if (process == 0) {
        ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
        execv(argv[4], argv + 4);
        _exit(fail(argv[4]));
    }
    unsigned long count = 0;
    const int status = process == -1
                           ? fail("fork")
                           : follow(process, std::strtoul(argv[2], nullptr, 10), argv[3], count);
    static_cast<void>(std::fprintf(report, "%lu\n", count));
    return std::fclose(report) == 0 ? status : fail(argv[1]);
}
