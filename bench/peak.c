// SPDX-License-Identifier: Apache-2.0
//
// peak ROOT WORD...: runs the command in ROOT and prints the most memory, in KiB, that one of its
// processes ever had resident. It asks the system just before each process ends: the figure that a
// parent gets afterwards includes the parent's own pages, which a child has before it starts.
#include <fcntl.h>
#include <signal.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/ptrace.h>
#include <sys/wait.h>
#include <unistd.h>

enum { FAILED = 125, STATUS_SIZE = 8192 };

static void fail(const char* what) {
    perror(what);
    exit(FAILED);
}

// VmHWM of a process that is about to end, in KiB.
static long peak_of(int proc, pid_t process) {
    char path[32];
    char status[STATUS_SIZE];
    snprintf(path, sizeof path, "%d/status", (int)process);
    const int file = openat(proc, path, O_RDONLY);
    const ssize_t length = file == -1 ? -1 : read(file, status, sizeof status - 1);
    if (length == -1) {
        fail(path);
    }
    close(file);
    status[length] = '\0';
    const char* const line = strstr(status, "VmHWM:");
    return line == NULL ? 0 : strtol(line + strlen("VmHWM:"), NULL, 10);
}

int main(int argc, char** argv) {
    static char* const ENVIRONMENT[] = {"PATH=/bin", NULL};
    const int proc = open("/proc", O_RDONLY | O_DIRECTORY);
    if (argc < 3 || proc == -1) {
        fputs("usage: peak ROOT WORD..., with /proc\n", stderr);
        return FAILED;
    }
    const pid_t child = fork();
    if (child == 0) {
        if (chroot(argv[1]) != 0 || chdir("/") != 0) {
            fail(argv[1]);
        }
        ptrace(PTRACE_TRACEME, 0, NULL, NULL);
        raise(SIGSTOP);
        execve(argv[2], argv + 2, ENVIRONMENT);
        fail(argv[2]);
    }
    int status = 0;
    if (waitpid(child, &status, 0) != child || !WIFSTOPPED(status)) {
        fail("child");
    }
    const long options = PTRACE_O_TRACEEXIT | PTRACE_O_TRACEFORK | PTRACE_O_TRACEVFORK |
                         PTRACE_O_TRACECLONE | PTRACE_O_EXITKILL;
    if (ptrace(PTRACE_SETOPTIONS, child, NULL, options) != 0) {
        fail("ptrace");
    }
    ptrace(PTRACE_CONT, child, NULL, NULL);

    long peak = 0;
    int is_done = 0;
    for (pid_t stopped = waitpid(-1, &status, __WALL); stopped > 0;
         stopped = waitpid(-1, &status, __WALL)) {
        if (!WIFSTOPPED(status)) {
            is_done |= stopped == child && WIFEXITED(status) && WEXITSTATUS(status) == 0;
            continue;
        }
        if (status >> 8 == (SIGTRAP | PTRACE_EVENT_EXIT << 8)) {
            const long own = peak_of(proc, stopped);
            peak = own > peak ? own : peak;
        }
        const int signal = WSTOPSIG(status);
        const int is_ours = signal == SIGTRAP || signal == SIGSTOP;
        ptrace(PTRACE_CONT, stopped, NULL, is_ours ? 0L : (long)signal);
    }
    printf("%ld\n", peak);
    return is_done ? 0 : FAILED;
}
