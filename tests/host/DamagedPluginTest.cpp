#include "host/OBConstants.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <stdexcept>
#include <string>
#include <vector>

using namespace tests;

namespace {

const OBMediaManagerClass* entryPointThatThrowsTwoLines()
{
    throw std::runtime_error("first\nsecond");
}

/// Checks that the bundle is refused with one line that names it and holds `reason`, and that the other one loads.
void checkRefused(TestHost& test, const std::string& identifier, const std::string& reason)
{
    CAPTURE(reason);
    const std::string folder = test.machine.folder.path("plugins/Damaged.obplugin");
    test.host().tryAllPlugins();
    const auto plugins = test.host().plugins();
    REQUIRE(plugins.size() == 2);
    CHECK(plugins[0].path == folder);
    CHECK_FALSE(plugins[0].loaded);
    CHECK(plugins[0].reason.find(reason) != std::string::npos);
    CHECK(plugins[0].reason.find('\n') == std::string::npos);
    CHECK(test.host().managerClass(identifier) == nullptr);
    if (!identifier.empty()) {
        const OBManagerResult result = test.host().createManager(identifier);
        CHECK(result.manager == nullptr);
        CHECK(result.problem.find(folder) != std::string::npos);
        CHECK(result.problem.find(reason) != std::string::npos);
        CHECK(result.problem.find('\n') == std::string::npos);
    }
    CHECK(plugins[1].loaded);
    CHECK(test.manager() != nullptr);
}

MadeUpBundle& addDamaged(TestHost& test)
{
    return test.machine.addBundle("plugins/Damaged.obplugin", "org.test.Damaged");
}

} // namespace

TEST_CASE("a plug-in with a damaged manifest is refused")
{
    TestHost test;
    addDamaged(test).manifestProblem = "manifest.json:3: no value";
    checkRefused(test, "", "manifest.json:3: no value");
    CHECK(test.machine.bundles.librariesLoaded().size() == 1);
}

TEST_CASE("a plug-in without a manifest is refused")
{
    TestHost test;
    test.machine.folder.folder("plugins/Damaged.obplugin");
    checkRefused(test, "", "manifest.json: no such file");
}

TEST_CASE("a plug-in made for a later host interface is refused without loading its code")
{
    TestHost test;
    MadeUpBundle& bundle = addDamaged(test);
    bundle.manifest.hostInterfaceMinimum = OBHostInterfaceVersion + 1;
    bundle.manifest.hostInterfaceMaximum = OBHostInterfaceVersion + 3;
    checkRefused(test, "org.test.Damaged", "made for host interface 2 to 4, this is 1");
    CHECK(test.machine.bundles.librariesLoaded().size() == 1);
}

TEST_CASE("a plug-in made for an earlier host interface is refused without loading its code")
{
    TestHost test;
    MadeUpBundle& bundle = addDamaged(test);
    bundle.manifest.hostInterfaceMinimum = OBHostInterfaceVersion - 1;
    bundle.manifest.hostInterfaceMaximum = OBHostInterfaceVersion - 1;
    checkRefused(test, "org.test.Damaged", "made for host interface 0 to 0, this is 1");
    CHECK(test.machine.bundles.librariesLoaded().size() == 1);
}

TEST_CASE("a plug-in whose range of host interfaces holds this one is taken")
{
    TestHost test;
    test.bundle().manifest.hostInterfaceMinimum = OBHostInterfaceVersion - 1;
    test.bundle().manifest.hostInterfaceMaximum = OBHostInterfaceVersion + 5;
    CHECK(test.manager() != nullptr);
}

TEST_CASE("a plug-in whose library is missing or damaged is refused")
{
    TestHost test;
    addDamaged(test).libraryProblem = "library.so: cannot be loaded";
    checkRefused(test, "org.test.Damaged", "library.so: cannot be loaded");
}

TEST_CASE("a library without an entry point is refused")
{
    TestHost test;
    addDamaged(test).entryPoint = nullptr;
    checkRefused(test, "org.test.Damaged", "no function OBPluginMediaManagerClass");
}

TEST_CASE("a plug-in that offers no source is refused")
{
    TestHost test;
    addDamaged(test).entryPoint = &noSource;
    checkRefused(test, "org.test.Damaged", "offers no source");
}

TEST_CASE("a plug-in whose entry point throws is refused, whatever it throws")
{
    TestHost test;
    addDamaged(test).entryPoint = &throwingEntryPoint;
    checkRefused(test, "org.test.Damaged", "it threw: not today");
    TestHost other;
    addDamaged(other).entryPoint = &entryPointThatThrowsANumber;
    checkRefused(other, "org.test.Damaged", "it threw");
}

TEST_CASE("what a plug-in throws is told on one line")
{
    TestHost test;
    addDamaged(test).entryPoint = &entryPointThatThrowsTwoLines;
    checkRefused(test, "org.test.Damaged", "it threw: first");
}

TEST_CASE("a plug-in that makes no manager is refused")
{
    TestHost test;
    addDamaged(test).entryPoint = &sourceWithoutManagers;
    checkRefused(test, "org.test.Damaged", "it made no manager");
}

TEST_CASE("a plug-in that throws when it makes a manager is refused")
{
    TestHost test;
    addDamaged(test).entryPoint = &sourceThatThrowsInAlloc;
    checkRefused(test, "org.test.Damaged", "it threw: no room");
}

TEST_CASE("a plug-in whose manager throws in its init is refused, and the manager is destroyed without dealloc")
{
    TestHost test;
    addDamaged(test);
    test.script->whenInit = [](ScriptedManager& manager) -> bool {
        if (manager.pluginIdentifier() == "org.test.Damaged")
            throw std::runtime_error("not ready");
        return true;
    };
    const OBManagerResult result = test.host().createManager("org.test.Damaged");
    CHECK(result.manager == nullptr);
    CHECK(test.script->journal.lines() == std::vector<std::string> { "init", "destroyed" });
    checkRefused(test, "org.test.Damaged", "it threw: not ready");
}

TEST_CASE("a plug-in whose manager does not become ready is refused and not tried again")
{
    TestHost test;
    addDamaged(test);
    test.script->whenInit = [](ScriptedManager& manager) { return manager.pluginIdentifier() != "org.test.Damaged"; };
    CHECK(test.host().createManager("org.test.Damaged").manager == nullptr);
    CHECK(test.host().createManager("org.test.Damaged").manager == nullptr);
    CHECK(test.script->journal.count("init") == 1);
    checkRefused(test, "org.test.Damaged", "did not become ready");
}

TEST_CASE("a manager that was handed out works on when another of its plug-in could not be made")
{
    TestHost test;
    bool isReady = true;
    test.script->whenInit = [&isReady](ScriptedManager&) { return isReady; };
    const auto manager = test.manager();
    isReady = false;
    CHECK(test.host().createManager(TestHost::identifier).manager == nullptr);
    CHECK(Request(*manager).answer().outcome == OBLoadOutcome::loaded);
}
