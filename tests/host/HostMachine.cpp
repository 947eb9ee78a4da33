#include "tests/host/HostMachine.h"

#include "host/OBConstants.h"
#include "platform/PathText.h"
#include "tests/host/ScriptedSource.h"

#include <utility>

namespace tests {

std::vector<std::string> MadeUpBundles::manifestsRead() const
{
    std::lock_guard guard(_lock);
    return _manifestsRead;
}

std::vector<std::string> MadeUpBundles::librariesLoaded() const
{
    std::lock_guard guard(_lock);
    return _librariesLoaded;
}

platform::ManifestAnswer MadeUpBundles::readManifest(std::string_view folder) const
{
    {
        std::lock_guard guard(_lock);
        _manifestsRead.emplace_back(folder);
    }
    const auto found = bundles.find(folder);
    if (found == bundles.end())
        return { {}, std::string(folder) + "/manifest.json: no such file" };
    if (!found->second.manifestProblem.empty())
        return { {}, found->second.manifestProblem };
    return { found->second.manifest, {} };
}

platform::StringTableAnswer MadeUpBundles::readStringTable(std::string_view folder, std::string_view language) const
{
    const auto found = bundles.find(folder);
    if (found == bundles.end())
        return { {}, "no bundle" };
    const auto table = found->second.tables.find(language);
    return table != found->second.tables.end()
        ? table->second
        : platform::StringTableAnswer { {}, "no table " + std::string(language) };
}

std::optional<platform::ImageResource> MadeUpBundles::imageResource(
    std::string_view folder, std::string_view name) const
{
    const auto found = bundles.find(folder);
    if (found == bundles.end() || found->second.pictures.count(std::string(name)) == 0)
        return std::nullopt;
    const std::string file
        = platform::pathJoined(platform::pathJoined(folder, "resources"), std::string(name) + ".svg");
    return platform::ImageResource { file, found->second.pictures.find(name)->second };
}

platform::LibraryAnswer MadeUpBundles::loadLibrary(const std::string& path, const char* symbol)
{
    {
        std::lock_guard guard(_lock);
        _librariesLoaded.push_back(path);
    }
    const auto found = bundles.find(platform::pathByRemovingLastComponent(path));
    if (found == bundles.end())
        return { nullptr, path + ": no such file" };
    if (!found->second.libraryProblem.empty())
        return { nullptr, found->second.libraryProblem };
    if (!found->second.entryPoint || std::string_view(symbol) != OBPluginEntryPointName)
        return { nullptr, path + ": no function " + symbol };
    return { reinterpret_cast<void*>(found->second.entryPoint), {} };
}

std::vector<int> RecordingThreads::niceValues() const
{
    std::lock_guard guard(_lock);
    return _niceValues;
}

std::vector<std::string> RecordingThreads::started() const
{
    std::lock_guard guard(_lock);
    return _started;
}

bool RecordingThreads::startDetached(const std::string& name, std::function<void()> body)
{
    if (refuses)
        return false;
    {
        std::lock_guard guard(_lock);
        _started.push_back(name);
    }
    return _threads.startDetached(name, std::move(body));
}

void RecordingThreads::setNiceOfCurrentThread(int nice)
{
    std::lock_guard guard(_lock);
    _niceValues.push_back(nice);
}

platform::PreferencesAnswer ListedPreferences::valuesOfDomain(std::string_view domain) const
{
    const auto found = domains.find(domain);
    return found != domains.end() ? found->second : platform::PreferencesAnswer {};
}

platform::Value CountingIndex::attributesOfFile(std::string_view path) const
{
    ++_timesAsked;
    return platform::Value::Dictionary { { "kMDItemPath", path }, { "kMDItemFSSize", 17 } };
}

std::vector<std::string> CountingMovies::read() const
{
    std::lock_guard guard(_lock);
    return _read;
}

std::vector<std::thread::id> CountingMovies::threads() const
{
    std::lock_guard guard(_lock);
    return _threads;
}

std::optional<platform::MovieHeader> CountingMovies::headerOfMovie(
    std::string_view path, platform::PathKnowledge known) const
{
    {
        std::lock_guard guard(_lock);
        _read.emplace_back(path);
        _threads.push_back(std::this_thread::get_id());
    }
    return _movies.headerOfMovie(path, known);
}

HostMachine::HostMachine()
    : _mainThread([this] { mainRunLoop.run(); })
    , _mainThreadID(_mainThread.get_id())
{
}

HostMachine::~HostMachine()
{
    endMainLoop();
}

platform::Platform HostMachine::platform()
{
    const platform::Platform base = bare.platform();
    return {
        .fileSystem = files,
        .pathWatching = base.pathWatching,
        .volumes = base.volumes,
        .workspace = base.workspace,
        .preferences = preferences,
        .metadataIndex = metadataIndex,
        .movies = movies,
        .notifications = base.notifications,
        .workspaceNotifications = base.workspaceNotifications,
        .clock = base.clock,
        .calendar = base.calendar,
        .threads = threads,
        .mainRunLoop = mainRunLoop,
        .console = base.console,
        .bundles = bundles,
        .languages = languages,
    };
}

MadeUpBundle& HostMachine::addBundle(std::string_view relativePath, const std::string& identifier)
{
    MadeUpBundle& bundle = bundles.bundles[folder.folder(relativePath)];
    bundle.manifest.identifier = identifier;
    bundle.manifest.version = "1.0";
    bundle.manifest.hostInterfaceMinimum = OBHostInterfaceVersion;
    bundle.manifest.hostInterfaceMaximum = OBHostInterfaceVersion;
    bundle.manifest.library = "library.so";
    bundle.manifest.className = "ScriptedManager";
    bundle.manifest.languages = { "en" };
    bundle.tables["en"] = { platform::Value::Dictionary {}, {} };
    bundle.entryPoint = &scriptedSource;
    return bundle;
}

std::thread::id HostMachine::mainThread() const
{
    return _mainThreadID;
}

void HostMachine::endMainLoop()
{
    mainRunLoop.quit();
    if (_mainThread.joinable())
        _mainThread.join();
}

} // namespace tests
