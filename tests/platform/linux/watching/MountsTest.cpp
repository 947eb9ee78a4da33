#include "tests/platform/linux/Environment.h"
#include "tests/platform/linux/watching/Listener.h"
#include "tests/support/OwnMounts.h"

#include <doctest/doctest.h>

#include <functional>
#include <memory>
#include <string>

#include <sys/mount.h>

using tests::Changes;
using tests::FollowedDisk;
using tests::Listener;
using tests::mountMemory;

namespace {

/// Runs `check` with mounts of its own; says so where the system refuses them.
void checkWithOwnMounts(const std::function<bool()>& check)
{
    const tests::ChildAnswer answer = tests::askWithOwnMounts(check);
    if (answer == tests::ChildAnswer::impossible)
        MESSAGE("skipped: this system lets nobody have mounts of his own");
    CHECK(answer != tests::ChildAnswer::no);
}

/// Waits for mounts to be told, as a listener does.
bool isToldOfMounts(FollowedDisk& machine, const std::function<void()>& act)
{
    platform::WakeSignal told;
    const auto watch = machine.volumes.watchMounts([&told] { told.raise(); });
    act();
    return watch && told.waitFor(std::chrono::minutes(1));
}

} // namespace

TEST_CASE("mounts are told to whoever asked, until he no longer wants to know")
{
    checkWithOwnMounts([] {
        FollowedDisk machine;
        const std::string place = machine.disk.folder("place");
        int calls = 0;
        machine.volumes.watchMounts([&calls] { ++calls; }).reset();
        return isToldOfMounts(machine, [&] { mountMemory(place); })
            && isToldOfMounts(machine, [&] { umount(place.c_str()); }) && calls == 0;
    });
}

TEST_CASE("a mount at, above or below a watched path is told, is followed, and can be unmounted")
{
    for (const std::string watched : { "place", "place/inner", "" }) {
        CAPTURE(watched);
        checkWithOwnMounts([&] {
            FollowedDisk machine;
            const std::string place = machine.disk.folder("place");
            machine.disk.folder("place/inner");
            Listener listener(machine.watching, machine.path(watched));
            bool isRight = mountMemory(place);
            listener.until("anythingChanged .");
            if (watched == "place/inner") {
                tests::makeFolder(place + "/inner");
                listener.until("anythingChanged .");
            }
            tests::writeFile(machine.path(watched) + (watched.empty() ? "/place/file" : "/file"), "x");
            isRight = isRight && listener.hears(watched.empty() ? "arrivalEnded place/file" : "arrivalEnded file");
            listener.take();
            isRight = umount(place.c_str()) == 0 && isRight && listener.hears("anythingChanged .");
            tests::writeFile(place + "/inner/below", "x");
            const std::string below = watched.empty() ? "place/inner/below"
                : watched == "place"                  ? "inner/below"
                                                      : "below";
            return isRight && listener.hears("appeared " + below);
        });
    }
}

TEST_CASE("a mount elsewhere is told to nobody")
{
    checkWithOwnMounts([] {
        FollowedDisk machine;
        machine.disk.folder("watched");
        const std::string place = machine.disk.folder("place");
        Listener listener(machine.watching, machine.path("watched"));
        Listener witness(machine.watching, place);
        mountMemory(place);
        const bool isRight
            = witness.hears("anythingChanged .") && tests::changesSoFar(listener, machine.path("watched")).empty();
        return umount(place.c_str()) == 0 && isRight;
    });
}

TEST_CASE("a folder that is mounted in two places is followed in both")
{
    checkWithOwnMounts([] {
        FollowedDisk machine;
        const std::string one = machine.disk.folder("one");
        const std::string other = machine.disk.folder("other");
        bool isRight = mount(one.c_str(), other.c_str(), nullptr, MS_BIND, nullptr) == 0;
        {
            Listener listener(machine.watching, machine.path(""));
            tests::makeFolder(one + "/a");
            isRight = isRight && listener.hears("appeared one/a/") && listener.hears("appeared other/a/");
            tests::changesSoFar(listener, machine.path(""));
            tests::moveItem(one + "/a", one + "/b");
            isRight = isRight && listener.hears("appeared one/b/") && listener.hears("appeared other/b/");
            tests::writeFile(other + "/b/file", "x");
            isRight = isRight && listener.hears("appeared one/b/file") && listener.hears("appeared other/b/file");
        }
        return umount(other.c_str()) == 0 && isRight;
    });
}

TEST_CASE("a mount between the time that matters and the watch is told, though no folder there has changed since")
{
    checkWithOwnMounts([] {
        FollowedDisk machine;
        const std::string store = machine.disk.folder("store");
        const std::string place = machine.disk.folder("place");
        bool isRight = mountMemory(store);
        tests::makeFolder(store + "/library");
        // The kernel stamps finely what somebody has looked at since, ahead of the time of other changes.
        const platform::Date made = machine.clock.now();
        while (machine.watching.timeOfChangesNow() <= made) { }
        const platform::Date since = machine.watching.timeOfChangesNow();
        {
            Listener before(machine.watching, place, since);
            isRight = isRight && tests::changesSoFar(before, place).empty();
        }
        isRight = isRight && mount(store.c_str(), place.c_str(), nullptr, MS_BIND, nullptr) == 0;
        {
            Listener after(machine.watching, place + "/library", since);
            isRight = isRight && after.hears("anythingChanged .");
        }
        return umount(place.c_str()) == 0 && umount(store.c_str()) == 0 && isRight;
    });
}
