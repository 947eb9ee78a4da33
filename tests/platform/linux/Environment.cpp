#include "tests/platform/linux/Environment.h"

#include "tests/support/OwnMounts.h"

#include <cstdlib>
#include <filesystem>
#include <iterator>

#include <grp.h>
#include <sys/wait.h>
#include <unistd.h>

namespace tests {

namespace {

    constexpr int yesStatus = 0;
    constexpr int noStatus = 1;
    constexpr int impossibleStatus = 2;

    ChildAnswer askInChild(const std::function<bool()>& prepare, const std::function<bool()>& check)
    {
        const pid_t child = fork();
        if (child == -1)
            return ChildAnswer::impossible;
        if (child == 0) {
            if (!prepare())
                _exit(impossibleStatus);
            _exit(check() ? yesStatus : noStatus);
        }
        int status = 0;
        while (waitpid(child, &status, 0) == -1) { }
        if (!WIFEXITED(status))
            return ChildAnswer::no;
        if (WEXITSTATUS(status) == yesStatus)
            return ChildAnswer::yes;
        return WEXITSTATUS(status) == impossibleStatus ? ChildAnswer::impossible : ChildAnswer::no;
    }

} // namespace

Environment::~Environment()
{
    for (const auto& [name, value] : _before) {
        if (value)
            setenv(name.c_str(), value->c_str(), 1);
        else
            unsetenv(name.c_str());
    }
}

void Environment::set(const std::string& name, const std::string& value)
{
    keep(name);
    setenv(name.c_str(), value.c_str(), 1);
}

void Environment::remove(const std::string& name)
{
    keep(name);
    unsetenv(name.c_str());
}

void Environment::keep(const std::string& name)
{
    const char* value = getenv(name.c_str());
    _before.emplace(name, value ? std::optional<std::string>(value) : std::nullopt);
}

ChildAnswer askAsOrdinaryUser(const std::function<bool()>& check)
{
    constexpr id_t nobody = 65534;
    const auto giveUpRights
        = [] { return geteuid() != 0 || (setgroups(0, nullptr) == 0 && setgid(nobody) == 0 && setuid(nobody) == 0); };
    return askInChild(giveUpRights, check);
}

ChildAnswer askWithOwnMounts(const std::function<bool()>& check)
{
    return askInChild(enterOwnMounts, check);
}

int openDescriptors()
{
    const std::filesystem::directory_iterator entries("/proc/self/fd");
    return static_cast<int>(std::distance(begin(entries), end(entries)));
}

} // namespace tests
