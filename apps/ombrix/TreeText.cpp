#include "apps/ombrix/TreeText.h"

#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/TextLine.h"
#include "apps/ombrix/TreeFacts.h"

#include <algorithm>

namespace ombrix {
namespace {

    constexpr int gap = 3;
    constexpr int widestNameInPipe = 60;
    constexpr int leastNameWidth = 16;
    constexpr int columnsOfLevel = 3;

    /// How wide the columns are. A width of 0 stands for a column that is not there.
    struct Columns {
        int name = 0;
        int count = 0;
        int unit = 0;
        int size = 0;
        int date = 0;

        int countStart() const { return name + gap; }
        int countWidth() const { return count > 0 ? count + 1 + unit : 0; }
        int sizeStart() const { return countStart() + (countWidth() > 0 ? countWidth() + gap : 0); }
        int dateStart() const { return sizeStart() + (size > 0 ? size + gap : 0); }
        int noteStart() const { return dateStart() + (date > 0 ? date + gap : 0); }
        int factsWidth() const { return dateStart() + date - name; }
    };

    class TreePrinter {
    public:
        TreePrinter(
            const std::vector<TreeNode>& nodes, const std::vector<TreeLine>& lines, const TreeTextWishes& wishes)
            : _nodes(nodes)
            , _lines(lines)
            , _wishes(wishes)
        {
        }

        void print(const std::function<void(std::string_view)>& print)
        {
            measure();
            _hasMoreBelow.clear();
            for (const TreeLine& line : _lines)
                print(textOf(line));
        }

    private:
        std::size_t depthOf(const TreeLine& line) const { return _nodes[line.node].depth + (line.hidden > 0 ? 1 : 0); }

        std::string nameOf(const TreeNode& node) const
        {
            platform::Text name = node.group->name();
            if (name.empty())
                name = node.group->ID();
            return _wishes.style.name(name);
        }

        std::string labelOf(const TreeLine& line) const
        {
            return line.hidden > 0 ? moreText(_nodes, line) : nameOf(_nodes[line.node]);
        }

        void measure()
        {
            for (const TreeLine& line : _lines) {
                const int label = prefixWidth(line) + apps::displayWidth(labelOf(line));
                const bool isFirst = line.node == 0 && line.hidden == 0;
                if (!isFirst || _lines.size() == 1)
                    _columns.name = std::max(_columns.name, label);
                if (line.hidden > 0)
                    continue;
                const NodeFacts facts = factsOf(_nodes, line, _wishes.now);
                _columns.count = std::max(_columns.count, apps::displayWidth(facts.count));
                _columns.unit = std::max(_columns.unit, apps::displayWidth(facts.unit));
                _columns.size = std::max(_columns.size, apps::displayWidth(facts.size));
                _columns.date = std::max(_columns.date, apps::displayWidth(facts.date));
            }
            if (!_wishes.columns) {
                _columns.name = std::min(_columns.name, widestNameInPipe);
                return;
            }
            // Where it gets tight the size goes first: counts and dates tell groups apart.
            if (*_wishes.columns - _columns.factsWidth() < leastNameWidth)
                _columns.size = 0;
            if (*_wishes.columns - _columns.factsWidth() < leastNameWidth)
                _columns.date = 0;
            _columns.name = std::min(_columns.name, std::max(leastNameWidth, *_wishes.columns - _columns.factsWidth()));
        }

        int mostPrefixColumns() const { return _wishes.columns ? std::max(9, *_wishes.columns / 3) : 1 << 30; }

        int prefixWidth(const TreeLine& line) const
        {
            return std::min(static_cast<int>(depthOf(line)) * columnsOfLevel, mostPrefixColumns());
        }

