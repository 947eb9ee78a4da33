#include "tests/plugin/support/SourceMachine.h"

#include "host/OBMediaManagerClass.h"
#include "tests/plugin/support/RecordText.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <future>
#include <utility>

extern "C" const OBMediaManagerClass* OBPluginMediaManagerClass();

namespace tests {

namespace {

    constexpr std::string_view sourceIdentifier = "org.ombrix.OBMontaroPlugin";

    std::vector<platform::AddedLink> linksTo(const TemporaryFolder& disk)
    {
        return { { "/Volumes", disk.path("Volumes") }, { "/Montaro Projects", disk.path("boot/Montaro Projects") },
            { "/Montaro Events", disk.path("boot/Montaro Events") } };
    }

    void replaceAll(std::string& text, const std::string& from, std::string_view to)
    {
        for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size()))
            text.replace(at, from.size(), to);
    }

    [[noreturn]] void cannotGoOn(const std::string& why)
    {
        std::fprintf(stderr, "tests: %s\n", why.c_str());
        std::abort();
    }

} // namespace

SourceMachine::SourceMachine(SourceCode code)
    : _links(linksTo(disk), _noVolumes, _kernel)
{
    files.home.store(disk.folder("home"));
    workspace.editor.store(disk.file("opt/montaro"));
    if (code == SourceCode::linked)
        bundles.linkedEntryPoint = reinterpret_cast<void*>(&OBPluginMediaManagerClass);
    OBHostOptions options;
    options.pluginFolders = { OMBRIX_PLUGIN_FOLDER };
    options.logSink = [this](std::string_view message, int level, const OBMediaManager* sender) {
        platform::Locked guard(_logLock);
        _log.push_back({ std::string(message), level, sender });
    };
    host = std::make_unique<OBMediaHost>(platform(), std::move(options));
    _mainThread = std::thread([this] { mainRunLoop.run(); });
}

SourceMachine::~SourceMachine()
{
    waitForThreads();
    mainRunLoop.quit();
    _mainThread.join();
}

platform::Platform SourceMachine::platform()
{
    return { files, pathWatching, volumes, workspace, preferences, metadataIndex, movies, notifications,
        workspaceNotifications, clock, calendar, threads, mainRunLoop, console, bundles, languages };
}

LibraryBuilder SourceMachine::volumeProjects(const std::string& name) const
{
    return LibraryBuilder(disk.path("Volumes/" + name + "/Montaro Projects"));
}

void SourceMachine::dateEverything() const
{
    namespace fs = std::filesystem;
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(disk.path()))
        setModificationDate(entry.path().string(), dateOfEverything);
}

std::shared_ptr<OBMediaManager> SourceMachine::makeManager()
{
    OBManagerResult result = host->createManager(sourceIdentifier);
    if (!result.manager)
        cannotGoOn("there is no source: " + result.problem);
    return std::move(result.manager);
}

std::shared_ptr<OBMontaroPlugin> SourceMachine::makeSource()
{
    const std::shared_ptr<OBMediaManager> manager = makeManager();
    return { manager, static_cast<OBMontaroPlugin*>(manager.get()) };
}

void SourceMachine::waitForThreads()
{
    if (!host->waitForThreads(longestWait))
        cannotGoOn("a thread of the source does not end");
}

std::future<OBLoadResult> SourceMachine::beginLoad(OBMediaManager& manager)
{
    const auto answer = std::make_shared<std::promise<OBLoadResult>>();
    std::future<OBLoadResult> result = answer->get_future();
    manager.setNeedsReload(true);
    manager.requestRootMediaGroup([](const std::function<void()>& call) { call(); },
        [answer](OBLoadResult loaded) { answer->set_value(std::move(loaded)); });
    return result;
}

OBLoadResult SourceMachine::load(OBMediaManager& manager)
{
    std::future<OBLoadResult> result = beginLoad(manager);
    if (result.wait_for(longestWait) != std::future_status::ready)
        cannotGoOn("a load does not end");
    return result.get();
}

void SourceMachine::tellOfVolume(const char* path)
{
    workspaceNotifications.post({ platform::volumeMountedNotification, nullptr,
        platform::Value::Dictionary { { platform::Text(platform::mountedVolumePathKey), path } } });
    // A worker sleeps before it reloads.
    while (!host->waitForThreads(std::chrono::milliseconds(1))) {
        if (clock.sleepers() != 0)
            clock.advance(std::chrono::seconds(5));
    }
}

void SourceMachine::onMainThread(const std::function<void()>& call)
{
    if (!mainRunLoop.performAndWait(call))
        cannotGoOn("the main thread has ended");
}

std::string SourceMachine::abbreviated(std::string text) const
{
    replaceAll(text, disk.path("home/Movies/Montaro Projects"), "PROJECTS");
    replaceAll(text, disk.path(), "DISK");
    return text;
}

std::vector<std::string> SourceMachine::abbreviated(std::vector<std::string> paths) const
{
    for (std::string& path : paths)
        path = abbreviated(std::move(path));
    return paths;
}

std::string SourceMachine::text(const OBMediaGroupRef& group) const
{
    return group ? abbreviated("\n" + textOfGroup(*group)) : "no group";
}

std::string SourceMachine::text(const OBMediaGroupList& groups) const
{
    std::string lines = "\n";
    for (const OBMediaGroupRef& group : groups)
        lines += textOfGroup(*group);
    return abbreviated(std::move(lines));
}

std::string SourceMachine::text(const OBMediaObjectList& objects) const
{
    return abbreviated("\n" + textOfObjects(objects));
}

std::vector<SourceMachine::LogLine> SourceMachine::takeLog()
{
    platform::Locked guard(_logLock);
    return std::exchange(_log, {});
}

HeldLoad::HeldLoad(SourceMachine& machine, OBMediaManager& manager)
    : _machine(machine)
{
    _machine.workspace.whenAsked = [this] { _stop.stopHere(); };
    _load = machine.beginLoad(manager);
    if (!_stop.waitUntilReached())
        cannotGoOn("a load does not begin");
}

HeldLoad::~HeldLoad()
{
    _stop.release();
    if (_load.wait_for(longestWait) != std::future_status::ready)
        cannotGoOn("a load does not end");
    _machine.waitForThreads();
    _machine.workspace.whenAsked = nullptr;
}

} // namespace tests
