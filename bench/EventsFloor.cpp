#include <algorithm>
#include <array>
#include <atomic>
#include <cerrno>
#include <charconv>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <memory>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

// The floor under the events scan: the system calls that no scan can leave out, on one thread, keeping nothing.
//
// The library: one listing (open, read to its end, close). An event: one listing of "Original Media", relative to the
// open library. A clip: one status, relative to the open folder. Neither the marker file nor the date of an event is
// asked for, though a scan has to.
//
// With --threads N that many threads take one event after the other: what more than one can gain here.

namespace {

constexpr std::string_view originalMedia = "/Original Media";
constexpr int folderFlags = O_RDONLY | O_DIRECTORY | O_CLOEXEC;
constexpr std::size_t listingSize = 32768;

struct Count {
    std::uint64_t events = 0;
    std::uint64_t clips = 0;
    std::uint64_t nameBytes = 0;
    std::int64_t oldest = INT64_MAX;
    std::int64_t newest = INT64_MIN;

    void add(const Count& other)
    {
        events += other.events;
        clips += other.clips;
        nameBytes += other.nameBytes;
        oldest = std::min(oldest, other.oldest);
        newest = std::max(newest, other.newest);
    }
};

using Listing = std::unique_ptr<char[]>;

/// Calls `each` with the name of every visible entry of the open folder that is not of the kind to leave out.
template <typename Each> void listFolder(int folder, const Listing& buffer, unsigned char leftOut, const Each& each)
{
    while (true) {
        const ssize_t count = ::getdents64(folder, buffer.get(), listingSize);
        for (ssize_t at = 0; at < count;) {
            const auto* entry = reinterpret_cast<const dirent64*>(buffer.get() + at);
            if (entry->d_name[0] != '.' && entry->d_type != leftOut)
                each(static_cast<const char*>(entry->d_name));
            at += entry->d_reclen;
        }
        if (count <= 0)
            return;
    }
}

class Floor {
public:
    explicit Floor(int library)
        : _library(library)
    {
    }

    Count run(unsigned threads)
    {
        listFolder(_library, std::make_unique<char[]>(listingSize), DT_REG,
            [this](const char* name) { _media.emplace_back(name).append(originalMedia); });
        std::vector<Count> counts(threads);
        std::vector<std::thread> others;
        for (unsigned index = 1; index < threads; ++index)
            others.emplace_back([this, &count = counts[index]] { takeEvents(count); });
        takeEvents(counts[0]);
        for (std::thread& other : others)
            other.join();
        Count all;
        for (const Count& count : counts)
            all.add(count);
        return all;
    }

private:
    void takeEvents(Count& result)
    {
        const Listing buffer = std::make_unique<char[]>(listingSize);
        Count count;
        for (std::size_t index = _next++; index < _media.size(); index = _next++)
            lookAtEvent(_media[index].c_str(), buffer, count);
        result = count;
    }

    void lookAtEvent(const char* media, const Listing& buffer, Count& count) const
    {
        const int folder = ::openat(_library, media, folderFlags);
        if (folder < 0)
            return;
        const std::uint64_t before = count.clips;
        listFolder(folder, buffer, DT_DIR, [&](const char* name) { lookAtClip(folder, name, count); });
        ::close(folder);
        count.events += count.clips > before ? 1 : 0;
    }

    static void lookAtClip(int folder, const char* name, Count& count)
    {
        struct statx status;
        if (::statx(folder, name, AT_SYMLINK_NOFOLLOW, STATX_BASIC_STATS | STATX_BTIME, &status) != 0)
            return;
        ++count.clips;
        count.nameBytes += std::strlen(name);
        count.oldest = std::min<std::int64_t>(count.oldest, status.stx_mtime.tv_sec);
        count.newest = std::max<std::int64_t>(count.newest, status.stx_mtime.tv_sec);
    }

    const int _library;
    std::vector<std::string> _media; // relative to the library
    std::atomic<std::size_t> _next { 0 };
};

double secondsOf(clockid_t clock)
{
    struct timespec now { };
    ::clock_gettime(clock, &now);
    return double(now.tv_sec) + double(now.tv_nsec) / 1e9;
}

int run(const char* library, unsigned threads)
{
    const double wall = secondsOf(CLOCK_MONOTONIC);
    const double processor = secondsOf(CLOCK_PROCESS_CPUTIME_ID);
    const int descriptor = ::open(library, folderFlags);
    if (descriptor < 0) {
        std::fprintf(stderr, "events_floor: %s: %s\n", library, std::strerror(errno));
        return 1;
    }
    const Count count = Floor(descriptor).run(threads);
    ::close(descriptor);
    const double processorUsed = secondsOf(CLOCK_PROCESS_CPUTIME_ID) - processor;
    const double wallUsed = secondsOf(CLOCK_MONOTONIC) - wall;
    std::printf("{\"events\": %ju, \"clips\": %ju, \"nameBytes\": %ju, \"oldest\": %jd, \"newest\": %jd, "
                "\"cpuSeconds\": %.6f, \"wallSeconds\": %.6f}\n",
        std::uintmax_t { count.events }, std::uintmax_t { count.clips }, std::uintmax_t { count.nameBytes },
        std::intmax_t { count.oldest }, std::intmax_t { count.newest }, processorUsed, wallUsed);
    return 0;
}

/// How many threads the arguments ask for; 0 when they cannot be understood.
unsigned threadsAsked(int argc, char** argv)
{
    constexpr unsigned mostThreads = 64;
    if (argc == 2)
        return 1;
    if (argc != 4 || std::strcmp(argv[2], "--threads") != 0)
        return 0;
    unsigned threads = 0;
    const char* end = argv[3] + std::strlen(argv[3]);
    const auto [last, error] = std::from_chars(static_cast<const char*>(argv[3]), end, threads);
    return error == std::errc() && last == end && threads <= mostThreads ? threads : 0;
}

} // namespace

int main(int argc, char** argv)
{
    const unsigned threads = threadsAsked(argc, argv);
    if (threads == 0) {
        std::fprintf(stderr, "usage: events_floor LIBRARY [--threads N]\n");
        return 2;
    }
    return run(argv[1], threads);
}
