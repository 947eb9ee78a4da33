#include "host/OBMetadataQuery.h"
#include "platform/MetadataIndex.h"
#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxPlatform.h"
#include "tests/support/BareMachine.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <string>
#include <utility>
#include <vector>

using namespace tests;
using platform::FileProblem;
using Paths = std::vector<std::string>;
using Skips = std::vector<std::pair<std::string, FileProblem>>;

namespace {

const char* const movies = "(kMDItemContentType = 'org.ombrix.movie')";

std::shared_ptr<const OBMetadataQuery> parsed(std::string_view text)
{
    OBMetadataQuery::ParseResult result = OBMetadataQuery::parse(text);
    REQUIRE_MESSAGE(result.query != nullptr, result.problem);
    return result.query;
}

/// What a query answers over a scope, in order of paths.
Paths answers(const platform::Platform& platform, std::string_view query, std::string_view scope)
{
    Paths paths;
    CHECK(parsed(query)->gather(
        platform, scope, [&paths](std::string_view path) { paths.emplace_back(path); }, [] { return false; }));
    std::sort(paths.begin(), paths.end());
    return paths;
}

/// Real files with a record of the calls about them.
struct Disk {
    Paths answers(std::string_view query, std::string_view scope)
    {
        return ::answers(machine.platform(), query, scope);
    }
    Paths answers(std::string_view query) { return answers(query, folder.path()); }
    bool matches(std::string_view query, const std::string& path)
    {
        return parsed(query)->matches(machine.platform(), path);
    }

    TemporaryFolder folder {};
    platform::LinuxFileSystem kernel {};
    FaultyFileSystem files { kernel };
    BareMachine machine { files };
};

} // namespace

TEST_CASE("plain files are found, hidden ones and those in hidden folders too")
{
    Disk disk;
    const Paths all { disk.folder.file(".hid/.b.mov"), disk.folder.file(".hidden", "a.mov\n"),
        disk.folder.file("a.mov"), disk.folder.file("sub/c.mov") };
    disk.folder.folder("folder.mov");
    disk.folder.pipe("pipe.mov");
    disk.folder.link("link.mov", "a.mov");
    disk.folder.link("linked folder", "sub");
    CHECK(disk.answers("kMDItemFSName = '*'") == all);
    CHECK(disk.answers(movies) == Paths { all[0], all[2], all[3] });
    CHECK(disk.answers("kMDItemFSSize >= 0") == all);
}

TEST_CASE("answers come in the order of the listings, each folder with what is in it when its turn comes")
{
    Disk disk;
    for (const char* path : { "a", "b/c", "b/d/e", "f", "g/h", "i" })
        disk.folder.file(path);
    Paths expected;
    const auto list = [&](const auto& self, const std::string& folder) -> void {
        for (const platform::FolderItem& item : disk.kernel.itemsInFolder(folder, {})) {
            const std::string path = folder + "/" + std::string(item.name);
            if (item.kind == platform::ItemKind::folder)
                self(self, path);
            else
                expected.push_back(path);
        }
    };
    list(list, disk.folder.path());
    Paths found;
    parsed("kMDItemFSName = '*'")
        ->gather(disk.machine.platform(), disk.folder.path(),
            [&found](std::string_view path) { found.emplace_back(path); }, {});
    CHECK(found.size() == 6);
    CHECK(found == expected);
}

TEST_CASE("a query that names, paths or types answer looks at no file")
{
    Disk disk;
    disk.folder.file("sub/a.mov", movieBytes(640, 480));
    disk.folder.file("sub/b.txt");
    Paths asked;
    disk.files.onEachCall = [&asked](std::string_view path) { asked.emplace_back(path); };
    CHECK(disk.answers(movies).size() == 1);
    CHECK(std::find(asked.begin(), asked.end(), disk.folder.path("sub/a.mov")) == asked.end());
    asked.clear();
    CHECK(parsed(movies)->matchesByPath(disk.folder.path("sub/a.mov")));
    CHECK(asked.empty());
}

