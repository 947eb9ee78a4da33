#include "tests/host/ScriptedSource.h"

#include <stdexcept>
#include <utility>

namespace tests {

namespace {

    std::shared_ptr<Script>& scriptInUse()
    {
        static std::shared_ptr<Script> script;
        return script;
    }

    class ScriptedClass final : public OBMediaManagerClass {
    public:
        std::unique_ptr<OBMediaManager> alloc(const OBManagerContext& context) const override
        {
            return std::make_unique<ScriptedManager>(context, scriptInUse());
        }
    };

    class ClassWithoutManagers final : public OBMediaManagerClass {
    public:
        std::unique_ptr<OBMediaManager> alloc(const OBManagerContext&) const override { return nullptr; }
    };

    class ClassThatThrows final : public OBMediaManagerClass {
    public:
        std::unique_ptr<OBMediaManager> alloc(const OBManagerContext&) const override
        {
            throw std::runtime_error("no room");
        }
    };

} // namespace

void setScript(std::shared_ptr<Script> script)
{
    scriptInUse() = std::move(script);
}

ScriptedManager::ScriptedManager(const OBManagerContext& context, std::shared_ptr<Script> script)
    : OBMediaManager(context)
    , _script(std::move(script))
{
}

ScriptedManager::~ScriptedManager()
{
    _script->journal.write("destroyed");
}

bool ScriptedManager::init()
{
    const bool base = OBMediaManager::init();
    _script->journal.write("init");
    return base && (!_script->whenInit || _script->whenInit(*this));
}

void ScriptedManager::dealloc()
{
    _script->journal.write("dealloc");
    OBMediaManager::dealloc();
}

void ScriptedManager::loadData()
{
    _script->journal.write("loadData");
    if (_script->whenLoadData)
        _script->whenLoadData(*this);
    OBMediaManager::loadData();
}

OBMediaGroupRef ScriptedManager::performLoadData()
{
    const int number = ++_script->loads;
    _script->journal.write("performLoadData");
    if (_script->whenPerforming)
        _script->whenPerforming(*this);
    _script->gate.pass();
    _script->journal.write("returned");
    if (_script->whenReturning)
        return _script->whenReturning(*this);
    auto root = OBMediaGroup::initWithTypeIdentifier(OBMontaroRootGroupTypeIdentifier);
    root->setName(platform::Text("load " + std::to_string(number)));
    return root;
}

void ScriptedManager::rootMediaGroupInstalled(const OBMediaGroupRef& root)
{
    if (_script->whenInstalled)
        _script->whenInstalled(*this, root);
}

void ScriptedManager::watchedPathChanged_fileChangedEventFlags(std::string_view path, std::uint64_t)
{
    if (_script->whenPathChanged)
        _script->whenPathChanged(*this, path);
}

bool ScriptedManager::canLoadData()
{
    _script->journal.write("canLoadData");
    return _script->canLoad;
}

const OBMediaManagerClass* scriptedSource()
{
    static const ScriptedClass source;
    return &source;
}

const OBMediaManagerClass* noSource()
{
    return nullptr;
}

const OBMediaManagerClass* throwingEntryPoint()
{
    throw std::runtime_error("not today");
}

const OBMediaManagerClass* entryPointThatThrowsANumber()
{
    throw 42;
}

const OBMediaManagerClass* sourceWithoutManagers()
{
    static const ClassWithoutManagers source;
    return &source;
}

const OBMediaManagerClass* sourceThatThrowsInAlloc()
{
    static const ClassThatThrows source;
    return &source;
}

} // namespace tests
