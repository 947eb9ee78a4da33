#include "platform/PathText.h"
#include "tests/platform/linux/Environment.h"
#include "tests/platform/linux/watching/Listener.h"
#include "tests/support/OwnMounts.h"

#include <doctest/doctest.h>

#include <cerrno>
#include <cstdint>
#include <functional>
#include <string>
#include <thread>

#include <sys/mount.h>
#include <unistd.h>

using platform::Locked;
using tests::Changes;
using tests::Listener;

namespace {

/// The files of this machine, with a disk that keeps those waiting who look at it. Any thread.
class SilentDisk : public platform::LinuxFileSystem {
public:
    void silence(const std::string& mountPoint)
    {
        Locked guard(_lock);
        _silent = mountPoint;
    }
    void answer()
    {
        Locked guard(_lock);
        _silent.clear();
        _changed.notifyAll();
    }
    void waitUntilAsked() const
    {
        Locked guard(_lock);
        while (_asked == 0)
            _changed.wait(_lock);
    }
    std::string resolvedPath(std::string_view path) const override
    {
        wait(path);
        return LinuxFileSystem::resolvedPath(path);
    }
    std::optional<std::string> linkTarget(std::string_view path) const override
    {
        wait(path);
        return LinuxFileSystem::linkTarget(path);
    }

private:
    void wait(std::string_view path) const
    {
        Locked guard(_lock);
        const auto isSilent
            = [&]() REQUIRES(_lock) { return !_silent.empty() && platform::isSameOrBelow(path, _silent); };
        while (isSilent()) {
            ++_asked;
            _changed.notifyAll();
            _changed.wait(_lock);
        }
    }

    mutable platform::Mutex _lock;
    mutable platform::Condition _changed;
    mutable int _asked GUARDED_BY(_lock) = 0;
    std::string _silent GUARDED_BY(_lock);
};

/// A look may hold a disk for a moment.
bool isUnmounted(const std::string& mountPoint)
{
    while (umount(mountPoint.c_str()) != 0) {
        if (errno != EBUSY)
            return false;
        std::this_thread::yield();
    }
    return true;
}

/// A disk on which two others are mounted, "one" and "two".
struct ThreeDisks : tests::FollowedFiles<SilentDisk> {
    bool areMounted = false;

    explicit ThreeDisks(platform::LinuxWatchingLimits limits = {})
        : FollowedFiles(std::move(limits))
    {
        areMounted = tests::mountMemory(disk.folder("one")) && tests::mountMemory(disk.folder("two"));
        for (const char* const folder : { "home", "one/library", "two/library" })
            tests::makeFolder(path(folder));
    }
    ~ThreeDisks()
    {
        for (const char* const place : { "one", "two" })
            isUnmounted(path(place));
    }
    ThreeDisks(const ThreeDisks&) = delete;
    ThreeDisks& operator=(const ThreeDisks&) = delete;
};

void checkWithThreeDisks(const std::function<bool()>& check)
{
    const tests::ChildAnswer answer = tests::askWithOwnMounts(check);
    if (answer == tests::ChildAnswer::impossible)
        MESSAGE("skipped: this system lets nobody have mounts of his own");
    CHECK(answer != tests::ChildAnswer::no);
}

bool hearsOfFile(Listener& listener, const std::string& folder, const std::string& name)
{
    tests::writeFile(folder + "/" + name, "x");
    return listener.hears("arrivalEnded " + name);
}

} // namespace

TEST_CASE("a disk that does not answer keeps no other disk's changes from being told")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        Listener home(machine.watching, machine.path("home"));
        Listener two(machine.watching, machine.path("two/library"));
        machine.files.silence(machine.path("one"));
        Listener silent;
        silent.begin(machine.watching, machine.path("one/library"), tests::afterEverything());
        machine.files.waitUntilAsked();
        bool isRight = machine.areMounted && hearsOfFile(home, machine.path("home"), "a")
            && hearsOfFile(two, machine.path("two/library"), "b");
        // Nor from being followed.
        tests::makeFolder(machine.path("later"));
        Listener later(machine.watching, machine.path("later"));
        isRight = isRight && hearsOfFile(later, machine.path("later"), "c");
        machine.files.answer();
        return isRight && silent.waitUntilStanding() && hearsOfFile(silent, machine.path("one/library"), "d");
    });
}

TEST_CASE("a link to a disk that does not answer keeps no other disk's changes from being told")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        symlink(machine.path("one/library").c_str(), machine.path("home/link").c_str());
        machine.files.silence(machine.path("one"));
        Listener silent;
        silent.begin(machine.watching, machine.path("home/link"), tests::afterEverything());
        machine.files.waitUntilAsked();
        Listener home(machine.watching, machine.path("home"));
        Listener two(machine.watching, machine.path("two/library"));
        const bool isRight = machine.areMounted && hearsOfFile(home, machine.path("home"), "a")
            && hearsOfFile(two, machine.path("two/library"), "b");
        machine.files.answer();
        return isRight && silent.waitUntilStanding() && hearsOfFile(silent, machine.path("one/library"), "c");
    });
}

