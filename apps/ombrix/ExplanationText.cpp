// An explanation in columns: number, verdict, rule, path, and what was found there.
//
// The one surprise: each path is told by what it adds to the one before, and not again while it stays the same. A
// terminal that is too narrow for two columns gets the findings below the paths, or below the rules.

#include "apps/ombrix/ExplanationText.h"

#include "apps/common/DisplayWidth.h"
#include "apps/ombrix/TextLine.h"
#include "host/OBConstants.h"
#include "platform/PathText.h"

#include <algorithm>
#include <climits>
#include <utility>
#include <vector>

namespace ombrix {
namespace {

    constexpr int gap = 3;
    constexpr std::string_view listedTitle = "listed";
    constexpr std::string_view unlistedTitle = "not listed";
    constexpr std::string_view remedyTitle = "to list it";
    constexpr std::string_view decidesMark = "← decides";

    int columnBehind(std::string_view title)
    {
        return apps::displayWidth(title) + gap;
    }

    std::string_view kindOfGroup(const OBMediaGroup& group)
    {
        const OBTypeIdentifierRef type = group.typeIdentifier();
        if (type == OBMontaroEventGroupTypeIdentifier)
            return "event";
        if (type == OBMontaroProjectGroupTypeIdentifier)
            return "project";
        return type == OBMontaroFolderGroupTypeIdentifier ? "folder" : "group";
    }

    /// The place that the steps lead to; of several the innermost, and there the first.
    const TreePlace& mainPlace(const Explanation& explanation)
    {
        const auto rank = [&explanation](const TreePlace& place) {
            const platform::Text folder = place.group->path();
            const auto leadsThere
                = [&](const ExplainedStep& step) { return folder && platform::isSameOrBelow(step.path, folder); };
            const bool isOnTheWay = std::any_of(explanation.steps.begin(), explanation.steps.end(), leadsThere);
            return std::pair(isOnTheWay, place.names.size());
        };
        return *std::max_element(explanation.places.begin(), explanation.places.end(),
            [&](const TreePlace& left, const TreePlace& right) { return rank(left) < rank(right); });
    }

    std::string breadcrumbs(const TreePlace& place)
    {
        std::string text;
        for (const platform::Text& name : place.names)
            text += name.string() + " › ";
        return text + place.group->name().string();
    }

    class ExplanationText {
    public:
        ExplanationText(Program& program, const Explanation& explanation, const ExplanationTextWishes& wishes)
            : _program(program)
            , _style(program.style())
            , _explanation(explanation)
            , _wishes(wishes)
        {
            for (std::size_t index = 0; index < explanation.steps.size(); ++index) {
                _paths.push_back(_style.name(newPartOfPath(index)));
                _pathWidth = std::max(_pathWidth, std::min(widestPath, apps::displayWidth(_paths.back())));
                _pathColumn
                    = std::max(_pathColumn, ruleColumn + columnBehind(_style.name(explanation.steps[index].rule)));
            }
            const int textColumn = _pathColumn + _pathWidth + gap;
            _textIsBelow = program.columns() && *program.columns() - textColumn < leastTextWidth;
            const bool isNarrow = _textIsBelow && *_program.columns() - _pathColumn < leastWidthBelow;
            _textColumn = isNarrow ? ruleColumn + gap : _textIsBelow ? _pathColumn : textColumn;
        }

        void print() const
        {
            if (_wishes.namesPath)
                printPath();
            if (_explanation.isListed())
                printPlace(mainPlace(_explanation));
            else
                printParagraph(unlistedTitle, TextLine::Look::bold, reason());
            for (std::size_t index = 0; index < _explanation.steps.size(); ++index)
                printStep(index);
            if (!_explanation.remedy.empty())
                printParagraph(remedyTitle, TextLine::Look::bold, _explanation.remedy);
        }

    private:
        static constexpr int numberWidth = 3;
        static constexpr int ruleColumn = numberWidth + 3 + gap;
        static constexpr int widestPath = 40;
        static constexpr int leastTextWidth = 40;
        static constexpr int leastWidthBelow = 24;

        TextLine emptyLine() const { return { _style, _program.columns() }; }

        void printParagraph(std::string_view title, TextLine::Look look, std::string_view text) const
        {
            _program.printWrapped(emptyLine().add(0, title, look), columnBehind(title), _style.name(text));
        }

        /// Above the rest, whole: a terminal breaks it behind a slash where it can.
        void printPath() const
        {
            const std::string path = _style.name(abbreviated(_explanation.path));
            const int room = _program.columns().value_or(INT_MAX);
            std::string line;
            for (std::size_t start = 0, end = 0; start < path.size(); start = end) {
                end = std::min(path.find('/', start), path.size() - 1) + 1;
                const std::string part = path.substr(start, end - start);
                if (!line.empty() && apps::displayWidth(line) + apps::displayWidth(part) > room)
                    _program.printLine(_style.bold(std::exchange(line, {}), linkTo(_explanation.path)));
                line += part;
            }
            _program.printLine(_style.bold(line, linkTo(_explanation.path)));
        }

