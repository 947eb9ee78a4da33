#include "tests/plugin/support/SourceMachine.h"

#include "host/OBMediaBrowserImageManager.h"

#include <doctest/doctest.h>

using namespace tests;
using Lines = std::vector<std::string>;
using platform::Size;

namespace {

constexpr Size iconSize { 16, 16 };

std::string bundlePicture(const char* name)
{
    return std::string(OMBRIX_PLUGIN_FOLDER "/Montaro.obplugin/resources/") + name + ".svg";
}

} // namespace

TEST_CASE("with the editor installed the root icon is the editor's, 16 by 16 points, and scales")
{
    SourceMachine machine;
    machine.workspace.iconFile.store("/icons/editor.png");
    const auto source = machine.makeSource();
    const OBImageRef icon = source->rootMediaGroupIcon();
    REQUIRE(icon);
    CHECK(icon->pixelSource().file == "/icons/editor.png");
    CHECK(icon->size() == iconSize);
    CHECK(icon->scalesWhenResized());
    CHECK(machine.trace.take()
        == Lines { "application org.ombrix.Montaro", "picture MontaroProjectIcon", "picture MontaroEventIcon",
            "picture MontaroCalendarIcon", "preferences org.ombrix.Montaro", "preferences org.ombrix.browser" });
}

TEST_CASE("without the editor, or where it has no icon, the root icon is the bundle's, 16 by 16 points, and scales")
{
    for (const bool isInstalled : { false, true }) {
        SourceMachine machine;
        if (!isInstalled)
            machine.workspace.editor.store(std::nullopt);
        const auto source = machine.makeSource();
        const OBImageRef icon = source->rootMediaGroupIcon();
        REQUIRE(icon);
        CHECK(icon->name() == "MontaroIcon");
        CHECK(icon->pixelSource().file.string() == bundlePicture("MontaroIcon"));
        CHECK(icon->size() == iconSize);
        CHECK(icon->scalesWhenResized());
    }
}

TEST_CASE("the bundle's root icon is the image manager's own image, resized in place")
{
    SourceMachine machine;
    const auto source = machine.makeSource();
    CHECK(OBMediaBrowserImageManager::sharedInstance()->imageNamed_inBundle("MontaroIcon", source->pluginBundle())
        == source->rootMediaGroupIcon());
}

TEST_CASE("every call answers the same root icon, which an editor that is installed later does not replace")
{
    SourceMachine machine;
    machine.workspace.editor.store(std::nullopt);
    const auto source = machine.makeSource();
    const OBImageRef icon = source->rootMediaGroupIcon();
    machine.workspace.editor.store(machine.disk.path("opt/montaro"));
    machine.workspace.iconFile.store("/icons/editor.png");
    machine.trace.take();
    CHECK(source->rootMediaGroupIcon() == icon);
    CHECK(source->displayImage() == icon);
    CHECK(machine.trace.take().empty());
}

TEST_CASE("a root icon that cannot be found is sought again at the next call")
{
    SourceMachine machine;
    machine.bundles.hasPictures.store(false);
    const auto source = machine.makeSource();
    CHECK(source->rootMediaGroupIcon() == nullptr);
    machine.workspace.iconFile.store("/icons/editor.png");
    const OBImageRef icon = source->rootMediaGroupIcon();
    REQUIRE(icon);
    CHECK(icon->size() == iconSize);
    CHECK(source->rootMediaGroupIcon() == icon);
}

TEST_CASE("the root group carries a copy of the root icon, 16 by 16 points")
{
    SourceMachine machine;
    machine.workspace.iconFile.store("/icons/editor.png");
    const auto source = machine.makeSource();
    const OBImageRef small = machine.load(*source).rootMediaGroup->icon();
    REQUIRE(small);
    CHECK(small->name() == "smallAppIcon");
    CHECK(small != source->rootMediaGroupIcon());
    CHECK(small->pixelSource().file == "/icons/editor.png");
    CHECK(small->size() == iconSize);
    CHECK(small->scalesWhenResized());
    source->rootMediaGroupIcon()->setSize({ 99, 99 });
    CHECK(small->size() == iconSize);
}

TEST_CASE("pictures of projects and events are the bundle's at their natural size")
{
    SourceMachine machine;
    machine.projects().project("Trip");
    const auto source = machine.makeSource();
    const OBMediaGroupList children = machine.load(*source).rootMediaGroup->childGroups();
    const OBImageRef projectIcon = children[0]->icon();
    const OBImageRef eventIcon = children[1]->icon();
    REQUIRE(projectIcon);
    REQUIRE(eventIcon);
    CHECK(projectIcon->pixelSource().file.string() == bundlePicture("MontaroProjectIcon"));
    CHECK(eventIcon->pixelSource().file.string() == bundlePicture("MontaroEventIcon"));
    const Size natural = machine.bundles.imageResource(source->pluginBundle().folder(), "MontaroProjectIcon")->size;
    CHECK(natural.width > 0);
    CHECK(projectIcon->size() == natural);
    CHECK_FALSE(projectIcon->scalesWhenResized());
}

TEST_CASE("without pictures groups carry no icon, and nothing is logged for it")
{
    SourceMachine machine;
    machine.projects().project("Trip").movie("a.mov");
    machine.bundles.hasPictures.store(false);
    const auto source = machine.makeSource();
    const OBMediaGroupRef root = machine.load(*source).rootMediaGroup;
    CHECK(root->icon() == nullptr);
    CHECK(root->childGroups()[0]->icon() == nullptr);
    CHECK(root->childGroups()[0]->mediaObjects()[0]->icon() == nullptr);
    CHECK(root->childGroups()[1]->icon() == nullptr);
    CHECK(machine.takeLog().empty());
}

TEST_CASE("grabbing the icons again loads only those that are unset")
{
    SourceMachine machine;
    machine.bundles.hasPictures.store(false);
    const auto source = machine.makeSource();
    machine.bundles.hasPictures.store(true);
    machine.trace.take();
    source->_grabMontaroIcons();
    CHECK(machine.trace.take()
        == Lines { "application org.ombrix.Montaro", "picture MontaroIcon", "picture MontaroProjectIcon",
            "picture MontaroEventIcon", "picture MontaroCalendarIcon" });
    source->_grabMontaroIcons();
    CHECK(machine.trace.take().empty());
}
