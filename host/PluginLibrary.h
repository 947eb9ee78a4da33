#pragma once

#include "host/FrameworkCore.h"
#include "host/OBBundle.h"
#include "host/OBMediaHost.h"
#include "host/OBMediaManagerClass.h"
#include "platform/ThreadSafety.h"

#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// The bundles that a host found. A bundle that cannot be used is refused with one line that names it; the others load.
/// Any thread.
class PluginLibrary {
public:
    PluginLibrary(FrameworkCore& core, std::vector<std::string> folders);

    std::vector<OBPluginInfo> plugins() const;
    /// The class of the plug-in; null when there is none or it is refused.
    const OBMediaManagerClass* managerClass(std::string_view identifier);
    OBManagerResult createManager(const std::shared_ptr<FrameworkCore>& core, std::string_view identifier);

private:
    struct Plugin {
        OBPluginInfo info;
        platform::BundleManifest manifest;
        const OBMediaManagerClass* managerClass = nullptr;
        std::shared_ptr<const OBBundle> bundle;
    };

    Plugin readBundle(std::string path) const;
    Plugin* find(std::string_view identifier) REQUIRES(_lock);
    Plugin* loaded(std::string_view identifier, std::vector<std::string>& toLog) REQUIRES(_lock);
    void load(Plugin& plugin, std::vector<std::string>& toLog) REQUIRES(_lock);
    void refuseOthers(const Plugin& used) REQUIRES(_lock);
    platform::Value stringTable(const Plugin& plugin, std::vector<std::string>& toLog) const;
    void log(const std::vector<std::string>& lines);
    void refuse(std::string_view identifier, const std::string& reason);

    FrameworkCore& _core;
    mutable platform::Mutex _lock;
    std::vector<Plugin> _plugins GUARDED_BY(_lock);
};
