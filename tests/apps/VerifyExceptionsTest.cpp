#include "apps/ombrix/Verification.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/apps/PrintedTree.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

using namespace tests;
using ombrix::Verification;

namespace {

/// A followed source that searches and watches one folder of each half, on real folders.
struct FollowedFolders {
    FollowedFolders()
    {
        source.projectFolders = { projects };
        source.eventFolders = { events };
        source.watchedPaths = { projects, events };
        source.seenFacts = [this](const std::string& path) -> std::optional<platform::FileFacts> {
            const auto status = files.status(path);
            if (!status)
                return std::nullopt;
            return platform::FileFacts { status->creationDate, status->size + (path == rewritten ? 1 : 0) };
        };
    }

    Verification compare(const PrintedGroup& followed, const PrintedGroup& fresh) const
    {
        return ombrix::compareTrees(followed.json(), fresh.json(), source, files);
    }
    /// Counted as a difference, and nothing is a note.
    bool isFault(const PrintedGroup& followed, const PrintedGroup& fresh) const
    {
        const Verification result = compare(followed, fresh);
        return !result.differences.empty() && result.notes.empty();
    }
    /// All that differs is a note, and each holds `reason`.
    bool isNote(const PrintedGroup& followed, const PrintedGroup& fresh, const std::string& reason) const
    {
        const Verification result = compare(followed, fresh);
        for (const std::string& note : result.notes) {
            if (note.find(reason) == std::string::npos)
                return false;
        }
        return result.differences.empty() && !result.notes.empty();
    }

    const TemporaryFolder disk;
    const std::string projects = disk.folder("Montaro Projects");
    const std::string events = disk.folder("Montaro Events");
    const platform::LinuxFileSystem files {};
    ombrix::FollowedSource source {};
    std::string rewritten {};
};

/// A root with a library of events; movies of the events are those of the root too.
PrintedGroup rootOfEvents(const std::vector<PrintedGroup>& years)
{
    PrintedGroup root = printedRoot({ printedEvents(years) });
    for (const PrintedGroup& year : years) {
        for (const PrintedGroup& event : year.children)
            root.movies.insert(root.movies.end(), event.movies.begin(), event.movies.end());
    }
    return root;
}

} // namespace

TEST_CASE("what is missing, surplus or changed without a reason is a fault")
{
    const FollowedFolders test;
    const std::string movie = test.disk.file("Montaro Projects/a/m.mov");
    const PrintedGroup project = printedProject(test.projects + "/a", { { movie } });
    CHECK(test.compare(printedRoot({ project }), printedRoot({ project })).notes.empty());
    CHECK(test.isFault(printedRoot({}), printedRoot({ project })));
    CHECK(test.isFault(printedRoot({ project }), printedRoot({})));
    CHECK(test.isFault(printedRoot({ printedProject(test.projects + "/a") }), printedRoot({ project })));
    PrintedGroup renamed = project;
    renamed.name = "b";
    CHECK(test.isFault(printedRoot({ renamed }), printedRoot({ project })));
    CHECK(test.isFault(rootOfEvents({}), rootOfEvents({ printedYear("2011", { printedEvent(test.events + "/e") }) })));
}

TEST_CASE("projects of a volume that was mounted later are shown by a restart")
{
    FollowedFolders test;
    const PrintedGroup late = printedProject("/Volumes/Stick/Montaro Projects/a", { { "/Volumes/Stick/x/m.mov" } });
    CHECK(test.isNote(printedRoot({}), printedRoot({ late }, late.movies), "listed once"));
    test.source.projectFolders.emplace_back("/Volumes/Stick/Montaro Projects");
    test.source.watchedPaths.emplace_back("/Volumes/Stick/Montaro Projects");
    CHECK_FALSE(test.isNote(printedRoot({}), printedRoot({ late }), "listed once"));
}

TEST_CASE("what no watched path holds, and events among projects, are not followed")
{
    FollowedFolders test;
    const PrintedGroup event = printedEvent(test.events + "/e", { { test.events + "/e/m.mov" } });
    const PrintedGroup with = rootOfEvents({ printedYear("2011", { event }) });
    CHECK(test.isFault(rootOfEvents({}), with));
    test.source.watchedPaths = { test.projects };
    CHECK(test.isNote(rootOfEvents({}), with, "are not followed"));
    const std::string among = test.disk.folder("Montaro Projects/x/Montaro Events");
    test.source.eventFolders.push_back(among);
    const PrintedGroup hidden = printedEvent(among + "/e", { { among + "/e/m.mov" } });
    CHECK(test.isNote(rootOfEvents({}), rootOfEvents({ printedYear("2011", { hidden }) }), "are not followed"));
}

TEST_CASE("a library of events without a clip is shown by a load alone")
{
    const FollowedFolders test;
    const PrintedGroup empty = rootOfEvents({ printedYear("2011", { printedEvent(test.events + "/e") }) });
    CHECK(test.isNote(printedRoot({}), empty, "without a clip"));
    CHECK(test.isFault(empty, printedRoot({})));
    const PrintedGroup full = rootOfEvents({ printedYear("2011", { printedEvent(test.events + "/e", { { "/m" } }) }) });
    CHECK_FALSE(test.isNote(printedRoot({}), full, "without a clip"));
}