        void printPlace(const TreePlace& place) const
        {
            const int column = columnBehind(listedTitle);
            const TextLine title = emptyLine().add(0, listedTitle, TextLine::Look::bold);
            const std::string groupName = _style.name(place.group->name());
            const std::string kind(kindOfGroup(*place.group));
            std::string whole = kind + " " + groupName;
            TextLine line = title;
            if (place.object) {
                const bool isClip = place.group->typeIdentifier() == OBMontaroEventGroupTypeIdentifier;
                const std::string before = isClip ? "clip \"" : "movie \"";
                const std::string name = _style.name(place.object->name());
                line.add(column, before);
                line.addBehind(name, TextLine::Look::bold, linkTo(place.object->path().view()));
                line.addBehind("\" of the " + kind + " ");
                whole = before + name + "\" of the " + whole;
            } else {
                line.add(column, kind + " ");
            }
            const platform::Text path = place.group->path();
            line.addBehind(groupName, TextLine::Look::bold, path ? linkTo(path.view()) : std::string());
            if (_program.columns() && column + apps::displayWidth(whole) > *_program.columns())
                _program.printWrapped(title, column, whole);
            else
                _program.printLine(line.text());
            _program.printWrapped(emptyLine(), column, _style.name(breadcrumbs(place)), TextLine::Look::dim);
        }

        /// Why the path is not listed, told of a folder that it lies in where that decides.
        std::string reason() const
        {
            const ExplainedStep& last = _explanation.steps.back();
            if (last.path == _explanation.path)
                return last.text;
            return std::string(platform::lastPathComponent(last.path)) + ": " + last.text;
        }

        void printStep(std::size_t index) const
        {
            const ExplainedStep& step = _explanation.steps[index];
            TextLine line = emptyLine();
            line.add(0, apps::paddedBefore(std::to_string(index + 1), numberWidth) + " ");
            line.addBehind(step.passed ? "ok" : "NO", step.passed ? TextLine::Look::plain : TextLine::Look::warning);
            line.add(ruleColumn, _style.name(step.rule));
            if (step.passed)
                printFinding(line, _paths[index], _style.name(step.text));
            else
                printDeciding(line, _paths[index]);
        }

        void printFinding(TextLine& line, const std::string& path, const std::string& text) const
        {
            if (_textIsBelow && (!path.empty() || _textColumn < _pathColumn)) {
                _program.printLine(line.addName(_pathColumn, path).text());
                _program.printWrapped(emptyLine(), _textColumn, text, TextLine::Look::dim);
                return;
            }
            if (!path.empty())
                line.add(_pathColumn, cutTo(_pathWidth, path));
            _program.printWrapped(line, _textColumn, text, TextLine::Look::dim);
        }

        /// What decides was said above the steps.
        void printDeciding(TextLine& line, const std::string& path) const
        {
            const int behindPath = _pathColumn + columnBehind(path);
            if (path.empty() || !_textIsBelow) {
                line.add(_pathColumn, cutTo(_pathWidth, path)).addWhole(_textColumn, decidesMark);
            } else if (behindPath + apps::displayWidth(decidesMark) <= *_program.columns()) {
                line.addName(_pathColumn, path).addWhole(behindPath, decidesMark);
            } else {
                _program.printLine(line.addName(_pathColumn, path).text());
                _program.printLine(emptyLine().addWhole(_textColumn, decidesMark).text());
                return;
            }
            _program.printLine(line.text());
        }

        std::string cutTo(int width, const std::string& path) const
        {
            return _program.columns() ? apps::cutInMiddle(path, width) : path;
        }

        /// What the path of a step adds to that of the step before; empty where it is the same.
        std::string newPartOfPath(std::size_t index) const
        {
            const std::string& path = _explanation.steps[index].path;
            if (index == 0)
                return abbreviated(path);
            const std::string& before = _explanation.steps[index - 1].path;
            if (path == before)
                return {};
            const std::string_view below = platform::pathRelativeTo(path, before);
            if (!below.empty())
                return std::string(below);
            const std::string& library = _explanation.steps.front().path;
            const std::string_view inLibrary = platform::pathRelativeTo(path, library);
            return inLibrary.empty() ? abbreviated(path) : std::string(inLibrary);
        }

        std::string abbreviated(const std::string& path) const
        {
            if (!_wishes.home || *_wishes.home == "/" || !platform::isSameOrBelow(path, *_wishes.home))
                return path;
            return platform::pathJoined("~", platform::pathRelativeTo(path, *_wishes.home));
        }

        std::string linkTo(std::string_view path) const
        {
            return _style.hasLinks() ? _wishes.linkTarget(path) : std::string();
        }

        Program& _program;
        const apps::Style& _style;
        const Explanation& _explanation;
        const ExplanationTextWishes& _wishes;
        std::vector<std::string> _paths {}; // laid out, one for each step
        int _pathWidth = 0;
        int _pathColumn = 0;
        int _textColumn = 0;
        bool _textIsBelow = false;
    };

} // namespace

void printExplanation(Program& program, const Explanation& explanation, const ExplanationTextWishes& wishes)
{
    ExplanationText(program, explanation, wishes).print();
}

} // namespace ombrix
