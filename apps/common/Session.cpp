#include "apps/common/Session.h"

#include "apps/common/HostileNames.h"
#include "apps/common/PluginPath.h"
#include "apps/common/StandardError.h"
#include "apps/common/Terminal.h"

#include <algorithm>
#include <charconv>
#include <cstddef>
#include <utility>
#include <vector>

namespace apps {
namespace {

    constexpr int lowestLogWish = 2;

    /// The highest level that is wanted; 0 for none.
    int wantedLogLevel()
    {
        const std::string_view wish = environmentVariable("OMBRIX_LOG");
        int level = 0;
        const auto [end, error] = std::from_chars(wish.data(), wish.data() + wish.size(), level);
        if (error == std::errc::result_out_of_range && wish.front() != '-')
            return 1 << 30;
        return error == std::errc() && level >= lowestLogWish ? level : 0;
    }

    void printLog(std::string_view message, int level, const OBMediaManager* sender)
    {
        const std::string identifier = sender ? sender->pluginIdentifier().string() : std::string();
        const std::size_t dot = identifier.rfind('.');
        const std::string name = identifier.empty() ? "OmbrixMediaBrowser" : identifier.substr(dot + 1);
        printError(name + "[" + std::to_string(level) + "]: " + escapedText(message));
    }

    /// What there is instead of a source that was not found, and what keeps bundles from being found.
    std::string whyNotFound(OBMediaHost& host, const platform::FileSystem& fileSystem)
    {
        constexpr std::size_t mostNamed = 3;
        std::vector<std::string> found;
        for (const OBPluginInfo& plugin : host.plugins()) {
            if (!plugin.identifier.empty() && std::find(found.begin(), found.end(), plugin.identifier) == found.end())
                found.push_back(plugin.identifier);
        }
        std::string text = "there is no such plug-in";
        for (std::size_t index = 0; index < std::min(found.size(), mostNamed); ++index)
            text += (index == 0 ? "; found: " : ", ") + found[index];
        if (found.size() > mostNamed)
            text += " and " + std::to_string(found.size() - mostNamed) + " more";
        const std::vector<std::string> problems = problemsOfPluginPath(fileSystem);
        return problems.empty() ? text : text + "; " + problems.front();
    }

    OBHostOptions hostOptions()
    {
        OBHostOptions options { foldersOfPluginPath(), {} };
        if (const int wanted = wantedLogLevel()) {
            options.logSink = [wanted](std::string_view message, int level, const OBMediaManager* sender) {
                if (level <= wanted)
                    printLog(message, level, sender);
            };
        }
        return options;
    }

} // namespace

Session::Session(std::unique_ptr<Machine> machine, std::string source)
    : _machine(std::move(machine))
    , _platform(_machine->platform())
    , _host(_platform, hostOptions())
    , _source(std::move(source))
{
}

std::shared_ptr<OBMediaManager> Session::manager()
{
    if (!_manager && _problem.empty()) {
        OBManagerResult result = _host.createManager(_source);
        _manager = std::move(result.manager);
        if (!_manager)
            _problem = knows(_source) ? std::move(result.problem)
                                      : _source + ": " + whyNotFound(_host, _platform.fileSystem);
    }
    return _manager;
}

bool Session::knows(const std::string& source)
{
    const std::vector<OBPluginInfo> plugins = _host.plugins();
    return std::any_of(
        plugins.begin(), plugins.end(), [&](const OBPluginInfo& plugin) { return plugin.identifier == source; });
}

SessionResult openSession(const SessionWishes& wishes)
{
    MachineResult result = chooseMachine(wishes.machineFile);
    if (!result.machine)
        return { nullptr, std::move(result.problem) };
    return { std::make_unique<Session>(std::move(result.machine), wishes.source), {} };
}

} // namespace apps
