#pragma once

#include "host/OBMediaManager.h"
#include "host/OBMediaManagerClass.h"
#include "tests/host/Waiting.h"

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <thread>

namespace tests {

class ScriptedManager;

/// What the managers of a made-up source do, and what was seen of them. The hooks are set before a manager is made.
struct Script {
    std::function<bool(ScriptedManager&)> whenInit {}; ///< true where it is not set
    std::function<void(ScriptedManager&)> whenLoadData {}; ///< before the base operation
    std::function<void(ScriptedManager&)> whenPerforming {}; ///< before the gate
    std::function<OBMediaGroupRef(ScriptedManager&)> whenReturning {}; ///< a new tree where it is not set

    std::function<void(ScriptedManager&, std::string_view path)> whenPathChanged {};
    std::function<void(ScriptedManager&, const OBMediaGroupRef& root)> whenInstalled {};

    std::atomic<bool> canLoad { true };
    std::atomic<int> loads { 0 }; ///< begun
    Gate gate {}; ///< each load comes to it
    /// What managers were called for: init, canLoadData, loadData, performLoadData, returned, dealloc, destroyed.
    Journal journal {};
};

/// The script by which managers are made from now on. Test thread.
void setScript(std::shared_ptr<Script> script);

/// A manager that follows the script that was set when it was made.
class ScriptedManager final : public OBMediaManager, public OBMediaManagerPlugin_MustImplement {
public:
    ScriptedManager(const OBManagerContext& context, std::shared_ptr<Script> script);
    ~ScriptedManager() override;

    bool init() override;
    void dealloc() override;
    void loadData() override;
    OBMediaGroupRef performLoadData() override;
    bool canLoadData() override;
    void rootMediaGroupInstalled(const OBMediaGroupRef& root) override;
    void watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t flags) override;

private:
    const std::shared_ptr<Script> _script;
};

// Entry points of plug-ins.

const OBMediaManagerClass* scriptedSource();
const OBMediaManagerClass* noSource();
const OBMediaManagerClass* throwingEntryPoint();
const OBMediaManagerClass* entryPointThatThrowsANumber();
const OBMediaManagerClass* sourceWithoutManagers();
const OBMediaManagerClass* sourceThatThrowsInAlloc();

} // namespace tests
