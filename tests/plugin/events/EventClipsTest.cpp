#include "tests/plugin/support/EventMachine.h"
#include "tests/plugin/support/RecordText.h"

#include <doctest/doctest.h>

#include <cstdio>
#include <functional>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

constexpr std::string_view clipFolder = "/Trip/Original Media";

/// Name and path of each clip of the event Trip in the home's library, whose folder of clips `make` fills.
Lines clipsAfter(EventMachine& machine, const std::function<void(BundleBuilder&)>& make)
{
    BundleBuilder event = machine.events().event("Trip");
    make(event);
    const auto source = machine.makeSource();
    machine.load(*source);
    Lines lines;
    source->mediaGroups()[0]->ownMediaObjects().visit([&](const OBMediaObject& clip) {
        std::string path = machine.abbreviated(clip.path().string());
        const std::string folder = "DISK/home/Movies/Montaro Events" + std::string(clipFolder);
        if (path.starts_with(folder))
            path.replace(0, folder.size(), "CLIPS");
        lines.push_back(clip.name().string() + " " + path);
        CHECK(*clip.attributeForKey("Project Path").text() == clip.path());
        return true;
    });
    return lines;
}

Lines clipsAfter(const std::function<void(BundleBuilder&)>& make)
{
    EventMachine machine;
    return clipsAfter(machine, make);
}

/// What the event Trip got from one clip, of which the file is of 2011, that was recorded at `date`.
std::string recordedAt(platform::Date date, bool newestFirst)
{
    EventMachine machine;
    machine.arrangeNewestFirst(newestFirst);
    machine.clip("Trip", "a.mov", noonOf(2011));
    EventMachine::recordedDates()["a.mov"] = date;
    return EventMachine::yearAndDates(*machine.library()->childGroups()[0]->childGroups()[0]);
}

} // namespace

TEST_CASE("every file is a clip, whatever its extension, and so is a pipe")
{
    CHECK(clipsAfter([](BundleBuilder& event) {
        for (const char* name : { "a.mov", "b.MOV", "c", "d.tar.gz", "e.txt.", "g.", "h.." })
            event.movieWithBytes(name, "x");
        makeFolder(event.moviePath("folder.mov"));
        TemporaryFolder disk;
        disk.pipe("f.pipe");
        std::rename(disk.path("f.pipe").c_str(), event.moviePath("f.pipe").c_str());
    })
        == Lines { "a CLIPS/a.mov", "b CLIPS/b.MOV", "c CLIPS/c", "d.tar CLIPS/d.tar.gz", "e.txt CLIPS/e.txt.",
            "f CLIPS/f.pipe", "g. CLIPS/g.", "h. CLIPS/h.." });
}

TEST_CASE("clips stand in the order in which their folder lists them, links among them")
{
    EventMachine machine;
    machine.files.order = std::greater<>();
    CHECK(clipsAfter(machine,
              [](BundleBuilder& event) {
                  event.movieWithBytes("a.mov", "x")
                      .movieLink("b.mov", "/nowhere/target.mov")
                      .movieWithBytes("c.mov", "x");
                  EventMachine::recordedDates()["d.mov"] = noonOf(2011);
                  event.movieWithBytes("d.mov", "x").movieWithBytes("e.mov", "x");
              })
        == Lines { "e CLIPS/e.mov", machine.calendar.textOfDate(noonOf(2011), "%B %e, %Y %H:%M:%S") + " CLIPS/d.mov",
            "c CLIPS/c.mov", "target /nowhere/target.mov", "a CLIPS/a.mov" });
}

TEST_CASE("hidden names and listed names are no clips, and folders are not entered, packages neither")
{
    CHECK(clipsAfter([](BundleBuilder& event) {
        event.movieWithBytes(".dotted.mov", "x").movieWithBytes("listed.mov", "x").movieWithBytes("shown.mov", "x");
        event.movieSubfolder("Pack.app").movieWithBytes("folder/inner.mov", "x").hiddenMovies({ "listed.mov" });
    }) == Lines { "shown CLIPS/shown.mov" });
}

TEST_CASE("a link becomes the file that it leads to, with that file's name, unless that is hidden or a folder")
{
    EventMachine machine;
    LibraryBuilder elsewhere(machine.disk.path("elsewhere"));
    elsewhere.file("a.mov").file("hidden.mov").file(".dotted.mov").folder("folder").hiddenNames("", { "hidden.mov" });
    CHECK(clipsAfter(machine, [&](BundleBuilder& event) {
        event.movieLink("1 file", elsewhere.path("a.mov"));
        event.movieLink("2 chain", "1 file");
        event.movieLink("3 hidden", elsewhere.path("hidden.mov"));
        event.movieLink("4 dotted", elsewhere.path(".dotted.mov"));
        event.movieLink("5 folder", elsewhere.path("folder"));
        event.movieLink(".6 hidden itself", elsewhere.path("a.mov"));
    }) == Lines { "a DISK/elsewhere/a.mov", "a DISK/elsewhere/a.mov" });
}

TEST_CASE("a link that its own folder lists as hidden is a clip where the file that it leads to is shown")
{
    EventMachine machine;
    machine.disk.file("elsewhere/a.mov");
    CHECK(clipsAfter(machine, [&](BundleBuilder& event) {
        event.movieLink("listed.mov", machine.disk.path("elsewhere/a.mov")).hiddenMovies({ "listed.mov" });
    }) == Lines { "a DISK/elsewhere/a.mov" });
}

