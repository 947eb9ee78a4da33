#include "apps/ombrix/ScanRecord.h"
#include "apps/ombrix/Explanation.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

using namespace ombrix;
using platform::FileProblem;

namespace {

OBScanDecision decision(const std::string& path, bool passed = true)
{
    return { .rule = passed ? "good" : "bad",
        .path = path,
        .passed = passed,
        .text = "of " + path,
        .remedy = passed ? "" : "mend it",
        .itself = {},
        .inside = {},
        .insideRemedy = {} };
}

std::vector<std::string> pathsOf(const ScanRecord::Library& library)
{
    std::vector<std::string> paths;
    for (const OBScanDecision& each : library.decisions)
        paths.push_back(each.path);
    return paths;
}

using Paths = std::vector<std::string>;

/// What is said of a path by a record, where the tree is empty.
Explanation explanationOf(const ScanRecord& record, const std::string& path, const platform::FileSystem& fileSystem)
{
    const TreePlaces places(nullptr, { path }, {});
    const Paths folders { "/lib" };
    return Explainer(fileSystem, folders, record, places).explain(path);
}

Explanation explanationOf(const ScanRecord& record, const std::string& path)
{
    const platform::LinuxFileSystem fileSystem;
    return explanationOf(record, path, fileSystem);
}

} // namespace

TEST_CASE("what is decided of other paths is not kept")
{
    ScanRecord record(Paths { "/lib/event/clips/a" });
    record.libraryBegan("/lib");
    for (const char* path : { "/lib", "/lib/other", "/lib/event", "/lib/other/clips", "/lib/event/clips",
             "/lib/event/clips/a", "/lib/event/clips/b" })
        record.scanDecided(decision(path));
    REQUIRE(record.libraries().size() == 1);
    CHECK(pathsOf(record.libraries()[0]) == Paths { "/lib", "/lib/event", "/lib/event/clips", "/lib/event/clips/a" });
}

TEST_CASE("once a link is seen to lead to a path, all that was decided on the way to the link is kept")
{
    ScanRecord record(Paths { "/store/real" });
    record.libraryBegan("/lib");
    for (const char* path : { "/lib", "/lib/event", "/lib/other", "/lib/event/clips", "/lib/event/clips/a" })
        record.scanDecided(decision(path));
    record.linkFollowed("/lib/event/clips/a", "/store/a");
    record.scanDecided(decision("/lib/event/clips/link"));
    record.linkFollowed("/lib/event/clips/link", "/store/real");
    record.scanDecided(decision("/lib/event/clips/link"));
    record.scanDecided(decision("/lib/event/clips/z"));
    CHECK(pathsOf(record.libraries()[0])
        == Paths { "/lib", "/lib/event", "/lib/event/clips", "/lib/event/clips/link", "/lib/event/clips/link" });
}

TEST_CASE("a library that is searched twice is recorded twice")
{
    ScanRecord record(Paths { "/lib/a" });
    for (int time = 0; time < 2; ++time) {
        record.libraryBegan("/lib");
        record.scanDecided(decision("/lib/a", false));
    }
    CHECK(record.libraries().size() == 2);
    const Explanation explanation = explanationOf(record, "/lib/a");
    CHECK(explanation.steps.size() == 1);
    CHECK(explanation.remedy == "mend it");
}

TEST_CASE("the first rule that a path does not pass ends its way")
{
    ScanRecord record(Paths { "/lib/a/b" });
    record.libraryBegan("/lib");
    record.scanDecided(decision("/lib"));
    record.scanDecided(decision("/lib/a", false));
    record.scanDecided(decision("/lib/a/b"));
    const Explanation explanation = explanationOf(record, "/lib/a/b");
    REQUIRE(explanation.steps.size() == 2);
    CHECK(explanation.steps[0].passed);
    CHECK_FALSE(explanation.steps[1].passed);
    CHECK(explanation.steps[1].text == "of /lib/a");
}

TEST_CASE("a scan that was stopped before a library says so")
{
    ScanRecord record(Paths { "/lib/a" });
    record.libraryBegan("/lib");
    const Explanation explanation = explanationOf(record, "/lib/a");
    REQUIRE(explanation.steps.size() == 1);
    CHECK(explanation.steps[0].text == "the scan was stopped before it came here");
    CHECK(explanation.remedy == "load again");
}

TEST_CASE("what a source decides without telling of a library is told of the paths that it speaks of, and of no others")
{
    ScanRecord record(Paths { "/a/clips/text", "/a/other", "/b" });
    record.scanDecided(decision("/a/clips"));
    record.scanDecided(decision("/a/clips/text", false));
    record.scanDecided(decision("/a/clips/movie"));
    const Explanation rejected = explanationOf(record, "/a/clips/text");
    REQUIRE(rejected.steps.size() == 2);
    CHECK(rejected.steps[1].text == "of /a/clips/text");
    CHECK(rejected.remedy == "mend it");
    for (const char* path : { "/a/other", "/b" })
        CHECK(explanationOf(record, path).steps.back().text == "it lies in none of the 1 folders that are searched");
}

TEST_CASE("a source that calls the whole disk its library is told of in the same way")
{
    ScanRecord record(Paths { "/a", "/b" });
    record.libraryBegan("/");
    record.scanDecided(decision("/a", false));
    CHECK(explanationOf(record, "/a").steps.back().text == "of /a");
    CHECK(explanationOf(record, "/b").steps.back().text == "it lies in none of the 1 folders that are searched");
}

TEST_CASE("nothing is claimed of a path in a folder that may not be searched")
{
    const tests::TemporaryFolder folder;
    const std::string library = folder.folder("lib");
    const std::string path = library + "/a/b";
    const platform::LinuxFileSystem real;
    tests::FaultyFileSystem fileSystem(real);
    fileSystem.whenOpening = [](std::string_view) { return FileProblem::notPermitted; };
    ScanRecord record(Paths { path });
    record.libraryBegan(library);
    record.scanDecided(decision(library));
    Explanation explanation = explanationOf(record, path, fileSystem);
    CHECK(explanation.steps.back().rule == "existence");
    CHECK(explanation.steps.back().path == library + "/a");
    CHECK(explanation.steps.back().text == "a folder that it lies in may not be searched, so nothing is known of it");
    CHECK(explanation.remedy == "permit reading: chmod u+rx " + library);
    explanation = explanationOf(record, path, real);
    CHECK(explanation.steps.back().text == "nothing is there");
    folder.file("lib/a/b");
    explanation = explanationOf(record, path, real);
    CHECK(explanation.steps.back().text == "it was not there when the folder was listed");
}
