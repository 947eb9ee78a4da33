#include "bench/MovieBoxes.h"

#include <array>
#include <charconv>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>

// Makes a large library to measure on: COUNT projects with three movies each, a hundred projects a folder and ten such
// folders on a shelf. The same COUNT gives the same names and bytes everywhere, so figures can be compared.
//
// FOLDER/machine.json describes the machine; FOLDER/home serves as HOME just as well, its desktop entry names the
// editor.

namespace {

namespace files = std::filesystem;

constexpr unsigned projectsInBox = 100;
constexpr unsigned boxesOnShelf = 10;
constexpr std::string_view stampName = "made.txt";

struct MovieKind {
    std::string_view ending;
    std::string bytes;
};

std::string numbered(std::string_view word, unsigned number, unsigned digits)
{
    std::string text = std::to_string(number);
    if (text.size() < digits)
        text.insert(0, digits - text.size(), '0');
    return std::string(word) + " " + text;
}

bool writeFile(const files::path& path, std::string_view bytes)
{
    std::ofstream stream(path, std::ios::binary | std::ios::trunc);
    stream.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    stream.close();
    return stream.good();
}

bool makeFolder(const files::path& path)
{
    std::error_code error;
    files::create_directories(path, error);
    return !error;
}

bool makeProject(const files::path& box, unsigned number, const std::array<MovieKind, 3>& kinds)
{
    const std::string name = numbered("Trip", number, 5);
    const files::path project = box / name;
    if (!makeFolder(project / "Shared Items") || !writeFile(project / "CurrentVersion.mtrproject", "made to measure\n"))
        return false;
    for (const MovieKind& kind : kinds) {
        if (!writeFile(project / "Shared Items" / (name + std::string(kind.ending)), kind.bytes))
            return false;
    }
    return true;
}

bool makeLibrary(const files::path& library, unsigned count)
{
    const std::array<MovieKind, 3> kinds { {
        { " - Mobile.m4v", bench::smallMovie("M4V ", 640, 360, 61, false) },
        { " - Large.mov", bench::smallMovie("qt  ", 1920, 1080, 61, true) },
        { " - Medium.mp4", bench::smallMovie("isom", 1280, 720, 61, false) },
    } };
    if (!makeFolder(library))
        return false;
    for (unsigned number = 0; number < count; ++number) {
        const unsigned box = number / projectsInBox;
        const files::path folder = library / numbered("Shelf", box / boxesOnShelf + 1, 3) / numbered("Box", box + 1, 4);
        if (!makeProject(folder, number + 1, kinds))
            return false;
    }
    return true;
}

bool makeMachine(const files::path& folder)
{
    const files::path editor = folder / "editor" / "montaro";
    const files::path entries = folder / "home" / ".local" / "share" / "applications";
    if (!makeFolder(editor.parent_path()) || !makeFolder(entries) || !writeFile(editor, "#!/bin/sh\n"))
        return false;
    std::error_code error;
    files::permissions(editor, files::perms::owner_exec, files::perm_options::add, error);
    const std::string entry = "[Desktop Entry]\nType=Application\nName=Montaro\nExec=\"" + editor.string() + "\"\n";
    constexpr std::string_view machine
        = "{\n  \"home\": \"home\",\n  \"localVolumes\": [],\n  \"removableMedia\": [],\n"
          "  \"editor\": {\"path\": \"editor/montaro\"}\n}\n";
    return !error && writeFile(entries / "org.ombrix.Montaro.desktop", entry)
        && writeFile(folder / "machine.json", machine);
}

std::string readFile(const files::path& path)
{
    std::ifstream stream(path, std::ios::binary);
    return { std::istreambuf_iterator<char>(stream), std::istreambuf_iterator<char>() };
}

std::optional<unsigned> countFrom(std::string_view text)
{
    unsigned count = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), count);
    if (error != std::errc() || end != text.data() + text.size())
        return std::nullopt;
    return count;
}

int make(const files::path& folder, unsigned count)
{
    const std::string stamp = "1 " + std::to_string(count) + "\n";
    const std::string found = readFile(folder / stampName);
    if (found == stamp)
        return 0;
    if (!found.empty()) {
        std::fprintf(stderr, "make_projects: %s: holds another library, remove it first\n", folder.c_str());
        return 1;
    }
    if (!makeMachine(folder) || !makeLibrary(folder / "home" / "Movies" / "Montaro Projects", count)
        || !writeFile(folder / stampName, stamp)) {
        std::fprintf(stderr, "make_projects: %s: cannot be written\n", folder.c_str());
        return 1;
    }
    return 0;
}

} // namespace

int main(int argc, char** argv)
{
    const std::optional<unsigned> count = argc == 3 ? countFrom(argv[2]) : std::nullopt;
    std::error_code error;
    const files::path folder = argc == 3 ? files::absolute(argv[1], error) : files::path();
    if (!count || error) {
        std::fprintf(stderr, "usage: make_projects FOLDER COUNT\n");
        return 2;
    }
    return make(folder, *count);
}
