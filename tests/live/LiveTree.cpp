#include "tests/live/LiveTree.h"

#include "host/OBMediaManagerClass.h"
#include "host/OBSourceInspection.h"
#include "platform/PathText.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <utility>

extern "C" const OBMediaManagerClass* OBPluginMediaManagerClass();

namespace tests {

namespace {

    constexpr std::string_view sourceIdentifier = "org.ombrix.OBMontaroPlugin";
    constexpr const char* sharedPreferences = "/Users/ann/Library/Preferences/org.ombrix.Zuno.plist";

    const OBExecutor inPlace = [](const std::function<void()>& call) { call(); };

    /// What holds the folders to search: the home's folder of movies, volumes, the top of the boot volume.
    std::vector<std::string> volumesOf(const std::vector<std::string>& folders)
    {
        std::vector<std::string> volumes;
        for (const std::string& folder : folders)
            volumes.emplace_back(platform::pathByRemovingLastComponent(folder));
        return volumes;
    }

    /// The records of a tree, each with its nesting, which tells as much as the braces around it.
    std::vector<std::string> recordsIn(const std::string& json)
    {
        std::vector<std::string> records;
        for (std::size_t start = 0; start < json.size();) {
            const std::size_t end = std::min(json.find("{\"", start + 1), json.size());
            records.push_back(json.substr(start, end - start));
            start = end;
        }
        return records;
    }

