#pragma once

#include <chrono>
#include <cstdint>
#include <functional>

namespace platform {

/// In which states of the loop a delayed call may run. A plain call runs in every state.
enum class RunLoopModes : std::uint8_t {
    common = 1, ///< while the loop runs normally
    modalPanel = 2, ///< while a modal dialog runs
    commonAndModalPanel = 3,
};

/// The host's main thread: whoever runs the loop is the main thread until the loop has ended.
///
/// It need not be the thread that paints. Calls run in the order in which they were posted; never while the loop holds
/// a lock. What a call throws ends the program, as on any thread.
class MainRunLoop {
public:
    virtual ~MainRunLoop() = default;

    /// Runs calls on this thread until `quit`. Calls still posted then are dropped; the loop stays ended.
    virtual void run() = 0;
    /// Runs the loop in modal-panel mode on the main thread, from inside a call, until `endModal`. Nests.
    virtual void runModal() = 0;
    /// Ends the innermost `runModal`. Main thread.
    virtual void endModal() = 0;
    /// Ends `run` after the call at work. Any thread.
    virtual void quit() = 0;

    /// Whether the calling thread is the main thread.
    virtual bool isMainThread() const = 0;
    /// Runs `call` on the main thread soon. Any thread. Dropped when the loop has ended.
    virtual void post(std::function<void()> call) = 0;
    /// Runs `call` on the main thread and waits until it has finished; at once where the caller is the main thread.
    /// False, with `call` not run, when the loop has ended or ends before its turn comes.
    virtual bool performAndWait(const std::function<void()>& call) = 0;
    /// Runs `call` on the main thread once `delay` has passed and the loop is in one of `modes`. Any thread.
    virtual void performAfterDelay(std::chrono::nanoseconds delay, RunLoopModes modes, std::function<void()> call) = 0;
};

} // namespace platform
