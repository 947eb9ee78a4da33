#pragma once

#include "tests/live/LiveMachine.h"
#include "tests/support/simulated/SimulatedMachine.h"

#include <cstdint>
#include <map>

namespace tests {

/// A simulated disk as one on which a tree is left open.
class SimulatedLiveDisk : public LiveDisk {
public:
    /// `disk` outlives this object.
    explicit SimulatedLiveDisk(SimulatedDisk& disk)
        : _disk(disk)
    {
    }

    std::optional<platform::ItemKind> kindOf(const std::string& path) const override;
    std::vector<Item> itemsIn(const std::string& path) const override;
    std::string linkTarget(const std::string& path) const override;
    std::string realPath(const std::string& path) const override;
    std::uint64_t numberOf(const std::string& path) override;
    std::string pathOf(std::uint64_t number) const override;

    bool makeFolder(const std::string& path) override { return _disk.makeFolder(path); }
    std::uint64_t beginFile(const std::string& path) override { return _disk.beginFile(path); }
    void endFile(std::uint64_t number, const std::string& text, std::optional<platform::Date> date) override
    {
        _disk.endFile(number, text, date);
    }
    bool writeFile(const std::string& path, const std::string& text) override { return _disk.writeFile(path, text); }
    bool makeLink(const std::string& path, const std::string& target) override { return _disk.makeLink(path, target); }
    bool rename(const std::string& from, const std::string& to) override { return _disk.rename(from, to); }
    bool remove(const std::string& path) override { return _disk.remove(path); }
    bool setOpen(const std::string& path, bool isOpen) override { return _disk.setOpen(path, isOpen); }
    bool setModified(const std::string& path, platform::Date date) override { return _disk.setModified(path, date); }

private:
    SimulatedDisk& _disk;
};

/// A simulated machine as one on which a tree is left open. A seed replays exactly.
class SimulatedLiveMachine : public LiveMachine {
public:
    /// `linkedEntryPoint` is the C entry point of the plug-in, whose bundle lies in `bundle`.
    SimulatedLiveMachine(std::uint64_t seed, void* linkedEntryPoint, const std::string& bundle);

    platform::Platform platform() override { return _machine.platform(); }
    LiveDisk& disk() override { return _disk; }
    Chance& chance() override { return _machine.chance; }
    std::string spelled(const std::string& path) const override { return path; }

    void makeVolume(const Volume& volume) override;
    bool mount(Volume& volume) override;
    bool unmount(Volume& volume) override;
    void tellVolumes(const ListedVolumes* told) override;

    void drawWatching() override;
    bool somethingIsPolled() const override { return _machine.pathWatching.somethingIsPolled(); }
    void dropReports() override { _machine.pathWatching.beginDropping(); }
    void tell(const std::string& watchedPath, const platform::PathChange& change) override;
    void setWhenListing(std::function<platform::FileProblem(std::string_view)> whenListing) override;

    void perform(const std::function<void()>& body) override { _machine.threads.perform(body); }
    void pause(std::chrono::nanoseconds duration) override { _machine.threads.pause(duration); }
    void pauseBetweenOperations() override;
    void after(std::chrono::nanoseconds delay, std::function<void()> call) override;
    void waitUntilQuiet(const std::function<bool()>&) override { _machine.threads.waitUntilQuiet(); }
    void waitUntil(const std::function<bool()>&) override { _machine.threads.waitUntilQuiet(); }
    void end() override { _machine.mainRunLoop.quit(); }

    void alone(const std::function<void()>& call) override;
    std::chrono::nanoseconds passed() const override { return _machine.threads.monotonic(); }

private:
    SimulatedMachine _machine;
    SimulatedLiveDisk _disk { _machine.disk };
    std::map<std::string, SimulatedMachine::Volume> _simulatedVolumes {}; ///< by their mount points
    ListedVolumes _told {};
};

} // namespace tests
