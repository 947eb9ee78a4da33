#include "apps/ombrix/Verification.h"

#include <algorithm>
#include <utility>

namespace ombrix {
namespace {

    void countInto(Verification& verification, const TreeDocument& tree)
    {
        verification.groups = tree.groups.size();
        for (const DocumentGroup& group : tree.groups)
            verification.movies += group.objects.size();
        verification.movies -= tree.groups.front().objects.size();
    }

} // namespace

Verification compareTrees(
    std::string followed, std::string fresh, const FollowedSource& source, const platform::FileSystem& files)
{
    Verification verification;
    std::optional<TreeDocument> followedTree = readTreeDocument(std::move(followed));
    std::optional<TreeDocument> freshTree = readTreeDocument(std::move(fresh));
    if (!followedTree || !freshTree) {
        verification.problem = "a tree was not printed whole";
        return verification;
    }
    sortAsSource(*followedTree);
    sortAsSource(*freshTree);
    countInto(verification, *followedTree);
    const ComparedTrees trees { *followedTree, *freshTree };
    std::vector<TreeDifference> differences = differencesOf(trees);
    // The order of the root's movies follows from that of the groups.
    std::stable_partition(differences.begin(), differences.end(), [](const TreeDifference& difference) {
        return difference.kind != TreeDifference::Kind::reordered || !difference.isOfObjects;
    });
    VerifyExceptions exceptions(source, files, trees);
    for (const TreeDifference& difference : differences) {
        const std::string text = textOf(difference, trees);
        if (const std::optional<std::string> reason = exceptions.reasonFor(difference))
            verification.notes.push_back(text + ": " + *reason);
        else
            verification.differences.push_back(text);
    }
    return verification;
}

} // namespace ombrix
