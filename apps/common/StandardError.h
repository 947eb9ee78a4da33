#pragma once

#include <csignal>
#include <string_view>

namespace apps {

// Standard error of this process, of which there is one: lines for people, and at its end one line of progress that
// vanishes without a trace, also when a signal ends the process. No escape sequences. Any thread.

/// The most columns that a line of progress can have.
inline constexpr int longestProgress = 500;

/// Prints `line` and a line feed; progress that is shown is erased first.
void printError(std::string_view line);

/// Shows `line`, at most one terminal line long, in place of the progress line shown so far.
void showProgress(std::string_view line);
void eraseProgress();

/// From now on SIGINT, SIGTERM and SIGHUP erase the progress line and then end the process as they always do. A signal
/// that is ignored stays so.
void eraseProgressOnSignals();

/// While it lives, those signals wait for the calling thread or go to another; threads that it starts meanwhile never
/// get one.
class EndingSignalsHeld {
public:
    EndingSignalsHeld();
    ~EndingSignalsHeld();
    EndingSignalsHeld(const EndingSignalsHeld&) = delete;
    EndingSignalsHeld& operator=(const EndingSignalsHeld&) = delete;

private:
    sigset_t _before {};
};

/// Waits for one of those signals, and takes it; every thread has to hold them. False, at once, when all of them are
/// ignored.
bool waitForEndingSignal();

} // namespace apps
