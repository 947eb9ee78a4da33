#include "tests/house/Layering.h"

#include <algorithm>

namespace house {

namespace {

    using Names = std::vector<std::string_view>;

    // What the files of one folder may include beside their own folder's headers and the standard library.
    struct Layer {
        std::string_view folder;
        Names headers; // "folder" itself, "folder/" with all below it, "folder/Name*" by its beginning, or one header
        Names libraries; // how the name of a library's header begins
        bool systemHeaders;
        std::string_view rule;
    };

    // The orderings extend the framework's group, so their header is the one that plug-in topics share.
    constexpr std::string_view orderings = "plugin/events/MontaroSupport.h";

    // What the host offers to programs and plug-ins from outside; its other headers are its own.
    constexpr std::string_view publicHost = "host/OB*";

    // The first folder that a path lies in rules it, so inner folders stand before outer ones.
    const std::vector<Layer>& layers()
    {
        static const std::vector<Layer> table {
            { "platform/formats", { "platform" }, { "expat.h", "rapidjson/", "utf8proc.h" }, false,
                "platform/formats knows roles, the standard library and its one library a format" },
            { "platform/common", { "platform", "platform/formats" }, {}, false,
                "platform/common knows roles, formats and the standard library" },
            { "platform/linux/watching", { "platform", "platform/linux" }, {}, true,
                "the watching of this machine knows roles and the system" },
            { "platform/linux",
                { "platform", "platform/formats", "platform/common", "platform/linux/watching/LinuxPathWatching.h" },
                {}, true, "platform/linux knows roles, formats and the system, and no other machine" },
            { "platform/described", { "platform", "platform/formats", "platform/common" }, {}, false,
                "platform/described knows roles, formats and the standard library, and no other machine" },
            { "platform", {}, {}, false, "a role knows the standard library and other roles only" },
            { "host", { "platform" }, {}, false, "host knows roles and the standard library only" },
            { "plugin/projects", { "plugin", "host", "platform", orderings }, {}, false,
                "a topic of the plug-in knows plugin/, host/ and roles, and no other topic's header" },
            { "plugin/events", { "plugin", "host", "platform" }, {}, false,
                "a topic of the plug-in knows plugin/, host/ and roles, and no other topic's header" },
            { "plugin/watching", { "plugin", "host", "platform", orderings }, {}, false,
                "a topic of the plug-in knows plugin/, host/ and roles, and no other topic's header" },
            { "plugin/ui", { "plugin", "host", "platform", orderings }, {}, false,
                "a topic of the plug-in knows plugin/, host/ and roles, and no other topic's header" },
            { "plugin", { "host", "platform", orderings }, {}, false,
                "plugin knows host/ and roles, and no topic's header" },
            { "apps/common",
                { "host", "platform", "platform/linux", "platform/described", "platform/common", "platform/formats" },
                {}, true, "apps/common knows host/, roles and the machines it chooses from" },
            { "apps/browser", { "host", "platform", "apps/common" }, { "Q" }, false,
                "the window knows host/, roles, apps/common and its toolkit" },
            { "apps/clipboard", { "platform", "apps/common" }, { "Q" }, true,
                "the clipboard's program knows roles, apps/common, its toolkit and the system" },
            { "apps", { "host", "platform", "apps/common" }, {}, false,
                "a program knows host/, roles and apps/common; machines and the system lie behind them" },
            { "examples/folders", { publicHost, "platform" }, {}, false,
                "an example of a source knows what a plug-in from outside does: the host's public headers and roles" },
            { "examples", { publicHost, "platform", "platform/linux", "platform/described" }, {}, true,
                "an example knows what an application from outside does: the host's public headers, roles and the "
                "machine" },
            { "tests/platform/linux/watching", { "platform/", "tests/support", "tests/platform/linux" }, { "doctest/" },
                true, "a test knows public headers and tests/support" },
            { "tests",
                { "platform/", "host", "plugin", orderings, "apps/", "tests/support", "tests/support/simulated",
                    "tests/plugin/support" },
                { "doctest/" }, true, "a test knows public headers and tests/support" },
            { "bench", { "platform/", "host", "plugin", "apps/common" }, {}, true, "a benchmark knows public headers" },
            { "fuzz", { "platform/", "host", "plugin" }, {}, true, "a fuzz target knows public headers" },
        };
        return table;
    }

