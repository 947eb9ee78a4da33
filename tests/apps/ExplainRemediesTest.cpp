// Advice that people follow: none of it ends a project or an event, or lists what is no movie.

#include "tests/apps/ExplainedMachine.h"

#include <doctest/doctest.h>

using namespace tests;

TEST_CASE("what lies beside the movies of a project or event is told where movies belong")
{
    ExplainedMachine machine;
    machine.projects.project("Trip").file("loose.mov").file("Takes/a.mov");
    machine.events.event("Coast").movie("a.mov").file("loose.mov").file("Day 1/a.mov");
    const std::string ofProject = "of a project only the movies directly in its folder \"Shared Items\" are listed";
    const std::string ofEvent = "of an event only the clips directly in its folder \"Original Media\" are listed";
    for (const char* path : { "Trip/loose.mov", "Trip/Takes/a.mov" })
        checkUnlisted(machine.answer(machine.projects.path(path)), "place", ofProject,
            "move it into the project's folder \"Shared Items\", with the extension mov, m4v, mp4 or 3gp");
    checkUnlisted(machine.answer(machine.projects.path("Trip/Takes")), "place", ofProject,
        "move the movies in it into the project's folder \"Shared Items\"");
    for (const char* path : { "Coast/loose.mov", "Coast/Day 1/a.mov" })
        checkUnlisted(machine.answer(machine.events.path(path)), "place", ofEvent,
            "move it into the event's folder \"Original Media\"");
    checkUnlisted(machine.answer(machine.events.path("Coast/Day 1")), "place", ofEvent,
        "move the clips in it into the event's folder \"Original Media\"");
}

TEST_CASE("nobody is advised to move what marks a project or event")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip");
    const BundleBuilder coast = machine.events.event("Coast").movie("a.mov");
    checkUnlisted(machine.answer(trip.path() + "/CurrentVersion.mtrproject"), "place", "it marks the project", "null");
    checkUnlisted(machine.answer(coast.path() + "/CurrentVersion.mtrevent"), "place", "it marks the event", "null");
}

TEST_CASE("a project or event in another is to move out of it")
{
    ExplainedMachine machine;
    machine.projects.project("Outer");
    machine.projects.project("Outer/Sub/Inner").movie("a.mov");
    machine.events.event("Coast").movie("a.mov");
    machine.events.event("Coast/Inner").movie("a.mov");
    machine.events.project("Coast/Film");
    const std::string outer = machine.projects.path("Outer/Sub/Inner");
    checkUnlisted(machine.answer(outer), "place", "it is a project that lies in a project, where none is looked for",
        "move it out of the project that holds it");
    for (const char* below : { "/Shared Items/a.mov", "/CurrentVersion.mtrproject" })
        checkUnlisted(machine.answer(outer + below), "place",
            "Inner is a project that lies in a project, where none is looked for",
            "move Inner out of the project that holds it");
    checkUnlisted(machine.answer(machine.events.path("Coast/Inner")), "place",
        "it is an event that lies in an event, where none is looked for", "move it out of the event that holds it");
    checkUnlisted(machine.answer(machine.events.path("Coast/Film")), "place",
        "it is a project that lies in an event, where none is looked for",
        "move it into a folder \"Montaro Projects\"");
}

TEST_CASE("what lies in a movie that is a folder is to move out of it")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").file("Shared Items/a.mov/part.mov");
    checkUnlisted(machine.answer(trip.moviePath("a.mov/part.mov")), "place",
        "a movie is not looked into, even if it is a folder", "move it into the folder \"Shared Items\" itself");
}

TEST_CASE("a project among events, and an event among projects, are told where they belong")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.events.project("Trip").movie("a.mov");
    checkUnlisted(machine.answer(trip.path()), "event",
        "it is a project, and projects are looked for in folders called \"Montaro Projects\"",
        "move it into a folder \"Montaro Projects\"");
    const BundleBuilder coast = machine.projects.event("Coast").movie("a.mov");
    CHECK(machine.answer(coast.path()).listed); // as a folder
    for (const std::string& path : { coast.moviePath("a.mov"), coast.path() + "/CurrentVersion.mtrevent" })
        checkUnlisted(machine.answer(path), "folder",
            "it lies in an event, and events are looked for in folders called \"Montaro Events\"",
            "move the event into a folder \"Montaro Events\"");
}

TEST_CASE("a folder among the movies of a project is not advised to look like a movie")
{
    ExplainedMachine machine;
    const BundleBuilder trip = machine.projects.project("Trip").movie("a.mov");
    machine.projects.folder("Trip/Shared Items/Day 1").folder("Trip/Shared Items/Day 2.MOV");
    const BundleBuilder inner = machine.projects.project("Trip/Shared Items/Inner");
    for (const char* name : { "Day 1", "Day 2.MOV" })
        checkUnlisted(machine.answer(trip.moviePath(name)), "extension",
            "it is a folder, and movies in it are not looked for", "move the movies in it one folder up");
    checkUnlisted(machine.answer(inner.path()), "extension",
        "it is a project that lies in a project, where none is looked for", "move it out of the project that holds it");
}

TEST_CASE("a folder between the library and its events is told that they belong one up")
{
    ExplainedMachine machine;
    const BundleBuilder coast = machine.events.event("Sub/Coast").movie("a.mov");
    const std::string reason = "it is no event, and events in it are not looked for";
    checkUnlisted(machine.answer(machine.events.path("Sub")), "event", reason, "move the events in it one folder up");
    checkUnlisted(
        machine.answer(coast.moviePath("a.mov")), "event", reason, "Sub: move the events in it one folder up");
}
