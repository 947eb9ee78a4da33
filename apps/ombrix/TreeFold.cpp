#include "apps/ombrix/TreeFold.h"

#include <algorithm>

namespace ombrix {
namespace {

    class Folding {
    public:
        explicit Folding(const std::vector<TreeNode>& nodes)
            : _nodes(nodes)
        {
        }

        /// Adds the line of a node and, in at most `room` lines, what is below it.
        void addNode(std::size_t node, std::size_t room, bool isLast)
        {
            const bool isFolded = _nodes[node].children > 0 && room == 0;
            _lines.push_back({ node, 0, 0, isFolded, isLast });
            if (_nodes[node].children > 0 && room > 0)
                addChildren(node, room);
        }

        std::vector<TreeLine> lines() { return std::move(_lines); }

    private:
        std::size_t below(std::size_t node) const { return _nodes[node].end - node - 1; }

        std::vector<std::size_t> childrenOf(std::size_t node, std::size_t most) const
        {
            std::vector<std::size_t> children;
            for (std::size_t child = node + 1; child < _nodes[node].end && children.size() < most;
                 child = _nodes[child].end)
                children.push_back(child);
            return children;
        }

        std::size_t lastChildOf(std::size_t node) const
        {
            std::size_t child = node + 1;
            while (_nodes[child].end < _nodes[node].end)
                child = _nodes[child].end;
            return child;
        }

        void addChildren(std::size_t node, std::size_t room)
        {
            const std::size_t count = _nodes[node].children;
            const bool hides = count > room;
            const bool keepsLast = node == 0 && hides && room >= 2;
            // One line tells what is hidden.
            const std::size_t shown = hides ? room - 1 - (keepsLast ? 1 : 0) : count;
            const std::vector<std::size_t> children = childrenOf(node, shown + 1);
            std::size_t left = room - std::min(room, count);
            std::size_t expandable = 0;
            for (std::size_t index = 0; index < shown; ++index)
                expandable += _nodes[children[index]].children > 0;
            for (std::size_t index = 0; index < shown; ++index) {
                std::size_t share = 0;
                if (_nodes[children[index]].children > 0)
                    share = shareOf(children[index], left, expandable--);
                left -= share;
                addNode(children[index], share, !hides && index + 1 == count);
            }
            if (hides)
                _lines.push_back({ node, count - shown - (keepsLast ? 1 : 0), children[shown], false, !keepsLast });
            if (keepsLast)
                addNode(lastChildOf(node), 0, true);
        }

        /// An equal share of the lines left; fewer where that is enough, none where it would only say "more".
        std::size_t shareOf(std::size_t node, std::size_t left, std::size_t expandable) const
        {
            const std::size_t share = std::min(below(node), left / expandable);
            return share < 2 && share < below(node) ? 0 : share;
        }

        const std::vector<TreeNode>& _nodes;
        std::vector<TreeLine> _lines;
    };

} // namespace

std::vector<TreeLine> unfoldedLines(const std::vector<TreeNode>& nodes)
{
    std::vector<TreeLine> lines;
    lines.reserve(nodes.size());
    for (std::size_t index = 0; index < nodes.size(); ++index)
        lines.push_back({ index, 0, 0, false, nodes[index].isLast });
    return lines;
}

std::vector<TreeLine> foldedLines(const std::vector<TreeNode>& nodes, std::size_t most)
{
    if (nodes.size() <= most)
        return unfoldedLines(nodes);
    Folding folding(nodes);
    folding.addNode(0, most > 1 ? most - 1 : 0, true);
    return folding.lines();
}

} // namespace ombrix
