#include "tests/support/LibraryBuilder.h"

#include "platform/PathText.h"
#include "tests/support/MovieWriter.h"
#include "tests/support/TemporaryFolder.h"

#include <utility>

namespace tests {

namespace {

    constexpr std::string_view projectMarker = "CurrentVersion.mtrproject";
    constexpr std::string_view projectMovieFolder = "Shared Items";
    constexpr std::string_view eventMarker = "CurrentVersion.mtrevent";
    constexpr std::string_view eventMovieFolder = "Original Media";

} // namespace

BundleBuilder::BundleBuilder(std::string path, std::string movieFolder)
    : _path(std::move(path))
    , _movieFolder(std::move(movieFolder))
{
}

std::string BundleBuilder::moviePath(std::string_view name) const
{
    return platform::pathJoined(platform::pathJoined(_path, _movieFolder), name);
}

BundleBuilder& BundleBuilder::movie(std::string_view name, double width, double height)
{
    return movieWithBytes(name, movieBytes(width, height));
}

BundleBuilder& BundleBuilder::movieWithBytes(std::string_view name, std::string_view bytes)
{
    writeFile(moviePath(name), bytes);
    return *this;
}

BundleBuilder& BundleBuilder::damagedMovie(std::string_view name)
{
    const std::string whole = movieBytes(1920, 1080);
    return movieWithBytes(name, std::string_view(whole).substr(0, whole.size() / 2));
}

BundleBuilder& BundleBuilder::movieLink(std::string_view name, const std::string& target)
{
    makeLink(moviePath(name), target);
    return *this;
}

BundleBuilder& BundleBuilder::movieSubfolder(std::string_view name)
{
    makeFolder(moviePath(name));
    return *this;
}

BundleBuilder& BundleBuilder::hiddenMovies(const std::vector<std::string>& names)
{
    return movieWithBytes(".hidden", hiddenNamesText(names));
}

BundleBuilder& BundleBuilder::file(std::string_view relativePath, std::string_view bytes)
{
    writeFile(platform::pathJoined(_path, relativePath), bytes);
    return *this;
}

LibraryBuilder::LibraryBuilder(std::string path)
    : _path(std::move(path))
{
    makeFolder(_path);
}

std::string LibraryBuilder::path(std::string_view relativePath) const
{
    return platform::pathJoined(_path, relativePath);
}

BundleBuilder LibraryBuilder::project(std::string_view relativePath)
{
    BundleBuilder project(path(relativePath), std::string(projectMovieFolder));
    project.file(projectMarker);
    return project;
}

BundleBuilder LibraryBuilder::event(std::string_view relativePath)
{
    BundleBuilder event(path(relativePath), std::string(eventMovieFolder));
    event.file(eventMarker);
    return event;
}

LibraryBuilder& LibraryBuilder::folder(std::string_view relativePath)
{
    makeFolder(path(relativePath));
    return *this;
}

LibraryBuilder& LibraryBuilder::file(std::string_view relativePath, std::string_view bytes)
{
    writeFile(path(relativePath), bytes);
    return *this;
}

LibraryBuilder& LibraryBuilder::link(std::string_view relativePath, const std::string& target)
{
    makeLink(path(relativePath), target);
    return *this;
}

LibraryBuilder& LibraryBuilder::hiddenNames(std::string_view relativePath, const std::vector<std::string>& names)
{
    writeFile(platform::pathJoined(path(relativePath), ".hidden"), hiddenNamesText(names));
    return *this;
}

std::string hiddenNamesText(const std::vector<std::string>& names)
{
    std::string text;
    for (const std::string& name : names)
        text.append(name).push_back('\n');
    return text;
}

} // namespace tests
