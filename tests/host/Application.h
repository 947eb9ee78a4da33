#pragma once

#include "host/OBExecutor.h"
#include "host/OBLoad.h"
#include "tests/host/Waiting.h"

#include <cstddef>
#include <functional>
#include <memory>
#include <optional>
#include <thread>

class OBMediaManager;

namespace tests {

/// Runs each call at once, on the thread that hands it over.
OBExecutor inPlace();

/// An application with a thread of its own choice: what is handed to its executor waits until the test runs it.
class Application {
public:
    Application();

    /// May outlive the application; calls are then kept by nobody.
    OBExecutor executor() const;
    /// How many calls have been handed over so far.
    std::size_t callsHandedOver() const;
    /// Runs, on the calling thread, the calls that wait now, and answers how many there were.
    std::size_t runWaiting();
    /// Runs calls until `isDone`; false when that has not come within the longest wait.
    bool runUntil(const std::function<bool()>& isDone);

private:
    struct Queue;
    std::shared_ptr<Queue> _queue;
};

/// One request for a tree, and its answer.
class Request {
public:
    explicit Request(OBMediaManager& manager, const OBExecutor& executor = inPlace());

    bool isAnswered() const;
    /// Waits for the answer. Where none comes within the longest wait, the test fails and a default one is answered.
    OBLoadResult answer() const;
    /// The thread that answered.
    std::thread::id thread() const;

private:
    struct State;
    std::shared_ptr<State> _state;
};

} // namespace tests
