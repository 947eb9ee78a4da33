#pragma once

#include "platform/ThreadSafety.h"
#include "platform/Value.h"

#include <cstddef>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <string>

class FrameworkCore;
class OBPathWatcherObserver;

/// The reports of one watched path or query on their way to one observer.
///
/// Equal reports that have not been delivered yet are one. At most two calls are under way at once, so that one that
/// sleeps holds back none; what comes beyond waits for one of them to return. Reports that pile up become one report
/// of everything. Any thread.
class ReportLane : public std::enable_shared_from_this<ReportLane> {
public:
    using Deliver = std::function<void(const std::string& report)>;

    /// `everything` stands for all reports; `cause` tells people why a call was made, and is empty where the report
    /// does; `deliver` makes the call. `core` outlives what is under way.
    ReportLane(FrameworkCore& core, OBPathWatcherObserver& observer, std::string everything, std::string cause,
        Deliver deliver);

    void add(const std::string& report);
    /// Asks the observer again whether it takes calls.
    void resume();
    /// Whether no report waits and no call is under way.
    bool isAtRest() const EXCLUDES(_lock);
    /// Lets no further call begin; what waits is forgotten. Waits for nothing.
    void close() EXCLUDES(_lock);
    /// Waits for calls under way on other threads, unless the observer keeps itself alive during calls. Once closed.
    void waitForCalls() EXCLUDES(_lock);

private:
    struct Pending {
        std::string report;
        platform::Date heardAt;
        bool standsForAll = false;
    };
    enum class Delivery : std::uint8_t { done, nothingToDo, notNow };

    void start();
    void work();
    Delivery deliverOne();
    bool deliverFirst();
    bool takeFirst(Pending& first);

    FrameworkCore& _core;
    OBPathWatcherObserver& _observer;
    const bool _keepsItselfAlive;
    const std::weak_ptr<void> _life;
    const std::string _everything;
    const std::string _cause;
    const Deliver _deliver;

    mutable platform::Mutex _lock;
    platform::Condition _callEnded;
    std::deque<Pending> _pending GUARDED_BY(_lock);
    std::size_t _workers GUARDED_BY(_lock) = 0; // threads that deliver, or are about to
    std::size_t _calls GUARDED_BY(_lock) = 0; // under way
    std::uint64_t _resumes GUARDED_BY(_lock) = 0;
    bool _closed GUARDED_BY(_lock) = false;
};