TEST_CASE("a link that leads nowhere becomes the place it names, and one in circles stays itself")
{
    CHECK(clipsAfter([](BundleBuilder& event) {
        event.movieLink("circle.mov", "circle.mov").movieLink("nowhere.mov", "../gone/b.mov");
        event.movieLink("one.mov", "two.mov").movieLink("two.mov", "one.mov").hiddenMovies({ "two.mov" });
    })
        == Lines {
            "circle CLIPS/circle.mov", "b DISK/home/Movies/Montaro Events/Trip/gone/b.mov", "one CLIPS/one.mov" });
}

TEST_CASE("where nothing is, nothing is hidden, so a link to a hidden name that is gone is a clip")
{
    CHECK(clipsAfter([](BundleBuilder& event) { event.movieLink("a.mov", "/nowhere/.dotted.mov"); })
        == Lines { ".dotted /nowhere/.dotted.mov" });
}

TEST_CASE("where the folder of clips is a link, its files bear their real paths")
{
    EventMachine machine;
    machine.disk.file("elsewhere/real/a.mov");
    machine.disk.file("elsewhere/real/b.mov");
    machine.disk.link("elsewhere/link", "real");
    BundleBuilder event = machine.events().event("Trip");
    makeLink(event.path() + "/Original Media", "../../../../elsewhere/link");
    EventMachine::recordedDates()["b.mov"] = noonOf(2011);
    const auto source = machine.makeSource();
    machine.load(*source);
    const OBMediaObjectList clips = source->mediaGroups()[0]->ownMediaObjects();
    CHECK(machine.abbreviated(clips[0]->path().string()) == "DISK/elsewhere/real/a.mov");
    CHECK(machine.abbreviated(clips[1]->path().string()) == "DISK/elsewhere/real/b.mov");
    CHECK(clips[0]->aliasResolvedPath() == clips[0]->path());
}

TEST_CASE("clips at the top of the file system have paths with one slash")
{
    EventMachine machine;
    BundleBuilder event = machine.events().event("Trip");
    makeLink(event.path() + "/Original Media", "/");
    const std::string clips = event.path() + "/Original Media";
    machine.files.furtherFiles = { { clips, "a.mov" }, { clips, "b.mov" } };
    EventMachine::recordedDates()["b.mov"] = noonOf(2011);
    const auto source = machine.makeSource();
    machine.load(*source);
    Lines paths;
    source->mediaGroups()[0]->ownMediaObjects().visit([&](const OBMediaObject& clip) {
        if (clip.path().view().ends_with(".mov"))
            paths.push_back(clip.path().string());
        return true;
    });
    CHECK(paths == Lines { "/a.mov", "/b.mov" });
}

TEST_CASE("clips carry the properties of the file at their path, and neither resolution nor duration after a load")
{
    EventMachine machine;
    machine.events().event("Trip").movie("a.mov");
    const auto source = machine.makeSource();
    machine.load(*source);
    CHECK(machine.movies.pathsRead.take().empty());
    const OBMediaObjectRef clip = source->mediaGroups()[0]->ownMediaObjects()[0];
    CHECK(clip->attributes().size() == 1);
    CHECK(*clip->marvexProperties()->valueForKey("kMDItemPath").text() == clip->path());
    CHECK(clip->marvexProperties()->valueForKey("kMDItemDurationSeconds").real());
}

TEST_CASE("a scan lists each library and each folder of clips once, and asks nothing more of a clip that is no link")
{
    EventMachine machine;
    for (const char* name : { "a.mov", "b.mov" })
        machine.clip("Trip", name, noonOf(2011));
    const auto source = machine.makeSource();
    machine.load(*source);
    Trace calls;
    machine.files.onEachCall = [&](std::string_view path) { calls.add(machine.abbreviated(std::string(path))); };
    source->_reloadMontaroEvents_updateRootMediaGroup("Montaro", false);
    machine.files.onEachCall = nullptr;
    const std::string library = "DISK/home/Movies/Montaro Events";
    CHECK(calls.take() == Lines { library, library + "/Trip/Original Media", "/Montaro Events" });
}

TEST_CASE("a clip whose recording is dated bears that date as a name, and counts to that year")
{
    EventMachine machine;
    machine.clip("Trip", "a.mov", noonOf(2011));
    machine.events().event("Trip").movieLink("b.mov", machine.disk.file("elsewhere/b.mov"));
    EventMachine::recordedDates()["a.mov"] = noonOf(1999, 12, 24);
    EventMachine::recordedDates()["b.mov"] = noonOf(2002);
    const OBMediaGroupRef event = machine.library()->childGroups()[0]->childGroups()[0];
    const auto text
        = [&](platform::Date date) { return platform::Text(machine.calendar.textOfDate(date, "%B %e, %Y %H:%M:%S")); };
    CHECK(text(noonOf(1999, 12, 24)).view().starts_with("December 24, 1999 "));
    CHECK(event->ownMediaObjects()[0]->name() == text(noonOf(1999, 12, 24)));
    CHECK(event->ownMediaObjects()[1]->name() == text(noonOf(2002)));
    CHECK(EventMachine::yearAndDates(*event) == "2002, 1999-12-24 to 2002-07-01");
}

TEST_CASE("a recording's year counts from 0 to 9999, beyond that the file's, with the date of the recording")
{
    CHECK(recordedAt(noonOf(1), true) == "1, 1-07-01 to 1-07-01");
    CHECK(recordedAt(noonOf(9999), true) == "9999, 9999-07-01 to 9999-07-01");
    CHECK(recordedAt(noonOf(10'000), true) == "2011, 10000-07-01 to 10000-07-01");
    CHECK(recordedAt(noonOf(10'000), false) == "2011, 10000-07-01 to 10000-07-01");
    CHECK(recordedAt(noonOf(-1), false) == "2011, -1-07-01 to -1-07-01");
    CHECK(recordedAt(noonOf(0), false) == "0, 0-07-01 to -");
}
