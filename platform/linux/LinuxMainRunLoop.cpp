#include "platform/linux/LinuxMainRunLoop.h"

#include <algorithm>
#include <atomic>

#include <linux/futex.h>
#include <sys/syscall.h>
#include <unistd.h>

namespace platform {

namespace {

    // What a call throws ends the program here, as it would on a thread of its own.
    void perform(const std::function<void()>& body) noexcept
    {
        body();
    }

    std::chrono::steady_clock::time_point instantAfter(std::chrono::nanoseconds delay)
    {
        constexpr std::chrono::nanoseconds longest = std::chrono::hours(24 * 365 * 100);
        return std::chrono::steady_clock::now() + std::clamp(delay, std::chrono::nanoseconds::zero(), longest);
    }

} // namespace

/// A thread that waits for its call. Shared, so that whoever wakes it may still hold it when it has gone on. Waits by
/// futex(2) itself: what the language offers first spins, while this wait lasts as long as reading a movie.
class LinuxMainRunLoop::Waiter {
public:
    void wake(bool hasRun)
    {
        _state.store(hasRun ? ran : dropped, std::memory_order_release);
        syscall(SYS_futex, &_state, FUTEX_WAKE_PRIVATE, 1, nullptr, nullptr, 0);
    }
    bool wait()
    {
        while (_state.load(std::memory_order_acquire) == waiting)
            syscall(SYS_futex, &_state, FUTEX_WAIT_PRIVATE, waiting, nullptr, nullptr, 0);
        return _state.load(std::memory_order_acquire) == ran;
    }

private:
    static constexpr int waiting = 0;
    static constexpr int ran = 1;
    static constexpr int dropped = 2;
    std::atomic<int> _state { waiting };
    static_assert(sizeof(_state) == sizeof(int), "a futex is the int itself");
};

void LinuxMainRunLoop::run()
{
    {
        Locked guard(_lock);
        if (_isRunning || _isQuit)
            return;
        _isRunning = true;
        _mainThread = std::this_thread::get_id();
    }
    const bool never = false;
    runWhile(never, RunLoopModes::common);
    Locked guard(_lock);
    _isRunning = false;
    _mainThread = {};
}

void LinuxMainRunLoop::runModal()
{
    bool isOver = false;
    {
        Locked guard(_lock);
        if (!_isRunning || _mainThread != std::this_thread::get_id())
            return;
        _modalEnds.push_back(&isOver);
    }
    runWhile(isOver, RunLoopModes::modalPanel);
    Locked guard(_lock);
    _modalEnds.pop_back();
}

void LinuxMainRunLoop::endModal()
{
    Locked guard(_lock);
    const auto innermost
        = std::find_if(_modalEnds.rbegin(), _modalEnds.rend(), [](const bool* isOver) { return !*isOver; });
    if (innermost != _modalEnds.rend())
        **innermost = true;
    _changed.notifyAll();
}

void LinuxMainRunLoop::quit()
{
    std::deque<Call> calls;
    Delayed delayed;
    {
        Locked guard(_lock);
        _isQuit = true;
        calls.swap(_calls);
        delayed.swap(_delayed);
        _changed.notifyAll();
    }
    // What the dropped calls held is released outside of the lock, for that may call anything.
    for (const Call& call : calls) {
        if (call.waiter)
            call.waiter->wake(false);
    }
}

bool LinuxMainRunLoop::isMainThread() const
{
    Locked guard(_lock);
    return _isRunning && _mainThread == std::this_thread::get_id();
}

void LinuxMainRunLoop::post(std::function<void()> call)
{
    if (call)
        enqueue({ std::chrono::steady_clock::now(), std::move(call) });
}

bool LinuxMainRunLoop::performAndWait(const std::function<void()>& call)
{
    if (!call)
        return false;
    if (isMainThread()) {
        perform(call);
        return true;
    }
    const auto waiter = std::make_shared<Waiter>();
    return enqueue({ std::chrono::steady_clock::now(), [&call] { call(); }, waiter }) && waiter->wait();
}

void LinuxMainRunLoop::performAfterDelay(std::chrono::nanoseconds delay, RunLoopModes modes, std::function<void()> call)
{
    if (!call)
        return;
    DelayedCall delayedCall { modes, std::move(call) };
    Locked guard(_lock);
    if (_isQuit)
        return;
    _delayed.emplace(instantAfter(delay), std::move(delayedCall));
    if (_isWaiting)
        _changed.notifyOne();
}

// Whether the loop will still come to it.
bool LinuxMainRunLoop::enqueue(Call call)
{
    bool isAwaited = false;
    {
        Locked guard(_lock);
        if (_isQuit)
            return false;
        _calls.push_back(std::move(call));
        isAwaited = _isWaiting;
    }
    if (isAwaited)
        _changed.notifyOne(); // with the lock free, or the main thread would wake only to wait for it
    return true;
}

void LinuxMainRunLoop::runWhile(const bool& isOver, RunLoopModes mode)
{
    while (auto call = nextCall(isOver, mode)) {
        perform(call->body);
        if (call->waiter)
            call->waiter->wake(true);
    }
}

// The call that has waited longest, so that neither kind keeps the other from running; absent once the loop is to end.
std::optional<LinuxMainRunLoop::Call> LinuxMainRunLoop::nextCall(const bool& isOver, RunLoopModes mode)
{
    Locked guard(_lock);
    for (;;) {
        if (_isQuit || isOver)
            return std::nullopt;
        const auto delayed = nextDelayed(mode);
        const bool hasDelayed = delayed != _delayed.end();
        const bool isFirst = hasDelayed && (_calls.empty() || delayed->first < _calls.front().time);
        if (isFirst && delayed->first <= std::chrono::steady_clock::now())
            return takeDelayed(delayed);
        if (!_calls.empty()) {
            Call call = std::move(_calls.front());
            _calls.pop_front();
            return call;
        }
        wait(mode);
    }
}

LinuxMainRunLoop::Delayed::iterator LinuxMainRunLoop::nextDelayed(RunLoopModes mode)
{
    const auto wanted = static_cast<unsigned>(mode);
    return std::find_if(_delayed.begin(), _delayed.end(),
        [wanted](const auto& entry) { return (static_cast<unsigned>(entry.second.modes) & wanted) != 0; });
}

LinuxMainRunLoop::Call LinuxMainRunLoop::takeDelayed(Delayed::iterator position)
{
    Call call { position->first, std::move(position->second.body), nullptr };
    _delayed.erase(position);
    return call;
}

void LinuxMainRunLoop::wait(RunLoopModes mode)
{
    const auto delayed = nextDelayed(mode);
    _isWaiting = true;
    if (delayed == _delayed.end()) {
        _changed.wait(_lock);
    } else {
        // A copy: the call may be dropped while nobody holds the lock.
        const Instant due = delayed->first;
        _changed.waitUntil(_lock, due);
    }
    _isWaiting = false;
}

} // namespace platform
