#pragma once

#include "host/OBLoad.h"
#include "host/OBMediaGroup.h"
#include "platform/FileSystem.h"
#include "platform/Value.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace ombrix {

/// What a group is to a person.
enum class NodeKind { root, folder, project, eventLibrary, year, event, other };

NodeKind kindOf(const OBMediaGroup& group);
/// "project"
std::string_view kindText(NodeKind kind);
/// What a group of that kind holds: "movie" or "clip".
std::string_view mediaUnit(NodeKind kind);

/// What lies in a group and below it.
struct Totals {
    std::uint64_t projects = 0;
    std::uint64_t folders = 0; ///< below it, itself not counted
    std::uint64_t events = 0;
    std::uint64_t movies = 0; ///< of projects; representatives are none
    std::uint64_t clips = 0; ///< of events
    std::uint64_t bytes = 0;
    std::optional<platform::Date> oldest {};
    std::optional<platform::Date> newest {};

    void add(const Totals& other);
    void addMovie(const platform::ItemStatus& status, platform::Date date);
};

/// One group of a tree that was laid flat, depth first.
struct TreeNode {
    OBMediaGroupRef group;
    NodeKind kind = NodeKind::other;
    std::size_t depth = 0;
    std::size_t parent = 0; ///< its own index for the first node
    std::size_t end = 0; ///< one past the last node below it: those are [own index + 1, end)
    std::size_t children = 0;
    bool isLast = true; ///< among the children of its parent
    std::size_t unreadableFolders = 0; ///< of the root: folders that could not be read and that no group stands for
    bool isUnreadable = false; ///< its folder, or one that holds its movies, could not be read
    Totals totals {};
};

/// `root` and everything below it, with the sizes and dates of the movies, which one look at each of them tells.
std::vector<TreeNode> treeNodes(
    const OBMediaGroupRef& root, const platform::FileSystem& fileSystem, const std::vector<OBLoadProblem>& problems);

} // namespace ombrix
