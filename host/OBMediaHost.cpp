#include "host/OBMediaHost.h"

#include "host/FrameworkCore.h"
#include "host/LiveQueryTable.h"
#include "host/PluginLibrary.h"

#include <set>
#include <utility>

OBMediaHost::OBMediaHost(const platform::Platform& platform, OBHostOptions options)
    : _core(std::make_shared<FrameworkCore>(platform, std::move(options.logSink)))
    , _plugins(std::make_unique<PluginLibrary>(*_core, std::move(options.pluginFolders)))
{
    FrameworkCore::setCurrent(_core);
}

OBMediaHost::~OBMediaHost()
{
    if (FrameworkCore::current() == _core)
        FrameworkCore::setCurrent(nullptr);
    _core->stopLogging();
}

std::vector<OBPluginInfo> OBMediaHost::plugins()
{
    return _plugins->plugins();
}

std::vector<OBPluginInfo> OBMediaHost::tryAllPlugins()
{
    std::set<std::string> tried;
    for (const OBPluginInfo& plugin : _plugins->plugins()) {
        if (plugin.reason.empty() && tried.insert(plugin.identifier).second)
            createManager(plugin.identifier);
    }
    return _plugins->plugins();
}

const OBMediaManagerClass* OBMediaHost::managerClass(std::string_view identifier)
{
    return _plugins->managerClass(identifier);
}

OBManagerResult OBMediaHost::createManager(std::string_view identifier)
{
    return _plugins->createManager(_core, identifier);
}

OBObservation OBMediaHost::followChanges(const OBFollowOptions& options)
{
    _core->beginFollowing(options);
    return OBObservation(std::shared_ptr<void>(nullptr, [core = _core](void*) { core->endFollowing(); }));
}

OBObservation OBMediaHost::followQuery(const std::shared_ptr<const OBMetadataQuery>& query,
    const std::vector<std::string>& scope, OBLiveQueryHandlers handlers)
{
    const platform::Date now = _core->platform().pathWatching.timeOfChangesNow();
    const auto following = LiveQueryTable::follow(*_core, query, scope, now, std::move(handlers));
    return OBObservation(std::shared_ptr<void>(nullptr, [core = _core, following](void*) {}));
}

OBPathWatcher& OBMediaHost::pathWatcher()
{
    return _core->pathWatcher();
}

std::size_t OBMediaHost::threadCount() const
{
    return _core->threadCount();
}

bool OBMediaHost::waitForThreads(std::chrono::nanoseconds limit)
{
    return _core->waitForThreads(limit);
}
