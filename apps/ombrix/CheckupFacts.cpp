// A check-up asks in three rounds, for what is asked next depends on what was answered. In each all disks are asked at
// once, so that it takes as long as one silent disk however many there are.

#include "apps/ombrix/CheckupFacts.h"

#include "platform/PathText.h"

#include <algorithm>
#include <charconv>

namespace ombrix {
namespace {

    using platform::FollowingMeans;
    using platform::isSameOrBelow;

    using Questions = std::vector<std::vector<std::string>>;

    std::vector<FolderState> statesOfPaths(const std::vector<std::string>& paths)
    {
        std::vector<FolderState> states;
        for (const std::string& path : paths) {
            const auto isKnown = [&](const FolderState& state) { return state.path == path; };
            const auto known = std::find_if(states.begin(), states.end(), isKnown);
            if (known == states.end())
                states.emplace_back().path = path;
            else
                ++known->timesSearched;
        }
        return states;
    }

    void takeVolumes(CheckupFacts& facts, const DiskAnswer& mounted)
    {
        const std::vector<std::string> paths = textsIn(mounted, "volume");
        const std::vector<std::string> names = textsIn(mounted, "name");
        facts.volumes = statesOfPaths(paths);
        for (FolderState& volume : facts.volumes) {
            const auto first = std::find(paths.begin(), paths.end(), volume.path) - paths.begin();
            volume.name = static_cast<std::size_t>(first) < names.size() ? names[static_cast<std::size_t>(first)] : "";
        }
    }

    void takeFirstRound(CheckupFacts& facts, const std::vector<DiskAnswer>& answers)
    {
        const DiskAnswer& mounted = answers[0];
        const DiskAnswer& source = answers[1];
        const DiskAnswer& editor = answers[2];
        facts.volumesAnswered = mounted.has_value();
        facts.sourceAnswered = source.has_value();
        facts.editorAnswered = editor.has_value();
        facts.home = textIn(mounted, "home").value_or("");
        takeVolumes(facts, mounted);
        facts.sourceName = textIn(source, "name").value_or("");
        facts.projects = statesOfPaths(textsIn(source, "project"));
        facts.events = statesOfPaths(textsIn(source, "event"));
        facts.editorPath = textIn(editor, "path");
        facts.canLoad = textIn(editor, "canLoad").has_value();
        for (const std::string& domain : textsIn(source, "domain"))
            facts.preferences.push_back({ domain });
        facts.preferencesAsked = facts.preferences.size();
    }

    /// Libraries of the home folder's movies may lie in `videos` by mistake.
    void seekStrays(CheckupFacts& facts, const std::string& videos)
    {
        const std::string movies = platform::pathJoined(facts.home, "Movies");
        for (const auto* searched : { &facts.projects, &facts.events }) {
            if (searched->empty() || facts.home.empty() || videos.empty() || videos == movies)
                continue;
            const std::string& sought = searched->front().path;
            if (platform::pathByRemovingLastComponent(sought) != movies)
                continue;
            StrayLibrary& library = facts.strays.emplace_back();
            library.stray.path = platform::pathJoined(videos, platform::lastPathComponent(sought));
            library.sought.path = sought;
            library.movies.path = movies;
            library.videos = videos;
        }
    }

    std::vector<FolderState*> allStates(CheckupFacts& facts)
    {
        std::vector<FolderState*> states;
        for (auto* group : { &facts.volumes, &facts.projects, &facts.events }) {
            for (FolderState& state : *group)
                states.push_back(&state);
        }
        for (StrayLibrary& library : facts.strays)
            states.insert(states.end(), { &library.stray, &library.sought, &library.movies });
        return states;
    }

    void askForStates(CheckupFacts& facts, const AskDisks& ask)
    {
        const std::vector<FolderState*> states = allStates(facts);
        Questions questions;
        for (const FolderState* state : states)
            questions.push_back(wordsOf(DiskQuestion::folder, state->path));
        for (const DamagedPreferences& preferences : facts.preferences)
            questions.push_back(wordsOf(DiskQuestion::preferences, preferences.domain));
        const std::vector<DiskAnswer> answers = ask(questions);
        for (std::size_t index = 0; index < states.size(); ++index)
            *states[index] = stateOfAnswer(*states[index], answers[index]);
        for (std::size_t index = 0; index < facts.preferences.size(); ++index) {
            DamagedPreferences& preferences = facts.preferences[index];
            const DiskAnswer& answer = answers[states.size() + index];
            preferences.isSilent = !answer;
            preferences.problem = textIn(answer, "problem").value_or("");
            preferences.file = textIn(answer, "file").value_or("");
            preferences.isNotPermitted = textIn(answer, "notPermitted").has_value();
        }
        std::erase_if(facts.preferences,
            [](const DamagedPreferences& preferences) { return !preferences.isSilent && preferences.problem.empty(); });
        std::erase_if(facts.strays, [](const StrayLibrary& library) {
            return !library.stray.isThere() || library.stray.realPath == library.sought.realPath;
        });
    }

    void countFolders(CheckupFacts& facts, const AskDisks& ask)
    {
        std::vector<FolderState*> counted;
        Questions questions;
        for (const FolderState* folder : distinctSearchFolders(facts)) {
            if (folder->problem != platform::FileProblem::none)
                continue;
            counted.push_back(const_cast<FolderState*>(folder)); // it lies in `facts`
            questions.push_back(wordsOf(DiskQuestion::count, folder->path));
        }
        const std::vector<DiskAnswer> answers = ask(questions);
        for (std::size_t index = 0; index < counted.size(); ++index) {
            const std::string text = textIn(answers[index], "folders").value_or("0");
            std::uint64_t number = 0;
            std::from_chars(text.data(), text.data() + text.size(), number);
            counted[index]->folders = number;
            counted[index]->hasMore = !answers[index] || textIn(answers[index], "hasMore");
            counted[index]->closed = textsIn(answers[index], "closed");
            counted[index]->hasMoreClosed = textIn(answers[index], "hasMoreClosed").has_value();
        }
    }

} // namespace

std::vector<const FolderState*> distinctSearchFolders(const CheckupFacts& facts)
{
    std::vector<const FolderState*> distinct;
    for (const auto* searched : { &facts.projects, &facts.events }) {
        for (const FolderState& folder : *searched) {
            if (!folder.isThere())
                continue;
            const auto holdsIt
                = [&](const FolderState* other) { return isSameOrBelow(folder.realPath, other->realPath); };
            if (std::any_of(distinct.begin(), distinct.end(), holdsIt))
                continue;
            std::erase_if(
                distinct, [&](const FolderState* other) { return isSameOrBelow(other->realPath, folder.realPath); });
            distinct.push_back(&folder);
        }
    }
    return distinct;
}

std::uint64_t foldersToWatch(const CheckupFacts& facts)
{
    std::uint64_t count = 0;
    for (const FolderState* folder : distinctSearchFolders(facts)) {
        if (folder->means == FollowingMeans::reports)
            count += folder->folders.value_or(0);
    }
    return count;
}

CheckupFacts askForFacts(const AskDisks& ask)
{
    CheckupFacts facts;
    const std::vector<DiskAnswer> answers = ask({ wordsOf(DiskQuestion::volumes), wordsOf(DiskQuestion::source),
        wordsOf(DiskQuestion::editor), wordsOf(DiskQuestion::videos) });
    takeFirstRound(facts, answers);
    seekStrays(facts, textIn(answers[3], "folder").value_or(""));
    askForStates(facts, ask);
    countFolders(facts, ask);
    return facts;
}

} // namespace ombrix
