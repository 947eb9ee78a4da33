#include "tests/live/LiveTree.h"

#include "host/OBSourceInspection.h"
#include "platform/PathText.h"

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <iterator>
#include <utility>

namespace tests {

namespace {

    constexpr std::string_view sourceIdentifier = "org.ombrix.OBMontaroPlugin";
    constexpr const char* sharedPreferences = "/Users/ann/Library/Preferences/org.ombrix.Zuno.plist";

    const OBExecutor inPlace = [](const std::function<void()>& call) { call(); };

    /// What holds the folders to search: the home's folder of movies, volumes, the top of the boot volume.
    std::vector<std::string> volumesOf(const std::vector<std::string>& folders)
    {
        std::vector<std::string> volumes;
        volumes.reserve(folders.size());
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

LiveTree::LiveTree(LiveMachine& machine)
    : _machine(machine)
    , _operations(_machine)
{
    _machine.perform([this] { prepare(); });
}

void LiveTree::prepare()
{
    _machine.drawWatching();
    _operations.makeEditor();
    _operations.prepare();
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
    _machine.perform([this] {
        _observation = {};
        _following = {};
        _freshSources.clear();
        _source = nullptr;
        waitUntilQuiet();
        _machine.end();
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
        ++_publications;
        _operations.log("published " + publication.part + ": " + publication.cause.text);
    } });
    const bool followsFirst = _machine.chance().oneIn(2);
    const OBFollowOptions options { .callsOnMainThread = _machine.chance().oneIn(5) };
    if (followsFirst)
        _following = _host->followChanges(options);
    _machine.pause(followsFirst ? std::chrono::seconds(0) : std::chrono::hours(1));
    load(*_source);
    if (!followsFirst)
        _following = _host->followChanges(options);
    _host->pathWatcher().watchPath_observer(_machine.spelled(sharedPreferences), _source.get());
}

void LiveTree::load(OBMediaManager& manager)
{
    manager.setNeedsReload(true);
    manager.requestRootMediaGroup(inPlace, [](const OBLoadResult&) {});
}

void LiveTree::live(int operations)
{
    for (; operations != 0; --operations) {
        _operations.perform();
        if (!_machine.chance().oneIn(3))
            _machine.pauseBetweenOperations();
    }
    waitUntilQuiet();
}

/// What changed unseen is seen with the next reload of its half, whatever brings that about.
void LiveTree::reloadUnseen()
{
    if (std::exchange(_operations.preferenceChanged, false)) {
        _machine.disk().writeFile(sharedPreferences, "shared");
        waitUntilQuiet();
        _operations.unseen.note(UnseenChanges::Reason::preference, "/Users/ann/Movies/Montaro Events");
    }
    if (std::exchange(_operations.editorWasMissing, false)) {
        load(*_source);
        waitUntilQuiet();
    }
    for (const char* const name : { "Montaro Projects", "Montaro Events" }) {
        const std::string folder = _machine.spelled(std::string("/Users/ann/Movies/") + name);
        if (folder.ends_with("Projects") ? _operations.unseen.projects() : _operations.unseen.events())
            _machine.tell(
                folder, { platform::PathChange::Kind::folderChanged, true, false, folder + "/no such folder" });
    }
    _operations.unseen.forget();
    waitUntilQuiet();
}

/// The folders with projects that only one of both searches.
std::vector<std::string> LiveTree::foldersOfOneTree() const
{
    std::vector<std::string> open = _source->inspection()->projectSearchPaths();
    std::vector<std::string> fresh = _freshSources.back()->inspection()->projectSearchPaths();
    std::sort(open.begin(), open.end());
    std::sort(fresh.begin(), fresh.end());
    std::vector<std::string> folders;
    std::set_symmetric_difference(open.begin(), open.end(), fresh.begin(), fresh.end(), std::back_inserter(folders));
    return folders;
}

/// Has a new source build the list of folders with events that the open tree has by now.
void LiveTree::tellVolumesInSearchOrder()
{
    ListedVolumes told;
    const std::vector<std::string> volumes = volumesOf(_source->inspection()->eventSearchPaths());
    const auto boot = std::find(volumes.begin(), volumes.end(), "/");
    for (auto volume = volumes.begin() + 1; volume < boot; ++volume)
        told.local.push_back({ *volume, std::string(platform::lastPathComponent(*volume)) });
    for (auto volume = boot + 1; volume < volumes.end(); ++volume)
        told.removable.push_back({ *volume, *volume });
    _machine.tellVolumes(&told);
}

OBMediaGroupRef LiveTree::freshTree()
{
    tellVolumesInSearchOrder();
    _freshSources.push_back(makeSource());
    OBMediaManager& fresh = *_freshSources.back();
    load(fresh);
    _machine.waitUntil([&] { return fresh.isAtRest(); });
    _host->pathWatcher().removeObserver(&fresh);
    _machine.waitUntil([&] { return fresh.isAtRest(); });
    _machine.tellVolumes(nullptr);
    return fresh.rootMediaGroup();
}

std::string LiveTree::differenceAfter(int operations)
{
    std::string found;
    _machine.perform([&] {
        live(operations);
        found = difference();
    });
    return found;
}

void LiveTree::waitUntilQuiet()
{
    _machine.waitUntilQuiet([this] { return isAtRest(); });
}

bool LiveTree::isAtRest()
{
    const std::uint64_t publications = _publications;
    if (std::exchange(_publicationsSeen, publications) != publications)
        return false;
    return (!_source || _source->isAtRest())
        && std::all_of(_freshSources.begin(), _freshSources.end(), [](const auto& fresh) { return fresh->isAtRest(); });
}

std::string LiveTree::difference()
{
    reloadUnseen();
    const OBMediaGroupRef freshRoot = freshTree();
    const std::string open = comparableTree(_source->rootMediaGroup(), foldersOfOneTree());
    const std::string fresh = comparableTree(freshRoot, foldersOfOneTree());
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
