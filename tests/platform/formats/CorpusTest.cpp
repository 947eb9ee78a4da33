#include "platform/formats/DesktopEntry.h"
#include "platform/formats/Manifest.h"
#include "platform/formats/MovieHeader.h"
#include "platform/formats/PropertyList.h"

#include "tests/platform/formats/MemoryFile.h"

#include <doctest/doctest.h>

#include <filesystem>
#include <fstream>
#include <iterator>

using namespace platform;

namespace {

/// Calls `read` with the content of each file of a corpus; answers how many there are.
template <typename Read> int replay(const std::string& name, Read read)
{
    int count = 0;
    for (const auto& entry : std::filesystem::directory_iterator(std::string(CORPUS_FOLDER) + "/" + name)) {
        CAPTURE(entry.path().string());
        std::ifstream file(entry.path(), std::ios::binary);
        read(std::string(std::istreambuf_iterator<char>(file), {}));
        ++count;
    }
    return count;
}

bool isOneLine(const std::string& problem)
{
    return problem.find('\n') == std::string::npos;
}

} // namespace

TEST_CASE("every movie header of the corpus is read or refused")
{
    int read = 0;
    CHECK(replay("movie-header", [&](const std::string& bytes) { read += readMovieHeader(MemoryFile(bytes)) ? 1 : 0; })
        >= 4);
    CHECK(read >= 3);
}

TEST_CASE("every property list of the corpus is read, and written and read again, or refused with one line")
{
    int read = 0;
    const auto readTwice = [&](const std::string& bytes) {
        const PropertyListResult result = readPropertyList(bytes);
        CHECK(isOneLine(result.problem));
        if (!result.problem.empty())
            return;
        ++read;
        CHECK(readPropertyList(writeXmlPropertyList(result.value)).problem == "");
    };
    CHECK(replay("property-list-xml", readTwice) >= 3);
    CHECK(replay("property-list-binary", readTwice) >= 3);
    CHECK(read >= 5);
}

TEST_CASE("every manifest of the corpus is read or refused with one line")
{
    int read = 0;
    CHECK(replay("manifest", [&](const std::string& bytes) {
        const ManifestAnswer answer = readManifest(bytes);
        CHECK(isOneLine(answer.problem));
        read += answer.problem.empty() ? 1 : 0;
    }) >= 2);
    CHECK(read >= 1);
}

TEST_CASE("every desktop entry of the corpus is read or refused with one line")
{
    int read = 0;
    CHECK(replay("desktop-entry", [&](const std::string& bytes) {
        const DesktopEntryResult result = readDesktopEntry(bytes);
        CHECK(isOneLine(result.problem));
        splitExec(result.entry.exec);
        read += result.problem.empty() ? 1 : 0;
    }) >= 2);
    CHECK(read >= 1);
}
