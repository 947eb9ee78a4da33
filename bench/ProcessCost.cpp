#include <cerrno>
#include <cstdio>
#include <cstring>
#include <ctime>

#include <fcntl.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

// What one run of a program costs, its output thrown away: wall clock, processor and peak memory.
//
// A small program of its own, because a process counts its parent's memory as its own peak until it has replaced
// itself: measured from a script, nothing would ever seem smaller than the script's interpreter.

extern char** environ; // NOLINT(readability-redundant-declaration): POSIX leaves it to the program

namespace {

double secondsNow()
{
    struct timespec now { };
    ::clock_gettime(CLOCK_MONOTONIC, &now);
    return double(now.tv_sec) + double(now.tv_nsec) / 1e9;
}

double secondsOf(const timeval& time)
{
    return double(time.tv_sec) + double(time.tv_usec) / 1e6;
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 2) {
        std::fprintf(stderr, "usage: process_cost PROGRAM [ARGUMENT...]\n");
        return 2;
    }
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    ::posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
    const double start = secondsNow();
    pid_t child = 0;
    const int problem = ::posix_spawn(&child, argv[1], &actions, nullptr, argv + 1, environ);
    ::posix_spawn_file_actions_destroy(&actions);
    int status = 0;
    struct rusage used { };
    if (problem != 0 || ::wait4(child, &status, 0, &used) != child) {
        std::fprintf(stderr, "process_cost: %s: %s\n", argv[1], std::strerror(problem != 0 ? problem : errno));
        return 1;
    }
    const double wall = secondsNow() - start;
    if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) {
        std::fprintf(stderr, "process_cost: %s: did not end well\n", argv[1]);
        return 1;
    }
    std::printf("{\"cpuSeconds\": %.6f, \"wallSeconds\": %.6f, \"peakBytes\": %ld}\n",
        secondsOf(used.ru_utime) + secondsOf(used.ru_stime), wall, used.ru_maxrss * 1024L);
    return 0;
}
