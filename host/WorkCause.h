#pragma once

#include "host/OBPublication.h"

#include <utility>

/// Why this thread does what it does, while this object lives. A thread that is started meanwhile does it for the same
/// cause.
class WorkCause {
public:
    explicit WorkCause(OBChangeCause cause)
        : _outer(std::exchange(current(), std::move(cause)))
    {
    }
    ~WorkCause() { current() = std::move(_outer); }
    WorkCause(const WorkCause&) = delete;
    WorkCause& operator=(const WorkCause&) = delete;

    static OBChangeCause& current()
    {
        thread_local OBChangeCause cause;
        return cause;
    }

private:
    OBChangeCause _outer;
};