TEST_CASE("a disk that lies behind another one, and lay before it, keeps nothing of that one from being told")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        const auto turn = [&](const char* link, const char* target) {
            const std::string turned = machine.path(link) + "-new";
            symlink(machine.path(target).c_str(), turned.c_str());
            tests::moveItem(turned, machine.path(link));
        };
        turn("home/link", "one/link");
        turn("one/link", "two/library");
        tests::makeFolder(machine.path("two/other"));
        turn("two/link", "two/other");
        Listener two(machine.watching, machine.path("two/library"));
        Listener listener(machine.watching, machine.path("home/link"));
        turn("home/link", "two/link");
        listener.until("anythingChanged .");
        machine.files.silence(machine.path("one"));
        turn("two/link", "one/library");
        machine.files.waitUntilAsked();
        const bool isRight = machine.areMounted && hearsOfFile(two, machine.path("two/library"), "a");
        machine.files.answer();
        listener.until("anythingChanged .");
        return isRight && hearsOfFile(listener, machine.path("one/library"), "b");
    });
}

TEST_CASE("a link that is turned from disk to disk is told each time, and what it leads to is followed")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        const std::string link = machine.path("home/link");
        symlink(machine.path("one/library").c_str(), link.c_str());
        Listener listener(machine.watching, link);
        bool isRight = machine.areMounted && hearsOfFile(listener, machine.path("one/library"), "first");
        int turn = 0;
        for (const char* const target : { "two/library", "home", "one/library", "missing", "two/library" }) {
            const std::string folder = machine.path(target);
            const std::string before = link + "-new";
            symlink(folder.c_str(), before.c_str());
            tests::moveItem(before, link);
            listener.until("anythingChanged .");
            if (access(folder.c_str(), F_OK) == 0)
                isRight = isRight && hearsOfFile(listener, folder, "file" + std::to_string(++turn));
        }
        return isRight;
    });
}

TEST_CASE("a way that leads over one disk to another and back is followed to its end")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        symlink(machine.path("one/link").c_str(), machine.path("home/link").c_str());
        symlink(machine.path("two/link").c_str(), machine.path("one/link").c_str());
        symlink(machine.path("home/end").c_str(), machine.path("two/link").c_str());
        tests::makeFolder(machine.path("home/end"));
        Listener listener(machine.watching, machine.path("home/link"));
        bool isRight = machine.areMounted && hearsOfFile(listener, machine.path("home/end"), "a");
        // Each link on the way counts.
        unlink(machine.path("one/link").c_str());
        listener.until("anythingChanged .");
        symlink(machine.path("one/library").c_str(), machine.path("one/link").c_str());
        listener.until("anythingChanged .");
        isRight = isRight && hearsOfFile(listener, machine.path("one/library"), "b");
        return isRight;
    });
}

TEST_CASE("a path whose disk goes and comes back is told each time, and is followed")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        const std::string place = machine.disk.folder("place");
        const auto mountDisk
            = [&] { return mount(machine.path("one").c_str(), place.c_str(), nullptr, MS_BIND, nullptr) == 0; };
        bool isRight = machine.areMounted && mountDisk();
        {
            Listener listener(machine.watching, place + "/library");
            for (const char* const file : { "a", "b", "c" }) {
                isRight = isRight && isUnmounted(place);
                listener.until("anythingChanged .");
                isRight = isRight && mountDisk();
                listener.until("anythingChanged .");
                isRight = isRight && hearsOfFile(listener, place + "/library", file);
            }
        }
        return isUnmounted(place) && isRight;
    });
}

TEST_CASE("a disk that is mounted again as soon as it was unmounted is followed again")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        const std::string place = machine.path("one");
        Listener listener(machine.watching, place + "/library");
        bool isRight = machine.areMounted;
        for (int turn = 0; isRight && turn < 20; ++turn) {
            isRight = isUnmounted(place) && tests::mountMemory(place);
            // The kernel gives it the numbers that it had.
            tests::makeFolder(place + "/library");
            isRight = isRight && tests::comesToHear(listener, place + "/library", "turn " + std::to_string(turn));
        }
        return isRight;
    });
}

TEST_CASE("what is mounted for a moment only is told, at, above and below it")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        const std::string place = machine.path("home/place");
        tests::makeFolder(place + "/library");
        Listener above(machine.watching, machine.path("home"));
        Listener at(machine.watching, place);
        Listener below(machine.watching, place + "/library");
        bool isRight = machine.areMounted && tests::mountMemory(place) && isUnmounted(place);
        for (Listener* const listener : { &above, &at, &below })
            isRight = isRight && listener->hears("anythingChanged .");
        return isRight;
    });
}

TEST_CASE("the folders of all disks count against the watches that may be used")
{
    checkWithThreeDisks([] {
        std::uint64_t needed = 0;
        {
            ThreeDisks machine;
            Listener one(machine.watching, machine.path("one/library"));
            needed = machine.watching.state().watchedFolders;
            Listener two(machine.watching, machine.path("two/library"));
            if (!machine.areMounted || machine.watching.state().watchedFolders != 2 * needed)
                return false;
        }
        platform::LinuxWatchingLimits limits;
        limits.watchesAtMost = 2 * needed - 1;
        ThreeDisks machine(limits);
        Listener one(machine.watching, machine.path("one/library"));
        Listener two;
        two.begin(machine.watching, machine.path("two/library"), tests::afterEverything());
        return two.hearsFailure() && one.problems().empty();
    });
}

TEST_CASE("nothing is counted as followed once nothing is, on whatever disk it lay")
{
    checkWithThreeDisks([] {
        ThreeDisks machine;
        {
            Listener one(machine.watching, machine.path("one/library"));
            Listener two(machine.watching, machine.path("two/library"));
        }
        while (machine.watching.state().watchedFolders != 0) { }
        Listener again(machine.watching, machine.path("one/library"));
        return machine.areMounted && hearsOfFile(again, machine.path("one/library"), "a");
    });
}
