#pragma once

#include <string_view>
#include <vector>

#include <poll.h>

/// Pipes through which other programs read. Each gets its bytes as fast as its reader takes them, and none waits for
/// another's.
class PendingReads {
public:
    /// Gives `bytes`, which stay where they are, to the pipe, and closes it behind them.
    void add(int pipe, std::string_view bytes);
    bool isEmpty() const { return _reads.empty(); }
    /// What to wait for.
    std::vector<pollfd> sides() const;
    /// Goes on with every pipe that takes something.
    void goOn();

private:
    struct Read {
        int pipe;
        std::string_view left;
    };

    std::vector<Read> _reads;
};