    std::string_view folderOf(std::string_view path)
    {
        const std::size_t slash = path.rfind('/');
        return slash == std::string_view::npos ? std::string_view() : path.substr(0, slash);
    }

    bool liesBelow(std::string_view path, std::string_view folder)
    {
        return path.size() > folder.size() && path.starts_with(folder) && path[folder.size()] == '/';
    }

    const Layer* layerOf(std::string_view path)
    {
        const auto found = std::find_if(
            layers().begin(), layers().end(), [path](const Layer& layer) { return liesBelow(path, layer.folder); });
        return found == layers().end() ? nullptr : &*found;
    }

    bool mayIncludeHeader(const Layer& layer, std::string_view path, std::string_view header)
    {
        if (folderOf(header) == folderOf(path))
            return true;
        return std::any_of(layer.headers.begin(), layer.headers.end(), [header](std::string_view allowed) {
            if (allowed.ends_with('*'))
                return header.starts_with(allowed.substr(0, allowed.size() - 1));
            return allowed.ends_with('/') ? header.starts_with(allowed)
                                          : header == allowed || folderOf(header) == allowed;
        });
    }

    // The standard library's headers are the only ones without an extension or a folder.
    bool isStandard(std::string_view header)
    {
        return std::all_of(header.begin(), header.end(),
            [](char c) { return (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9') || c == '_'; });
    }

    bool mayIncludeLibrary(const Layer& layer, std::string_view header)
    {
        return layer.systemHeaders || isStandard(header)
            || std::any_of(layer.libraries.begin(), layer.libraries.end(),
                [header](std::string_view library) { return header.starts_with(library); });
    }

    // The include in this line, if it holds one; its line number is left to the caller.
    std::optional<Include> includeIn(std::string_view line)
    {
        const auto skipBlanks = [&line] { line.remove_prefix(std::min(line.find_first_not_of(" \t"), line.size())); };
        skipBlanks();
        if (!line.starts_with('#'))
            return std::nullopt;
        line.remove_prefix(1);
        skipBlanks();
        constexpr std::string_view keyword = "include";
        if (!line.starts_with(keyword))
            return std::nullopt;
        line.remove_prefix(keyword.size());
        skipBlanks();
        if (line.empty() || (line.front() != '"' && line.front() != '<'))
            return std::nullopt;
        const bool isQuoted = line.front() == '"';
        line.remove_prefix(1);
        return Include { std::string(line.substr(0, line.find(isQuoted ? '"' : '>'))), isQuoted, 0 };
    }

} // namespace

std::vector<Include> includesIn(std::string_view text)
{
    std::vector<Include> includes;
    std::size_t number = 0;
    while (!text.empty()) {
        const std::size_t end = std::min(text.find('\n'), text.size());
        ++number;
        if (std::optional<Include> include = includeIn(text.substr(0, end))) {
            include->line = number;
            includes.push_back(*std::move(include));
        }
        text.remove_prefix(std::min(end + 1, text.size()));
    }
    return includes;
}

std::optional<std::string> brokenRule(std::string_view path, const Include& include)
{
    const Layer* layer = layerOf(path);
    if (!layer)
        return std::nullopt;
    if (include.isQuoted && folderOf(include.name).empty())
        return "a header of this tree is named by its path from the root";
    const bool mayStand
        = include.isQuoted ? mayIncludeHeader(*layer, path, include.name) : mayIncludeLibrary(*layer, include.name);
    return mayStand ? std::nullopt : std::optional(std::string(layer->rule));
}

} // namespace house
