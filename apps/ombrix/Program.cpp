#include "apps/ombrix/Program.h"

#include "apps/common/DisplayWidth.h"
#include "apps/common/HostileNames.h"
#include "apps/common/StandardError.h"
#include "apps/ombrix/GroupSearch.h"
#include "platform/FileProblemText.h"

#include <algorithm>
#include <climits>
#include <utility>

namespace ombrix {
namespace {

    constexpr int standardOutput = 1;

    /// Why `manager` cannot load, and where.
    std::pair<std::string, std::string> whyNothingLoads(OBMediaManager& manager)
    {
        const std::string source = manager.displayName().string();
        const platform::Text path = manager.getAppPath();
        if (path.isAbsent() && !manager.inspection())
            return { source, "it cannot load now" };
        if (path.isAbsent())
            return { source, "the editor is not installed, so its libraries are not shown" };
        return { source, "the editor is not installed: nothing exists at " + apps::escapedText(path) };
    }

    std::string textOfUnreadFolders(const std::vector<OBLoadProblem>& problems)
    {
        if (problems.empty())
            return {};
        std::string first = apps::escapedText(problems[0].path) + ": "
            + std::string(platform::textOfFileProblem(problems[0].problem));
        if (problems.size() == 1)
            return first;
        return std::to_string(problems.size()) + " folders could not be read, the first: " + first;
    }

} // namespace

Program::Program(Arguments arguments)
    : _arguments(std::move(arguments))
    , _output(standardOutput)
    , _style(apps::Style::wishesFor(standardOutput, _arguments.color, _arguments.hyperlink))
{
}

std::optional<int> Program::columns() const
{
    if (!_style.isTerminal())
        return std::nullopt;
    return apps::sizeOfTerminal(standardOutput).columns;
}

void Program::printLine(std::string_view line)
{
    _output.write(line);
    _output.write("\n");
}

void Program::printWrapped(const TextLine& before, int column, std::string_view laidOut, TextLine::Look look)
{
    constexpr int leastWidth = 20;
    const std::optional<int> width = columns();
    const int room = width ? std::max(leastWidth, *width - column) : INT_MAX;
    bool isFirst = true;
    for (const std::string& words : apps::wrappedWords(laidOut, room)) {
        TextLine line = isFirst ? before : TextLine(_style, width);
        printLine(line.addWhole(column, words, look).text());
        isFirst = false;
    }
}

void Program::printPath(std::string_view path)
{
    if (_arguments.has("-0")) {
        _output.write(path);
        _output.write(std::string_view("\0", 1));
    } else {
        printLine(_style.plain(_style.name(path)));
    }
}

int Program::fail(std::string_view place, std::string_view what) const
{
    apps::printError("ombrix: " + apps::escapedText(std::string(place) + ": " + std::string(what)));
    return failed;
}

int Program::failGroup(std::string_view typed, std::string_view what, std::string_view suggestion) const
{
    if (typed.empty())
        return fail(_arguments.command->name, "\"\" is the " + std::string(what) + " of no group");
    return fail(typed, "no group has this " + std::string(what) + std::string(suggestion));
}

int Program::failUsage(std::string_view what) const
{
    apps::printError("ombrix: " + apps::escapedText(what));
    return wrongUsage;
}

void Program::warn(std::string_view what) const
{
    apps::printError("ombrix: warning: " + apps::escapedText(what));
}

apps::Session* Program::session()
{
    if (!_session) {
        apps::SessionResult result = apps::openSession({ _arguments.machineFile, _arguments.source });
        _session = std::move(result.session);
        if (!_session)
            apps::printError("ombrix: " + apps::escapedText(result.problem));
    }
    return _session.get();
}

std::shared_ptr<OBMediaManager> Program::manager()
{
    apps::Session* open = session();
    if (!open)
        return nullptr;
    std::shared_ptr<OBMediaManager> manager = open->manager();
    if (!manager)
        apps::printError("ombrix: " + apps::escapedText(open->problem()));
    return manager;
}

const OBMediaManagerClass* Program::managerClass()
{
    apps::Session* open = session();
    const OBMediaManagerClass* managerClass = open ? open->host().managerClass(open->source()) : nullptr;
    if (open && !managerClass)
        manager(); // says why there is none
    return managerClass;
}

std::shared_ptr<OBMediaManager> Program::loadableManager()
{
    std::shared_ptr<OBMediaManager> source = manager();
    if (!source || source->canLoadData())
        return source;
    failLoad(*source, { OBLoadOutcome::unavailable });
    return nullptr;
}

int Program::failLoad(OBMediaManager& manager, const OBLoadResult& result) const
{
    if (result.outcome == OBLoadOutcome::failed)
        return fail(manager.displayName(), "the load failed: " + result.problem);
    if (result.outcome != OBLoadOutcome::unavailable)
        return fail(manager.displayName(), "the load ended without a tree");
    const auto [place, what] = whyNothingLoads(manager);
    return fail(place, what);
}

OBMediaGroupRef Program::load(const std::shared_ptr<OBScanObserver>& observer)
{
    const std::shared_ptr<OBMediaManager> source = loadableManager();
    if (!source)
        return nullptr;
    if (observer)
        source->setScanObserver(observer);
    const apps::TreeLoad load = apps::loadTree(source);
    _loadDuration = load.duration;
    const bool hasLoaded = load.result.problem.empty() && load.result.outcome != OBLoadOutcome::unavailable;
    if (hasLoaded && load.result.rootMediaGroup)
        return load.result.rootMediaGroup;
    failLoad(*source, load.result);
    return nullptr;
}

Program::GroupAnswer Program::loadGroupOfOption()
{
    const std::string* identifier = _arguments.valueOf("--group");
    const OBMediaGroupRef root = load();
    if (!root)
        return { nullptr, failed };
    OBMediaGroupRef group = groupWithID(root, *identifier);
    if (!group)
        return { nullptr, failGroup(*identifier, "ID", suggestedID(root, *identifier)) };
    return { std::move(group), done };
}

std::string Program::unreadFoldersText()
{
    return textOfUnreadFolders(manager()->loadProblems());
}

void Program::warnOfUnreadFolders()
{
    warnOfUnreadFolders(manager()->loadProblems());
}

void Program::warnOfUnreadFolders(const std::vector<OBLoadProblem>& folders) const
{
    if (const std::string text = textOfUnreadFolders(folders); !text.empty())
        warn(text);
}

int Program::finish(int status)
{
    _output.flush();
    if (!_output.problem().empty())
        return fail("standard output", _output.problem());
    return status;
}

} // namespace ombrix
