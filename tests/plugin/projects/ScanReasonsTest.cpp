#include "tests/plugin/support/SourceMachine.h"

#include "host/OBScanObserver.h"

#include <doctest/doctest.h>

#include <map>

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
    const std::string closed = library.path("Trip/");
    machine.files.whenAskedForStatus = [closed](std::string_view path) { return !path.starts_with(closed); };
    machine.files.whenOpening = [closed](std::string_view path) {
        return path.starts_with(closed) ? FileProblem::notPermitted : FileProblem::none;
    };
    CHECK(reasonsIn(machine)
        == std::map<std::string, std::string> {
            { "PROJECTS/Open/notes.txt", "it is neither a project nor a folder | " },
            { "PROJECTS/Trip/CurrentVersion",
                "its folder may be listed but not searched, so nothing is known of it"
                " | permit searching its folder (chmod +x)" },
        });
}