    /// The records that only one of two trees has; where there is none, the first that stands elsewhere.
    std::string differenceOf(const std::string& open, const std::string& fresh)
    {
        const std::vector<std::string> inOpen = recordsIn(open);
        const std::vector<std::string> inFresh = recordsIn(fresh);
        std::string text;
        for (const std::string& record : inOpen) {
            if (std::count(inOpen.begin(), inOpen.end(), record) > std::count(inFresh.begin(), inFresh.end(), record))
                text += "only left open: " + record + "\n";
        }
        for (const std::string& record : inFresh) {
            if (std::count(inFresh.begin(), inFresh.end(), record) > std::count(inOpen.begin(), inOpen.end(), record))
                text += "only loaded now: " + record + "\n";
        }
        if (!text.empty())
            return text;
        const auto [first, second] = std::mismatch(inOpen.begin(), inOpen.end(), inFresh.begin(), inFresh.end());
        return "left open: " + *first + "\nloaded now: " + *second;
    }

} // namespace

LiveTree::LiveTree(std::uint64_t seed)
    : _machine(seed, reinterpret_cast<void*>(&OBPluginMediaManagerClass))
    , _operations(_machine)
{
    _machine.threads.perform([this] { prepare(); });
}

void LiveTree::prepare()
{
    Chance& chance = _machine.chance;
    _machine.pathWatching.dropsOneIn = chance.oneIn(3) ? 150 : 0;
    _machine.pathWatching.pollsOneIn = chance.oneIn(4) ? 3 : 0;
    _operations.makeEditor();
    _operations.prepare();
    // The bundle's own files are real; that there is one, the simulated disk tells.
    _machine.disk.makeFolders(OMBRIX_PLUGIN_FOLDER "/Montaro.obplugin");
    OBHostOptions options;
    options.pluginFolders = { OMBRIX_PLUGIN_FOLDER };
    _host = std::make_unique<OBMediaHost>(_machine.platform(), std::move(options));
    _source = makeSource();
    _operations.load = [this](bool cancelsFirst) {
        if (cancelsFirst)
            _source->cancelLoad();
        load(*_source);
    };
    follow();
}

LiveTree::~LiveTree()
{
    _machine.threads.perform([this] {
        _observation = {};
        _following = {};
        _freshSources.clear();
        _source = nullptr;
        _machine.threads.waitUntilQuiet();
    });
}

std::shared_ptr<OBMediaManager> LiveTree::makeSource()
{
    OBManagerResult result = _host->createManager(sourceIdentifier);
    if (!result.manager) {
        std::fprintf(stderr, "tests: there is no source: %s\n", result.problem.c_str());
        std::abort();
    }
    return std::move(result.manager);
}

/// Asks for a first tree, and follows changes before or after it has come.
void LiveTree::follow()
{
    _observation = _source->observe(inPlace, { .published = [this](const OBPublication& publication) {
        _operations.log("published " + publication.part + ": " + publication.cause.text);
    } });
    const bool followsFirst = _machine.chance.oneIn(2);
    const OBFollowOptions options { .callsOnMainThread = _machine.chance.oneIn(5) };
    if (followsFirst)
        _following = _host->followChanges(options);
    _machine.threads.pause(followsFirst ? std::chrono::seconds(0) : std::chrono::hours(1));
    load(*_source);
    if (!followsFirst)
        _following = _host->followChanges(options);
    _host->pathWatcher().watchPath_observer(sharedPreferences, _source.get());
}

void LiveTree::load(OBMediaManager& manager)
{
    manager.setNeedsReload(true);
    manager.requestRootMediaGroup(inPlace, [](const OBLoadResult&) {});
}

void LiveTree::live(int operations)
{
    Chance& chance = _machine.chance;
    for (; operations != 0; --operations) {
        _operations.perform();
        if (!chance.oneIn(3))
            _machine.threads.pause(chance.time(chance.oneIn(10) ? std::chrono::hours(2) : std::chrono::seconds(20)));
    }
    _machine.threads.waitUntilQuiet();
}

/// What changed unseen is seen with the next reload of its half, whatever brings that about.
void LiveTree::reloadUnseen()
{
    if (std::exchange(_operations.preferenceChanged, false)) {
        _machine.disk.writeFile(sharedPreferences, "shared");
        _machine.threads.waitUntilQuiet();
        _operations.unseen.note(UnseenChanges::Reason::preference, "/Users/ann/Movies/Montaro Events");
    }
    if (std::exchange(_operations.editorWasMissing, false)) {
        load(*_source);
        _machine.threads.waitUntilQuiet();
    }
    for (const std::string folder : { "/Users/ann/Movies/Montaro Projects", "/Users/ann/Movies/Montaro Events" }) {
        if (folder.ends_with("Projects") ? _operations.unseen.projects() : _operations.unseen.events())
            _machine.pathWatching.tell(
                folder, { platform::PathChange::Kind::folderChanged, true, false, folder + "/no such folder" });
    }
    _operations.unseen.forget();
    _machine.threads.waitUntilQuiet();
}

/// The volumes that are searched for events, and for projects not.
std::vector<std::string> LiveTree::laterVolumes() const
{
    const std::vector<std::string> projects = volumesOf(_source->inspection()->projectSearchPaths());
    std::vector<std::string> volumes = volumesOf(_source->inspection()->eventSearchPaths());
    std::erase_if(volumes, [&](const std::string& volume) {
        return std::find(projects.begin(), projects.end(), volume) != projects.end();
    });
    return volumes;
}

/// Has a new source build the list of folders with events that the open tree has by now.
void LiveTree::tellVolumesInSearchOrder()
{
    _toldVolumes = {};
    const std::vector<std::string> volumes = volumesOf(_source->inspection()->eventSearchPaths());
    const auto boot = std::find(volumes.begin(), volumes.end(), "/");
    for (auto volume = volumes.begin() + 1; volume < boot; ++volume)
        _toldVolumes.local.push_back({ *volume, std::string(platform::lastPathComponent(*volume)) });
    for (auto volume = boot + 1; volume < volumes.end(); ++volume)
        _toldVolumes.removable.push_back({ *volume, *volume });
    _machine.toldVolumes = &_toldVolumes;
}

OBMediaGroupRef LiveTree::freshTree()
{
    tellVolumesInSearchOrder();
    _freshSources.push_back(makeSource());
    OBMediaManager& fresh = *_freshSources.back();
    load(fresh);
    _machine.threads.waitUntilQuiet();
    _host->pathWatcher().removeObserver(&fresh);
    _machine.threads.waitUntilQuiet();
    _machine.toldVolumes = nullptr;
    return fresh.rootMediaGroup();
}

std::string LiveTree::differenceAfter(int operations)
{
    std::string found;
    _machine.threads.perform([&] {
        live(operations);
        found = difference();
    });
    return found;
}

std::string LiveTree::difference()
{
    reloadUnseen();
    const OBMediaGroupRef freshRoot = freshTree();
    const std::string open = comparableTree(_source->rootMediaGroup(), laterVolumes());
    const std::string fresh = comparableTree(freshRoot, laterVolumes());
    return open == fresh ? std::string() : differenceOf(open, fresh);
}

std::string LiveTree::history() const
{
    std::string text;
    for (const std::string& line : _operations.lines())
        text += line + "\n";
    return text;
}

} // namespace tests
