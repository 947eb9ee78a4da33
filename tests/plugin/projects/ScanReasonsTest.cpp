#include "tests/plugin/support/SourceMachine.h"

#include "host/OBScanObserver.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <map>
#include <utility>
#include <vector>

using namespace tests;
using platform::FileProblem;

namespace {

/// What kept each item out, by its path below the library: the reason, a bar, and the remedy.
class Reasons final : public OBScanObserver {
public:
    void scanDecided(const OBScanDecision& decision) override
    {
        if (!decision.passed)
            byPath[decision.path] = decision.text + " | " + decision.remedy;
    }
    std::map<std::string, std::string> byPath {};
};

std::map<std::string, std::string> reasonsIn(SourceMachine& machine)
{
    const auto reasons = std::make_shared<Reasons>();
    const auto source = machine.makeSource();
    source->setScanObserver(reasons);
    machine.load(*source);
    std::map<std::string, std::string> abbreviated;
    for (const auto& [path, reason] : reasons->byPath)
        abbreviated.emplace(machine.abbreviated(path), reason);
    return abbreviated;
}

/// Makes the machine answer about what lies below `folder` as it does of a folder that may not be searched.
void closeBelow(SourceMachine& machine, const std::string& folder)
{
    const std::string closed = folder + "/";
    machine.files.whenAskedForStatus = [closed](std::string_view path) { return !path.starts_with(closed); };
    machine.files.whenOpening = [closed](std::string_view path) {
        return path.starts_with(closed) ? FileProblem::notPermitted : FileProblem::none;
    };
}

/// A bar, and the remedy for a folder that may not be read.
std::string permitting(const std::string& folder)
{
    return " | permit reading: chmod u+rx '" + folder + "'";
}

LibraryBuilder eventsOf(const SourceMachine& machine)
{
    return LibraryBuilder(machine.disk.path("home/Movies/Montaro Events"));
}

/// Every decision about one path, in order: the rule, a bar, what was found, and why nothing inside is listed.
class DecisionsOnPath final : public OBScanObserver {
public:
    explicit DecisionsOnPath(std::string path)
        : _path(std::move(path))
    {
    }
    void scanDecided(const OBScanDecision& decision) override
    {
        if (decision.path == _path)
            lines.push_back(std::string(decision.rule) + (decision.passed ? " | " : " fails | ") + decision.text
                + (decision.inside.empty() ? "" : " | " + decision.inside + " | " + decision.insideRemedy));
    }
    std::vector<std::string> lines {};

private:
    const std::string _path;
};

std::vector<std::string> decisionsOn(SourceMachine& machine, const std::string& path)
{
    const auto decisions = std::make_shared<DecisionsOnPath>(path);
    const auto source = machine.makeSource();
    source->setScanObserver(decisions);
    machine.load(*source);
    return decisions->lines;
}

} // namespace

TEST_CASE("a link, a movie and another file in a library are each told by what they are")
{
    SourceMachine machine;
    LibraryBuilder library = machine.projects();
    library.folder("Ideas").link("link", machine.projects().path("Ideas")).file("movie.mov").file("notes.txt");
    CHECK(reasonsIn(machine)
        == std::map<std::string, std::string> {
            { "PROJECTS/link",
                "it is a symbolic link that leads to no project, and no other link is followed in a library"
                " | put what it leads to in its place" },
            { "PROJECTS/movie.mov",
                "it is a movie that lies in no project | move it into the folder \"Shared Items\" of a project" },
            { "PROJECTS/notes.txt", "it is neither a project nor a folder | " },
        });
}

TEST_CASE("what lies in a folder that may be listed but not searched is told by that")
{
    SourceMachine machine;
    LibraryBuilder library = machine.projects();
    library.folder("Trip").file("Trip/CurrentVersion").file("Open/notes.txt");
    closeBelow(machine, library.path("Trip"));
    CHECK(reasonsIn(machine)
        == std::map<std::string, std::string> {
            { "PROJECTS/Open/notes.txt", "it is neither a project nor a folder | " },
            { "PROJECTS/Trip/CurrentVersion",
                "its folder may be listed but not searched, so nothing is known of it"
                    + permitting(library.path("Trip")) },
        });
}

