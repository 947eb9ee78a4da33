#pragma once

#include "platform/MainRunLoop.h"
#include "tests/support/simulated/SimulatedThreads.h"

#include <deque>
#include <functional>
#include <memory>

namespace tests {

/// A main thread that is one of the simulated ones, from construction until `quit`. Never modal.
class SimulatedMainLoop : public platform::MainRunLoop {
public:
    explicit SimulatedMainLoop(SimulatedThreads& threads);

    void run() override { }
    void runModal() override { }
    void endModal() override { }
    void quit() override { _quits = true; }
    bool isMainThread() const override;
    void post(std::function<void()> call) override;
    /// Asked on one of the simulated threads.
    bool performAndWait(const std::function<void()>& call) override;
    void performAfterDelay(
        std::chrono::nanoseconds delay, platform::RunLoopModes modes, std::function<void()> call) override;

private:
    void work();
    std::function<void()> takeFirst();

    SimulatedThreads& _threads;
    std::deque<std::function<void()>> _calls {};
    bool _quits = false;
};

} // namespace tests
