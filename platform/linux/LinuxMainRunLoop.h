#pragma once

#include "platform/MainRunLoop.h"
#include "platform/ThreadSafety.h"

#include <deque>
#include <map>
#include <memory>
#include <optional>
#include <thread>
#include <utility>
#include <vector>

namespace platform {

/// A main thread that does nothing but run calls.
class LinuxMainRunLoop : public MainRunLoop {
public:
    void run() override EXCLUDES(_lock);
    void runModal() override EXCLUDES(_lock);
    void endModal() override EXCLUDES(_lock);
    void quit() override EXCLUDES(_lock);
    bool isMainThread() const override EXCLUDES(_lock);
    void post(std::function<void()> call) override EXCLUDES(_lock);
    bool performAndWait(const std::function<void()>& call) override EXCLUDES(_lock);
    void performAfterDelay(std::chrono::nanoseconds delay, RunLoopModes modes, std::function<void()> call) override
        EXCLUDES(_lock);

private:
    using Instant = std::chrono::steady_clock::time_point;
    class Waiter;

    struct Call {
        Instant time; ///< when it was posted
        std::function<void()> body {};
        std::shared_ptr<Waiter> waiter {}; ///< the thread that waits for it, if one does
    };
    struct DelayedCall {
        RunLoopModes modes;
        std::function<void()> body;
    };
    using Delayed = std::multimap<Instant, DelayedCall>; ///< in the order in which they fall due

    bool enqueue(Call call) EXCLUDES(_lock);
    void runWhile(const bool& isOver, RunLoopModes mode) EXCLUDES(_lock);
    std::optional<Call> nextCall(const bool& isOver, RunLoopModes mode) EXCLUDES(_lock);
    Delayed::iterator nextDelayed(RunLoopModes mode) REQUIRES(_lock);
    Call takeDelayed(Delayed::iterator position) REQUIRES(_lock);
    void wait(RunLoopModes mode) REQUIRES(_lock);

    mutable Mutex _lock;
    Condition _changed; ///< something that the main thread waits for
    std::deque<Call> _calls GUARDED_BY(_lock);
    Delayed _delayed GUARDED_BY(_lock);
    std::vector<bool*> _modalEnds GUARDED_BY(
        _lock); ///< one for each modal loop, innermost last: true once it is to end
    std::thread::id _mainThread GUARDED_BY(_lock) {};
    bool _isWaiting GUARDED_BY(_lock) = false;
    bool _isRunning GUARDED_BY(_lock) = false;
    bool _isQuit GUARDED_BY(_lock) = false;
};

} // namespace platform
