#pragma once

#include "platform/Platform.h"

#include <memory>
#include <optional>
#include <string>

namespace apps {

/// The machine that a program runs on: this one, or one that a file describes. It outlives every thread that uses it,
/// so a program keeps it until its end.
class Machine {
public:
    virtual ~Machine() = default;
    virtual platform::Platform platform() = 0;
};

/// A machine, or why there is none.
struct MachineResult {
    std::unique_ptr<Machine> machine;
    std::string problem; ///< one line that begins with the description's file and the line in it
};

/// Chooses the machine: the one that `descriptionFile` describes, else this one.
MachineResult chooseMachine(const std::optional<std::string>& descriptionFile);

} // namespace apps
