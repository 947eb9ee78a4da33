#include "tests/apps/ProgramRun.h"

#include "apps/common/ChildProcess.h"

#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <string_view>

#include <fcntl.h>
#include <poll.h>
#include <pty.h>
#include <sys/wait.h>
#include <unistd.h>

namespace tests {
namespace {

    constexpr int longestWait = 60'000; // milliseconds; only a failure reaches it

    struct Descriptors {
        int output = -1;
        int errors = -1;
    };

    std::string assignment(std::string_view name, std::string_view value)
    {
        std::string text(name);
        return text.append("=").append(value);
    }

    /// Of two values for one variable the first holds.
    std::vector<std::string> environmentOf(const RunWishes& wishes, const std::string& term)
    {
        std::vector<std::string> variables;
        for (const auto& [name, value] : wishes.environment)
            variables.push_back(assignment(name, value));
        for (const char* always : { "LC_ALL=C", "TZ=UTC", "HOME=/nonexistent", "PATH=/usr/bin:/bin" })
            variables.emplace_back(always);
        variables.push_back(assignment("TERM", term));
        for (const char* name : { "ASAN_OPTIONS", "UBSAN_OPTIONS", "TSAN_OPTIONS" }) {
            if (const char* value = std::getenv(name))
                variables.push_back(assignment(name, value));
        }
        return variables;
    }

    pid_t start(const RunWishes& wishes, const std::string& term, Descriptors descriptors)
    {
        std::vector<std::string> words { wishes.program.empty() ? OMBRIX_PROGRAM : wishes.program };
        words.insert(words.end(), wishes.arguments.begin(), wishes.arguments.end());
        std::vector<std::string> variables = environmentOf(wishes, term);
        const std::vector<char*> arguments = apps::pointersTo(words);
        const std::vector<char*> environment = apps::pointersTo(variables);
        const char* input = wishes.inputFile.empty() ? "/dev/null" : wishes.inputFile.c_str();
        const pid_t child = ::fork();
        if (child == 0) {
            ::dup2(::open(input, O_RDONLY), 0);
            ::dup2(descriptors.output, 1);
            ::dup2(descriptors.errors, 2);
            ::close_range(3, ~0U, 0);
            ::execve(arguments.front(), arguments.data(), environment.data());
            ::_exit(127);
        }
        return child;
    }

    /// Reads what is there; false once the other side is closed. A terminal says so by an error.
    bool readSome(int descriptor, std::string& text)
    {
        std::array<char, 65536> bytes;
        const ssize_t count = ::read(descriptor, bytes.data(), bytes.size());
        if (count > 0)
            text.append(bytes.data(), static_cast<std::size_t>(count));
        return count > 0 || (count < 0 && errno == EINTR);
    }

    int statusOf(pid_t child)
    {
        int status = 0;
        while (::waitpid(child, &status, 0) < 0 && errno == EINTR) { }
        return WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
    }

    /// Reads both sides until they are closed, and sends the signal when its time has come.
    void readAll(ProgramRun& run, Descriptors from, pid_t child, const TerminalWishes& terminal)
    {
        bool isSignalled = terminal.signal == 0;
        std::array<pollfd, 2> sides { { { from.output, POLLIN, 0 }, { from.errors, POLLIN, 0 } } };
        std::array<std::string*, 2> texts { &run.output, &run.errors };
        while (sides[0].fd >= 0 || sides[1].fd >= 0) {
            if (::poll(sides.data(), sides.size(), longestWait) <= 0) {
                ::kill(child, SIGKILL);
                return;
            }
            for (std::size_t side = 0; side < sides.size(); ++side) {
                if (sides[side].fd >= 0 && sides[side].revents != 0 && !readSome(sides[side].fd, *texts[side]))
                    sides[side].fd = -1;
                if (!isSignalled && texts[side]->find(terminal.sendSignalAfter) != std::string::npos) {
                    ::kill(child, terminal.signal);
                    isSignalled = true;
                }
            }
        }
    }

    std::string withoutReturns(const std::string& text)
    {
        std::string result;
        for (std::size_t index = 0; index < text.size(); ++index) {
            if (text.compare(index, 2, "\r\n") != 0)
                result += text[index];
        }
        return result;
    }

    struct Pipe {
        Pipe()
        {
            if (::pipe(ends.data()) != 0)
                std::abort();
        }
        std::array<int, 2> ends {};
    };

