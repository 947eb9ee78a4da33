#include "tests/support/simulated/SimulatedMainLoop.h"

#include <utility>

namespace tests {

namespace {

    thread_local bool thisIsTheMainThread = false;

} // namespace

SimulatedMainLoop::SimulatedMainLoop(SimulatedThreads& threads)
    : _threads(threads)
{
    _threads.startDetached("main", [this] { work(); });
}

bool SimulatedMainLoop::isMainThread() const
{
    return thisIsTheMainThread;
}

void SimulatedMainLoop::work()
{
    thisIsTheMainThread = true;
    while (!_quits) {
        if (_calls.empty()) {
            _threads.waitUntil([this] { return !_calls.empty() || _quits; });
            continue;
        }
        takeFirst()();
    }
}

std::function<void()> SimulatedMainLoop::takeFirst()
{
    const SimulatedThreads::Undisturbed here;
    std::function<void()> call = std::move(_calls.front());
    _calls.pop_front();
    return call;
}

void SimulatedMainLoop::post(std::function<void()> call)
{
    const SimulatedThreads::Undisturbed here;
    _calls.push_back(std::move(call));
}

bool SimulatedMainLoop::performAndWait(const std::function<void()>& call)
{
    if (isMainThread()) {
        call();
        return true;
    }
    bool isDone = false;
    post([&] {
        call();
        isDone = true;
    });
    _threads.waitUntil([&] { return isDone; });
    return true;
}

void SimulatedMainLoop::performAfterDelay(
    std::chrono::nanoseconds delay, platform::RunLoopModes, std::function<void()> call)
{
    _threads.after(delay, [this, posted = std::move(call)] { post(posted); });
}

} // namespace tests
