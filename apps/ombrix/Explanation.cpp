#include "apps/ombrix/Explanation.h"

#include "platform/PathText.h"

#include <algorithm>
#include <utility>

namespace ombrix {
namespace {

    ExplainedStep stepOf(const OBScanDecision& decision)
    {
        return { std::string(decision.rule), decision.path, decision.passed, decision.text };
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

Explanation Explainer::explain(const std::string& path) const
{
    Explanation explanation { path };
    explanation.places = _places.withPath(path);
    for (const ScanRecord::Made& made : _record.objectsMade()) {
        if (made.entry != path || made.object->path() == std::string_view(path))
            continue;
        const std::vector<TreePlace>& places = _places.ofObject(made.object.get());
        explanation.places.insert(explanation.places.end(), places.begin(), places.end());
    }
    Way way = chosenWay(explanation);
    explanation.steps = std::move(way.steps);
    explanation.remedy = std::move(way.remedy);
    return explanation;
}

/// The way through the first library that lists the path, else through the first that meets it.
Explainer::Way Explainer::chosenWay(const Explanation& explanation) const
{
    std::vector<Way> ways;
    for (const ScanRecord::Library& library : _record.libraries()) {
        if (!platform::isSameOrBelow(explanation.path, library.path))
            continue;
        Way way = wayThrough(library, explanation.path, explanation.isListed());
        if (way.passes)
            return way;
        ways.push_back(std::move(way));
    }
    if (explanation.isListed()) {
        // No library lists it where it lies, so a link in one leads to it.
        Way way;
        if (const ScanRecord::Made* made = entryOf(explanation.path)) {
            for (const ScanRecord::Library& library : _record.libraries()) {
                if (platform::isSameOrBelow(made->entry, library.path) && !way.passes)
                    way = wayThrough(library, made->entry, true);
            }
        }
        way.steps.push_back({ "record", explanation.path, true, "the tree shows it by this path" });
        way.remedy.clear();
        return way;
    }
    return ways.empty() ? wayOutside(explanation.path) : std::move(ways.front());
}

Explainer::Way Explainer::wayThrough(const ScanRecord::Library& library, const std::string& path, bool isListed) const
{
    Way way;
    way.passes = true;
    std::vector<const OBScanDecision*> met;
    for (const OBScanDecision& decision : library.decisions) {
        if (!platform::isSameOrBelow(path, decision.path))
            continue;
        met.push_back(&decision);
        way.steps.push_back(stepOf(decision));
        if (!decision.passed) {
            way.passes = false;
            way.remedy = decision.remedy;
            return way;
        }
    }
    if (met.empty())
        way.end("search folder", library.path, "the scan was stopped before it came here", "load again");
    else if (met.back()->path != path)
        endBelow(way, met, path);
    else if (!isListed)
        way.end("record", path,
            met.back()->itself.empty() ? "it is no group and no movie of its own" : met.back()->itself, {});
    return way;
}

/// Ends a way at a path of which no rule speaks, below one that passed.
void Explainer::endBelow(Way& way, const std::vector<const OBScanDecision*>& decisions, const std::string& path) const
{
    const std::string& folder = decisions.back()->path;
    const OBScanDecision* inside = nullptr;
    for (const OBScanDecision* decision : decisions) {
        if (decision->path == folder && !decision->inside.empty())
            inside = decision;
    }
    const std::string next = firstBelow(folder, path);
    const bool cannotBeListed = inside && inside->rule == "listing";
    if (cannotBeListed) {
        way.end("listing", next, inside->inside, inside->insideRemedy);
        return;
    }
    if (std::string missing = firstMissing(folder, path); !missing.empty())
        way.end("existence", std::move(missing), "nothing is there", {});
    else if (inside)
        way.end("place", next, inside->inside, inside->insideRemedy);
    else
        way.end("place", next, "it was not there when the folder was listed", "load again");
}

Explainer::Way Explainer::wayOutside(const std::string& path) const
{
    Way way;
    for (const std::string& folder : _folders) {
        const std::string real = _fileSystem.resolvedPath(folder);
        if (real != folder && platform::isSameOrBelow(path, real)) {
            const std::string spelled = platform::pathJoined(folder, platform::pathRelativeTo(path, real));
            way.end("search folder", path, "the folder that it lies in is searched by another path, " + folder,
                "ask about " + spelled);
            return way;
        }
    }
    const auto bearsName = [&](const std::string& folder) {
        const std::string name = "/" + std::string(platform::lastPathComponent(folder));
        return (path + "/").find(name + "/") != std::string::npos;
    };
    const auto nameless = std::find_if(_folders.begin(), _folders.end(), bearsName);
    if (nameless != _folders.end())
        way.end("search folder", path,
            "its volume or folder is not searched; folders of that name are searched in the home folder's Movies and "
            "at the top of local volumes and removable media",
            "move the library there, or mount its volume");
    else
        way.end("search folder", path,
            "it lies in none of the " + std::to_string(_folders.size()) + " folders that are searched",
            _folders.empty() ? std::string() : "move it into a library, such as " + _folders.front());
    return way;
}

const ScanRecord::Made* Explainer::entryOf(const std::string& path) const
{
    for (const ScanRecord::Made& made : _record.objectsMade()) {
        if (made.object->path() == std::string_view(path))
            return &made;
    }
    return nullptr;
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
