// Bundles: which are there, which of them this host can use, and the managers made of them.
//
// The one surprise: a plug-in's code runs only when one of its managers is wanted. Until then its manifest has to do.

#include "host/PluginLibrary.h"

#include "host/OBConstants.h"
#include "host/SourceCall.h"
#include "platform/Bundles.h"
#include "platform/FileSystem.h"
#include "platform/Languages.h"
#include "platform/PathText.h"

#include <algorithm>
#include <exception>
#include <utility>

using platform::Locked;
using platform::Value;

namespace {

constexpr std::string_view fallbackLanguage = "en";

/// Ends its manager when the application has dropped the last reference.
struct Ownership {
    explicit Ownership(std::shared_ptr<OBMediaManager> owned)
        : manager(std::move(owned))
    {
    }
    ~Ownership() { manager->end(); }
    Ownership(const Ownership&) = delete;
    Ownership& operator=(const Ownership&) = delete;

    const std::shared_ptr<OBMediaManager> manager;
};

/// Ends a manager's life: `dealloc` answers `init`, where that succeeded.
struct Deallocate {
    bool isReady = false;

    void operator()(OBMediaManager* manager) const
    {
        const std::unique_ptr<OBMediaManager> last(manager);
        if (last && isReady)
            last->dealloc();
    }
};

/// Calls code of a plug-in; what it throws, or nothing.
template <class Call> std::string textOfThrown(const Call& call)
{
    const std::string error = errorThrownBy(call);
    return error.empty() ? error : "it threw: " + error;
}

std::vector<std::string> bundlesIn(const platform::FileSystem& fileSystem, const std::string& folder)
{
    std::vector<std::string> paths;
    const platform::FolderListing listing = fileSystem.itemsInFolder(folder, {});
    for (const platform::FolderItem item : listing) {
        if (platform::extensionOfName(item.name) == OBBundleExtension)
            paths.push_back(platform::pathJoined(folder, item.name));
    }
    std::sort(paths.begin(), paths.end());
    return paths;
}

std::string versionProblem(const platform::BundleManifest& manifest)
{
    if (manifest.hostInterfaceMinimum <= OBHostInterfaceVersion
        && OBHostInterfaceVersion <= manifest.hostInterfaceMaximum)
        return {};
    return "made for host interface " + std::to_string(manifest.hostInterfaceMinimum) + " to "
        + std::to_string(manifest.hostInterfaceMaximum) + ", this is " + std::to_string(OBHostInterfaceVersion);
}

} // namespace

PluginLibrary::PluginLibrary(FrameworkCore& core, std::vector<std::string> folders)
    : _core(core)
{
    folders.push_back(core.platform().bundles.installedPluginsFolder());
    Locked guard(_lock);
    for (const std::string& folder : folders) {
        for (std::string& path : bundlesIn(core.platform().fileSystem, folder)) {
            const auto known = std::find_if(
                _plugins.begin(), _plugins.end(), [&](const Plugin& other) { return other.info.path == path; });
            if (known != _plugins.end())
                continue;
            _plugins.push_back(readBundle(std::move(path)));
        }
    }
}

PluginLibrary::Plugin PluginLibrary::readBundle(std::string path) const
{
    Plugin plugin;
    platform::ManifestAnswer answer = _core.platform().bundles.readManifest(path);
    plugin.info = { answer.manifest.identifier, answer.manifest.version, std::move(path), false, answer.problem };
    if (plugin.info.reason.empty())
        plugin.info.reason = versionProblem(answer.manifest);
    plugin.manifest = std::move(answer.manifest);
    return plugin;
}

std::vector<OBPluginInfo> PluginLibrary::plugins() const
{
    std::vector<OBPluginInfo> result;
    Locked guard(_lock);
    for (const Plugin& plugin : _plugins)
        result.push_back(plugin.info);
    return result;
}

/// The bundle that is used for `identifier`: the first that is not refused, else the first.
PluginLibrary::Plugin* PluginLibrary::find(std::string_view identifier)
{
    Plugin* refused = nullptr;
    for (Plugin& plugin : _plugins) {
        if (identifier.empty() || plugin.info.identifier != identifier)
            continue;
        if (plugin.info.reason.empty())
            return &plugin;
        refused = refused ? refused : &plugin;
    }
    return refused;
}

