#include "apps/common/StandardError.h"

#include "apps/common/DisplayWidth.h"
#include "platform/Immortal.h"
#include "platform/ThreadSafety.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <csignal>
#include <ctime>
#include <string>

#include <unistd.h>

namespace apps {
namespace {

    constexpr std::array<int, 3> endingSignals { SIGINT, SIGTERM, SIGHUP };

    // What a signal handler needs lies in atomics: it may interrupt whoever holds the lock.
    std::atomic<int> shownColumns { 0 };
    std::atomic<bool> isWriting { false };
    std::atomic<bool> isEnding { false };

    platform::Immortal<platform::Mutex>& writing()
    {
        static platform::Immortal<platform::Mutex> lock;
        return lock;
    }

    void writeBytes(std::string_view bytes)
    {
        while (!bytes.empty()) {
            const ssize_t written = ::write(STDERR_FILENO, bytes.data(), bytes.size());
            if (written <= 0)
                return;
            bytes.remove_prefix(static_cast<std::size_t>(written));
        }
    }

    void writeErasure(int columns)
    {
        std::array<char, longestProgress + 2> blanks;
        blanks.fill(' ');
        const auto count = static_cast<std::size_t>(std::min(columns, longestProgress));
        blanks[0] = '\r';
        blanks[count + 1] = '\r';
        writeBytes({ blanks.data(), count + 2 });
    }

    /// Replaces the progress line by `bytes`, of which `columns` columns are progress.
    void replaceProgress(std::string_view bytes, int columns)
    {
        platform::Locked guard(*writing());
        isWriting = true;
        if (!isEnding) {
            const int before = shownColumns.load();
            if (before > 0)
                writeErasure(before);
            shownColumns = columns;
            writeBytes(bytes);
        }
        isWriting = false;
    }

    extern "C" void endBySignal(int signal)
    {
        isEnding = true;
        // A line that is just being written is waited for, but not for long: the terminal may have been stopped.
        const timespec shortly { 0, 1'000'000 };
        for (int turn = 0; turn < 20 && isWriting; ++turn)
            ::nanosleep(&shortly, nullptr);
        const int columns = shownColumns.exchange(0);
        if (columns > 0)
            writeErasure(columns);
        (void)std::raise(signal);
    }

    void handle(int signal)
    {
        struct sigaction action { };
        if (::sigaction(signal, nullptr, &action) != 0 || action.sa_handler == SIG_IGN)
            return;
        action = {};
        action.sa_handler = endBySignal;
        action.sa_flags = static_cast<int>(SA_RESETHAND);
        (void)::sigaction(signal, &action, nullptr);
    }

} // namespace

void printError(std::string_view line)
{
    std::string bytes(line);
    bytes += '\n';
    replaceProgress(bytes, 0);
}

void showProgress(std::string_view line)
{
    const std::string shown = cutAtEnd(line, longestProgress);
    replaceProgress(shown, displayWidth(shown));
}

void eraseProgress()
{
    if (shownColumns > 0)
        replaceProgress({}, 0);
}

void eraseProgressOnSignals()
{
    for (const int signal : endingSignals)
        handle(signal);
}

bool waitForEndingSignal()
{
    sigset_t awaited;
    sigemptyset(&awaited);
    bool isAnyAwaited = false;
    for (const int signal : endingSignals) {
        struct sigaction action { };
        if (::sigaction(signal, nullptr, &action) != 0 || action.sa_handler == SIG_IGN)
            continue;
        sigaddset(&awaited, signal);
        isAnyAwaited = true;
    }
    int signal = 0;
    return isAnyAwaited && ::sigwait(&awaited, &signal) == 0;
}

EndingSignalsHeld::EndingSignalsHeld()
{
    sigset_t held;
    sigemptyset(&held);
    for (const int signal : endingSignals)
        sigaddset(&held, signal);
    (void)::pthread_sigmask(SIG_BLOCK, &held, &_before);
}

EndingSignalsHeld::~EndingSignalsHeld()
{
    (void)::pthread_sigmask(SIG_SETMASK, &_before, nullptr);
}

} // namespace apps
