#include "apps/common/ChildProcess.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <memory>
#include <utility>

#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

namespace apps {
namespace {

    using Time = std::chrono::steady_clock::time_point;
    using std::chrono::milliseconds;

    struct Pipe {
        Pipe() { (void)::pipe2(ends.data(), O_CLOEXEC); }
        ~Pipe()
        {
            closeEnd(0);
            closeEnd(1);
        }
        Pipe(const Pipe&) = delete;
        Pipe& operator=(const Pipe&) = delete;
        bool isOpen() const { return ends[0] >= 0; }
        void closeEnd(std::size_t end)
        {
            if (const int descriptor = std::exchange(ends[end], -1); descriptor >= 0)
                ::close(descriptor);
        }

        std::array<int, 2> ends { -1, -1 };
    };

    /// How a child gets its descriptors and signals: none held, those that end it doing so.
    class SpawnManner {
    public:
        SpawnManner(int output, int errors)
        {
            ::posix_spawn_file_actions_init(&files);
            ::posix_spawn_file_actions_addopen(&files, 0, "/dev/null", O_RDONLY, 0);
            ::posix_spawn_file_actions_adddup2(&files, output, 1);
            ::posix_spawn_file_actions_adddup2(&files, errors, 2);
            sigset_t signals;
            sigemptyset(&signals);
            ::posix_spawnattr_init(&attributes);
            ::posix_spawnattr_setsigmask(&attributes, &signals);
            sigaddset(&signals, SIGPIPE);
            ::posix_spawnattr_setsigdefault(&attributes, &signals);
            ::posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF);
        }
        ~SpawnManner()
        {
            ::posix_spawnattr_destroy(&attributes);
            ::posix_spawn_file_actions_destroy(&files);
        }
        SpawnManner(const SpawnManner&) = delete;
        SpawnManner& operator=(const SpawnManner&) = delete;

        posix_spawn_file_actions_t files {};
        posix_spawnattr_t attributes {};
    };

    class Child {
    public:
        Child(const ChildWishes& wishes, ChildAnswer& answer)
            : _answer(answer)
        {
            std::vector<std::string> words { wishes.program };
            words.insert(words.end(), wishes.arguments.begin(), wishes.arguments.end());
            if (wishes.limit)
                _deadline = std::chrono::steady_clock::now() + *wishes.limit;
            const SpawnManner manner(_pipes[0].ends[1], _pipes[1].ends[1]);
            const bool isStarted = _pipes[0].isOpen() && _pipes[1].isOpen()
                && ::posix_spawn(&_process, wishes.program.c_str(), &manner.files, &manner.attributes,
                       pointersTo(words).data(), environ)
                    == 0;
            for (Pipe& pipe : _pipes) {
                pipe.closeEnd(1);
                if (!isStarted)
                    pipe.closeEnd(0);
            }
            _hasEnded = !isStarted;
        }

        bool hasEnded() const { return _hasEnded; }

        /// What to wait for: a closed side is -1, which is waited for in vain.
        std::array<pollfd, 2> sides() const
        {
            return { { { _pipes[0].ends[0], POLLIN, 0 }, { _pipes[1].ends[0], POLLIN, 0 } } };
        }

        std::optional<Time> deadline() const { return _deadline; }

        void readSide(std::size_t side)
        {
            std::array<char, 65536> bytes;
            const ssize_t count = ::read(_pipes[side].ends[0], bytes.data(), bytes.size());
            if (count > 0)
                (side == 0 ? _answer.output : _answer.errors).append(bytes.data(), static_cast<std::size_t>(count));
            else if (count == 0 || errno != EINTR)
                _pipes[side].closeEnd(0);
            if (!_pipes[0].isOpen() && !_pipes[1].isOpen())
                takeStatus();
        }

        void endWhenLate(Time now)
        {
            if (_hasEnded || !_deadline || now < *_deadline)
                return;
            ::kill(_process, SIGKILL);
            (void)::waitpid(_process, nullptr, WNOHANG);
            _answer.end = ChildAnswer::End::silent;
            _hasEnded = true;
        }

    private:
        void takeStatus()
        {
            int status = 0;
            while (::waitpid(_process, &status, 0) < 0 && errno == EINTR) { }
            _answer.end = WIFEXITED(status) ? ChildAnswer::End::exited : ChildAnswer::End::killed;
            _answer.status = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
            _hasEnded = true;
        }

        ChildAnswer& _answer;
        std::array<Pipe, 2> _pipes {};
        std::optional<Time> _deadline {};
        pid_t _process = -1;
        bool _hasEnded = false;
    };

    using Children = std::vector<std::unique_ptr<Child>>;

    int millisecondsToNextDeadline(const Children& children)
    {
        std::optional<Time> next;
        for (const auto& child : children) {
            if (child->deadline())
                next = next ? std::min(*next, *child->deadline()) : child->deadline();
        }
        if (!next)
            return -1;
        const auto left = std::chrono::ceil<milliseconds>(*next - std::chrono::steady_clock::now());
        return static_cast<int>(std::max<milliseconds::rep>(left.count(), 0));
    }

    /// Waits until a child has something to say or is late.
    void attendTo(const Children& children)
    {
        std::vector<pollfd> sides;
        for (const auto& child : children) {
            for (const pollfd& side : child->sides())
                sides.push_back(side);
        }
        (void)::poll(sides.data(), sides.size(), millisecondsToNextDeadline(children));
        for (std::size_t index = 0; index < sides.size(); ++index) {
            if (sides[index].fd >= 0 && sides[index].revents != 0)
                children[index / 2]->readSide(index % 2);
        }
        for (const auto& child : children)
            child->endWhenLate(std::chrono::steady_clock::now());
    }

} // namespace

std::vector<ChildAnswer> runChildren(const std::vector<ChildWishes>& wishes, std::size_t atOnce)
{
    std::vector<ChildAnswer> answers(wishes.size());
    Children children;
    std::size_t started = 0;
    while (started < wishes.size() || !children.empty()) {
        for (; started < wishes.size() && children.size() < atOnce; ++started)
            children.push_back(std::make_unique<Child>(wishes[started], answers[started]));
        std::erase_if(children, [](const auto& child) { return child->hasEnded(); });
        if (children.empty())
            continue;
        attendTo(children);
        std::erase_if(children, [](const auto& child) { return child->hasEnded(); });
    }
    return answers;
}

std::vector<char*> pointersTo(std::vector<std::string>& texts)
{
    std::vector<char*> pointers;
    pointers.reserve(texts.size() + 1);
    for (std::string& text : texts)
        pointers.push_back(text.data());
    pointers.push_back(nullptr);
    return pointers;
}

std::string thisProgram()
{
    std::array<char, 4096> path {};
    const ssize_t length = ::readlink("/proc/self/exe", path.data(), path.size());
    return length > 0 ? std::string(path.data(), static_cast<std::size_t>(length)) : std::string();
}

} // namespace apps
