#include "plugin/MontaroConstants.h"

#include "tests/plugin/support/SourceMachine.h"

#include "host/OBMediaManagerClass.h"

#include <doctest/doctest.h>

#include <dlfcn.h>

using namespace tests;
using platform::Value;

namespace {

/// The symbol of the source's library as it was built, or null.
const void* symbolOfBundle(const char* name)
{
    void* library = dlopen(OMBRIX_PLUGIN_FOLDER "/Montaro.obplugin/OBMontaroPlugin.so", RTLD_NOW | RTLD_LOCAL);
    return library ? dlsym(library, name) : nullptr;
}

} // namespace

TEST_CASE("the published texts are exact")
{
    const std::vector<std::pair<std::string, std::string>> texts {
        { OBMontaroPluginIdentifier, "org.ombrix.Montaro" },
        { MontaroBundleIdentifier, "org.ombrix.Montaro" },
        { MontaroPrefsPath, "~/Library/Preferences/org.ombrix.Montaro.plist" },
        { OBMontaroPrefsPath, "~/Library/Preferences/org.ombrix.Montaro.plist" },
        { OBMontaro, "Montaro" },
        { OBMontaroProjectPathKey, "Project Path" },
        { OBMontaroProjectFormatVersion, "Project Format Version" },
        { OBMontaroProjectRepresentative, "Project Representative" },
        { OBMontaroPluginKey, "OBMontaroPlugin" },
        { MontaroAppIconFile, "MontaroIcon" },
        { MontaroProjectIconFile, "MontaroProjectIcon" },
        { MontaroEventIconFile, "MontaroEventIcon" },
        { MontaroCalendarIconFile, "MontaroCalendarIcon" },
        { MontaroApplicationName, "Montaro" },
        { MontaroApplicationVersion, "10.0" },
        { MontaroEventsFolderName, "Montaro Events" },
        { MontaroProjectsFolderName, "Montaro Projects" },
        { MontaroEventIdentifierPathComponent, "CurrentVersion.mtrevent" },
        { MontaroProjectIdentifierPathComponent, "CurrentVersion.mtrproject" },
        { OBMontaroEventCreationYear, "MontaroEventCreationYear" },
        { OBMontaroEventOldestClipDate, "MontaroEventOldestClipDate" },
        { OBMontaroEventNewestClipDate, "MontaroEventNewestClipDate" },
    };
    for (const auto& [text, expected] : texts)
        CHECK(text == expected);
}

TEST_CASE("the source's library exports its build version as a number")
{
    const auto* number = static_cast<const double*>(symbolOfBundle("OBMBMontaroPluginVersionNumber"));
    REQUIRE(number);
    CHECK(*number == 288.2);
}

TEST_CASE("the source's library exports its build version as a text that ends with a line feed")
{
    const auto* text = static_cast<const char*>(symbolOfBundle("OBMBMontaroPluginVersionString"));
    REQUIRE(text);
    CHECK(std::string(text) == "@(#)PROGRAM:OBMBMontaroPlugin  PROJECT:OBMBMontaroPlugin-288.2.12\n");
}

TEST_CASE("the source reports its build version to whoever inspects it")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    OBSourceInspection* const inspection = source->inspection();
    REQUIRE(inspection);
    CHECK(inspection->pluginVersionNumber() == 288.2);
    CHECK(inspection->pluginVersionString() == "@(#)PROGRAM:OBMBMontaroPlugin  PROJECT:OBMBMontaroPlugin-288.2.12\n");
}

TEST_CASE("the source says where folders of its names are searched, of paths that lie in one, and of no others")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    const OBSourceInspection& inspection = *source->inspection();
    for (const char* path : { "/x/Montaro Projects", "/x/Montaro Events/Coast/a.mov" }) {
        const auto place = inspection.whyUnsearched(path);
        REQUIRE(place);
        CHECK(place->text.find("in the home folder's Movies and at the top of local volumes") != std::string::npos);
        CHECK(place->remedy == "move the library there, or mount its volume");
    }
    for (const char* path : { "/x/Montaro Projects 2/a.mov", "/x/My Montaro Events/a.mov", "/", "" })
        CHECK_FALSE(inspection.whyUnsearched(path));
}

TEST_CASE("the identity of the source is constant")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(source->rootMediaGroupTitle() == "Montaro");
    CHECK(source->displayName() == "Montaro");
    CHECK(source->uniqueID() == "Montaro");
    CHECK(source->mediaTypesSupported() == 4);
    CHECK(source->pluginIdentifier() == "org.ombrix.OBMontaroPlugin");
    CHECK(source->displayImage() == source->rootMediaGroupIcon());
}

TEST_CASE("name, identifier and image follow a subclass that changes title and icon")
{
    class Retitled final : public OBMontaroPlugin {
    public:
        using OBMontaroPlugin::OBMontaroPlugin;
        platform::Text rootMediaGroupTitle() override { return "Other"; }
        OBImageRef rootMediaGroupIcon() override { return nullptr; }
    };
    class RetitledClass final : public OBMediaManagerClass {
    public:
        std::unique_ptr<OBMediaManager> alloc(const OBManagerContext& context) const override
        {
            return std::make_unique<Retitled>(context);
        }
    };
    static const RetitledClass retitledClass;
    const OBPluginEntryPoint entryPoint = []() -> const OBMediaManagerClass* { return &retitledClass; };

    SourceMachine machine;
    machine.bundles.linkedEntryPoint = reinterpret_cast<void*>(entryPoint);
    const auto source = machine.makeManager();
    CHECK(source->displayName() == "Other");
    CHECK(source->uniqueID() == "Other");
    CHECK(source->displayImage() == nullptr);
}

TEST_CASE("the class manages no media itself and writes one pasteboard type, given as a list in a list")
{
    SourceMachine machine;
    const OBMediaManagerClass* const sourceClass = machine.host->managerClass("org.ombrix.OBMontaroPlugin");
    REQUIRE(sourceClass);
    CHECK_FALSE(sourceClass->isManagedMediaSource());
    const Value types = sourceClass->supportedPasteboardTypes();
    REQUIRE(types.list());
    REQUIRE(types.list()->size() == 1);
    const Value& inner = types.list()->front();
    REQUIRE(inner.list());
    CHECK(*inner.list() == Value::List { "OBMontaroProjectsPboardType" });
}

TEST_CASE("the source in its bundle builds the tree that the same code builds when it is linked")
{
    std::string trees[2];
    for (const SourceCode code : { SourceCode::linked, SourceCode::bundled }) {
        SourceMachine machine(code);
        machine.projects().project("Trip").movie("a.mov");
        machine.projects().project("Old/Summer").movie("b.m4v", 640, 480);
        machine.dateEverything();
        const auto source = machine.makeManager();
        trees[code == SourceCode::linked ? 0 : 1] = machine.text(machine.load(*source).rootMediaGroup);
    }
    CHECK(trees[0].find("Summer") != std::string::npos);
    CHECK(trees[0] == trees[1]);
}
