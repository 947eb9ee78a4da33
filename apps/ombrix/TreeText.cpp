#include "apps/ombrix/TreeText.h"

#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/TextLine.h"
#include "apps/ombrix/TreeFacts.h"

#include <algorithm>

namespace ombrix {
namespace {

    constexpr int gap = 3;
    constexpr int leastNameWidth = 16; // with the boxes before it
    constexpr int leastWithoutBoxes = 8;
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

        std::size_t print(const std::function<void(std::string_view)>& print)
        {
            measure();
            _hasMoreBelow.clear();
            std::size_t height = 0;
            for (const TreeLine& line : _lines) {
                const TextLine text = textOf(line);
                print(text.text());
                height += text.height();
            }
            return height;
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
            return line.hidden > 0 ? moreText(line) : nameOf(_nodes[line.node]);
        }

        void measure()
        {
            int leastName = leastNameWidth;
            int widestSummary = 0;
            for (const TreeLine& line : _lines) {
                const int boxes = prefixWidth(line);
                const int label = boxes + apps::displayWidth(labelOf(line));
                const bool isFirst = line.node == 0 && line.hidden == 0;
                if (!isFirst || _lines.size() == 1)
                    _columns.name = std::max(_columns.name, label);
                leastName = std::max(leastName, line.hidden > 0 ? label : boxes + leastWithoutBoxes);
                if (line.hidden > 0)
                    continue;
                const NodeFacts facts = factsOf(_nodes, line, _wishes.now);
                _columns.count = std::max(_columns.count, apps::displayWidth(facts.count));
                _columns.unit = std::max(_columns.unit, apps::displayWidth(facts.unit));
                _columns.size = std::max(_columns.size, apps::displayWidth(facts.size));
                _columns.date = std::max(_columns.date, apps::displayWidth(facts.date));
                widestSummary = std::max(widestSummary, apps::displayWidth(facts.summary));
            }
            if (_wishes.columns)
                fitInto(*_wishes.columns, leastName);
            _summaryStart = summaryStart(widestSummary);
        }

        void fitInto(int columns, int leastName)
        {
            leastName = std::min(leastName, _columns.name);
            // Where it gets tight the size goes first: counts and dates tell groups apart.
            for (int* width : { &_columns.size, &_columns.date, &_columns.count }) {
                if (columns - _columns.factsWidth() < leastName)
                    *width = 0;
            }
            _columns.name = std::min(_columns.name, std::max(leastName, columns - _columns.factsWidth()));
        }

        /// In the column of the dates, or the nearest one to the left in which every summary is whole.
        int summaryStart(int widest) const
        {
            for (const int start : { _columns.dateStart(), _columns.sizeStart() }) {
                if (!_wishes.columns || start + widest <= *_wishes.columns)
                    return start;
            }
            return _columns.countStart();
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

        TextLine textOf(const TreeLine& line)
        {
            const std::string prefix = prefixOf(line);
            TextLine text(_wishes.style, _wishes.columns);
            text.addBehind(prefix, TextLine::Look::dim);
            if (line.hidden > 0) {
                addHidden(text, line);
                return text;
            }
            std::string label = labelOf(line);
            if (_wishes.columns)
                label = apps::cutInMiddle(label, std::max(leastWithoutBoxes, _columns.name - prefixWidth(line)));
            const platform::Text path = _nodes[line.node].group->path();
            const bool isLink = _wishes.style.hasLinks() && path;
            text.addBehind(label, TextLine::Look::bold, isLink ? _wishes.linkTarget(path) : std::string());
            addFacts(text, line);
            return text;
        }

        /// How many are hidden and the command that shows them, of which nothing may be cut; and how old they are where
        /// there is room for it.
        void addHidden(TextLine& text, const TreeLine& line) const
        {
            const std::string command = _wishes.unfoldingCommand(_nodes[line.node].group);
            std::string label = moreText(line);
            const std::string withAge = label + ageText(_nodes, line);
            const int width = prefixWidth(line) + apps::displayWidth(withAge) + gap + apps::displayWidth(command);
            if (!_wishes.columns || width <= *_wishes.columns)
                label = withAge;
            text.addBehind(label, TextLine::Look::dim);
            text.addWhole(_summaryStart, command);
        }

        void addFacts(TextLine& text, const TreeLine& line) const
        {
            const TreeNode& node = _nodes[line.node];
            const NodeFacts facts = factsOf(_nodes, line, _wishes.now);
            if (node.isUnreadable) {
                addUnreadable(text, node);
            } else if (!facts.count.empty()) {
                addColumns(text, facts);
            } else if (const platform::Text message = _wishes.emptyMessage(node.group); !message.empty()) {
                text.add(_columns.countStart(), _wishes.style.name(message), TextLine::Look::dim);
                return;
            } else if (line.node == 0) {
                text.addMoving(_summaryStart, facts.summary);
            } else {
                text.add(_summaryStart, summaryThatFits(facts), TextLine::Look::dim);
            }
            text.addName(_columns.noteStart(), _wishes.style.name(facts.note), TextLine::Look::dim);
        }

        /// Of a group that only its source knows, the source may know why.
        void addUnreadable(TextLine& text, const TreeNode& node) const
        {
            text.add(_columns.countStart(), "unreadable", TextLine::Look::warning);
            const platform::Text message
                = node.kind == NodeKind::other ? _wishes.emptyMessage(node.group) : platform::Text();
            if (!message.empty())
                text.addBehind(": " + _wishes.style.name(message), TextLine::Look::dim);
        }

        std::string summaryThatFits(const NodeFacts& facts) const
        {
            const std::string whole = facts.summary + facts.newest;
            const bool fits = !_wishes.columns || _summaryStart + apps::displayWidth(whole) <= *_wishes.columns;
            return fits ? whole : facts.summary;
        }

        void addColumns(TextLine& text, const NodeFacts& facts) const
        {
            if (_columns.count > 0)
                addAligned(
                    text, _columns.countStart(), apps::paddedBefore(facts.count, _columns.count) + " " + facts.unit);
            if (_columns.size > 0)
                addAtRight(text, _columns.sizeStart(), _columns.size, facts.size);
            if (_columns.date > 0)
                addAtRight(text, _columns.dateStart(), _columns.date, facts.date);
        }

        /// Blanks before a fact are no text: the line is searched and copied.
        static void addAligned(TextLine& text, int start, std::string_view fact)
        {
            const std::size_t blanks = std::min(fact.find_first_not_of(' '), fact.size());
            text.add(start + static_cast<int>(blanks), fact.substr(blanks), TextLine::Look::dim);
        }

        static void addAtRight(TextLine& text, int start, int width, std::string_view fact)
        {
            text.add(start + width - apps::displayWidth(fact), fact, TextLine::Look::dim);
        }

        const std::vector<TreeNode>& _nodes;
        const std::vector<TreeLine>& _lines;
        const TreeTextWishes& _wishes;
        Columns _columns;
        int _summaryStart = 0;
        std::vector<bool> _hasMoreBelow;
    };

} // namespace

std::size_t printTreeText(const std::vector<TreeNode>& nodes, const std::vector<TreeLine>& lines,
    const TreeTextWishes& wishes, const std::function<void(std::string_view)>& print)
{
    return TreePrinter(nodes, lines, wishes).print(print);
}

} // namespace ombrix
