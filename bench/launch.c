/*
 * launch.c: runs a program many times and prints what each run cost: CPU and wall time in nanoseconds, peak resident
 * memory in KiB. Stops at the first run that fails, and shows its exit status.
 *
 *     launch RUNS STDIN STDOUT FRESH PROGRAM [ARGUMENT...]
 *
 * FRESH is a file that is removed before each run, so that each run creates it. This is written in C because the peak
 * memory of a program begins with that of its parent: an interpreter would hide what small programs take.
 */
#define _DEFAULT_SOURCE
#include <fcntl.h>
#include <spawn.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <time.h>
#include <unistd.h>

extern char **environ;

static long long nanoseconds(void) {
    struct timespec now;
    clock_gettime(CLOCK_MONOTONIC, &now);
    return now.tv_sec * 1000000000LL + now.tv_nsec;
}

static long long cpu_nanoseconds(const struct rusage *usage) {
    long long seconds = usage->ru_utime.tv_sec + usage->ru_stime.tv_sec;
    return seconds * 1000000000LL + (usage->ru_utime.tv_usec + usage->ru_stime.tv_usec) * 1000LL;
}

/* 0, or the status of a run that failed. */
static int run(const posix_spawn_file_actions_t *streams, char **command) {
    struct rusage usage;
    pid_t child = 0;
    int status = 0;
    long long start = nanoseconds();
    if (posix_spawnp(&child, command[0], streams, NULL, command, environ) != 0 || wait4(child, &status, 0, &usage) < 0)
        return 127;
    long long wall = nanoseconds() - start;
    if (status != 0)
        return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    printf("%lld %lld %ld\n", cpu_nanoseconds(&usage), wall, usage.ru_maxrss);
    return 0;
}

int main(int argc, char **argv) {
    if (argc < 6)
        return 2;
    posix_spawn_file_actions_t streams;
    posix_spawn_file_actions_init(&streams);
    posix_spawn_file_actions_addopen(&streams, 0, argv[2], O_RDONLY, 0);
    posix_spawn_file_actions_addopen(&streams, 1, argv[3], O_WRONLY | O_CREAT | O_TRUNC, 0644);
    int failed = 0;
    for (int runs = atoi(argv[1]); runs > 0 && failed == 0; --runs) {
        unlink(argv[4]);
        failed = run(&streams, argv + 5);
    }
    return failed;
}
