// "explain": one load whose scan is listened to, then one answer a path. Where the editor is missing there is no scan,
// and that alone is the answer.

#include "apps/common/DisplayWidth.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Explanation.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/TextLine.h"
#include "host/OBConstants.h"
#include "host/OBSourceInspection.h"
#include "platform/PathText.h"

#include <algorithm>
#include <filesystem>
#include <iostream>
#include <iterator>
#include <optional>

namespace ombrix {
namespace {

    using platform::Value;
    using Paths = std::vector<std::string>;

    constexpr const char* standardInput = "-";

    /// Every path ended by a zero byte; the last may lack it.
    Paths pathsOfStandardInput()
    {
        Paths paths;
        for (std::string path; std::getline(std::cin, path, '\0');)
            paths.push_back(path);
        return paths;
    }

    /// Absolute, "." and ".." taken out as text; no link is looked at.
    std::optional<std::string> absolutePath(const std::string& path)
    {
        std::error_code error;
        const std::filesystem::path current = std::filesystem::current_path(error);
        if (path.empty() || (error && path.front() != '/'))
            return std::nullopt;
        const std::string normal = (current / path).lexically_normal().string();
        return std::string(platform::pathWithoutTrailingSlashes(normal));
    }

    Value jsonOf(const Explanation& explanation)
    {
        Value::List groups;
        Value::List objects;
        for (const TreePlace& place : explanation.places) {
            const Value identifier = place.group->ID();
            if (place.object)
                objects.emplace_back(Value::Dictionary { { "group", identifier }, { "path", place.object->path() } });
            else
                groups.push_back(identifier);
        }
        Value::List steps;
        for (const ExplainedStep& step : explanation.steps) {
            steps.emplace_back(
                Value::Dictionary { { "rule", std::string_view(step.rule) }, { "path", std::string_view(step.path) },
                    { "passed", step.passed }, { "text", std::string_view(step.text) } });
        }
        return Value::Dictionary { { "path", std::string_view(explanation.path) }, { "listed", explanation.isListed() },
            { "groups", Value(std::move(groups)) }, { "objects", Value(std::move(objects)) },
            { "steps", Value(std::move(steps)) },
            { "remedy", explanation.remedy.empty() ? Value() : Value(std::string_view(explanation.remedy)) } };
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

    /// The place that says most of it: the innermost.
    const TreePlace& mainPlace(const Explanation& explanation)
    {
        return *std::max_element(explanation.places.begin(), explanation.places.end(),
            [](const TreePlace& left, const TreePlace& right) { return left.names.size() < right.names.size(); });
    }

    std::string verdict(const TreePlace& place)
    {
        const std::string group = std::string(kindOfGroup(*place.group)) + " " + place.group->name().string();
        if (!place.object)
            return group;
        const bool isClip = place.group->typeIdentifier() == OBMontaroEventGroupTypeIdentifier;
        return (isClip ? "clip \"" : "movie \"") + place.object->name().string() + "\" of the " + group;
    }

    std::string breadcrumbs(const TreePlace& place)
    {
        std::string text;
        for (const platform::Text& name : place.names)
            text += name.string() + " › ";
        return text + place.group->name().string();
    }

    /// Paths by what tells them apart: the library as it is, everything else by what it is called in there.
    class StepTable {
    public:
        StepTable(Program& program, const Explanation& explanation)
            : _program(program)
            , _explanation(explanation)
        {
            for (const ExplainedStep& step : explanation.steps)
                _ruleWidth = std::max(_ruleWidth, apps::displayWidth(program.style().name(step.rule)));
        }

        void print() const
        {
            for (std::size_t index = 0; index < _explanation.steps.size(); ++index)
                printStep(index);
        }

    private:
        static constexpr int numberWidth = 3;
        static constexpr int verdictColumn = numberWidth + 1;
        static constexpr int ruleColumn = verdictColumn + 5;

        void printStep(std::size_t index) const
        {
            const apps::Style& style = _program.style();
            const ExplainedStep& step = _explanation.steps[index];
            const bool decides = index + 1 == _explanation.steps.size() && !step.passed;
            TextLine line(style, std::nullopt); // a reason is never cut
            line.add(0, apps::paddedBefore(std::to_string(index + 1), numberWidth));
            line.add(verdictColumn, step.passed ? "ok" : "NO",
                step.passed ? TextLine::Look::plain : TextLine::Look::warning);
            line.add(ruleColumn, style.name(step.rule));
            const std::string place = index == 0 || step.path != _explanation.steps[index - 1].path
                ? style.name(shortPath(step.path)) + ": "
                : std::string();
            line.add(ruleColumn + _ruleWidth + 3, place + style.name(step.text) + (decides ? "   ← decides" : ""),
                TextLine::Look::plain);
            _program.printLine(line.text());
        }

        std::string shortPath(const std::string& path) const
        {
            const std::string& first = _explanation.steps.front().path;
            const std::string_view below = platform::pathRelativeTo(path, first);
            return below.empty() ? path : std::string(below);
        }

        Program& _program;
        const Explanation& _explanation;
        int _ruleWidth = 0;
    };

    void printText(Program& program, const Explanation& explanation)
    {
        const apps::Style& style = program.style();
        if (explanation.isListed()) {
            const TreePlace& place = mainPlace(explanation);
            program.printLine(style.bold("listed") + "   " + style.plain(style.name(verdict(place))));
            program.printLine("         " + style.dim(style.name(breadcrumbs(place))));
        } else {
            program.printLine(
                style.bold("not listed") + "   " + style.plain(style.name(explanation.steps.back().text)));
        }
        StepTable(program, explanation).print();
        if (!explanation.remedy.empty())
            program.printLine("to list it   " + style.plain(style.name(explanation.remedy)));
    }

    void print(Program& program, const Explanation& explanation, bool isFirst)
    {
        if (program.wantsJson()) {
            apps::printValue(program.output(), jsonOf(explanation));
            return;
        }
        if (!isFirst)
            program.printLine("");
        printText(program, explanation);
    }

    Explanation withoutEditor(const std::string& path)
    {
        Explanation explanation { path };
        explanation.steps.push_back({ "editor", path, false, "the editor is not installed, so nothing is loaded" });
        explanation.remedy = "install the editor (\"ombrix info\" says where it is looked for)";
        return explanation;
    }

    std::unordered_set<const OBMediaObject*> objectsOf(const ScanRecord& record)
    {
        std::unordered_set<const OBMediaObject*> objects;
        for (const ScanRecord::Made& made : record.objectsMade())
            objects.insert(made.object.get());
        return objects;
    }

    std::vector<std::string> searchedFolders(OBMediaManager& manager)
    {
        OBSourceInspection* inspection = manager.inspection();
        if (!inspection)
            return {};
        Paths folders = inspection->projectSearchPaths();
        const Paths forEvents = inspection->eventSearchPaths();
        folders.insert(folders.end(), forEvents.begin(), forEvents.end());
        return folders;
    }

    int explainLoaded(Program& program, const Paths& paths)
    {
        const auto record = std::make_shared<ScanRecord>(paths);
        const OBMediaGroupRef root = program.load(record);
        if (!root)
            return failed;
        program.warnOfUnreadFolders();
        const TreePlaces places(root, { paths.begin(), paths.end() }, objectsOf(*record));
        const std::shared_ptr<OBMediaManager> manager = program.manager();
        const Paths folders = searchedFolders(*manager);
        const Explainer explainer(manager->platform().fileSystem, folders, *record, places);
        for (std::size_t index = 0; index < paths.size(); ++index)
            print(program, explainer.explain(paths[index]), index == 0);
        return done;
    }

} // namespace

int runExplain(Program& program)
{
    Paths asked = program.arguments().operands;
    if (program.arguments().has("-0")) {
        if (asked != Paths { standardInput })
            return program.failUsage("explain: option -0 reads paths from standard input: \"explain -0 -\"");
        asked = pathsOfStandardInput();
    } else if (asked.empty()) {
        return program.failUsage("explain: no PATH given (\"ombrix help explain\")");
    }
    Paths paths;
    for (const std::string& path : asked) {
        const std::optional<std::string> absolute = absolutePath(path);
        if (!absolute)
            return program.failUsage("explain: \"" + path + "\" is no path");
        paths.push_back(*absolute);
    }
    const std::shared_ptr<OBMediaManager> manager = program.manager();
    if (!manager)
        return failed;
    if (manager->canLoadData())
        return explainLoaded(program, paths);
    for (std::size_t index = 0; index < paths.size(); ++index)
        print(program, withoutEditor(paths[index]), index == 0);
    return done;
}

} // namespace ombrix
