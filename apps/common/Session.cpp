#include "apps/common/Session.h"

#include "apps/common/HostileNames.h"
#include "apps/common/StandardError.h"
#include "apps/common/Terminal.h"

#include <charconv>
#include <filesystem>
#include <system_error>
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

    /// Bundles are read from when something of them is needed, and the working folder may be another one then.
    std::string absoluteFolder(std::string_view folder)
    {
        std::error_code error;
        const std::filesystem::path absolute = std::filesystem::absolute(folder, error);
        return error ? std::string(folder) : absolute.string();
    }

    std::vector<std::string> foldersOfPluginPath()
    {
        std::vector<std::string> folders;
        std::string_view rest = environmentVariable("OMBRIX_PLUGIN_PATH");
        while (!rest.empty()) {
            const std::string_view folder = rest.substr(0, rest.find(':'));
            rest.remove_prefix(std::min(rest.size(), folder.size() + 1));
            if (!folder.empty())
                folders.push_back(absoluteFolder(folder));
        }
        return folders;
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
            _problem = result.problem.empty() ? _source + ": there is no such plug-in" : std::move(result.problem);
    }
    return _manager;
}

SessionResult openSession(const SessionWishes& wishes)
{
    MachineResult result = chooseMachine(wishes.machineFile);
    if (!result.machine)
        return { nullptr, std::move(result.problem) };
    return { std::make_unique<Session>(std::move(result.machine), wishes.source), {} };
}

} // namespace apps
