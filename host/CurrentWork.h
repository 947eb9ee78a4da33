#pragma once

#include "host/OBPublication.h"
#include "host/WorkCause.h"
#include "platform/Clock.h"
#include "platform/Platform.h"

#include <chrono>
#include <string>
#include <string_view>
#include <utility>

/// The load or reload that runs on this thread, while this object lives.
class CurrentWork {
public:
    /// `part` is the source's word for what it scans; empty for everything.
    CurrentWork(const platform::Platform& platform, std::string_view part)
        : _outer(std::exchange(current(), { std::string(part), platform.clock.now(), platform.clock.monotonic() }))
    {
    }
    ~CurrentWork() { current() = std::move(_outer); }
    CurrentWork(const CurrentWork&) = delete;
    CurrentWork& operator=(const CurrentWork&) = delete;

    /// What there is to say of a tree that this thread publishes now.
    static OBPublication publicationOf(const platform::Platform& platform, const OBMediaGroupRef& root)
    {
        const Work& work = current();
        const std::chrono::nanoseconds duration
            = work.startedAt.count() == 0 ? std::chrono::nanoseconds() : platform.clock.monotonic() - work.startedAt;
        return { root, work.part, WorkCause::current(), work.beganAt, duration };
    }

private:
    struct Work {
        std::string part {};
        platform::Date beganAt {};
        std::chrono::nanoseconds startedAt {}; // zero while there is no work
    };
    static Work& current()
    {
        thread_local Work work;
        return work;
    }

    Work _outer;
};
