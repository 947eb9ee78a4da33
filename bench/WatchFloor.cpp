#include <algorithm>
#include <array>
#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <sys/inotify.h>
#include <unistd.h>

// What watching a tree cannot do without: one watch and one listing a folder; and what hearing of a change cannot do
// without: reading the event on one thread and handing it to another that waits.

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::uint32_t mask = IN_CREATE | IN_DELETE | IN_MOVE | IN_MODIFY | IN_CLOSE_WRITE | IN_ATTRIB | IN_DELETE_SELF
    | IN_MOVE_SELF | IN_ONLYDIR | IN_DONT_FOLLOW;

[[noreturn]] void fail(const std::string& what)
{
    std::perror(what.c_str());
    std::exit(1);
}

std::size_t watchTree(int inotify, const std::string& folder)
{
    if (inotify_add_watch(inotify, folder.c_str(), mask) == -1)
        fail(folder);
    std::size_t folders = 1;
    DIR* const stream = opendir(folder.c_str());
    if (!stream)
        fail(folder);
    std::vector<std::string> inside;
    while (const dirent* entry = readdir(stream)) {
        if (entry->d_type == DT_DIR && entry->d_name[0] != '.')
            inside.push_back(folder + "/" + entry->d_name);
    }
    closedir(stream);
    for (const std::string& name : inside)
        folders += watchTree(inotify, name);
    return folders;
}

/// Hands each close of a written file to a thread that waits for it.
class Reader {
public:
    explicit Reader(int inotify)
        : _inotify(inotify)
    {
        std::thread([this] { read(); }).detach();
        std::thread([this] { receive(); }).detach();
    }
    /// From the close of `file`, which is written to, until the waiting thread knows of it.
    double secondsOfChange(const std::string& file)
    {
        const int descriptor = open(file.c_str(), O_WRONLY | O_CREAT, 0644);
        if (descriptor == -1 || write(descriptor, "x", 1) != 1)
            fail(file);
        const Clock::time_point start = Clock::now();
        close(descriptor);
        std::unique_lock guard(_lock);
        _changed.wait(guard, [this] { return _received; });
        _received = false;
        return std::chrono::duration<double>(_receivedAt - start).count();
    }

private:
    void read()
    {
        alignas(inotify_event) std::array<char, 65536> buffer {};
        for (;;) {
            const ssize_t length = ::read(_inotify, buffer.data(), buffer.size());
            if (length <= 0)
                fail("inotify");
            for (const char* at = buffer.data(); at < buffer.data() + length;) {
                const auto* event = reinterpret_cast<const inotify_event*>(at);
                if (event->mask & IN_CLOSE_WRITE) {
                    const std::lock_guard guard(_lock);
                    _handed = true;
                    _changed.notify_all();
                }
                at += sizeof(inotify_event) + event->len;
            }
        }
    }
    void receive()
    {
        for (;;) {
            std::unique_lock guard(_lock);
            _changed.wait(guard, [this] { return _handed; });
            _handed = false;
            _receivedAt = Clock::now();
            _received = true;
            _changed.notify_all();
        }
    }

    const int _inotify;
    std::mutex _lock;
    std::condition_variable _changed;
    bool _handed = false;
    bool _received = false;
    Clock::time_point _receivedAt;
};

} // namespace

int main(int count, char** arguments)
{
    if (count != 3) {
        std::fputs("usage: watch_floor FOLDER CHANGES\n", stderr);
        return 2;
    }
    const std::string folder = arguments[1];
    const int changes = std::atoi(arguments[2]);
    const int inotify = inotify_init1(IN_CLOEXEC);
    if (inotify == -1)
        fail("inotify");
    const Clock::time_point start = Clock::now();
    const std::size_t folders = watchTree(inotify, folder);
    const double setUp = std::chrono::duration<double>(Clock::now() - start).count();

    Reader reader(inotify);
    std::vector<double> arrivals;
    for (int change = 0; change < changes; ++change) {
        arrivals.push_back(reader.secondsOfChange(folder + "/0/0/file"));
        std::this_thread::sleep_for(std::chrono::milliseconds(2));
    }
    std::sort(arrivals.begin(), arrivals.end());
    std::printf("{\"folders\": %zu, \"setUpSeconds\": %.9f, \"arrivalSeconds\": %.9f}\n", folders, setUp,
        arrivals[arrivals.size() / 2]);
    std::fflush(stdout);
    std::_Exit(0);
}
