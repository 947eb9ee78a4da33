#include "bench/MovieBoxes.h"

#include <array>
#include <atomic>
#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <memory>
#include <string>
#include <string_view>
#include <thread>

#include <dirent.h>
#include <fcntl.h>
#include <linux/futex.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <unistd.h>

// The floor under the projects scan: the system calls that no scan can leave out, on one thread, keeping nothing.
//
// A folder: one listing (open, read to its end, close) and its date. An entry that can be a project: one test for the
// marker. A project: its date and one listing of "Shared Items". With --headers, also: each movie opened, read and
// closed by a second thread that waits for it, one hand-over there and back a project. All of it relative to the
// nearest open folder, because an absolute path costs more.

namespace {

constexpr std::string_view marker = "/CurrentVersion.mtrproject";
constexpr std::string_view sharedItems = "/Shared Items";
constexpr int folderFlags = O_RDONLY | O_DIRECTORY | O_CLOEXEC;
constexpr std::size_t listingSize = 32768;
constexpr int deepest = 64;

struct Count {
    std::uint64_t folders = 0;
    std::uint64_t projects = 0;
    std::uint64_t movies = 0;
    std::uint64_t headers = 0;
    std::uint64_t nameBytes = 0;
    std::int64_t newest = 0;
    bool tooDeep = false;
};

/// Something a waiting thread does when it is told, while the one that told it waits in turn.
class HandOver {
public:
    void give() noexcept { pass(theirs); }
    void giveBack() noexcept { pass(mine); }
    void waitForJob() noexcept { waitWhile(mine); }
    void waitForResult() noexcept { waitWhile(theirs); }

private:
    static constexpr std::uint32_t mine = 0;
    static constexpr std::uint32_t theirs = 1;

    void pass(std::uint32_t to) noexcept
    {
        _turn.store(to, std::memory_order_release);
        ::syscall(SYS_futex, &_turn, FUTEX_WAKE_PRIVATE, 1, nullptr, nullptr, 0);
    }

    void waitWhile(std::uint32_t turn) noexcept
    {
        while (_turn.load(std::memory_order_acquire) == turn)
            ::syscall(SYS_futex, &_turn, FUTEX_WAIT_PRIVATE, turn, nullptr, nullptr, 0);
    }

    std::atomic<std::uint32_t> _turn { mine };
};
static_assert(sizeof(std::atomic<std::uint32_t>) == sizeof(std::uint32_t));

/// The thread that reads the movies of one project at a time.
class MovieThread {
public:
    MovieThread()
        : _thread([this] { run(); })
    {
    }
    MovieThread(const MovieThread&) = delete;
    MovieThread& operator=(const MovieThread&) = delete;
    ~MovieThread()
    {
        _names = nullptr;
        _handOver.give();
        _thread.join();
    }

    /// Reads the movies whose names, each ended by a zero byte, lie in the open folder; answers how many had a size.
    std::uint64_t read(int folder, const std::string& names) noexcept
    {
        _folder = folder;
        _names = &names;
        _handOver.give();
        _handOver.waitForResult();
        return _found;
    }

private:
    void run()
    {
        for (_handOver.waitForJob(); _names; _handOver.waitForJob()) {
            _found = 0;
            for (std::size_t at = 0; at < _names->size(); at += std::strlen(_names->c_str() + at) + 1)
                _found += readOne(_names->c_str() + at) ? 1 : 0;
            _handOver.giveBack();
        }
    }

    bool readOne(const char* name)
    {
        const int descriptor = ::openat(_folder, name, O_RDONLY | O_NONBLOCK | O_CLOEXEC);
        if (descriptor < 0)
            return false;
        const bench::MovieFacts facts = bench::readMovieFacts(descriptor, _buffer);
        ::close(descriptor);
        return facts.width > 0;
    }

    HandOver _handOver;
    // What is handed over belongs to whoever has the turn.
    int _folder = -1;
    const std::string* _names = nullptr;
    std::uint64_t _found = 0;
    std::array<char, 4096> _buffer {};
    std::thread _thread;
};

bool isMovieName(std::string_view name)
{
    const std::string_view extension = name.substr(name.rfind('.') + 1);
    return extension.size() < name.size()
        && (extension == "mov" || extension == "m4v" || extension == "mp4" || extension == "3gp");
}

/// Calls `each` with the name and kind of every entry of the open folder; "." and ".." are told apart by their full
/// stop.
template <typename Each> void listFolder(int folder, char* buffer, const Each& each)
{
    while (true) {
        const ssize_t count = ::getdents64(folder, buffer, listingSize);
        for (ssize_t at = 0; at < count;) {
            const auto* entry = reinterpret_cast<const dirent64*>(buffer + at);
            each(static_cast<const char*>(entry->d_name), entry->d_type);
            at += entry->d_reclen;
        }
        if (count <= 0)
            return;
    }
}

class Floor {
public:
    explicit Floor(MovieThread* movies)
        : _movieThread(movies)
    {
    }

