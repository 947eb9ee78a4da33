#include "platform/linux/DetachedProgram.h"

#include "platform/linux/Descriptor.h"

#include <array>
#include <cstring>

#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

namespace platform {

namespace {

    // Between fork and exec only what POSIX calls async-signal-safe may be called: another thread of the parent may
    // have held any lock.
    [[noreturn]] void become(char* const* arguments, const char* workingFolder, int channel, int problemPipe)
    {
        sigset_t none;
        sigemptyset(&none);
        sigprocmask(SIG_SETMASK, &none, nullptr);
        for (int number = 1; number < NSIG; ++number)
            signal(number, SIG_DFL);
        const int nowhere = open("/dev/null", O_RDWR);
        for (int standard = 0; nowhere >= 0 && standard <= 2; ++standard)
            dup2(standard < 2 && channel >= 0 ? channel : nowhere, standard);
        // Nobody here may be kept waiting by what the program holds. Without the call an older kernel leaves it so.
        close_range(STDERR_FILENO + 1, ~0U, CLOSE_RANGE_CLOEXEC);
        int problem = 0;
        if (chdir(workingFolder) == -1)
            problem = errno;
        if (problem == 0) {
            execvp(arguments[0], arguments);
            problem = errno;
        }
        static_cast<void>(!write(problemPipe, &problem, sizeof(problem)));
        _exit(127);
    }

    int problemReadFrom(int pipe)
    {
        int problem = 0;
        const auto count = uninterrupted([&] { return read(pipe, &problem, sizeof(problem)); });
        return count == static_cast<ssize_t>(sizeof(problem)) ? problem : 0;
    }

} // namespace

std::string startDetachedProgram(
    const std::vector<std::string>& arguments, const std::string& workingFolder, int channel)
{
    if (arguments.empty())
        return "no program is named";
    std::vector<char*> texts;
    texts.reserve(arguments.size() + 1);
    for (const std::string& argument : arguments)
        texts.push_back(const_cast<char*>(argument.c_str()));
    texts.push_back(nullptr);
    std::array<int, 2> ends {};
    if (pipe2(ends.data(), O_CLOEXEC) == -1)
        return std::strerror(errno);
    const Descriptor reading(ends[0]);
    Descriptor writing(ends[1]);
    const char* const folder = workingFolder.empty() ? "/" : workingFolder.c_str();

    // The child ends at once, so that the program is nobody's child here and leaves no zombie.
    const pid_t child = fork();
    if (child == -1)
        return std::strerror(errno);
    if (child == 0) {
        setsid();
        const pid_t grandchild = fork();
        if (grandchild == 0)
            become(texts.data(), folder, channel, ends[1]);
        if (grandchild == -1) {
            const int problem = errno;
            static_cast<void>(!write(ends[1], &problem, sizeof(problem)));
        }
        _exit(0);
    }
    writing = Descriptor();
    uninterrupted([&] { return waitpid(child, nullptr, 0); });
    const int problem = problemReadFrom(reading.number());
    return problem == 0 ? std::string() : arguments.front() + ": " + std::strerror(problem);
}

} // namespace platform
