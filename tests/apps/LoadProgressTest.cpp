#include "apps/common/Session.h"
#include "platform/MainRunLoop.h"
#include "tests/support/DescribedMachine.h"
#include "tests/support/LibraryBuilder.h"
#include "tests/support/TemporaryFolder.h"
#include "tests/support/Turns.h"

#include <doctest/doctest.h>

#include <functional>
#include <utility>

TEST_CASE("progress counts every folder that a load listed, also one that was listed together with its library")
{
    const tests::TemporaryFolder folder;
    tests::LibraryBuilder projects(folder.folder("home/Movies/Montaro Projects"));
    projects.project("Trip").movie("a.mov");
    projects.project("Clients/Meyer").movie("b.mov");
    tests::DescribedMachine description;
    description.home(folder.path("home")).editor(folder.file("editor")).write(folder.path("machine.json"));
    const apps::SessionResult opened = apps::openSession({ folder.path("machine.json"), "org.ombrix.OBMontaroPlugin" });
    REQUIRE(opened.session);
    const auto manager = opened.session->manager();
    REQUIRE(manager);
    platform::MainRunLoop& loop = opened.session->platform().mainRunLoop;
    OBLoadOutcome outcome = OBLoadOutcome::ended;
    manager->requestRootMediaGroup([&](std::function<void()> call) { loop.post(std::move(call)); },
        [&](const OBLoadResult& result) {
            outcome = result.outcome;
            loop.quit();
        });
    loop.run();
    CHECK(outcome == OBLoadOutcome::loaded);
    // Four library folders, of which one exists; in it a folder; and the shared movies of two projects.
    CHECK(manager->loadProgress().foldersDone == 7);
    CHECK(opened.session->host().waitForThreads(tests::longestWait));
}
