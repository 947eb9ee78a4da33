// "explain": one load whose scan is listened to, then one answer a path. Where the editor is missing there is no scan,
// and that alone is the answer.

#include "apps/common/RecordJson.h"
#include "apps/ombrix/AbsolutePath.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Explanation.h"
#include "apps/ombrix/ExplanationText.h"
#include "apps/ombrix/Program.h"
#include "host/OBSourceInspection.h"

#include <algorithm>
#include <cstdio>
#include <optional>
#include <utility>

namespace ombrix {
namespace {

    using platform::Value;
    using Paths = std::vector<std::string>;

    constexpr const char* standardInput = "-";

    /// Every path ended by a zero byte; the last may lack it. Absent when it cannot be read to its end.
    std::optional<Paths> pathsOfStandardInput()
    {
        Paths paths;
        std::string path;
        for (int byte = std::getc(stdin); byte != EOF; byte = std::getc(stdin)) {
            if (byte != '\0')
                path.push_back(static_cast<char>(byte));
            else
                paths.push_back(std::exchange(path, {}));
        }
        if (!path.empty())
            paths.push_back(path);
        return std::ferror(stdin) ? std::nullopt : std::optional(std::move(paths));
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

    /// Prints one explanation after the other.
    class Answers {
    public:
        Answers(Program& program, std::size_t count)
            : _program(program)
        {
            const platform::FileSystem& fileSystem = program.session()->platform().fileSystem;
            _wishes.namesPath = count > 1;
            _wishes.home = fileSystem.homeFolder();
            _wishes.linkTarget = [&fileSystem](std::string_view path) { return fileSystem.resolvedPath(path); };
        }

        void print(const Explanation& explanation)
        {
            if (_program.wantsJson()) {
                apps::printValue(_program.output(), jsonOf(explanation));
                return;
            }
            if (!_isFirst)
                _program.printLine("");
            _isFirst = false;
            printExplanation(_program, explanation, _wishes);
        }

    private:
        Program& _program;
        ExplanationTextWishes _wishes {};
        bool _isFirst = true;
    };

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
        const Explainer explainer(manager->platform().fileSystem, folders, *record, places, manager->inspection());
        Answers answers(program, paths.size());
        for (const std::string& path : paths)
            answers.print(explainer.explain(path));
        return done;
    }

} // namespace

int runExplain(Program& program)
{
    Paths asked = program.arguments().operands;
    if (program.arguments().has("-0")) {
        if (asked != Paths { standardInput })
            return program.failUsage("explain: option -0 reads paths from standard input: \"explain -0 -\"");
        std::optional<Paths> read = pathsOfStandardInput();
        if (!read)
            return program.fail("standard input", "it cannot be read");
        asked = std::move(*read);
    } else if (std::find(asked.begin(), asked.end(), std::string()) != asked.end()) {
        return program.failUsage("explain: \"\" is no path");
    } else if (asked.empty()) {
        return program.failUsage("explain: no PATH given (\"ombrix help explain\")");
    }
    Paths paths;
    for (const std::string& path : asked) {
        const std::optional<std::string> absolute = absolutePath(path);
        if (!absolute)
            return program.fail(path, noCurrentFolder);
        paths.push_back(*absolute);
    }
    const std::shared_ptr<OBMediaManager> manager = program.manager();
    if (!manager)
        return failed;
    if (manager->canLoadData())
        return explainLoaded(program, paths);
    Answers answers(program, paths.size());
    for (const std::string& path : paths)
        answers.print(withoutEditor(path));
    return done;
}

} // namespace ombrix
