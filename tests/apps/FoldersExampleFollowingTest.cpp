#include "host/OBMediaHost.h"
#include "platform/linux/LinuxBundles.h"
#include "platform/linux/LinuxFileSystem.h"
#include "platform/linux/LinuxMainRunLoop.h"
#include "tests/support/BareMachine.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"
#include "tests/support/Turns.h"

#include <doctest/doctest.h>

#include <atomic>
#include <chrono>
#include <cstdlib>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

using namespace tests;
using Lines = std::vector<std::string>;

namespace {

/// How long the source waits; no thread of the framework sleeps as long.
constexpr std::chrono::seconds burst { 2 };

/// A publication as a line "PART | CAUSE | FOLDER: MOVIE MOVIE".
std::string textOf(const OBPublication& publication)
{
    std::string text = publication.part + " | " + publication.cause.text + " |";
    for (const OBMediaGroupRef& folder : publication.rootMediaGroup->childGroups()) {
        text += " " + folder->name().string() + ":";
        folder->mediaObjects().visit([&](OBMediaObject& movie) {
            text += " " + movie.name().string();
            return true;
        });
    }
    return text;
}

/// The example's source on a machine whose clock and whose changes are in a test's hand, loaded and followed.
struct FollowedFolders {
    explicit FollowedFolders(const OBFollowOptions& options = {})
    {
        disk.file("clips/a.mov", movieBytes(640, 480));
        setenv("OMBRIX_FOLDERS", clips.c_str(), 1);
        host = std::make_unique<OBMediaHost>(platform(), OBHostOptions { { OMBRIX_EXAMPLE_PLUGINS } });
        source = host->createManager("org.ombrix.example.Folders").manager;
        REQUIRE(source);
        following = host->followChanges(options);
        observation = source->observe([](const std::function<void()>& call) { call(); },
            { .published = [this](const OBPublication& publication) { add(textOf(publication)); } });
    }
    ~FollowedFolders()
    {
        end();
        mainRunLoop.quit();
        mainThread.join();
    }
    FollowedFolders(const FollowedFolders&) = delete;
    FollowedFolders& operator=(const FollowedFolders&) = delete;

    /// The application drops the source and follows nothing any more.
    void end()
    {
        observation = {};
        source = nullptr;
        following = {};
        CHECK(host->waitForThreads(longestWait));
    }
    platform::Platform platform()
    {
        const platform::Platform bare = machine.platform();
        return { bare.fileSystem, bare.pathWatching, bare.volumes, bare.workspace, bare.preferences, bare.metadataIndex,
            bare.movies, bare.notifications, bare.workspaceNotifications, bare.clock, bare.calendar, bare.threads,
            mainRunLoop, bare.console, bundles, bare.languages };
    }
    void change()
    {
        machine.pathWatching.tell(clips, { platform::PathChange::Kind::folderChanged, true, false, clips });
    }
    bool mainThreadIsFree()
    {
        const auto hasRun = std::make_shared<std::atomic<bool>>(false);
        mainRunLoop.post([hasRun] { *hasRun = true; });
        return waitUntil([&] { return hasRun->load(); });
    }
    void add(const std::string& line)
    {
        const std::lock_guard guard(lock);
        published.push_back(line);
    }
    Lines lines()
    {
        const std::lock_guard guard(lock);
        return published;
    }
    bool waitForLines(std::size_t count)
    {
        return waitUntil([&] { return lines().size() >= count; });
    }

    TemporaryFolder disk {};
    const std::string clips = disk.path("clips");
    platform::LinuxFileSystem files {};
    BareMachine machine { files };
    platform::LinuxBundles bundles { files };
    platform::LinuxMainRunLoop mainRunLoop {};
    std::thread mainThread { [this] { mainRunLoop.run(); } };
    std::mutex lock {};
    Lines published {};
    std::unique_ptr<OBMediaHost> host {};
    std::shared_ptr<OBMediaManager> source {};
    OBObservation observation {};
    OBObservation following {};
};

void checkOneReloadAnswersABurst(FollowedFolders& test)
{
    REQUIRE(test.waitForLines(1));
    test.disk.file("clips/b.mov", movieBytes(640, 480));
    test.change();
    REQUIRE(test.machine.clock.waitForSleep(burst));
    CHECK(test.mainThreadIsFree());
    test.change();
    test.disk.file("clips/c.mov", movieBytes(640, 480));
    giveOthersTheirTurn();
    test.machine.clock.advance(burst - std::chrono::milliseconds(1));
    CHECK(test.lines() == Lines { " |  | clips: a" });
    test.machine.clock.advance(std::chrono::milliseconds(1));
    REQUIRE(test.waitForLines(2));
    CHECK(test.lines().back() == "folders | changed: " + test.clips + " | clips: a b c");
    CHECK(test.source->mediaGroups()[0]->mediaObjects().size() == 3);
    giveOthersTheirTurn();
    CHECK(test.lines().size() == 2);
}

} // namespace

TEST_CASE("the example of a source answers a burst of changes by one reload, two seconds after the first")
{
    FollowedFolders test;
    checkOneReloadAnswersABurst(test);
}

TEST_CASE("the example of a source answers changes that it hears of on the main thread without holding that up")
{
    FollowedFolders test({ .callsOnMainThread = true });
    checkOneReloadAnswersABurst(test);
}

TEST_CASE("the example of a source that waits for a burst to pass ends at once")
{
    FollowedFolders test;
    REQUIRE(test.waitForLines(1));
    test.change();
    REQUIRE(test.machine.clock.waitForSleep(burst));
    test.end();
    CHECK(test.lines().size() == 1);
}
