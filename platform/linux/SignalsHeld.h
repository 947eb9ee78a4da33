#pragma once

#include <csignal>

namespace platform {

/// Holds all signals back for a scope. A thread started in it never gets one: those that end the program belong to the
/// thread that runs it.
class SignalsHeld {
public:
    SignalsHeld()
    {
        sigset_t all;
        sigfillset(&all);
        pthread_sigmask(SIG_SETMASK, &all, &_before);
    }
    ~SignalsHeld() { pthread_sigmask(SIG_SETMASK, &_before, nullptr); }
    SignalsHeld(const SignalsHeld&) = delete;
    SignalsHeld& operator=(const SignalsHeld&) = delete;

private:
    sigset_t _before {};
};

} // namespace platform