TEST_CASE("a movie that was rewritten in place may have other attributes, and another may stand for its project")
{
    FollowedFolders test;
    const std::string path = test.disk.file("Montaro Projects/a/m.mov", "bytes");
    const std::string other = test.disk.file("Montaro Projects/a/n.mov", "bytes");
    const PrintedGroup before = printedProject(test.projects + "/a", { { path, R"({"width":1})" }, { other } });
    const PrintedGroup after = printedProject(test.projects + "/a", { { path, R"({"width":2})" }, { other } });
    const std::string project = R"({"Project Path":")" + test.projects + R"(/a"})";
    const PrintedGroup followed = printedRoot({ before }, { { other, project } });
    const PrintedGroup fresh = printedRoot({ after }, { { path, project } });
    CHECK(test.isFault(followed, fresh));
    test.rewritten = path;
    CHECK(test.isNote(followed, fresh, "rewritten in place"));
    test.source.seenFacts = nullptr;
    CHECK(test.isNote(followed, fresh, "rewritten in place"));
    PrintedGroup renamed = after;
    renamed.movies[0].path = test.disk.file("Montaro Projects/a/new.mov");
    CHECK_FALSE(test.isNote(printedRoot({ before }), printedRoot({ renamed }), ""));
}

TEST_CASE("an event may stand in another year when a clip of it was given another date")
{
    FollowedFolders test;
    const std::string clip = test.disk.file("Montaro Events/e/m.mov", "bytes");
    PrintedGroup before = printedEvent(test.events + "/e", { { clip } });
    before.attributes = R"({"MontaroEventCreationYear":2011})";
    PrintedGroup after = before;
    after.attributes = R"({"MontaroEventCreationYear":2012})";
    const PrintedGroup followed = rootOfEvents({ printedYear("2011", { before }) });
    const PrintedGroup fresh = rootOfEvents({ printedYear("2012", { after }) });
    CHECK(test.isFault(followed, fresh));
    test.rewritten = clip;
    CHECK(test.isNote(followed, fresh, "rewritten in place"));
    const PrintedGroup sameYear = rootOfEvents({ printedYear("2011", { after }) });
    CHECK(test.isNote(followed, sameYear, "rewritten in place"));
    test.rewritten.clear();
    CHECK(test.isFault(followed, sameYear));
}

TEST_CASE("events may stand in another order when the editor's order has changed, or when they are equal to it")
{
    FollowedFolders test;
    const auto event = [&](const std::string& name, const std::string& year) {
        PrintedGroup made = printedEvent(
            test.events + "/" + name, { { test.disk.file("Montaro Events/" + name + "/m.mov", "bytes") } });
        made.attributes = R"({"MontaroEventCreationYear":)" + year + "}";
        return made;
    };
    const PrintedGroup a = event("a", "2011");
    PrintedGroup b = event("b", "2012");
    const PrintedGroup followed = rootOfEvents({ printedYear("y", { a, b }) });
    CHECK(test.isFault(followed, rootOfEvents({ printedYear("y", { b, a }) })));
    test.source.hasOrderChanged = true;
    CHECK(test.isNote(followed, rootOfEvents({ printedYear("y", { b, a }) }), "order of events has changed"));
    test.source.hasOrderChanged = false;
    b.attributes = a.attributes;
    b.name = a.name;
    CHECK(test.isNote(rootOfEvents({ printedYear("y", { a, b }) }), rootOfEvents({ printedYear("y", { b, a }) }),
        "equal to the order of events"));
}

TEST_CASE("what lies behind a link below a search folder is not followed")
{
    const FollowedFolders test;
    test.disk.folder("elsewhere/inner");
    test.disk.link("Montaro Projects/link", test.disk.path("elsewhere"));
    const PrintedGroup behind = printedProject(test.projects + "/link/inner");
    CHECK(test.isNote(printedRoot({}), printedRoot({ behind }), "behind a link"));
    test.disk.link("Montaro Projects/p/CurrentVersion.mtrproject", test.disk.path("elsewhere/marker"));
    CHECK(test.isNote(printedRoot({}), printedRoot({ printedProject(test.projects + "/p") }), "behind a link"));
    test.disk.folder("Montaro Projects/q/r");
    CHECK(test.isFault(printedRoot({}), printedRoot({ printedProject(test.projects + "/q/r") })));
    test.disk.link("Montaro Projects/q/.hidden", test.disk.path("elsewhere/names"));
    CHECK(test.isNote(printedRoot({}), printedRoot({ printedProject(test.projects + "/q/r") }), "behind a link"));
}

TEST_CASE("a tree that was not printed whole cannot be compared")
{
    const FollowedFolders test;
    CHECK_FALSE(ombrix::compareTrees("{}", "{", test.source, test.files).problem.empty());
}