/// What is to be logged is left to the caller, for when the lock is released.
void PluginLibrary::load(Plugin& plugin, std::vector<std::string>& toLog)
{
    if (plugin.managerClass || !plugin.info.reason.empty())
        return;
    const std::string file = platform::pathJoined(plugin.info.path, plugin.manifest.library);
    const platform::LibraryAnswer library = _core.platform().bundles.loadLibrary(file, OBPluginEntryPointName);
    if (!library.problem.empty() || !library.entryPoint) {
        plugin.info.reason = library.problem.empty() ? plugin.manifest.library + ": offers no source" : library.problem;
        return;
    }
    const auto entryPoint = reinterpret_cast<OBPluginEntryPoint>(library.entryPoint);
    plugin.info.reason = textOfThrown([&] { plugin.managerClass = entryPoint(); });
    if (plugin.info.reason.empty() && !plugin.managerClass)
        plugin.info.reason = plugin.manifest.library + ": offers no source";
    plugin.info.loaded = plugin.info.reason.empty();
    if (plugin.info.loaded) {
        plugin.bundle = std::make_shared<const OBBundle>(
            _core.platform().bundles, plugin.info.path, plugin.manifest, stringTable(plugin, toLog));
        plugin.info.flaw = toLog.empty() ? std::string() : toLog.front();
    }
}

/// The texts in the first of the user's languages that the bundle has, else in English.
Value PluginLibrary::stringTable(const Plugin& plugin, std::vector<std::string>& toLog) const
{
    std::vector<std::string> wanted = _core.platform().languages.preferredLanguages();
    wanted.emplace_back(fallbackLanguage);
    const std::vector<std::string>& offered = plugin.manifest.languages;
    for (const std::string& language : wanted) {
        if (std::find(offered.begin(), offered.end(), language) == offered.end())
            continue;
        platform::StringTableAnswer answer = _core.platform().bundles.readStringTable(plugin.info.path, language);
        if (answer.problem.empty())
            return std::move(answer.table);
        toLog.push_back(std::move(answer.problem));
    }
    return {};
}

/// The bundle that is used for `identifier`, loaded: one that turns out to be damaged leaves its place to the next, and
/// the one that loads takes it for good. Refused when all are; null when there is none.
PluginLibrary::Plugin* PluginLibrary::loaded(std::string_view identifier, std::vector<std::string>& toLog)
{
    Plugin* plugin = find(identifier);
    while (plugin && plugin->info.reason.empty() && !plugin->managerClass) {
        load(*plugin, toLog);
        if (plugin->managerClass)
            refuseOthers(*plugin);
        plugin = find(identifier);
    }
    return plugin;
}

void PluginLibrary::refuseOthers(const Plugin& used)
{
    for (Plugin& plugin : _plugins) {
        if (&plugin != &used && plugin.info.identifier == used.info.identifier && plugin.info.reason.empty())
            plugin.info.reason = "the plug-in is there already, in " + used.info.path;
    }
}

const OBMediaManagerClass* PluginLibrary::managerClass(std::string_view identifier)
{
    std::vector<std::string> toLog;
    const OBMediaManagerClass* managerClass = nullptr;
    {
        Locked guard(_lock);
        const Plugin* plugin = loaded(identifier, toLog);
        managerClass = plugin && plugin->info.reason.empty() ? plugin->managerClass : nullptr;
    }
    log(toLog);
    return managerClass;
}

void PluginLibrary::log(const std::vector<std::string>& lines)
{
    for (const std::string& line : lines)
        _core.logOnce(line, nullptr);
}

OBManagerResult PluginLibrary::createManager(const std::shared_ptr<FrameworkCore>& core, std::string_view identifier)
{
    const OBMediaManagerClass* managerClass = nullptr;
    std::shared_ptr<const OBBundle> bundle;
    std::vector<std::string> toLog;
    {
        Locked guard(_lock);
        const Plugin* plugin = loaded(identifier, toLog);
        if (!plugin)
            return { nullptr, std::string(identifier) + ": there is no such plug-in" };
        if (!plugin->info.reason.empty())
            return { nullptr, plugin->info.path + ": " + plugin->info.reason };
        managerClass = plugin->managerClass;
        bundle = plugin->bundle;
    }
    log(toLog);

    std::unique_ptr<OBMediaManager> made;
    std::string problem = textOfThrown([&] { made = managerClass->alloc(OBManagerContext(core, bundle)); });
    if (problem.empty() && !made)
        problem = "it made no manager";
    const std::shared_ptr<OBMediaManager> manager(made.release(), Deallocate {});
    bool isReady = false;
    if (problem.empty())
        problem = textOfThrown([&] { isReady = manager->init(); });
    if (problem.empty() && !isReady)
        problem = "its manager did not become ready";
    if (!problem.empty()) {
        if (manager)
            manager->end();
        refuse(identifier, problem);
        return { nullptr, bundle->folder() + ": " + problem };
    }
    std::get_deleter<Deallocate>(manager)->isReady = true;
    manager->wasHandedOut();
    const auto ownership = std::make_shared<Ownership>(manager);
    return { std::shared_ptr<OBMediaManager>(ownership, manager.get()), {} };
}

/// A source that could not be made is not offered again: what it left half done is not known.
void PluginLibrary::refuse(std::string_view identifier, const std::string& reason)
{
    Locked guard(_lock);
    if (Plugin* plugin = find(identifier)) {
        plugin->info.reason = reason;
        plugin->info.loaded = false;
    }
}
