#include "apps/common/Machine.h"
#include "host/OBMediaHost.h"
#include "host/OBPathWatcher.h"
#include "platform/PathWatching.h"

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <malloc.h>
#include <sys/resource.h>
#include <unistd.h>

// The product's side of what watching costs, through the host's public headers: the set-up of one watched folder, the
// memory that it keeps, from a file's close to an observer's call, and what it does while nothing happens.

namespace {

using Clock = std::chrono::steady_clock;

class Observer : public OBPathWatcherObserver {
public:
    void watchedPathChanged_fileChangedEventFlags(std::string_view, std::uint64_t) override
    {
        const Clock::time_point now = Clock::now();
        const std::lock_guard guard(_lock);
        _calledAt = now;
        ++_calls;
        _changed.notify_all();
    }
    long calls()
    {
        const std::lock_guard guard(_lock);
        return _calls;
    }
    /// When the call came that was the `number`th; ends the program when none comes.
    Clock::time_point waitForCall(long number)
    {
        std::unique_lock guard(_lock);
        if (!_changed.wait_for(guard, std::chrono::seconds(30), [&] { return _calls >= number; })) {
            std::fputs("watch_probe: a change was not told\n", stderr);
            std::_Exit(1);
        }
        return _calledAt;
    }

private:
    std::mutex _lock;
    std::condition_variable _changed;
    long _calls = 0;
    Clock::time_point _calledAt;
};

double secondsOfChange(Observer& observer, const std::string& file)
{
    const int descriptor = open(file.c_str(), O_WRONLY | O_CREAT, 0644);
    if (descriptor == -1 || write(descriptor, "x", 1) != 1) {
        std::perror(file.c_str());
        std::_Exit(1);
    }
    const long before = observer.calls();
    const Clock::time_point start = Clock::now();
    close(descriptor);
    return std::chrono::duration<double>(observer.waitForCall(before + 1) - start).count();
}

long heapBytes()
{
    const auto facts = mallinfo2();
    return static_cast<long>(facts.uordblks + facts.hblkhd);
}

long switchesOfProcess()
{
    rusage usage {};
    getrusage(RUSAGE_SELF, &usage);
    return usage.ru_nvcsw;
}

void waitUntilItStands(const platform::PathWatching& watching, Clock::time_point& stood)
{
    std::uint64_t folders = 0;
    for (;;) {
        const std::uint64_t now = watching.state().watchedFolders;
        if (now != folders) {
            folders = now;
            stood = Clock::now();
        } else if (folders != 0 && Clock::now() - stood > std::chrono::milliseconds(300)) {
            return;
        }
        std::this_thread::sleep_for(std::chrono::microseconds(200));
    }
}

} // namespace

int main(int count, char** arguments)
{
    if (count != 4) {
        std::fputs("usage: watch_probe FOLDER CHANGES IDLE-SECONDS\n", stderr);
        return 2;
    }
    const std::string folder = arguments[1];
    const int changes = std::atoi(arguments[2]);
    const int idleSeconds = std::atoi(arguments[3]);
    const apps::MachineResult chosen = apps::chooseMachine(std::nullopt);
    const platform::Platform machine = chosen.machine->platform();
    OBMediaHost host(machine, {});
    Observer observer;
    const long before = heapBytes();
    const Clock::time_point start = Clock::now();
    Clock::time_point stood = start;
    host.pathWatcher().watchPath_observer(folder, &observer);
    OBObservation following = host.followChanges();
    waitUntilItStands(machine.pathWatching, stood);
    const double setUp = std::chrono::duration<double>(stood - start).count();
    const long kept = heapBytes() - before;

    // The first is the arrival of the file, of which its folder is told.
    std::vector<double> arrivals;
    for (int change = 0; change <= changes; ++change) {
        const double seconds = secondsOfChange(observer, folder + "/0/0/file");
        if (change != 0)
            arrivals.push_back(seconds);
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
    }
    std::sort(arrivals.begin(), arrivals.end());
    std::this_thread::sleep_for(std::chrono::seconds(2)); // threads that were used end
    const long switches = switchesOfProcess();
    std::this_thread::sleep_for(std::chrono::seconds(idleSeconds));
    const long wakeUps = switchesOfProcess() - switches - 1; // this thread's own sleep is one
    std::printf("{\"folders\": %llu, \"setUpSeconds\": %.9f, \"arrivalSeconds\": %.9f, \"keptBytes\": %ld, "
                "\"wakeUps\": %ld}\n",
        static_cast<unsigned long long>(machine.pathWatching.state().watchedFolders), setUp,
        arrivals[arrivals.size() / 2], kept, wakeUps);
    std::fflush(stdout);
    host.pathWatcher().removeObserver(&observer);
    std::_Exit(0);
}
