#include "bench/MeasuredMachine.h"

#include <charconv>
#include <cstdio>
#include <fstream>
#include <iterator>
#include <optional>
#include <system_error>

// The stamp is written last, so that a machine that was made in part is made again and not measured.

namespace bench {

namespace {

    namespace files = std::filesystem;

    constexpr std::string_view stampName = "made.txt";

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

    int makeOnce(const MeasuredLibrary& library, const files::path& folder, unsigned count)
    {
        const std::string stamp = std::string(library.version) + " " + std::to_string(count) + "\n";
        const std::string found = readFile(folder / stampName);
        if (found == stamp)
            return 0;
        if (!found.empty()) {
            std::fprintf(stderr, "%s: %s: holds another library, remove it first\n", library.program, folder.c_str());
            return 1;
        }
        if (!makeMachine(folder) || !library.make(folder / "home" / "Movies", count)
            || !writeFile(folder / stampName, stamp)) {
            std::fprintf(stderr, "%s: %s: cannot be written\n", library.program, folder.c_str());
            return 1;
        }
        return 0;
    }

} // namespace

std::string numbered(std::string_view word, unsigned number, unsigned digits)
{
    std::string text = std::to_string(number);
    if (text.size() < digits)
        text.insert(0, digits - text.size(), '0');
    return std::string(word) + " " + text;
}

bool makeFolder(const files::path& path)
{
    std::error_code error;
    files::create_directories(path, error);
    return !error;
}

bool writeFile(const files::path& path, std::string_view bytes)
{
    std::ofstream stream(path, std::ios::binary | std::ios::trunc);
    stream.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    stream.close();
    return stream.good();
}

int makeMeasuredMachine(const MeasuredLibrary& library, int argc, char** argv)
{
    const std::optional<unsigned> count = argc == 3 ? countFrom(argv[2]) : std::nullopt;
    std::error_code error;
    const files::path folder = argc == 3 ? files::absolute(argv[1], error) : files::path();
    if (!count || error) {
        std::fprintf(stderr, "usage: %s FOLDER COUNT\n", library.program);
        return 2;
    }
    return makeOnce(library, folder, *count);
}

} // namespace bench
