#include "bench/MeasuredMachine.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <ctime>
#include <filesystem>
#include <string>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

// Makes a large events library to measure on: COUNT clips in about COUNT/100 events of 20 to 300 clips, dated over ten
// years. The same COUNT gives the same names, sizes of events and dates everywhere, so figures can be compared.
//
// The clips are empty: a scan looks at their names and dates alone, and a million of them has to fit on a disk. They
// are made relative to their open folder, two calls each, for the same reason.

namespace {

namespace files = std::filesystem;

constexpr unsigned fewest = 20;
constexpr unsigned most = 300;
constexpr mode_t fileMode = S_IFREG | 0644;
constexpr std::time_t firstDay = 1136073600; // 1 January 2006
constexpr std::time_t tenYears = 10 * 365 * 86400;

/// An open folder, made if it is not there.
class Folder {
public:
    Folder(int parent, const char* name)
    {
        if (::mkdirat(parent, name, 0755) == 0 || errno == EEXIST)
            _descriptor = ::openat(parent, name, O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;
    ~Folder()
    {
        if (isOpen())
            ::close(_descriptor);
    }

    bool isOpen() const { return _descriptor >= 0; }
    int descriptor() const { return _descriptor; }

    bool makeFile(const char* name, std::time_t date) const
    {
        const std::array<timespec, 2> dates { { { date, 0 }, { date, 0 } } };
        return (::mknodat(_descriptor, name, fileMode, 0) == 0 || errno == EEXIST)
            && ::utimensat(_descriptor, name, dates.data(), 0) == 0;
    }

private:
    int _descriptor = -1;
};

/// The numbers from 0 up to 1 that leave the fewest gaps, one after the other.
double evenlySpread(unsigned index)
{
    constexpr std::uint32_t goldenRatio = 0x9e3779b9;
    return (index * goldenRatio) / 4294967296.0;
}

/// Many small events and a few large ones, a hundred clips on average.
unsigned clipsOfEvent(unsigned event)
{
    const double position = evenlySpread(event + 1);
    return fewest + static_cast<unsigned>((most - fewest + 1) * position * position * std::sqrt(position));
}

/// As cameras, telephones and people name their clips.
std::string clipName(unsigned number, std::time_t date)
{
    std::array<char, 64> name {};
    struct tm parts { };
    ::gmtime_r(&date, &parts);
    const unsigned shortNumber = number % 10000;
    switch (number % 8) {
    case 3:
        std::strftime(name.data(), name.size(), "%Y-%m-%d %H_%M_%S.mov", &parts);
        break;
    case 5:
        std::snprintf(name.data(), name.size(), "MVI_%04u.MP4", shortNumber);
        break;
    case 7:
        std::snprintf(name.data(), name.size(), "Été à Zürich %04u.mov", shortNumber);
        break;
    default:
        std::snprintf(name.data(), name.size(), "IMG_%04u.MOV", shortNumber);
    }
    return name.data();
}

bool makeEvent(const Folder& library, unsigned event, unsigned firstClip, unsigned clips)
{
    constexpr std::time_t betweenClips = 613;
    const std::time_t start = firstDay + static_cast<std::time_t>(tenYears * evenlySpread(7 * event + 3));
    const Folder folder(library.descriptor(), bench::numbered("Event", event + 1, 5).c_str());
    if (!folder.isOpen() || !folder.makeFile("CurrentVersion.mtrevent", start))
        return false;
    const Folder media(folder.descriptor(), "Original Media");
    for (unsigned index = 0; media.isOpen() && index < clips; ++index) {
        const std::time_t date = start + static_cast<std::time_t>(index) * betweenClips;
        if (!media.makeFile(clipName(firstClip + index, date).c_str(), date))
            return false;
    }
    return media.isOpen();
}

bool makeLibrary(const files::path& movies, unsigned count)
{
    if (!bench::makeFolder(movies))
        return false;
    const Folder library(AT_FDCWD, (movies / "Montaro Events").c_str());
    unsigned made = 0;
    for (unsigned event = 0; library.isOpen() && made < count; ++event) {
        const unsigned clips = std::min(clipsOfEvent(event), count - made);
        if (!makeEvent(library, event, made, clips))
            return false;
        made += clips;
    }
    return library.isOpen();
}

} // namespace

int main(int argc, char** argv)
{
    return bench::makeMeasuredMachine({ "make_clips", "clips 1", makeLibrary }, argc, argv);
}
