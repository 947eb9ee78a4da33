#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

#include <string>
#include <vector>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

Lines identifiersOf(const std::vector<OBPluginInfo>& plugins)
{
    Lines identifiers;
    for (const OBPluginInfo& plugin : plugins)
        identifiers.push_back(plugin.identifier);
    return identifiers;
}

} // namespace

TEST_CASE("plug-ins are told by their manifests, without loading their code")
{
    TestHost test;
    const auto plugins = test.host().plugins();
    REQUIRE(plugins.size() == 1);
    CHECK(plugins[0].identifier == "org.test.Source");
    CHECK(plugins[0].version == "1.0");
    CHECK(plugins[0].path == test.bundleFolder());
    CHECK_FALSE(plugins[0].loaded);
    CHECK(plugins[0].reason.empty());
    CHECK(test.machine.bundles.manifestsRead() == Lines { test.bundleFolder() });
    CHECK(test.machine.bundles.librariesLoaded().empty());
}

TEST_CASE("the code of a plug-in is loaded when its class or a manager is wanted, once")
{
    TestHost test;
    CHECK(test.host().managerClass(TestHost::identifier) == scriptedSource());
    CHECK(test.host().plugins()[0].loaded);
    test.manager();
    test.manager();
    CHECK(test.host().managerClass(TestHost::identifier) == scriptedSource());
    CHECK(test.machine.bundles.librariesLoaded() == Lines { test.bundleFolder() + "/library.so" });
    CHECK(test.machine.bundles.manifestsRead().size() == 1);
}

TEST_CASE("class operations may be asked without a manager")
{
    TestHost test;
    const OBMediaManagerClass* source = test.host().managerClass(TestHost::identifier);
    REQUIRE(source != nullptr);
    CHECK(source->isManagedMediaSource());
    REQUIRE(source->supportedPasteboardTypes().list() != nullptr);
    CHECK(source->supportedPasteboardTypes().list()->empty());
    CHECK(source->validDiskFormat(test.machine.folder.path()));
    CHECK_FALSE(source->validDiskFormat(test.machine.folder.path("none")));
    CHECK(test.script->journal.lines().empty());
}

TEST_CASE("class operations ask the machine of the host that there is")
{
    CHECK(OBSharedPlatform() == nullptr);
    TestHost test;
    test.host();
    REQUIRE(OBSharedPlatform() != nullptr);
    CHECK(&OBSharedPlatform()->fileSystem == &test.machine.files);
    test.endHost();
    CHECK(OBSharedPlatform() == nullptr);
}

TEST_CASE("a plug-in that is not there has neither class nor manager, and that is told")
{
    TestHost test;
    CHECK(test.host().managerClass("org.test.Unknown") == nullptr);
    CHECK(test.host().managerClass("") == nullptr);
    const OBManagerResult result = test.host().createManager("org.test.Unknown");
    CHECK(result.manager == nullptr);
    CHECK(result.problem == "org.test.Unknown: there is no such plug-in");
}

TEST_CASE("a manager knows its plug-in's identifier and bundle")
{
    TestHost test;
    const auto manager = test.manager();
    CHECK(manager->pluginIdentifier() == "org.test.Source");
    CHECK(manager->pluginBundle().identifier() == "org.test.Source");
    CHECK(manager->pluginBundle().folder() == test.bundleFolder());
    CHECK(manager->pluginBundle().manifest().version == "1.0");
    CHECK(manager->uniqueID() == "org.test.Source");
}

TEST_CASE("a source that overrides nothing answers absent, null or empty")
{
    TestHost test;
    const auto manager = test.manager();
    CHECK(manager->displayName().isAbsent());
    CHECK(manager->displayImage() == nullptr);
    CHECK(manager->rootMediaGroupTitle().isAbsent());
    CHECK(manager->rootMediaGroupIcon() == nullptr);
    CHECK(manager->mediaTypesSupported() == 0);
    CHECK(manager->applicationVersion().isAbsent());
    CHECK(manager->getAppPath().isAbsent());
    CHECK_FALSE(manager->appInstalled());
    CHECK(manager->mediaGroups().empty());
    CHECK(manager->movieGroups().empty());
    CHECK(manager->defaultNoDataMessage(nullptr).isAbsent());
    CHECK(manager->inspection() == nullptr);
}