TEST_CASE("a file is read only when its path leaves the answer open, and opened only for what its contents tell")
{
    Disk disk;
    const std::string movie = disk.folder.file("a.mov", movieBytes(640, 480));
    const std::string other = disk.folder.file("b.txt", "text");
    Paths opened;
    disk.files.whenOpening = [&opened](std::string_view path) {
        opened.emplace_back(path);
        return FileProblem::none;
    };
    CHECK(disk.answers("kMDItemFSSize = 4 && kMDItemFSName = '*'") == Paths { other });
    CHECK(opened.empty());
    CHECK(disk.answers("kMDItemPixelWidth = 640 || kMDItemFSName = 'a.mov'") == Paths { movie });
    CHECK(opened.empty());
    CHECK(disk.answers("kMDItemPixelWidth = 640 && kMDItemFSName = '*.txt'").empty());
    CHECK(opened.empty());
    CHECK(disk.answers("kMDItemPixelWidth = 640") == Paths { movie });
    CHECK(opened == Paths { movie });
}

TEST_CASE("numbers are compared by value, and a file without the attribute is only ever not equal")
{
    Disk disk;
    const std::string movie = disk.folder.file("a.mov", movieBytes(640, 480));
    const std::string text = disk.folder.file("b.txt", "12345");
    const std::pair<const char*, Paths> cases[] {
        { "kMDItemFSSize = 5", { text } },
        { "kMDItemFSSize == 5.0", { text } },
        { "kMDItemFSSize != 5", { movie } },
        { "kMDItemFSSize < 6", { text } },
        { "kMDItemFSSize <= 5", { text } },
        { "kMDItemFSSize <= 4.9", {} },
        { "kMDItemFSSize > 5", { movie } },
        { "kMDItemFSSize >= 5", { movie, text } },
        { "kMDItemFSSize > -1e3 && kMDItemFSSize < +9223372036854775807", { movie, text } },
        { "kMDItemFSSize < 99999999999999999999", { movie, text } },
        { "kMDItemPixelWidth = 640", { movie } },
        { "kMDItemPixelHeight = 480 && kMDItemDurationSeconds = 2", { movie } },
        { "kMDItemPixelWidth < 641 || kMDItemPixelWidth >= 641", { movie } },
        { "kMDItemPixelWidth != 640", { text } },
        { "!(kMDItemPixelWidth = 640)", { text } },
        { "!kMDItemPixelWidth > 640", { movie, text } },
    };
    for (const auto& example : cases) {
        CAPTURE(example.first);
        CHECK(disk.answers(example.first) == example.second);
    }
}

