// SPDX-License-Identifier: Apache-2.0
//
// interleave ROOT RUNS WARM_UP COMMAND...: runs every COMMAND once a round, in ROOT, and prints a
// line for each counted run: the command's index, wall time in nanoseconds, page faults, exit
// status. Each round has a different order, so that the contents of the caches help or harm all
// commands alike. A COMMAND is words with single blanks between them; "> FILE" at its end takes
// its output. This program is small and static, so that starting a child costs the same little for
// every command.
#include <errno.h>
#include <fcntl.h>
#include <spawn.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

enum { MAX_COMMANDS = 32, MAX_WORDS = 16, FAILED = 125 };

struct command {
    char* words[MAX_WORDS + 1];
    const char* output; // or null
};

static struct command commands[MAX_COMMANDS];
static char* const ENVIRONMENT[] = {"PATH=/bin", NULL};

static void fail(const char* what) {
    perror(what);
    exit(FAILED);
}

static struct command parse(char* text) {
    struct command command = {{NULL}, NULL};
    int count = 0;
    for (char* word = strtok(text, " "); word != NULL; word = strtok(NULL, " ")) {
        if (strcmp(word, ">") == 0) {
            command.output = strtok(NULL, " ");
        } else if (count < MAX_WORDS) {
            command.words[count++] = word;
        }
    }
    if (count == 0) {
        fputs("interleave: an empty command\n", stderr);
        exit(FAILED);
    }
    return command;
}

static long long now(void) {
    struct timespec time;
    if (clock_gettime(CLOCK_MONOTONIC, &time) != 0) {
        fail("clock_gettime");
    }
    return time.tv_sec * 1000000000LL + time.tv_nsec;
}

static pid_t start(const struct command* command) {
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    if (command->output != NULL) {
        posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, command->output,
                                         O_WRONLY | O_CREAT | O_TRUNC, 0666);
    }
    pid_t child = -1;
    errno = posix_spawn(&child, command->words[0], &actions, NULL, command->words, ENVIRONMENT);
    if (errno != 0) {
        fail(command->words[0]);
    }
    posix_spawn_file_actions_destroy(&actions);
    return child;
}

static void run(int index, int is_counted) {
    struct rusage usage;
    int status = 0;
    const long long begin = now();
    const pid_t child = start(&commands[index]);
    if (wait4(child, &status, 0, &usage) != child) {
        fail(commands[index].words[0]);
    }
    const long long end = now();
    if (is_counted) {
        printf("%d %lld %ld %d\n", index, end - begin, usage.ru_minflt + usage.ru_majflt,
               WIFEXITED(status) ? WEXITSTATUS(status) : FAILED);
    }
}

// The same orders in every benchmark.
static void shuffle(int* order, int count) {
    for (int left = count; left > 1; --left) {
        const int other = rand() % left;
        const int last = order[left - 1];
        order[left - 1] = order[other];
        order[other] = last;
    }
}

int main(int argc, char** argv) {
    int order[MAX_COMMANDS];
    const int count = argc - 4;
    if (count < 1 || count > MAX_COMMANDS) {
        fputs("usage: interleave ROOT RUNS WARM_UP COMMAND...\n", stderr);
        return FAILED;
    }
    const long runs = strtol(argv[2], NULL, 10);
    const long warm_up = strtol(argv[3], NULL, 10);
    for (int index = 0; index < count; ++index) {
        commands[index] = parse(argv[4 + index]);
        order[index] = index;
    }
    if (chroot(argv[1]) != 0 || chdir("/") != 0) {
        fail(argv[1]);
    }
    for (long number = 0; number < warm_up + runs; ++number) {
        shuffle(order, count);
        for (int position = 0; position < count; ++position) {
            run(order[position], number >= warm_up);
        }
    }
    return 0;
}