TEST_CASE("an event that may not be searched is not said to lack its marker")
{
    SourceMachine machine;
    LibraryBuilder library = eventsOf(machine);
    library.folder("Closed").folder("Open");
    closeBelow(machine, library.path("Closed"));
    const std::string prefix = machine.abbreviated(library.path());
    CHECK(reasonsIn(machine)
        == std::map<std::string, std::string> {
            { prefix + "/Closed",
                "it may not be searched, so whether it holds CurrentVersion.mtrevent is not known"
                    + permitting(library.path("Closed")) },
            { prefix + "/Open", "it holds no CurrentVersion.mtrevent | open the event in Montaro, which marks it" },
        });
}

TEST_CASE("in a library that may be listed but not searched nothing is said of any marker")
{
    SourceMachine machine;
    LibraryBuilder library = eventsOf(machine);
    library.folder("Coast");
    closeBelow(machine, library.path());
    CHECK(reasonsIn(machine)
        == std::map<std::string, std::string> {
            { machine.abbreviated(library.path("Coast")),
                "its folder may be listed but not searched, so whether it holds CurrentVersion.mtrevent is not known"
                    + permitting(library.path()) },
        });
}

TEST_CASE("a folder of projects that may be neither searched nor listed says so of itself and of what is in it")
{
    SourceMachine machine;
    LibraryBuilder library = machine.projects();
    library.folder("Closed");
    const std::string path = library.path("Closed");
    closeBelow(machine, path);
    machine.files.whenListing
        = [path](std::string_view folder) { return folder == path ? FileProblem::notPermitted : FileProblem::none; };
    CHECK(decisionsOn(machine, path)
        == std::vector<std::string> {
            "hidden name | its name does not begin with a full stop",
            "hidden file | no file .hidden names it",
            ("project | it may not be searched, so whether it holds CurrentVersion.mtrproject is not known; it is "
             "taken for no project"),
            "folder | it is a folder",
            "package | it is a plain folder",
            "listing | what it holds is not listed: permission denied | it cannot be listed: permission denied"
                + permitting(path),
        });
}

TEST_CASE("an event whose folder of clips cannot be listed is left out for that")
{
    SourceMachine machine;
    LibraryBuilder library = eventsOf(machine);
    const std::string clips = library.event("Coast").movieWithBytes("a.mov", "clip").path() + "/Original Media";
    machine.files.whenListing
        = [clips](std::string_view folder) { return folder == clips ? FileProblem::notPermitted : FileProblem::none; };
    CHECK(reasonsIn(machine)
        == std::map<std::string, std::string> {
            { machine.abbreviated(library.path("Coast")),
                "its folder \"Original Media\" cannot be listed: permission denied" + permitting(clips) },
        });
}

TEST_CASE("a folder that stands in for one that cannot be listed is told of below it")
{
    SourceMachine machine;
    LibraryBuilder library = machine.projects();
    library.folder("Area.localized").project("Area/Trip");
    const std::string path = library.path("Area.localized");
    machine.files.whenListing
        = [path](std::string_view folder) { return folder == path ? FileProblem::notPermitted : FileProblem::none; };
    CHECK(decisionsOn(machine, path).back().starts_with("listing | what it holds is not listed: permission denied"));
    const std::vector<std::string> standIn = decisionsOn(machine, library.path("Area"));
    CHECK(std::count(standIn.begin(), standIn.end(), "listing | it holds 1 entry") == 2);
}

TEST_CASE("of a library that may not be reached the folder that forbids it is named")
{
    SourceMachine machine;
    const std::string library = machine.projects().path();
    const std::string closed = machine.disk.path("home/Movies");
    closeBelow(machine, closed);
    machine.files.whenListing = [closed](std::string_view folder) {
        return folder.starts_with(closed) ? FileProblem::notPermitted : FileProblem::none;
    };
    CHECK(decisionsOn(machine, library).back()
        == "listing | what it holds is not listed: permission denied | it cannot be listed: permission denied"
            + permitting(closed));
}
