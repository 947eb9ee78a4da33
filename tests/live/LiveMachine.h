#pragma once

#include "platform/FolderListing.h"
#include "platform/PathWatching.h"
#include "platform/Platform.h"
#include "tests/live/LiveDisk.h"
#include "tests/support/BareMachine.h"
#include "tests/support/simulated/Chance.h"

#include <chrono>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// A machine on which a tree is left open while anything happens to its disks: one in memory, on which hours pass in
/// milliseconds, or this one.
///
/// One thread is the application's and drives the machine; the other threads run while it waits, or beside it.
class LiveMachine {
public:
    struct Volume {
        std::string mountPoint;
        std::string displayName;
        bool isRemovable = false;
        bool isMounted = false;
    };

    LiveMachine() = default;
    virtual ~LiveMachine() = default;
    LiveMachine(const LiveMachine&) = delete;
    LiveMachine& operator=(const LiveMachine&) = delete;

    virtual platform::Platform platform() = 0;
    virtual LiveDisk& disk() = 0;
    virtual Chance& chance() = 0;
    /// How the programs of the machine spell a path of its disks.
    virtual std::string spelled(const std::string& path) const = 0;

    /// All there are, mounted or not.
    std::vector<Volume> volumes {};
    /// Makes a volume that is not mounted, and the folder for it.
    virtual void makeVolume(const Volume& volume) = 0;
    // False where the machine refuses.
    virtual bool mount(Volume& volume) = 0;
    virtual bool unmount(Volume& volume) = 0;
    /// What the plug-in is told of volumes from now on; null for those that are mounted.
    virtual void tellVolumes(const ListedVolumes* volumes) = 0;

    /// Draws how well it is watched.
    virtual void drawWatching() = 0;
    virtual bool somethingIsPolled() const = 0;
    /// Has reports of changes go astray for a while.
    virtual void dropReports() = 0;
    /// Tells whoever watches exactly `watchedPath`.
    virtual void tell(const std::string& watchedPath, const platform::PathChange& change) = 0;
    /// With which problem listing a folder fails. Set once, asked on any thread, alone.
    virtual void setWhenListing(std::function<platform::FileProblem(std::string_view folder)> whenListing) = 0;

    /// Runs `body` as the application's thread.
    virtual void perform(const std::function<void()>& body) = 0;
    // Of that thread:
    /// Lets time pass, at most as much.
    virtual void pause(std::chrono::nanoseconds duration) = 0;
    /// The time between two operations.
    virtual void pauseBetweenOperations() = 0;
    /// Has that thread, or nobody's, make a call after a while, of which some may be left out.
    virtual void after(std::chrono::nanoseconds delay, std::function<void()> call) = 0;
    /// Lets others run until nothing more comes of what has happened. `isAtRest` tells of those that can be asked.
    virtual void waitUntilQuiet(const std::function<bool()>& isAtRest) = 0;
    /// Lets others run until `condition` holds.
    virtual void waitUntil(const std::function<bool()>& condition) = 0;
    /// The application has ended.
    virtual void end() = 0;

    /// Makes a call, on any thread, beside no other that is made so.
    virtual void alone(const std::function<void()>& call) = 0;
    virtual std::chrono::nanoseconds passed() const = 0;
};

} // namespace tests
