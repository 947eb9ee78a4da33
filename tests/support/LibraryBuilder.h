#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace tests {

/// Fills the folder of one project or one event: the marker that makes it one is already there.
class BundleBuilder {
public:
    /// `movieFolder` is the name of the folder inside in which movies lie.
    BundleBuilder(std::string path, std::string movieFolder);

    const std::string& path() const noexcept { return _path; }
    std::string moviePath(std::string_view name) const;

    /// A real movie, two seconds long.
    BundleBuilder& movie(std::string_view name, double width = 1920, double height = 1080);
    /// A file among the movies that holds `bytes`, movie or not.
    BundleBuilder& movieWithBytes(std::string_view name, std::string_view bytes);
    /// A movie of which the second half is missing, header included.
    BundleBuilder& damagedMovie(std::string_view name);
    BundleBuilder& movieLink(std::string_view name, const std::string& target);
    /// A folder among the movies.
    BundleBuilder& movieSubfolder(std::string_view name);
    /// Lists names that file managers do not show, among the movies.
    BundleBuilder& hiddenMovies(const std::vector<std::string>& names);
    BundleBuilder& file(std::string_view relativePath, std::string_view bytes = {});

private:
    std::string _path;
    std::string _movieFolder;
};

/// Makes a library of projects or events on disk, in the folder that it is given.
class LibraryBuilder {
public:
    explicit LibraryBuilder(std::string path);

    const std::string& path() const noexcept { return _path; }
    std::string path(std::string_view relativePath) const;

    BundleBuilder project(std::string_view relativePath);
    BundleBuilder event(std::string_view relativePath);
    LibraryBuilder& folder(std::string_view relativePath);
    LibraryBuilder& file(std::string_view relativePath, std::string_view bytes = {});
    LibraryBuilder& link(std::string_view relativePath, const std::string& target);
    /// Lists names that file managers do not show in the folder at `relativePath`; empty for the library itself.
    LibraryBuilder& hiddenNames(std::string_view relativePath, const std::vector<std::string>& names);

private:
    std::string _path;
};

/// The text of a list of names that file managers do not show.
std::string hiddenNamesText(const std::vector<std::string>& names);

} // namespace tests
