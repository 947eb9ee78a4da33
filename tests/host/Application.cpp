#include "tests/host/Application.h"

#include "host/OBMediaManager.h"

#include <doctest/doctest.h>

#include <condition_variable>
#include <deque>
#include <mutex>
#include <utility>

namespace tests {

OBExecutor inPlace()
{
    return [](const std::function<void()>& call) { call(); };
}

struct Application::Queue {
    std::mutex lock;
    std::condition_variable changed;
    std::deque<std::function<void()>> calls; // under lock
    std::size_t handedOver = 0; // under lock

    std::function<void()> takeNext()
    {
        std::function<void()> call;
        std::lock_guard guard(lock);
        if (!calls.empty()) {
            call = std::move(calls.front());
            calls.pop_front();
        }
        return call;
    }
};

Application::Application()
    : _queue(std::make_shared<Queue>())
{
}

OBExecutor Application::executor() const
{
    return [queue = std::weak_ptr(_queue)](std::function<void()> call) {
        if (const auto alive = queue.lock()) {
            std::lock_guard guard(alive->lock);
            alive->calls.push_back(std::move(call));
            ++alive->handedOver;
            alive->changed.notify_all();
        }
    };
}

std::size_t Application::callsHandedOver() const
{
    std::lock_guard guard(_queue->lock);
    return _queue->handedOver;
}

std::size_t Application::runWaiting()
{
    std::size_t count = 0;
    while (const auto call = _queue->takeNext()) {
        call();
        ++count;
    }
    return count;
}

bool Application::runUntil(const std::function<bool()>& isDone)
{
    const auto end = std::chrono::steady_clock::now() + longestWait;
    while (!isDone()) {
        if (const auto call = _queue->takeNext()) {
            call();
            continue;
        }
        std::unique_lock guard(_queue->lock);
        if (!_queue->changed.wait_until(guard, end, [this] { return !_queue->calls.empty(); }))
            return false;
    }
    return true;
}

struct Request::State {
    Event answered;
    OBLoadResult result;
    std::thread::id thread;
};

Request::Request(OBMediaManager& manager, const OBExecutor& executor)
    : _state(std::make_shared<State>())
{
    manager.requestRootMediaGroup(executor, [state = _state](OBLoadResult result) {
        state->result = std::move(result);
        state->thread = std::this_thread::get_id();
        CHECK_FALSE(state->answered.hasHappened());
        state->answered.happen();
    });
}

bool Request::isAnswered() const
{
    return _state->answered.hasHappened();
}

OBLoadResult Request::answer() const
{
    const bool came = _state->answered.wait();
    CHECK(came);
    return came ? _state->result : OBLoadResult {};
}

std::thread::id Request::thread() const
{
    return _state->answered.wait() ? _state->thread : std::thread::id();
}

} // namespace tests
