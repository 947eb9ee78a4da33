#pragma once

#include "apps/ombrix/TreeDifferences.h"
#include "platform/FileSystem.h"

#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace ombrix {

/// What is known of the source that was followed, beside its tree.
struct FollowedSource {
    std::vector<std::string> projectFolders {}; ///< that it searches
    std::vector<std::string> eventFolders {};
    std::vector<std::string> watchedPaths {};
    bool hasOrderChanged = false; ///< the editor's user chose another order since its tree was scanned
    /// What was seen of a movie when it was found; absent where nothing was.
    std::function<std::optional<platform::FileFacts>(const std::string& path)> seenFacts {};
};

/// Tells which differences a followed tree cannot but have, and why. The one place that knows them.
class VerifyExceptions {
public:
    /// All outlive this object. `files` is asked about places at which the trees differ.
    VerifyExceptions(const FollowedSource& source, const platform::FileSystem& files, const ComparedTrees& trees);

    /// Why a difference is none; absent for one that is a fault. Those of the order of movies are asked last.
    std::optional<std::string> reasonFor(const TreeDifference& difference);

private:
    struct Place {
        const TreeDocument& tree;
        std::size_t group;
    };

    std::optional<std::string> reasonForGroup(const Place& place, bool isFresh);
    std::optional<std::string> reasonForContent(const Place& place);
    std::optional<std::string> reasonForObject(const TreeDifference& difference);
    std::optional<std::string> reasonForChange(const TreeDifference& difference);
    std::optional<std::string> reasonForOrder(const TreeDifference& difference);
    std::optional<std::string> reasonForPath(const std::string& path);
    std::optional<std::string> reasonForMove(const Place& place);
    std::optional<std::string> reasonForRewriting(std::size_t followedGroup);
    bool isFollowed(const std::string& path, const std::string& folder) const;
    bool isBehindLink(const std::string& path, const std::string& folder) const;
    bool wasRewritten(std::string_view object);
    const std::vector<std::string_view>& freshObjectsBeside(const std::string& path);
    bool isOrderOfEquals(const TreeDifference& difference) const;
    const std::vector<std::size_t>& groupsCalled(const TreeDocument& tree, std::string_view identifier);

    const FollowedSource& _source;
    const platform::FileSystem& _files;
    const ComparedTrees& _trees;
    std::optional<std::string> _reasonOfGroupOrder {}; ///< that the objects of the root follow
    std::map<const TreeDocument*, std::unordered_map<std::string_view, std::vector<std::size_t>>> _byIdentifier {};
};

} // namespace ombrix