TEST_CASE("the application's folders are searched in their order, before the installed one")
{
    TestHost test;
    test.machine.addBundle("installed/Z.obplugin", "org.test.Installed");
    test.machine.addBundle("second/B.obplugin", "org.test.B");
    test.machine.addBundle("second/A.obplugin", "org.test.A");
    test.machine.bundles.installedFolder = test.machine.folder.path("installed");
    test.options.pluginFolders = { test.machine.folder.path("second"), test.machine.folder.path("missing"),
        test.machine.folder.path("plugins") };
    CHECK(identifiersOf(test.host().plugins())
        == Lines { "org.test.A", "org.test.B", "org.test.Source", "org.test.Installed" });
}

TEST_CASE("of two plug-ins with one identifier the first is used, and the other names it")
{
    TestHost test;
    MadeUpBundle& second = test.machine.addBundle("more/Copy.obplugin", TestHost::identifier);
    second.manifest.version = "2.0";
    test.options.pluginFolders.push_back(test.machine.folder.path("more"));
    CHECK(test.manager()->pluginBundle().manifest().version == "1.0");
    const auto plugins = test.host().plugins();
    REQUIRE(plugins.size() == 2);
    CHECK(plugins[0].loaded);
    CHECK(plugins[0].reason.empty());
    CHECK_FALSE(plugins[1].loaded);
    CHECK(plugins[1].reason.find(test.bundleFolder()) != std::string::npos);
}

TEST_CASE("a plug-in whose library is damaged leaves its place to another with its identifier")
{
    TestHost test;
    test.bundle().libraryProblem = "it is no library";
    MadeUpBundle& second = test.machine.addBundle("more/Copy.obplugin", TestHost::identifier);
    second.manifest.version = "2.0";
    test.options.pluginFolders.push_back(test.machine.folder.path("more"));
    CHECK(test.manager()->pluginBundle().manifest().version == "2.0");
    const auto plugins = test.host().plugins();
    REQUIRE(plugins.size() == 2);
    CHECK(plugins[0].reason == "it is no library");
    CHECK(plugins[1].loaded);
}

TEST_CASE("a refused plug-in does not stand in the way of another with its identifier")
{
    TestHost test;
    test.bundle().manifest.hostInterfaceMinimum = OBHostInterfaceVersion + 1;
    test.bundle().manifest.hostInterfaceMaximum = OBHostInterfaceVersion + 1;
    MadeUpBundle& second = test.machine.addBundle("more/Copy.obplugin", TestHost::identifier);
    second.manifest.version = "2.0";
    test.options.pluginFolders.push_back(test.machine.folder.path("more"));
    CHECK(test.manager()->pluginBundle().manifest().version == "2.0");
}

TEST_CASE("a folder that is searched twice gives its plug-ins once")
{
    TestHost test;
    test.options.pluginFolders.push_back(test.options.pluginFolders[0]);
    test.machine.bundles.installedFolder = test.options.pluginFolders[0];
    CHECK(test.host().plugins().size() == 1);
}

TEST_CASE("only what is named like a bundle is taken for one")
{
    TestHost test;
    test.machine.addBundle("plugins/Other.bundle", "org.test.NoPlugin");
    test.machine.addBundle("plugins/obplugin", "org.test.NoExtension");
    test.machine.folder.file("plugins/readme.txt", "text");
    CHECK(identifiersOf(test.host().plugins()) == Lines { "org.test.Source" });
}

TEST_CASE("trying all plug-ins makes a manager of each, and ends it")
{
    TestHost test;
    test.machine.addBundle("plugins/Broken.obplugin", "org.test.Broken").entryPoint = nullptr;
    const auto plugins = test.host().tryAllPlugins();
    REQUIRE(plugins.size() == 2);
    CHECK(plugins[0].identifier == "org.test.Broken");
    CHECK_FALSE(plugins[0].loaded);
    CHECK_FALSE(plugins[0].reason.empty());
    CHECK(plugins[1].loaded);
    CHECK(plugins[1].reason.empty());
    CHECK(test.script->journal.lines() == Lines { "init", "dealloc", "destroyed" });
}