    struct Terminal {
        explicit Terminal(const TerminalWishes& wishes)
        {
            winsize size { static_cast<unsigned short>(wishes.lines), static_cast<unsigned short>(wishes.columns), 0,
                0 };
            if (::openpty(&ours, &theirs, nullptr, nullptr, &size) != 0)
                std::abort();
        }
        int ours = -1;
        int theirs = -1;
    };

} // namespace

ProgramRun runProgram(const RunWishes& wishes)
{
    const Pipe output;
    const Pipe errors;
    const int file = wishes.outputFile.empty() ? -1 : ::open(wishes.outputFile.c_str(), O_WRONLY);
    const pid_t child = start(wishes, "dumb", { file >= 0 ? file : output.ends[1], errors.ends[1] });
    ::close(output.ends[1]);
    ::close(errors.ends[1]);
    ProgramRun run;
    readAll(run, { output.ends[0], errors.ends[0] }, child, {});
    run.status = statusOf(child);
    for (const int descriptor : { output.ends[0], errors.ends[0] })
        ::close(descriptor);
    if (file >= 0)
        ::close(file);
    return run;
}

ProgramRun runProgramForNobody(const RunWishes& wishes)
{
    const Pipe output;
    const Pipe errors;
    ::close(output.ends[0]);
    const pid_t child = start(wishes, "dumb", { output.ends[1], errors.ends[1] });
    ::close(output.ends[1]);
    ::close(errors.ends[1]);
    ProgramRun run;
    readAll(run, { -1, errors.ends[0] }, child, {});
    run.status = statusOf(child);
    ::close(errors.ends[0]);
    return run;
}

ProgramRun runOnTerminal(const RunWishes& wishes, const TerminalWishes& terminal)
{
    const Terminal sides(terminal);
    const pid_t child = start(wishes, terminal.type, { sides.theirs, sides.theirs });
    ::close(sides.theirs);
    ProgramRun run;
    readAll(run, { sides.ours, -1 }, child, terminal);
    run.status = statusOf(child);
    ::close(sides.ours);
    run.output = withoutReturns(run.output);
    return run;
}

ProgramRun runWithErrorsOnTerminal(const RunWishes& wishes, const TerminalWishes& terminal)
{
    const Terminal sides(terminal);
    const Pipe output;
    const pid_t child = start(wishes, terminal.type, { output.ends[1], sides.theirs });
    ::close(sides.theirs);
    ::close(output.ends[1]);
    ProgramRun run;
    readAll(run, { output.ends[0], sides.ours }, child, terminal);
    run.status = statusOf(child);
    ::close(sides.ours);
    ::close(output.ends[0]);
    run.errors = withoutReturns(run.errors);
    return run;
}

RunningProgram::RunningProgram(const RunWishes& wishes)
{
    const Pipe output;
    const Pipe errors;
    _child = start(wishes, "dumb", { output.ends[1], errors.ends[1] });
    ::close(output.ends[1]);
    ::close(errors.ends[1]);
    _output = output.ends[0];
    _errors = errors.ends[0];
}

RunningProgram::~RunningProgram()
{
    if (_child >= 0)
        end(SIGKILL);
}

bool RunningProgram::prints(const std::string& text)
{
    while (_run.output.find(text) == std::string::npos) {
        pollfd side { _output, POLLIN, 0 };
        if (::poll(&side, 1, longestWait) <= 0 || !readSome(_output, _run.output))
            return false;
    }
    return true;
}

std::string RunningProgram::workingFolder() const
{
    return std::filesystem::read_symlink("/proc/" + std::to_string(_child) + "/cwd").string();
}

void RunningProgram::stop() const
{
    ::kill(_child, SIGSTOP);
    int status = 0;
    while (::waitpid(_child, &status, WUNTRACED) < 0 && errno == EINTR) { }
}

void RunningProgram::goOn() const
{
    ::kill(_child, SIGCONT);
}

void RunningProgram::stopReading()
{
    ::close(std::exchange(_output, -1));
}

ProgramRun RunningProgram::end(int signal)
{
    if (signal != 0)
        ::kill(_child, signal);
    readAll(_run, { _output, _errors }, _child, {});
    _run.status = statusOf(std::exchange(_child, -1));
    for (const int descriptor : { _output, _errors }) {
        if (descriptor >= 0)
            ::close(descriptor);
    }
    return _run;
}

} // namespace tests
