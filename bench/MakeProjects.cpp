#include "bench/MeasuredMachine.h"
#include "bench/MovieBoxes.h"

#include <array>
#include <filesystem>
#include <string>
#include <string_view>

// Makes a large library to measure on: COUNT projects with three movies each, a hundred projects a folder and ten such
// folders on a shelf. The same COUNT gives the same names and bytes everywhere, so figures can be compared.

namespace {

namespace files = std::filesystem;

constexpr unsigned projectsInBox = 100;
constexpr unsigned boxesOnShelf = 10;

struct MovieKind {
    std::string_view ending;
    std::string bytes;
};

bool makeProject(const files::path& box, unsigned number, const std::array<MovieKind, 3>& kinds)
{
    const std::string name = bench::numbered("Trip", number, 5);
    const files::path project = box / name;
    if (!bench::makeFolder(project / "Shared Items")
        || !bench::writeFile(project / "CurrentVersion.mtrproject", "made to measure\n"))
        return false;
    for (const MovieKind& kind : kinds) {
        if (!bench::writeFile(project / "Shared Items" / (name + std::string(kind.ending)), kind.bytes))
            return false;
    }
    return true;
}

bool makeLibrary(const files::path& movies, unsigned count)
{
    const files::path library = movies / "Montaro Projects";
    const std::array<MovieKind, 3> kinds { {
        { " - Mobile.m4v", bench::smallMovie("M4V ", 640, 360, 61, false) },
        { " - Large.mov", bench::smallMovie("qt  ", 1920, 1080, 61, true) },
        { " - Medium.mp4", bench::smallMovie("isom", 1280, 720, 61, false) },
    } };
    if (!bench::makeFolder(library))
        return false;
    for (unsigned number = 0; number < count; ++number) {
        const unsigned box = number / projectsInBox;
        const files::path folder
            = library / bench::numbered("Shelf", box / boxesOnShelf + 1, 3) / bench::numbered("Box", box + 1, 4);
        if (!makeProject(folder, number + 1, kinds))
            return false;
    }
    return true;
}

} // namespace

int main(int argc, char** argv)
{
    return bench::makeMeasuredMachine({ "make_projects", "1", makeLibrary }, argc, argv);
}
