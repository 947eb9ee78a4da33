#pragma once

#include <functional>
#include <map>
#include <optional>
#include <string>

namespace tests {

/// Environment variables as a test wants them, put back when this object ends. One at a time, main thread.
class Environment {
public:
    Environment() = default;
    ~Environment();
    Environment(const Environment&) = delete;
    Environment& operator=(const Environment&) = delete;

    void set(const std::string& name, const std::string& value);
    void remove(const std::string& name);

private:
    void keep(const std::string& name);

    std::map<std::string, std::optional<std::string>> _before {};
};

/// How a check ended that ran in a process of its own.
enum class ChildAnswer { yes, no, impossible };

/// Asks `check` in a child process that has no more rights than any user, whoever runs the tests.
ChildAnswer askAsOrdinaryUser(const std::function<bool()>& check);

/// Asks `check` in a child process whose mounts are its own; impossible where the system does not allow that.
ChildAnswer askWithOwnMounts(const std::function<bool()>& check);

/// How many descriptors this process has open.
int openDescriptors();

} // namespace tests
