#include "apps/common/DesktopClipboard.h"

#include "apps/common/ChildProcess.h"
#include "platform/linux/DetachedProgram.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <utility>

#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

namespace apps {
namespace {

    using std::chrono::steady_clock;
    using Problem = DesktopClipboard::Problem;

    Problem problem(std::string what)
    {
        return { "clipboard", std::move(what) };
    }

    std::string variable(const char* name)
    {
        const char* value = std::getenv(name);
        return value ? value : std::string();
    }

    /// What a person calls the display that the program would open; empty where there is none.
    std::string displayName()
    {
        const std::string compositor = variable("WAYLAND_DISPLAY");
        return compositor.empty() ? variable("DISPLAY") : compositor;
    }

    std::string textOf(ClipboardWord word)
    {
        switch (word) {
        case ClipboardWord::noDisplay:
            return "the display " + displayName() + " cannot be opened";
        case ClipboardWord::refused:
            return "the display " + displayName() + " leaves it to somebody else";
        case ClipboardWord::opened:
        case ClipboardWord::owned:
            break;
        }
        return std::string(clipboardProgramName) + " answered out of turn";
    }

    int millisecondsUntil(steady_clock::time_point deadline)
    {
        const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - steady_clock::now());
        return static_cast<int>(std::max<std::chrono::milliseconds::rep>(left.count(), 0));
    }

} // namespace

std::optional<Problem> DesktopClipboard::start()
{
    const std::string program = std::filesystem::path(thisProgram()).replace_filename(clipboardProgramName).string();
    if (::access(program.c_str(), X_OK) != 0)
        return Problem { program, "the program is not installed (it is built where Debian package qt6-base-dev is)" };
    std::array<int, 2> ends {};
    if (::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends.data()) != 0)
        return problem("no channel to " + program);
    _channel = platform::Descriptor(ends[0]);
    const platform::Descriptor theirs(ends[1]);
    std::string trouble = platform::startDetachedProgram({ program }, "/", theirs.number());
    return trouble.empty() ? std::nullopt : std::optional(problem(std::move(trouble)));
}

std::optional<Problem> DesktopClipboard::open()
{
    if (displayName().empty())
        return problem("there is no display (neither DISPLAY nor WAYLAND_DISPLAY is set)");
    if (std::optional<Problem> trouble = start())
        return trouble;
    return waitFor(ClipboardWord::opened, "did not answer");
}

std::optional<Problem> DesktopClipboard::offer(const std::vector<ClipboardItem>& items)
{
    // Where the program has ended meanwhile, the wait for its answer says so.
    const Time began = steady_clock::now();
    static_cast<void>(send(writtenOffer(items), began + _patience));
    _patience = std::max(_patience - (steady_clock::now() - began), decltype(_patience)());
    if (std::optional<Problem> trouble = waitFor(ClipboardWord::owned, "did not hand it over"))
        return trouble;
    static_cast<void>(send({ &keepClipboard, 1 }, steady_clock::now() + _patience));
    return std::nullopt;
}

std::optional<Problem> DesktopClipboard::waitFor(ClipboardWord wanted, std::string_view late)
{
    const Time began = steady_clock::now();
    if (!waitUntilReady(POLLIN, began + _patience))
        return problem("the display " + displayName() + " " + std::string(late) + " within "
            + std::to_string(clipboardPatience) + " seconds");
    _patience -= steady_clock::now() - began;
    ClipboardWord word {};
    const auto count = platform::uninterrupted([&] { return ::recv(_channel.number(), &word, sizeof(word), 0); });
    if (count != sizeof(word))
        return problem(std::string(clipboardProgramName)
            + " ended at once or lost the display (it needs Debian package libqt6gui6)");
    return word == wanted ? std::nullopt : std::optional(problem(textOf(word)));
}

bool DesktopClipboard::send(std::string_view bytes, Time deadline) const
{
    while (!bytes.empty()) {
        if (!waitUntilReady(POLLOUT, deadline))
            return false;
        const ssize_t count = ::send(_channel.number(), bytes.data(), bytes.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
        if (count < 0 && errno != EINTR && errno != EAGAIN)
            return false;
        bytes.remove_prefix(static_cast<std::size_t>(std::max<ssize_t>(count, 0)));
    }
    return true;
}

bool DesktopClipboard::waitUntilReady(short events, Time deadline) const
{
    pollfd side { _channel.number(), events, 0 };
    return platform::uninterrupted([&] { return ::poll(&side, 1, millisecondsUntil(deadline)); }) > 0;
}

} // namespace apps
