#pragma once

#include "apps/common/Machine.h"
#include "host/OBMediaHost.h"

#include <memory>
#include <optional>
#include <string>

namespace apps {

/// How a program wants its machine and its source.
struct SessionWishes {
    std::optional<std::string> machineFile {}; ///< a machine description; absent for this machine
    std::string source {}; ///< identifier of the plug-in whose tree is meant
};

/// A machine with the framework on it, and the manager of one source once it is asked for.
///
/// Bundles are searched in the folders of OMBRIX_PLUGIN_PATH first. Logs go to standard error, one line each, where
/// OMBRIX_LOG is 2 or higher: those of that level and below.
class Session {
public:
    Session(std::unique_ptr<Machine> machine, std::string source);

    const platform::Platform& platform() const { return _platform; }
    OBMediaHost& host() { return _host; }
    const std::string& source() const { return _source; }

    /// Makes the source's manager, once; null with the reason in `problem` when it cannot be made.
    std::shared_ptr<OBMediaManager> manager();
    /// One line; empty while there is none.
    const std::string& problem() const { return _problem; }

private:
    bool knows(const std::string& source);

    const std::unique_ptr<Machine> _machine;
    const platform::Platform _platform;
    OBMediaHost _host;
    const std::string _source;
    std::shared_ptr<OBMediaManager> _manager;
    std::string _problem;
};

/// A session, or why there is none.
struct SessionResult {
    std::unique_ptr<Session> session;
    std::string problem;
};

SessionResult openSession(const SessionWishes& wishes);

} // namespace apps
