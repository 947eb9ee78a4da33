#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace platform {

// Paths as text: nothing here asks the file system. Slashes at the end of a path mean nothing, except that "/" is one.

/// `path` without the slashes at its end; "/" stays.
constexpr std::string_view pathWithoutTrailingSlashes(std::string_view path) noexcept
{
    while (path.size() > 1 && path.back() == '/')
        path.remove_suffix(1);
    return path;
}

/// The name at the end of `path`; "/" for the root, empty for the empty path.
constexpr std::string_view lastPathComponent(std::string_view path) noexcept
{
    path = pathWithoutTrailingSlashes(path);
    const std::size_t slash = path.rfind('/');
    return slash == std::string_view::npos || path.size() == 1 ? path : path.substr(slash + 1);
}

/// The folder that holds `path`: "/" for the root and what lies directly in it, empty for a bare name.
constexpr std::string_view pathByRemovingLastComponent(std::string_view path) noexcept
{
    path = pathWithoutTrailingSlashes(path);
    const std::size_t slash = path.rfind('/');
    if (slash == std::string_view::npos)
        return {};
    return pathWithoutTrailingSlashes(path.substr(0, slash == 0 ? 1 : slash));
}

/// `name` inside `folder`, one slash between the two; the other one where one of them is empty.
inline std::string pathJoined(std::string_view folder, std::string_view name)
{
    std::string joined;
    joined.reserve(folder.size() + name.size() + 1);
    joined.append(folder);
    if (!folder.empty() && !name.empty() && folder.back() != '/')
        joined.push_back('/');
    joined.append(name);
    return joined;
}

/// Whether `path` is `folder` or lies below it, by whole components: "/a/bc" is not below "/a/b".
constexpr bool isSameOrBelow(std::string_view path, std::string_view folder) noexcept
{
    folder = pathWithoutTrailingSlashes(folder);
    if (folder == "/")
        return !path.empty() && path.front() == '/';
    return path.size() >= folder.size() && path.substr(0, folder.size()) == folder
        && (path.size() == folder.size() || path[folder.size()] == '/');
}

/// What `path` says below `folder`, without a slash at its start; empty for `folder` itself, and where `path` does not
/// lie below it.
constexpr std::string_view pathRelativeTo(std::string_view path, std::string_view folder) noexcept
{
    if (!isSameOrBelow(path, folder))
        return {};
    path.remove_prefix(pathWithoutTrailingSlashes(folder).size());
    while (!path.empty() && path.front() == '/')
        path.remove_prefix(1);
    return path;
}

/// Where the full stop stands that begins the extension of `name`; npos when it has none, which is so when its only
/// full stop stands first or last.
constexpr std::size_t extensionStart(std::string_view name) noexcept
{
    const std::size_t last = name.rfind('.');
    const bool isOnlyOne = last == name.find('.');
    if (last == std::string_view::npos || (isOnlyOne && (last == 0 || last + 1 == name.size())))
        return std::string_view::npos;
    return last;
}

/// The text after the last full stop of `name`; empty when it has no extension, or an empty one.
constexpr std::string_view extensionOfName(std::string_view name) noexcept
{
    const std::size_t start = extensionStart(name);
    return start == std::string_view::npos ? std::string_view() : name.substr(start + 1);
}

/// `name` without its extension and the full stop before it.
constexpr std::string_view nameWithoutExtension(std::string_view name) noexcept
{
    return name.substr(0, extensionStart(name));
}

} // namespace platform
