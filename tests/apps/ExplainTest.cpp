#include "tests/apps/ExplainedMachine.h"

#include <doctest/doctest.h>

using namespace tests;

TEST_CASE("a movie is listed by every rule from its search folder on")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    const ExplainAnswer answer = machine.answer(trip.moviePath("a.mov"));
    CHECK(answer.listed);
    CHECK(answer.groups.empty());
    const std::string object = " | " + trip.moviePath("a.mov");
    CHECK(answer.objects == std::vector<std::string> { "Montaro" + object, trip.path() + object });
    CHECK(answer.rules
        == std::vector<std::string> {
            "search folder", "listing", "hidden name", "hidden file", "project", "movies folder", "extension" });
    CHECK(answer.remedy == "null");
    const ExplainAnswer group = machine.answer(trip.path());
    CHECK(group.listed);
    CHECK(group.groups == std::vector<std::string> { trip.path() });
    CHECK(group.objects.empty());
}

TEST_CASE("a clip tells the year that it counts to, and the date that gave it")
{
    ExplainedMachine machine;
    const BundleBuilder coast = machine.events.event("Coast").movieWithBytes("a.MOV", "clip");
    setModificationDate(coast.moviePath("a.MOV"), { 1'299'146'400, 0 });
    const ExplainAnswer answer = machine.answer(coast.moviePath("a.MOV"));
    CHECK(answer.listed);
    CHECK(answer.rules
        == std::vector<std::string> { "search folder", "listing", "hidden name", "hidden file", "folder", "event",
            "clips folder", "hidden name", "hidden file", "kind", "year" });
    CHECK(answer.reason == "2011: file date 3 Mar 2011, the earlier of birth and modification");
}

TEST_CASE("a name with a full stop first is hidden, and so is all that lies below it")
{
    ExplainedMachine machine;
    machine.projects.project(".old").movie("a.mov");
    const std::string remedy = "rename it so that its name does not begin with a full stop";
    for (const char* path : { ".old", ".old/Shared Items/a.mov", ".old/no/such/thing" }) {
        const ExplainAnswer answer = machine.answer(machine.projects.path(path));
        const bool isItself = answer.path == answer.lastPath;
        checkUnlisted(answer, "hidden name", "its name begins with a full stop", isItself ? remedy : ".old: " + remedy);
        CHECK(answer.lastPath == machine.projects.path(".old"));
    }
}

TEST_CASE("a name in the file .hidden of its folder is told by that")
{
    ExplainedMachine machine;
    machine.projects.project("Trip").movie("a.mov");
    machine.projects.hiddenNames("", { "Trip" });
    checkUnlisted(machine.answer(machine.projects.path("Trip")), "hidden file",
        "the file .hidden of its folder names it", "remove its name from the file .hidden of its folder");
}

TEST_CASE("a package is not looked into")
{
    ExplainedMachine machine;
    machine.projects.project("Some.app/Trip");
    const ExplainAnswer answer = machine.answer(machine.projects.path("Some.app/Trip"));
    checkUnlisted(answer, "package", "its extension makes it a package, which is shown as one file and not looked into",
        "Some.app: remove its extension");
}

TEST_CASE("a folder of events without the marker file is no event")
{
    ExplainedMachine machine;
    machine.events.file("Coast/Original Media/a.mov");
    checkUnlisted(machine.answer(machine.events.path("Coast/Original Media/a.mov")), "event",
        "it holds no CurrentVersion.mtrevent", "Coast: open the event in Montaro, which marks it");
}

TEST_CASE("a marker that leads nowhere is told from one that is missing")
{
    ExplainedMachine machine;
    machine.events.link("Coast/CurrentVersion.mtrevent", "gone");
    checkUnlisted(machine.answer(machine.events.path("Coast")), "event",
        "its CurrentVersion.mtrevent is a symbolic link that leads nowhere",
        "open the event in Montaro, which marks it");
}

TEST_CASE("an event is left out without a folder of clips, with an empty one, and with none that is a clip")
{
    ExplainedMachine machine;
    machine.events.file("None/CurrentVersion.mtrevent").file("Empty/CurrentVersion.mtrevent");
    machine.events.folder("Empty/Original Media");
    machine.events.event("Hidden").movieWithBytes(".a.mov", "clip");
    checkUnlisted(machine.answer(machine.events.path("None")), "clips folder", "it has no folder \"Original Media\"",
        "put its clips into a folder \"Original Media\"");
    checkUnlisted(machine.answer(machine.events.path("Empty")), "clips folder",
        "its folder \"Original Media\" is empty", "put its clips into a folder \"Original Media\"");
    checkUnlisted(machine.answer(machine.events.path("Hidden")), "clips",
        "nothing in its folder \"Original Media\" is a clip", "put a clip into its folder \"Original Media\"");
}

TEST_CASE("a movie whose name with the right extension is taken is not advised to take it")
{
    ExplainedMachine machine;
    const BundleBuilder trip
        = machine.projects.project("Trip").movieWithBytes("final.MOV", "").movieWithBytes("final.mov", "");
    checkUnlisted(machine.answer(trip.moviePath("final.MOV")), "extension",
        "the extension \"MOV\" is not one of mov, m4v, mp4, 3gp (case matters for project movies)",
        "give it another name, one that is free and ends in .mov");
}

TEST_CASE("an extension that no project movie has is named, and only its case is changed where that is enough")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip")
                                   .movieWithBytes("final.MOV", "")
                                   .movieWithBytes("a.avi", "")
                                   .movieWithBytes("b", "");
    checkUnlisted(machine.answer(trip.moviePath("final.MOV")), "extension",
        "the extension \"MOV\" is not one of mov, m4v, mp4, 3gp (case matters for project movies)",
        "rename it to final.mov");
    checkUnlisted(machine.answer(trip.moviePath("a.avi")), "extension",
        "the extension \"avi\" is not one of mov, m4v, mp4, 3gp (case matters for project movies)",
        "give it the extension mov, m4v, mp4 or 3gp");
    checkUnlisted(machine.answer(trip.moviePath("b")), "extension",
        "it has no extension, and a project's movies have mov, m4v, mp4 or 3gp",
        "give it the extension mov, m4v, mp4 or 3gp");
}

TEST_CASE("a link that leads nowhere is told so in either library")
{
    ExplainedMachine machine;
    machine.projects.link("a", "gone");
    machine.events.link("b", "gone");
    checkUnlisted(machine.answer(machine.projects.path("a")), "folder", "it is a symbolic link that leads nowhere",
        "let it lead to a project");
    checkUnlisted(machine.answer(machine.events.path("b")), "folder", "it is a symbolic link that leads nowhere",
        "put an event in its place");
}

TEST_CASE("a link to an event is not followed")
{
    ExplainedMachine machine;
    LibraryBuilder store(machine.folder.folder("store"));
    store.event("Coast").movieWithBytes("a.mov", "clip");
    machine.events.link("Coast", store.path("Coast"));
    checkUnlisted(machine.answer(machine.events.path("Coast/Original Media/a.mov")), "folder",
        "it is a symbolic link, and no link is taken for an event", "Coast: put what it leads to in its place");
}

TEST_CASE("a folder among the clips is not entered, nor a link to one")
{
    ExplainedMachine machine;
    machine.events.event("Coast").movieSubfolder("Day 1").movieLink("Day 2", machine.folder.folder("store"));
    checkUnlisted(machine.answer(machine.events.path("Coast/Original Media/Day 1")), "kind",
        "it is a folder, and folders of clips are not entered", "move the clips in it one folder up");
    checkUnlisted(machine.answer(machine.events.path("Coast/Original Media/Day 2")), "kind",
        "it leads to a folder, and folders of clips are not entered",
        "put links to the clips in that folder in its place");
}
