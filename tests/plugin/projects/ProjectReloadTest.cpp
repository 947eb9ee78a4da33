#include "tests/plugin/support/RecordText.h"
#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"

#include <doctest/doctest.h>

using namespace tests;

namespace {

constexpr const char* editorNotFound = "OBMBMontaroPlugin -- getAppPath -- could not find Montaro Application";

OBMediaGroupRef groupOfType(OBTypeIdentifierRef type, const char* name)
{
    OBMediaGroupRef group = OBMediaGroup::initWithTypeIdentifier(type);
    group->setName(name);
    return group;
}

OBMediaGroupRef project(const char* name)
{
    return groupOfType(OBMontaroProjectGroupTypeIdentifier, name);
}

OBMediaGroupRef folder(const char* name)
{
    return groupOfType(OBMontaroFolderGroupTypeIdentifier, name);
}

OBMediaGroupRef events(const char* name)
{
    return groupOfType(OBMontaroEventLibraryGroupTypeIdentifier, name);
}

OBMediaGroupRef with(OBMediaGroupRef group, std::vector<OBMediaGroupRef> children)
{
    group->setChildGroups(OBMediaGroupList(std::move(children)));
    return group;
}

/// The root's children, first `before`, after a reload that found `found`.
std::string childrenAfterReload(SourceMachine& machine, OBMontaroPlugin& source, std::vector<OBMediaGroupRef> before,
    std::vector<OBMediaGroupRef> found)
{
    machine.takeLog();
    source.setRootMediaGroup(with(groupOfType(OBMontaroRootGroupTypeIdentifier, "Montaro"), std::move(before)));
    source.finishReloadMontaroProjects(with(project("library"), std::move(found)));
    return childNames(*source.rootMediaGroup());
}

} // namespace

TEST_CASE("a projects reload replaces projects and folders, keeps the rest, and sorts by name with the events last")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(childrenAfterReload(machine, *source, { events("E"), project("b"), project("A"), folder("c") },
              { project("Zed"), project("alpha") })
        == "alpha Zed E");
    CHECK(machine.takeLog().empty());
}

TEST_CASE("a projects reload that finds nothing leaves the events, whether or not the editor is installed")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(childrenAfterReload(machine, *source, { events("E"), project("A") }, {}) == "E");
    machine.workspace.editor.store(std::nullopt);
    CHECK(childrenAfterReload(machine, *source, { events("E"), project("A") }, {}) == "E");
    CHECK(machine.takeLog().empty());
}

TEST_CASE("a projects reload that leaves nothing empties the root while the editor is installed")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(childrenAfterReload(machine, *source, { project("A"), folder("b") }, {}).empty());
    CHECK(machine.takeLog().empty());
}

TEST_CASE("a projects reload that leaves nothing changes nothing once the editor is gone, and asks for it once")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    machine.workspace.editor.store(std::nullopt);
    CHECK(childrenAfterReload(machine, *source, { project("b"), project("A") }, {}) == "b A");
    CHECK(machine.takeLog() == std::vector<SourceMachine::LogLine> { { editorNotFound, 2, source.get() } });
    machine.workspace.editor.store("/registered/but/gone");
    CHECK(childrenAfterReload(machine, *source, { project("b"), project("A") }, {}) == "b A");
}

TEST_CASE("a projects reload keeps project libraries and groups tagged with equal texts, sorted among the rest")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    static constexpr OBTypeIdentifier sameText("OBMontaroProjectGroupTypeIdentifier");
    CHECK(childrenAfterReload(machine, *source,
              { events("E"), groupOfType(OBMontaroProjectLibraryGroupTypeIdentifier, "m"), groupOfType(&sameText, "c"),
                  groupOfType(nullptr, "y") },
              { project("d") })
        == "c d m y E");
}

TEST_CASE("a projects reload keeps the very groups that it keeps")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    const OBMediaGroupList before = root->childGroups();
    source->_reloadMontaroProjects();
    CHECK(source->rootMediaGroup() == root);
    CHECK(root->childGroups()[1] == before[1]);
    CHECK(root->childGroups()[0] != before[0]);
    CHECK(childNames(*root) == "Trip Events");
}

TEST_CASE("before the first load a projects reload finds nothing and publishes nothing")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    const auto source = machine.makeSource();
    CHECK(source->_reloadMontaroProjects().empty());
    CHECK(source->rootMediaGroup() == nullptr);
    source->finishReloadMontaroProjects(project("library"));
    CHECK(source->rootMediaGroup() == nullptr);
}

TEST_CASE("a projects reload sorts what the load had left in scan order")
{
    SourceMachine machine;
    machine.files.order = std::greater<>();
    for (const char* name : { "a", "B", "c folder/x", "D" })
        machine.projects().project(name);
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(childNames(*root) == "c folder a D B Events");
    source->_reloadMontaroProjects();
    CHECK(childNames(*root) == "a B c folder D Events");
}

TEST_CASE("a projects reload merges all libraries and publishes the installed root with its objects rebuilt")
{
    SourceMachine machine;
    machine.projects().project("b");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    Trace published;
    OBManagerCallbacks callbacks;
    callbacks.rootPublished = [&](const OBMediaGroupRef& group) {
        published.add((group == root ? "same root: " : "another root: ") + childNames(*group) + " | "
            + objectNames(group->ownMediaObjects()));
    };
    const OBObservation observation
        = source->observe([](const std::function<void()>& call) { call(); }, std::move(callbacks));
    machine.projects().project("b").movie("b.mov");
    machine.bootProjects().project("A").movie("a.mov");
    source->_reloadMontaroProjects();
    CHECK(published.take() == std::vector<std::string> { "same root: A b Events | A b" });
}

TEST_CASE("the result of a publishing scan holds the groups of all but the first library twice")
{
    SourceMachine machine;
    machine.projects().project("a");
    machine.bootProjects().project("b");
    machine.volumes.local.store({ { "/Volumes/Data", "Data" } });
    machine.volumeProjects("Data").project("c");
    const auto source = machine.makeSource();
    machine.load(*source);
    const OBMediaGroupList found = source->_reloadMontaroProjects(true);
    std::string names;
    for (const OBMediaGroupRef& group : found)
        names += group->name().string();
    CHECK(names == "acbcb");
    CHECK(found[1] == found[3]);
    CHECK(found[2] == found[4]);
}

TEST_CASE("the result of a scan that does not publish holds each group once and leaves the root alone")
{
    SourceMachine machine;
    machine.projects().project("a");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    machine.bootProjects().project("b");
    const OBMediaGroupList found = source->_reloadMontaroProjects(false);
    CHECK(found.size() == 2);
    CHECK(childNames(*root) == "a Events");
    CHECK(source->mediaGroups().size() == 2);
}

TEST_CASE("a reload on the main thread produces thumbnails at once")
{
    SourceMachine machine;
    machine.projects().project("a").movie("a.mov");
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    machine.projects().project("b").movie("b.mov");
    machine.onMainThread([&] { source->_reloadMontaroProjects(); });
    CHECK(objectNames(root->ownMediaObjects()) == "a b");
}
