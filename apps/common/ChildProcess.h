#pragma once

#include <chrono>
#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace apps {

/// A program that is to be run in a process of its own, with nothing to read.
struct ChildWishes {
    std::string program; ///< absolute
    std::vector<std::string> arguments {};
    std::optional<std::chrono::milliseconds> limit {}; ///< how long it may take; absent for ever
};

/// How a child process ended, and what it printed until then.
struct ChildAnswer {
    enum class End {
        exited,
        killed, ///< by a signal that somebody sent
        silent, ///< it had not ended when its time was over
        notStarted,
    };

    End end = End::notStarted;
    int status = -1; ///< of one that exited
    std::string output {};
    std::string errors {};
};

/// Runs child processes, at most `atOnce` at a time, and waits for all of them; the answers come in the order of the
/// wishes. Each has its own time. A silent one is killed and not waited for: what waits for a disk dies only when that
/// answers. One thread at a time.
std::vector<ChildAnswer> runChildren(const std::vector<ChildWishes>& wishes, std::size_t atOnce);

/// Texts as programs take their arguments, null behind the last. `texts` outlives the answer and is not changed.
std::vector<char*> pointersTo(std::vector<std::string>& texts);

/// The file that this process runs.
std::string thisProgram();

} // namespace apps
