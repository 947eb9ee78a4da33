// The way to a path, told by what the scan decided of it and of the folders that it lies in.
//
// The one surprise: whether a path is listed is asked of the tree alone; the decisions only say why. Where no library
// lists it at the place where it lies, a link leads to it, and the way is the link's.

#include "apps/ombrix/Explanation.h"

#include "apps/ombrix/ShellWord.h"
#include "host/OBSourceInspection.h"
#include "platform/ForbiddingFolder.h"
#include "platform/PathText.h"

#include <algorithm>
#include <utility>

namespace ombrix {
namespace {

    ExplainedStep stepOf(const OBScanDecision& decision)
    {
        return { std::string(decision.rule), decision.path, decision.passed, decision.text };
    }

    /// `remedy` to whoever asks about `path`: "it" is what decided, and is named where that is a folder around the
    /// path.
    std::string remedyFor(const std::string& path, const std::string& decided, const std::string& remedy)
    {
        if (path == decided || remedy.find(" it") == std::string::npos)
            return remedy;
        return std::string(platform::lastPathComponent(decided)) + ": " + remedy;
    }

    /// Whether a folder could not be listed. It may be in the tree all the same; what lies in it is not.
    bool isUnlisted(const OBScanDecision& decision)
    {
        return decision.rule == "listing" && !decision.inside.empty();
    }

    /// `path` below `folder`, cut after its first component there.
    std::string firstBelow(std::string_view folder, std::string_view path)
    {
        const std::string_view below = platform::pathRelativeTo(path, folder);
        return platform::pathJoined(folder, below.substr(0, below.find('/')));
    }

} // namespace

/// The steps from a library to a path, and whether they end in a record.
struct Explainer::Way {
    std::vector<ExplainedStep> steps {};
    std::string remedy {};
    bool passes = false;