        /// The boxes left of a name; of a line too deep for the terminal only the last ones.
        std::string prefixOf(const TreeLine& line)
        {
            const std::size_t depth = depthOf(line);
            _hasMoreBelow.resize(depth + 1);
            _hasMoreBelow[depth] = !line.isLast;
            if (depth == 0)
                return {};
            std::string prefix;
            const auto most = static_cast<std::size_t>(mostPrefixColumns());
            std::size_t level = 1;
            if (depth * columnsOfLevel > most) {
                level = depth - (most - 1) / columnsOfLevel + 1;
                prefix = "…" + std::string(most - 1 - (depth - level + 1) * columnsOfLevel, ' ');
            }
            for (; level < depth; ++level)
                prefix += _hasMoreBelow[level] ? "│  " : "   ";
            return prefix + (line.isLast ? "└─ " : "├─ ");
        }

        std::string textOf(const TreeLine& line)
        {
            const std::string prefix = prefixOf(line);
            TextLine text(_wishes.style, _wishes.columns);
            text.addBehind(prefix, TextLine::Look::dim);
            std::string label = labelOf(line);
            if (_wishes.columns)
                label = apps::cutInMiddle(label, std::max(leastNameWidth / 2, _columns.name - prefixWidth(line)));
            if (line.hidden > 0) {
                text.addBehind(label, TextLine::Look::dim);
                text.addWhole(_columns.dateStart(), _wishes.unfoldingCommand(_nodes[line.node].group));
                return text.text();
            }
            const TreeNode& node = _nodes[line.node];
            const platform::Text path = node.group->path();
            const bool isLink = _wishes.style.hasLinks() && path;
            text.addBehind(label, TextLine::Look::bold, isLink ? _wishes.linkTarget(path) : std::string());
            addFacts(text, line);
            return text.text();
        }

        void addFacts(TextLine& text, const TreeLine& line) const
        {
            const TreeNode& node = _nodes[line.node];
            const NodeFacts facts = factsOf(_nodes, line, _wishes.now);
            if (node.isUnreadable) {
                text.add(_columns.countStart(), "unreadable", TextLine::Look::warning);
            } else if (!facts.count.empty()) {
                const std::string count = apps::paddedBefore(facts.count, _columns.count);
                addAligned(text, _columns.countStart(), _columns.countWidth(), count + " " + facts.unit, false);
                if (_columns.size > 0)
                    addAligned(text, _columns.sizeStart(), _columns.size, facts.size, true);
                if (_columns.date > 0)
                    addAligned(text, _columns.dateStart(), _columns.date, facts.date, true);
            } else if (const platform::Text message = _wishes.emptyMessage(node.group); !message.empty()) {
                text.add(_columns.countStart(), _wishes.style.name(message), TextLine::Look::dim);
                return;
            } else {
                addSummary(text, line, facts.summary);
            }
            text.add(_columns.noteStart(), _wishes.style.name(facts.note), TextLine::Look::dim);
        }

        /// In the first column from the right that leaves it whole, so that summaries line up as far as they can.
        void addSummary(TextLine& text, const TreeLine& line, const std::string& summary) const
        {
            if (line.node == 0) {
                text.addWhole(_columns.dateStart(), summary);
                return;
            }
            const int width = apps::displayWidth(summary);
            for (const int start : { _columns.dateStart(), _columns.sizeStart(), _columns.countStart() }) {
                if (!_wishes.columns || start + width <= *_wishes.columns || start == _columns.countStart()) {
                    text.add(start, summary, TextLine::Look::dim);
                    return;
                }
            }
        }

        static void addAligned(TextLine& text, int start, int width, const std::string& fact, bool isRight)
        {
            const std::size_t blanks = std::min(fact.find_first_not_of(' '), fact.size());
            const int column = isRight ? start + width - apps::displayWidth(fact) : start + static_cast<int>(blanks);
            text.add(column, std::string_view(fact).substr(blanks), TextLine::Look::dim);
        }

        const std::vector<TreeNode>& _nodes;
        const std::vector<TreeLine>& _lines;
        const TreeTextWishes& _wishes;
        Columns _columns;
        std::vector<bool> _hasMoreBelow;
    };

} // namespace

void printTreeText(const std::vector<TreeNode>& nodes, const std::vector<TreeLine>& lines, const TreeTextWishes& wishes,
    const std::function<void(std::string_view)>& print)
{
    TreePrinter(nodes, lines, wishes).print(print);
}

} // namespace ombrix