    const Count& count() const { return _count; }

    void folder(int descriptor, int depth)
    {
        if (depth == deepest) {
            _count.tooDeep = true;
            return;
        }
        struct stat status;
        if (::fstat(descriptor, &status) == 0)
            noteDate(status);
        ++_count.folders;
        if (!_listings[depth])
            _listings[depth] = std::make_unique<char[]>(listingSize);
        listFolder(descriptor, _listings[depth].get(), [&](const char* name, unsigned char kind) {
            if (name[0] != '.' && kind != DT_REG)
                entry(descriptor, name, depth);
        });
    }

private:
    void noteDate(const struct stat& status)
    {
        if (status.st_mtim.tv_sec > _count.newest)
            _count.newest = status.st_mtim.tv_sec;
    }

    void entry(int parent, const char* name, int depth)
    {
        std::array<char, 256 + marker.size() + 1> path;
        const std::size_t length = std::strlen(name);
        std::memcpy(path.data(), name, length);
        std::memcpy(path.data() + length, marker.data(), marker.size() + 1);
        if (::faccessat(parent, path.data(), F_OK, 0) == 0) {
            std::memcpy(path.data() + length, sharedItems.data(), sharedItems.size() + 1);
            project(parent, name, path.data());
            return;
        }
        const int descriptor = ::openat(parent, name, folderFlags | O_NOFOLLOW);
        if (descriptor < 0)
            return;
        folder(descriptor, depth + 1);
        ::close(descriptor);
    }

    void project(int parent, const char* name, const char* shared)
    {
        ++_count.projects;
        _count.nameBytes += std::strlen(name);
        struct stat status;
        if (::fstatat(parent, name, &status, 0) == 0)
            noteDate(status);
        const int descriptor = ::openat(parent, shared, folderFlags);
        if (descriptor < 0)
            return;
        listMovies(descriptor);
        if (_movieThread && !_movieNames.empty())
            _count.headers += _movieThread->read(descriptor, _movieNames);
        ::close(descriptor);
    }

    void listMovies(int descriptor)
    {
        _movieNames.clear();
        listFolder(descriptor, _movieListing.get(), [&](const char* name, unsigned char) {
            const std::string_view view(name);
            if (!isMovieName(view))
                return;
            ++_count.movies;
            _count.nameBytes += view.size();
            if (_movieThread)
                _movieNames.append(view).push_back('\0');
        });
    }

    MovieThread* _movieThread;
    Count _count;
    std::string _movieNames;
    std::unique_ptr<char[]> _movieListing = std::make_unique<char[]>(listingSize);
    std::array<std::unique_ptr<char[]>, deepest> _listings;
};

double secondsOf(clockid_t clock)
{
    struct timespec now { };
    ::clock_gettime(clock, &now);
    return double(now.tv_sec) + double(now.tv_nsec) / 1e9;
}

int run(const char* library, MovieThread* movies)
{
    Floor floor(movies);
    const double wall = secondsOf(CLOCK_MONOTONIC);
    const double processor = secondsOf(CLOCK_PROCESS_CPUTIME_ID);
    const int descriptor = ::open(library, folderFlags);
    if (descriptor < 0) {
        std::fprintf(stderr, "projects_floor: %s: %s\n", library, std::strerror(errno));
        return 1;
    }
    floor.folder(descriptor, 0);
    ::close(descriptor);
    const double processorUsed = secondsOf(CLOCK_PROCESS_CPUTIME_ID) - processor;
    const double wallUsed = secondsOf(CLOCK_MONOTONIC) - wall;
    const Count& count = floor.count();
    if (count.tooDeep) {
        std::fprintf(stderr, "projects_floor: %s: folders nested deeper than %d\n", library, deepest);
        return 1;
    }
    std::printf("{\"folders\": %ju, \"projects\": %ju, \"movies\": %ju, \"headers\": %ju, \"nameBytes\": %ju, "
                "\"newest\": %jd, \"cpuSeconds\": %.6f, \"wallSeconds\": %.6f}\n",
        std::uintmax_t { count.folders }, std::uintmax_t { count.projects }, std::uintmax_t { count.movies },
        std::uintmax_t { count.headers }, std::uintmax_t { count.nameBytes }, std::intmax_t { count.newest },
        processorUsed, wallUsed);
    return 0;
}

} // namespace

int main(int argc, char** argv)
{
    const bool headers = argc == 3 && std::strcmp(argv[2], "--headers") == 0;
    if (argc != 2 && !headers) {
        std::fprintf(stderr, "usage: projects_floor LIBRARY [--headers]\n");
        return 2;
    }
    if (!headers)
        return run(argv[1], nullptr);
    MovieThread movies;
    return run(argv[1], &movies);
}
