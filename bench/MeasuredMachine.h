#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace bench {

/// `word`, a space, and `number` with zeros before it, up to so many digits.
std::string numbered(std::string_view word, unsigned number, unsigned digits);

/// Makes a folder and those above it; false when the disk refuses.
bool makeFolder(const std::filesystem::path& path);
/// Makes a file in a folder that is there; false when the disk refuses.
bool writeFile(const std::filesystem::path& path, std::string_view bytes);

/// One kind of library to measure on.
struct MeasuredLibrary {
    const char* program; ///< as messages name whoever makes it
    std::string_view version; ///< another text whenever the same count gives another library
    bool (*make)(const std::filesystem::path& movies, unsigned count); ///< fills the folder Movies of a home folder
};

/// The whole of a program that is called with FOLDER and COUNT: makes a machine with the library on it, unless FOLDER
/// holds just that already. FOLDER/machine.json describes the machine; FOLDER/home serves as HOME just as well, its
/// desktop entry names the editor. Answers the exit status.
int makeMeasuredMachine(const MeasuredLibrary& library, int argc, char** argv);

} // namespace bench
