#pragma once

#include "host/OBMediaHost.h"
#include "tests/host/Application.h"
#include "tests/host/HostMachine.h"
#include "tests/host/ScriptedSource.h"
#include "tests/host/Waiting.h"

#include <memory>
#include <optional>
#include <string>

struct OBMediaObjectKind;

namespace tests {

/// A host on a made-up machine, with one plug-in that makes scripted managers.
///
/// When it ends, every thread of a manager has to end; a test whose manager is still held fails.
class TestHost {
public:
    static constexpr const char* identifier = "org.test.Source";

    TestHost();
    ~TestHost();
    TestHost(const TestHost&) = delete;
    TestHost& operator=(const TestHost&) = delete;

    /// Made when it is first asked for; what is changed of the machine before counts.
    OBMediaHost& host();
    /// A new manager of the plug-in; the test cannot go on without one.
    std::shared_ptr<OBMediaManager> manager();
    /// The plug-in's bundle.
    MadeUpBundle& bundle();
    std::string bundleFolder() const;
    /// Destroys the host once no thread of a manager runs.
    void endHost();
    /// Destroys the host, whatever runs.
    void destroyHost() { _host = nullptr; }

    HostMachine machine {};
    OBHostOptions options {};
    std::shared_ptr<Script> script = std::make_shared<Script>();
    /// "LEVEL SENDER MESSAGE" a line; the sender is "-" or "manager".
    std::shared_ptr<Journal> log = std::make_shared<Journal>();

private:
    std::unique_ptr<OBMediaHost> _host;
};

/// What the movies of the plug-in share.
std::shared_ptr<OBMediaObjectKind> movieKind();

} // namespace tests
