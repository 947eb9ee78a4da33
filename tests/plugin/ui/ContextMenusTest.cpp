#include "tests/plugin/support/SourceMachine.h"

#include "host/OBConstants.h"
#include "platform/Notifications.h"

#include <doctest/doctest.h>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// A menu as lines: its title, then "TITLE ACTION KEY" of each item.
Lines linesOf(const OBMenuRef& menu)
{
    if (!menu)
        return { "no menu" };
    Lines lines { menu->title.string() + (menu->autoenablesItems ? " (enabled automatically)" : "") };
    for (const OBMenuItem& item : menu->items)
        lines.push_back(
            item.title.string() + " " + std::string(item.action->name) + " \"" + item.keyEquivalent.string() + "\"");
    return lines;
}

/// A loaded source with one movie, whose desktop and notifications are written down.
struct SourceWithMovie : SourceMachine {
    SourceWithMovie()
    {
        projects().project("First").movie("a.mov");
        source = makeSource();
        load(*source);
        project = source->rootMediaGroup()->childGroups()[0];
        movie = project->mediaObjects().objects().front();
        notifications.addObserver(
            OBWillOpenOrRevealInSourceNotification, nullptr, [this](const platform::Notification& notification) {
                trace.add(notification.object == source.get() && notification.userInfo.isNull() ? "notified"
                                                                                                : "notified wrongly");
            });
        trace.take();
    }
    /// What happened, without look-ups of the application.
    Lines happened()
    {
        Lines lines = trace.take();
        std::erase_if(lines, [](const std::string& line) { return line.starts_with("application "); });
        return lines;
    }

    std::shared_ptr<OBMontaroPlugin> source;
    OBMediaGroupRef project;
    OBMediaObjectRef movie;
};

} // namespace

TEST_CASE("a movie's menu opens the editor first and shows the file second")
{
    SourceWithMovie test;
    const OBMenuRef menu = test.source->contextMenuForMediaObject_inMediaGroup(test.movie, test.project);
    CHECK(linesOf(menu)
        == Lines { "Object Context Menu", "Open in Montaro contextMenuOpen: \"\"",
            "Show in File Manager contextMenuReveal: \"\"" });
    for (const OBMenuItem& item : menu->items) {
        CHECK(std::get<OBMediaObjectRef>(item.representedObject) == test.movie);
        CHECK(item.target.lock() == test.source);
    }
    CHECK(linesOf(test.source->contextMenuForMediaObject_inMediaGroup(test.movie, nullptr)).size() == 3);
}

TEST_CASE("the root's menu and that of any other group differ in their one item's text")
{
    SourceWithMovie test;
    const OBMenuRef ofRoot = test.source->contextMenuForMediaGroup(test.source->rootMediaGroup());
    CHECK(linesOf(ofRoot) == Lines { "Group Context Menu", "Open Montaro contextMenuOpen: \"\"" });
    CHECK(std::get<OBMediaGroupRef>(ofRoot->items[0].representedObject) == test.source->rootMediaGroup());
    CHECK(linesOf(test.source->contextMenuForMediaGroup(test.project))
        == Lines { "Group Context Menu", "Open in Montaro contextMenuOpen: \"\"" });
    CHECK(linesOf(test.source->contextMenuForMediaGroup(test.source->rootMediaGroup()->copy()))
        == Lines { "Group Context Menu", "Open in Montaro contextMenuOpen: \"\"" });
}

TEST_CASE("a missing object or group has no menu")
{
    SourceWithMovie test;
    CHECK(linesOf(test.source->contextMenuForMediaObject_inMediaGroup(nullptr, test.project)) == Lines { "no menu" });
    CHECK(linesOf(test.source->contextMenuForMediaGroup(nullptr)) == Lines { "no menu" });
}

TEST_CASE("choosing open tells of it, then launches the editor by its identifier, whatever was chosen")
{
    SourceWithMovie test;
    test.source->contextMenuForMediaObject_inMediaGroup(test.movie, test.project)->items[0].choose();
    CHECK(test.happened() == Lines { "notified", "launches org.ombrix.Montaro" });
    test.source->contextMenuForMediaGroup(test.project)->items[0].choose();
    CHECK(test.happened() == Lines { "notified", "launches org.ombrix.Montaro" });
}

TEST_CASE("choosing open does nothing where the editor is not registered, or at no place")
{
    SourceWithMovie test;
    const OBMenuRef menu = test.source->contextMenuForMediaGroup(test.project);
    test.workspace.editor.store(std::nullopt);
    menu->items[0].choose();
    test.workspace.editor.store("");
    menu->items[0].choose();
    CHECK(test.happened() == Lines {});
}

TEST_CASE("choosing reveal tells of it, then shows the movie by its real path")
{
    SourceWithMovie test;
    const OBMenuRef menu = test.source->contextMenuForMediaObject_inMediaGroup(test.movie, test.project);
    menu->items[1].choose();
    CHECK(test.happened()
        == Lines { "notified", "reveals " + test.disk.path("home/Movies/Montaro Projects/First/Shared Items/a.mov") });
}

TEST_CASE("choosing reveal does nothing for a movie that is gone, or for what is no movie")
{
    SourceWithMovie test;
    const OBMenuRef menu = test.source->contextMenuForMediaObject_inMediaGroup(test.movie, test.project);
    removeItem(test.disk.path("home/Movies/Montaro Projects/First/Shared Items/a.mov"));
    menu->items[1].choose();
    OBMenuItem ofGroup = menu->items[1];
    ofGroup.representedObject = test.project;
    ofGroup.choose();
    CHECK(test.happened() == Lines {});
}

TEST_CASE("an item of a source that has ended does nothing")
{
    SourceWithMovie test;
    const OBMenuRef menu = test.source->contextMenuForMediaGroup(test.project);
    test.source = nullptr;
    test.waitForThreads();
    test.trace.take();
    menu->items[0].choose();
    CHECK(test.happened() == Lines {});
}