TEST_CASE("dates are compared with moments that ISO 8601 spells")
{
    Disk disk;
    const std::string file = disk.folder.file("a");
    setModificationDate(file, { 1'299'146'400, 500'000'000 }); // 2011-03-03T10:00:00.5Z
    const auto holds = [&](const std::string& comparison) {
        CAPTURE(comparison);
        const bool isMatch = disk.matches("kMDItemFSContentChangeDate " + comparison, file);
        CHECK(disk.answers("kMDItemFSContentChangeDate " + comparison) == (isMatch ? Paths { file } : Paths {}));
        return isMatch;
    };
    CHECK(holds("= $time.iso(\"2011-03-03T10:00:00.5Z\")"));
    CHECK(holds("= $time.iso('2011-03-03T11:00:00.500000000+01:00')"));
    CHECK(holds("== $time.iso( 2011-03-03T04:30:00.5-0530 )"));
    CHECK(holds("> $time.iso(2011-03-03T10:00:00Z)"));
    CHECK(holds("< $time.iso(2011-03-03T10:00:01Z)"));
    CHECK(holds("> $time.iso(2011-03-03)"));
    CHECK(holds("< $time.iso(2011-03-04)"));
    CHECK(holds("!= $time.iso(2011-03-03T10:00:00Z)"));
    CHECK_FALSE(holds("<= $time.iso(2011-03-03T10:00:00.499999999Z)"));
    CHECK_FALSE(holds(">= $time.iso(2011-03-03T10:00:00.500000001Z)"));
    CHECK_FALSE(holds("> $time.iso(9999-12-31)"));
    CHECK(disk.answers("kMDItemFSCreationDate <= $time.iso(2011-03-03T10:00:00.5Z)") == Paths { file });
}

TEST_CASE("every attribute of the index can be asked for and has the value that the index tells")
{
    Disk disk;
    const std::string file = disk.folder.file("a.mov", movieBytes(640, 480));
    const platform::Value all = disk.machine.platform().metadataIndex.attributesOfFile(file);
    REQUIRE(all.dictionary() != nullptr);
    CHECK(all.dictionary()->size() == 9);
    for (const auto& [key, value] : *all.dictionary()) {
        std::string spelled = value.date() ? "$time.iso(1970-01-01)" : "";
        if (const platform::Text* text = value.text())
            spelled = "'" + text->string() + "'";
        else if (const std::int64_t* integer = value.integer())
            spelled = std::to_string(*integer);
        else if (const double* real = value.real())
            spelled = std::to_string(*real);
        const std::string query = key.string() + (value.date() ? " > " : " = ") + spelled;
        CAPTURE(query);
        CHECK(disk.matches(query, file));
    }
}

TEST_CASE("a path matches only while a plain file lies there")
{
    Disk disk;
    const std::string file = disk.folder.file("a.mov");
    CHECK(disk.matches(movies, file));
    CHECK_FALSE(disk.matches(movies, disk.folder.folder("b.mov")));
    CHECK_FALSE(disk.matches(movies, disk.folder.link("c.mov", "a.mov")));
    CHECK_FALSE(disk.matches(movies, disk.folder.pipe("d.mov")));
    CHECK_FALSE(disk.matches(movies, disk.folder.path("none.mov")));
    CHECK_FALSE(disk.matches("kMDItemFSSize > 0", file));
    writeFile(file, "more");
    CHECK(disk.matches("kMDItemFSSize > 0", file));
}

TEST_CASE("the scope is followed to where it leads, and answers keep its spelling")
{
    Disk disk;
    disk.folder.file("real/sub/a.mov");
    const std::string link = disk.folder.link("link", "real");
    platform::LinuxPlatform machine;
    CHECK(answers(machine.platform(), movies, link) == Paths { link + "/sub/a.mov" });
    CHECK(answers(machine.platform(), movies, link + "//") == Paths { link + "/sub/a.mov" });
    const std::string dotted = disk.folder.path() + "/link/../real";
    CHECK(answers(machine.platform(), movies, dotted) == Paths { dotted + "/sub/a.mov" });
    CHECK(disk.answers(movies, link) == Paths { link + "/sub/a.mov" });
}

TEST_CASE("a scope that is a file is answered itself")
{
    Disk disk;
    const std::string file = disk.folder.file("a.mov");
    CHECK(disk.answers(movies, file) == Paths { file });
    CHECK(disk.answers(movies, disk.folder.file("b.txt")).empty());
    const std::string link = disk.folder.link("link.mov", "b.txt");
    CHECK(disk.answers("kMDItemFSSize = 0", link) == Paths { link });
    CHECK(disk.answers(movies, disk.folder.pipe("c.mov")).empty());
}

TEST_CASE("described links are followed to a scope and not below it")
{
    Disk disk;
    const std::string file = disk.folder.file("stick/Events/a.mov");
    disk.folder.file("elsewhere/b.mov");
    disk.folder.folder("stick/linked");
    DescribedMachine description;
    description.link("/Volumes/Stick", disk.folder.path("stick"));
    description.link("/Volumes/Stick/linked", disk.folder.path("elsewhere"));
    platform::LinuxPlatform base;
    const platform::Platform machine = description.platform(disk.folder.path("machine.json"), base.platform());
    CHECK(answers(machine, movies, "/Volumes/Stick") == Paths { "/Volumes/Stick/Events/a.mov" });
    CHECK(answers(machine, movies, "/Volumes/Stick/linked") == Paths { "/Volumes/Stick/linked/b.mov" });
}

TEST_CASE("a folder that becomes a link while the walk is on its way is left out")
{
    Disk disk;
    disk.folder.file("scope/sub/a.mov");
    disk.folder.file("elsewhere/b.mov");
    const std::string sub = disk.folder.path("scope/sub");
    for (const std::string& scope : { disk.folder.path("scope"), disk.folder.link("to scope", "scope") }) {
        CAPTURE(scope);
        removeItem(sub);
        disk.folder.file("scope/sub/a.mov");
        platform::LinuxPlatform machine;
        const OBGatherObserver swap { [&](std::string_view folder) {
            if (folder != scope) {
                removeItem(sub);
                makeLink(sub, "../elsewhere");
            }
        } };
        Paths found;
        parsed(movies)->gather(
            machine.platform(), scope, [&found](std::string_view path) { found.emplace_back(path); }, {}, swap);
        CHECK(found == Paths {});
    }
}

TEST_CASE("a folder that cannot be read is told and the others are walked")
{
    Disk disk;
    const std::string file = disk.folder.file("a.mov");
    const std::string closed = disk.folder.folder("closed");
    const std::string gone = disk.folder.folder("gone");
    disk.files.whenListing = [&](std::string_view folder) {
        if (folder == gone)
            return FileProblem::missing;
        return folder == closed ? FileProblem::notPermitted : FileProblem::none;
    };
    Skips skipped;
    const OBGatherObserver observer { {},
        [&skipped](std::string_view path, FileProblem problem) { skipped.emplace_back(path, problem); } };
    const auto gather = [&](const std::string& scope) {
        skipped.clear();
        Paths found;
        parsed(movies)->gather(
            disk.machine.platform(), scope, [&found](std::string_view path) { found.emplace_back(path); }, {},
            observer);
        return found;
    };
    CHECK(gather(disk.folder.path()) == Paths { file });
    CHECK(skipped == Skips { { closed, FileProblem::notPermitted } });
    CHECK(gather(disk.folder.path("none")).empty());
    CHECK(skipped == Skips { { disk.folder.path("none"), FileProblem::missing } });
    CHECK(gather(closed).empty());
    CHECK(skipped == Skips { { closed, FileProblem::notPermitted } });
}

TEST_CASE("a gathering stops between folders when it is cancelled")
{
    Disk disk;
    for (const char* name : { "a", "b", "c" })
        disk.folder.file(std::string(name) + "/x.mov");
    int folders = 0;
    int asked = 0;
    const OBGatherObserver observer { [&folders](std::string_view) { ++folders; } };
    const auto gather = [&](int asksBefore) {
        folders = asked = 0;
        return parsed(movies)->gather(
            disk.machine.platform(), disk.folder.path(), [](std::string_view) {}, [&] { return asked++ == asksBefore; },
            observer);
    };
    CHECK_FALSE(gather(0));
    CHECK(folders == 0);
    CHECK_FALSE(gather(2));
    CHECK(folders == 2);
    CHECK(gather(4));
    CHECK(folders == 4);
}

TEST_CASE("folders far deeper than a path can be are walked as far as paths lead")
{
    Disk disk;
    makeNestedFolders(disk.folder.path("deep"), "d", 3'000);
    const std::string file = disk.folder.file("deep/d/d/a.mov");
    platform::LinuxPlatform machine;
    Skips skipped;
    Paths found;
    parsed(movies)->gather(machine.platform(), disk.folder.path(),
        [&found](std::string_view path) { found.emplace_back(path); }, {},
        { {}, [&skipped](std::string_view path, FileProblem problem) { skipped.emplace_back(path, problem); } });
    CHECK(found == Paths { file });
    REQUIRE(skipped.size() == 1);
    CHECK(skipped[0].second == FileProblem::pathTooLong);
}

TEST_CASE("names are compared and answered as the bytes on disk")
{
    Disk disk;
    const std::string file = disk.folder.file("\xFF\n\x1B.mov");
    CHECK(disk.answers("kMDItemFSName = '\xFF*'") == Paths { file });
    CHECK(disk.answers("kMDItemFSName = '\xFE*'cd").empty());
}