    void end(std::string_view rule, std::string path, std::string text, std::string cure)
    {
        steps.push_back({ std::string(rule), std::move(path), false, std::move(text) });
        remedy = std::move(cure);
        passes = false;
    }
};

Explainer::Explainer(const platform::FileSystem& fileSystem, const std::vector<std::string>& folders,
    const ScanRecord& record, const TreePlaces& places, const OBSourceInspection* inspection)
    : _fileSystem(fileSystem)
    , _folders(folders)
    , _record(record)
    , _places(places)
    , _inspection(inspection)
{
    for (const ScanRecord::Library& library : record.libraries()) {
        DecisionIndex& index = _decisions.emplace_back();
        for (std::size_t number = 0; number < library.decisions.size(); ++number)
            index[library.decisions[number].path].push_back(number);
    }
    for (const ScanRecord::Made& made : record.objectsMade()) {
        _madeByEntry[made.entry].push_back(&made);
        _madeByTarget.emplace(made.object->path().string(), &made);
    }
}

Explanation Explainer::explain(const std::string& path) const
{
    Explanation explanation { path };
    explanation.places = placesOf(path);
    Way way = chosenWay(explanation);
    explanation.steps = std::move(way.steps);
    explanation.remedy = std::move(way.remedy);
    return explanation;
}

/// Those with that very path, and those that were made from it by way of a link; in the order of the tree.
std::vector<TreePlace> Explainer::placesOf(const std::string& path) const
{
    std::vector<TreePlace> found = _places.withPath(path);
    const auto made = _madeByEntry.find(path);
    if (made == _madeByEntry.end())
        return found;
    for (const ScanRecord::Made* each : made->second) {
        if (each->object->path() == std::string_view(path))
            continue;
        const std::vector<TreePlace>& places = _places.ofObject(each->object.get());
        found.insert(found.end(), places.begin(), places.end());
    }
    std::sort(found.begin(), found.end(),
        [](const TreePlace& left, const TreePlace& right) { return left.order < right.order; });
    return found;
}

/// The way through the first library that lists the path, else through the first that meets it.
Explainer::Way Explainer::chosenWay(const Explanation& explanation) const
{
    std::vector<Way> ways;
    for (std::size_t library = 0; library < _decisions.size(); ++library) {
        if (!speaksOf(library, explanation.path))
            continue;
        Way way = wayThrough(library, explanation.path, explanation.isListed());
        if (way.passes)
            return way;
        ways.push_back(std::move(way));
    }
    if (explanation.isListed())
        return wayByLink(explanation.path);
    return ways.empty() ? wayOutside(explanation.path) : std::move(ways.front());
}

/// Whether the way through `library` is one to `path`. The whole disk as a library only is where something was decided.
bool Explainer::speaksOf(std::size_t library, const std::string& path) const
{
    const std::string& top = _record.libraries()[library].path;
    return platform::isSameOrBelow(path, top)
        && (top != ScanRecord::wholeDisk || !decisionsOnWay(library, path).empty());
}

/// The way of the link that leads to a path which no library lists where it lies.
Explainer::Way Explainer::wayByLink(const std::string& path) const
{
    Way way;
    if (const ScanRecord::Made* made = madeInto(path)) {
        for (std::size_t library = 0; library < _decisions.size() && !way.passes; ++library) {
            if (platform::isSameOrBelow(made->entry, _record.libraries()[library].path))
                way = wayThrough(library, made->entry, true);
        }
    }
    way.steps.push_back({ "real path", path, true, "the tree shows it by this path" });
    way.remedy.clear();
    return way;
}

Explainer::Way Explainer::wayThrough(std::size_t library, const std::string& path, bool isListed) const
{
    const Decisions met = decisionsOnWay(library, path);
    if (isListed)
        return wayToRecord(met, path);
    Way way;
    for (const OBScanDecision* decision : met) {
        if (isUnlisted(*decision) && decision->path != path) {
            way.end(decision->rule, decision->path, decision->inside,
                remedyFor(path, decision->path, decision->insideRemedy));
            return way;
        }
        way.steps.push_back(stepOf(*decision));
        if (!decision->passed) {
            way.remedy = remedyFor(path, decision->path, decision->remedy);
            return way;
        }
    }
    if (met.empty())
        way.end("search folder", _record.libraries()[library].path, "the scan was stopped before it came here",
            "load again");
    else
        endAt(way, met, path);
    return way;
}

/// A folder that is kept out by itself may be listed all the same in the place of another, so what was decided last
/// counts.
Explainer::Way Explainer::wayToRecord(const Decisions& met, const std::string& path) const
{
    Way way;
    way.passes = !met.empty() && met.back()->passed
        && std::any_of(met.begin(), met.end(), [&](const OBScanDecision* decision) { return decision->path == path; });
    for (const OBScanDecision* decision : met) {
        if (decision->passed)
            way.steps.push_back(stepOf(*decision));
    }
    return way;
}

/// Ends a way on which every rule passed, and which leads to no record.
void Explainer::endAt(Way& way, const Decisions& met, const std::string& path) const
{
    const std::string* itself = nullptr;
    const OBScanDecision* unlisted = nullptr;
    bool wasReached = false;
    for (const OBScanDecision* decision : met) {
        if (decision->path != path)
            continue;
        wasReached = true;
        if (!decision->itself.empty())
            itself = &decision->itself;
        if (isUnlisted(*decision))
            unlisted = decision;
    }
    if (!wasReached)
        endBelow(way, met, path);
    else if (unlisted && !_fileSystem.linkStatus(path) && !_fileSystem.isOutOfReach(path))
        way.end("existence", path, "nothing is there", {});
    else
        way.end("record", path, itself ? *itself : "it is no group and no movie of its own", {});
}

/// Ends a way at a path of which no rule speaks, below one that passed.
void Explainer::endBelow(Way& way, const Decisions& met, const std::string& path) const
{
    std::string_view folder;
    for (const OBScanDecision* decision : met) {
        if (decision->path.size() > folder.size())
            folder = decision->path;
    }
    const OBScanDecision* inside = nullptr;
    for (const OBScanDecision* decision : met) {
        if (decision->path == folder && !decision->inside.empty())
            inside = decision;
    }
    const std::string missing = firstMissing(folder, path);
    const std::string next = firstBelow(folder, path);
    if (!missing.empty() && _fileSystem.isOutOfReach(missing))
        way.end("existence", missing, "a folder that it lies in may not be searched, so nothing is known of it",
            "permit reading: chmod u+rx " + shellWord(platform::folderThatForbids(_fileSystem, missing)));
    else if (!missing.empty())
        way.end("existence", missing, "nothing is there", {});
    else if (auto place = inside && _inspection ? _inspection->whyUnsearched(path) : std::nullopt)
        way.end("place", path, std::move(place->text), std::move(place->remedy));
    else if (inside)
        way.end("place", next, inside->inside, inside->insideRemedy);
    else
        way.end("place", next, "it was not there when the folder was listed", "load again");
}

/// `path` as the search spells it, where that is another way to the same place, and the folder that is searched; empty
/// where there is none. Only links that lead into the folder are resolved: those below it stay as they were asked
/// about.
std::pair<std::string, std::string> Explainer::searchedSpelling(const std::string& path) const
{
    for (const std::string& folder : _folders) {
        const std::string real = _fileSystem.resolvedPath(folder);
        for (std::string step = "/"; step.size() < path.size();) {
            step = firstBelow(step, path);
            const std::string realStep = _fileSystem.resolvedPath(step);
            if (!platform::isSameOrBelow(realStep, real))
                continue;
            const std::string spelled = platform::pathJoined(folder, platform::pathRelativeTo(realStep, real));
            return { platform::pathJoined(spelled, platform::pathRelativeTo(path, step)), folder };
        }
    }
    return {};
}

Explainer::Way Explainer::wayOutside(const std::string& path) const
{
    Way way;
    if (const auto [spelled, folder] = searchedSpelling(path); !spelled.empty() && spelled != path) {
        way.end("search folder", path, "the folder that it lies in is searched by another path, " + folder,
            "ask about " + spelled);
        return way;
    }
    const auto has = [&](auto&& isSo) { return std::any_of(_folders.begin(), _folders.end(), isSo); };
    if (auto place = _inspection ? _inspection->whyUnsearched(path) : std::nullopt)
        way.end("search folder", path, std::move(place->text), std::move(place->remedy));
    else if (has([&](const std::string& folder) { return platform::isSameOrBelow(folder, path); }))
        way.end("search folder", path, "it holds folders that are searched, and is none itself", {});
    else if (_folders.empty())
        way.end("search folder", path, "the source tells of no folder that it searches", {});
    else
        way.end("search folder", path,
            "it lies in none of the " + std::to_string(_folders.size()) + " folders that are searched",
            "move it into a library, such as " + _folders.front());
    return way;
}

/// What was decided of `path` and of the folders that it lies in, in the order in which it was decided.
Explainer::Decisions Explainer::decisionsOnWay(std::size_t library, const std::string& path) const
{
    const DecisionIndex& index = _decisions[library];
    const std::string& top = _record.libraries()[library].path;
    std::vector<std::size_t> numbers;
    for (std::string_view above = path; platform::isSameOrBelow(above, top);
         above = platform::pathByRemovingLastComponent(above)) {
        if (const auto found = index.find(above); found != index.end())
            numbers.insert(numbers.end(), found->second.begin(), found->second.end());
        if (above.size() <= 1)
            break;
    }
    std::sort(numbers.begin(), numbers.end());
    Decisions decisions;
    for (const std::size_t number : numbers)
        decisions.push_back(&_record.libraries()[library].decisions[number]);
    return decisions;
}

/// The entry that became the record with this path; null when a path is a record by itself.
const ScanRecord::Made* Explainer::madeInto(const std::string& path) const
{
    const auto found = _madeByTarget.find(path);
    return found == _madeByTarget.end() ? nullptr : found->second;
}

/// The first thing on the way from `folder` to `path` that does not exist; empty when all do.
std::string Explainer::firstMissing(std::string_view folder, std::string_view path) const
{
    for (std::string step(folder); step.size() < path.size();) {
        step = firstBelow(step, path);
        if (!_fileSystem.linkStatus(step))
            return step;
    }
    return {};
}

} // namespace ombrix
