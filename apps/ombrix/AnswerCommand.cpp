// What the program asks of itself in a process of its own, because a disk may never answer.

#include "apps/ombrix/Arguments.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/DiskQuestions.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/SearchFolders.h"
#include "host/OBSourceInspection.h"
#include "platform/Clock.h"
#include "platform/ForbiddingFolder.h"
#include "platform/PathText.h"
#include "platform/Preferences.h"
#include "platform/Volumes.h"
#include "platform/Workspace.h"

namespace ombrix {
namespace {

    constexpr std::size_t mostClosedTold = 5;

    using Answer = std::vector<std::pair<std::string, std::string>>;

    void addTexts(Answer& answer, const std::string& name, const std::vector<std::string>& texts)
    {
        for (const std::string& text : texts)
            answer.emplace_back(name, text);
    }

    Answer tellVolumes(const platform::Platform& machine)
    {
        Answer answer;
        std::vector<std::string> volumes = machine.volumes.localVolumes();
        for (std::string& medium : machine.volumes.removableMedia())
            volumes.push_back(std::move(medium));
        for (const std::string& volume : volumes) {
            answer.emplace_back("volume", volume);
            answer.emplace_back("name", machine.volumes.displayName(volume));
        }
        if (const std::optional<std::string> home = machine.fileSystem.homeFolder())
            answer.emplace_back("home", *home);
        return answer;
    }

    Answer tellSource(OBMediaManager& manager)
    {
        Answer answer { { "name", manager.displayName().string() } };
        if (OBSourceInspection* inspection = manager.inspection()) {
            addTexts(answer, "project", inspection->projectSearchPaths());
            addTexts(answer, "event", inspection->eventSearchPaths());
            addTexts(answer, "domain", inspection->preferencesDomains());
        }
        return answer;
    }

    Answer tellEditor(OBMediaManager& manager)
    {
        Answer answer;
        if (const platform::Text path = manager.getAppPath())
            answer.emplace_back("path", path.string());
        if (manager.canLoadData())
            answer.emplace_back("canLoad", "");
        return answer;
    }

    Answer tellVideos(const platform::Platform& machine)
    {
        const std::optional<std::string> folder = machine.workspace.videosFolder();
        return folder ? Answer { { "folder", *folder } } : Answer {};
    }

    /// The problem begins with the file's path, which ends with the domain and the extension.
    Answer tellPreferences(const platform::Platform& machine, const std::string& domain)
    {
        const std::string problem = machine.preferences.valuesOfDomain(domain).problem;
        const std::string name = "/" + domain + ".plist";
        const std::size_t at = problem.rfind(name);
        if (problem.empty() || at == problem.npos)
            return problem.empty() ? Answer {} : Answer { { "problem", problem } };
        const std::string file = problem.substr(0, at + name.size());
        Answer answer { { "problem", problem }, { "file", file } };
        if (machine.fileSystem.openPlainFile(file).problem == platform::FileProblem::notPermitted)
            answer.emplace_back("notPermitted", "");
        return answer;
    }

    Answer tellFolder(const platform::Platform& machine, const OBMediaManagerClass& source, const std::string& path)
    {
        const platform::FileSystem& files = machine.fileSystem;
        FolderState state;
        state.problem = searchProblem(files, path);
        if (state.problem == platform::FileProblem::notPermitted)
            state.blockedAt = platform::folderThatForbids(files, path);
        state.realPath = files.resolvedPath(path);
        state.fileSystem = machine.volumes.fileSystemType(path).value_or("");
        state.isFit = source.validDiskFormat(path);
        state.means = machine.pathWatching.meansOfFollowing(path);
        return answerOfState(state);
    }

    /// Counts folder by folder, links not followed, and ends before whoever asked gives up.
    Answer countFolders(const platform::Platform& machine, const std::string& path)
    {
        const std::chrono::nanoseconds end = machine.clock.monotonic() + untilSilent - std::chrono::milliseconds(500);
        std::vector<std::string> left { path };
        std::vector<std::string> closed;
        std::uint64_t count = 0;
        while (!left.empty() && machine.clock.monotonic() < end) {
            const std::string folder = std::move(left.back());
            left.pop_back();
            const platform::FolderListing listing = machine.fileSystem.itemsInFolder(folder, {});
            count += listing.problem() == platform::FileProblem::none ? 1 : 0;
            if (listing.problem() == platform::FileProblem::notPermitted)
                closed.push_back(folder);
            for (std::size_t index = 0; index < listing.size(); ++index) {
                const platform::FolderItem item = listing[index];
                if (item.kind == platform::ItemKind::folder)
                    left.push_back(platform::pathJoined(folder, item.name));
            }
        }
        Answer answer { { "folders", std::to_string(count + left.size()) } };
        if (!left.empty())
            answer.emplace_back("hasMore", "");
        if (closed.size() > mostClosedTold) {
            closed.resize(mostClosedTold);
            answer.emplace_back("hasMoreClosed", "");
        }
        addTexts(answer, "closed", closed);
        return answer;
    }

    std::optional<Answer> answerWithManager(Program& program, DiskQuestion question)
    {
        const std::shared_ptr<OBMediaManager> manager = program.manager();
        if (!manager)
            return std::nullopt;
        return question == DiskQuestion::source ? tellSource(*manager) : tellEditor(*manager);
    }

    std::optional<Answer> answerTo(Program& program, DiskQuestion question, const std::string& about)
    {
        apps::Session* session = program.session();
        const OBMediaManagerClass* source = session ? program.managerClass() : nullptr;
        if (!source)
            return std::nullopt;
        const platform::Platform& machine = session->platform();
        switch (question) {
        case DiskQuestion::volumes:
            return tellVolumes(machine);
        case DiskQuestion::source:
        case DiskQuestion::editor:
            return answerWithManager(program, question);
        case DiskQuestion::videos:
            return tellVideos(machine);
        case DiskQuestion::preferences:
            return tellPreferences(machine, about);
        case DiskQuestion::folder:
            return tellFolder(machine, *source, about);
        case DiskQuestion::count:
            return countFolders(machine, about);
        }
        return std::nullopt;
    }

} // namespace

int runAnswer(Program& program)
{
    const auto asked = questionOfWords(program.arguments().operands);
    if (!asked)
        return program.failUsage(unknownCommand("answer"));
    const std::optional<Answer> answer = answerTo(program, asked->first, asked->second);
    if (!answer)
        return failed;
    program.output().write(bytesOfAnswer(*answer));
    return done;
}

} // namespace ombrix
