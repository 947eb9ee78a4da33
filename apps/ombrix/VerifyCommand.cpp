// "verify": follows changes, and in the end compares what is installed with what a process of its own loads.
//
// The one surprise: a difference counts only when nothing was published since the trees were printed. Else the disks
// have changed between the two, and both are looked at again.

#include "apps/common/ChildProcess.h"
#include "apps/common/HumanText.h"
#include "apps/common/RecordJson.h"
#include "apps/common/StandardError.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/FollowedTree.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/Seconds.h"
#include "apps/ombrix/SuggestedCommand.h"
#include "apps/ombrix/Verification.h"
#include "host/OBGroupWalk.h"
#include "host/OBSourceInspection.h"
#include "platform/MainRunLoop.h"
#include "platform/Threads.h"

#include <unordered_map>
#include <utility>

namespace ombrix {
namespace {

    using platform::Value;

    constexpr int comparisonsAtMost = 5;

    /// What was seen of the movies of a tree, by their paths.
    class SeenMovies {
    public:
        explicit SeenMovies(OBMediaGroupRef root)
            : _root(std::move(root))
        {
        }

        std::optional<platform::FileFacts> factsOf(const std::string& path)
        {
            if (_root)
                collect(std::exchange(_root, nullptr));
            const auto known = _facts.find(path);
            return known == _facts.end() ? std::nullopt : known->second;
        }

    private:
        void collect(const OBMediaGroupRef& root)
        {
            OBWalkGroups(root, [this](const OBMediaGroupRef& group, const OBGroupPlace&) {
                group->ownMediaObjects().visit([this](const OBMediaObject& object) {
                    if (const auto facts = object.fileFacts())
                        _facts.emplace(object.path().string(), facts);
                    return true;
                });
                return true;
            });
        }

        OBMediaGroupRef _root;
        std::unordered_map<std::string, std::optional<platform::FileFacts>> _facts {};
    };

    std::string printed(const OBMediaGroupRef& root)
    {
        std::string text;
        {
            apps::Output output(text);
            apps::printGroup(output, root);
            output.flush();
        }
        return text;
    }

    class Verifier : public std::enable_shared_from_this<Verifier> {
    public:
        Verifier(
            Program& program, std::shared_ptr<OBMediaManager> manager, std::optional<std::chrono::nanoseconds> limit)
            : _program(program)
            , _host(program.session()->host())
            , _platform(program.session()->platform())
            , _tree(std::make_shared<FollowedTree>(_host, std::move(manager)))
            , _limit(limit)
        {
        }

        /// The exit status.
        int run()
        {
            compareAfterSignal();
            _tree->start([self = shared_from_this()](const OBLoadResult& result) { self->loaded(result); });
            _platform.mainRunLoop.run();
            return _status;
        }

    private:
        /// Until then signals wait; from then on they end the program as they always do.
        void compareAfterSignal()
        {
            _held.emplace();
            _platform.threads.startDetached("signals", [self = shared_from_this()] {
                if (!apps::waitForEndingSignal())
                    return;
                self->_platform.mainRunLoop.post([self] {
                    self->_held.reset();
                    self->_isToCompare = true;
                    if (self->_isLoaded)
                        self->settle();
                });
            });
        }

        void loaded(const OBLoadResult& result)
        {
            if (!result.rootMediaGroup) {
                _status = _program.failLoad(_tree->manager(), result);
                return _platform.mainRunLoop.quit();
            }
            _isLoaded = true;
            if (!_program.wantsJson() && !_limit) {
                _program.printLine("following changes; Ctrl-C compares and ends");
                _program.output().flush();
            }
            if (_isToCompare)
                settle();
            else if (_limit)
                _platform.mainRunLoop.performAfterDelay(
                    *_limit, platform::RunLoopModes::common, [self = shared_from_this()] { self->settle(); });
        }

        void settle()
        {
            if (std::exchange(_isSettling, true))
                return;
            _tree->settle([self = shared_from_this()](bool isQuiet) { self->compare(isQuiet); });
        }

        void compare(bool isQuiet)
        {
            _isSettling = false;
            const bool isConfirmed = _last && _tree->publications() == _publicationsCompared;
            if (isConfirmed || (_last && ++_comparisons >= comparisonsAtMost))
                return finish();
            _publicationsCompared = _tree->publications();
            _last = verification();
            if (!isQuiet)
                _last->notes.emplace_back("changes did not come to an end while the trees were compared");
            if (_last->problem.empty() && !_last->differences.empty())
                settle();
            else
                finish();
        }

        Verification verification()
        {
            const OBMediaGroupRef root = _tree->manager().rootMediaGroup();
            std::string followed = printed(root);
            const apps::ChildAnswer fresh = runProgram({ "tree", "--json" });
            if (fresh.end == apps::ChildAnswer::End::exited && fresh.status == done) {
                SeenMovies seen(root);
                FollowedSource source = followedSource();
                source.seenFacts = [&seen](const std::string& path) { return seen.factsOf(path); };
                return compareTrees(std::move(followed), fresh.output, source, _platform.fileSystem);
            }
            Verification nothing;
            if (!_tree->manager().canLoadData())
                nothing.notes.emplace_back("the editor is missing now, so there is no fresh load to compare with");
            else
                nothing.problem = "the fresh load failed: " + fresh.errors.substr(0, fresh.errors.find('\n'));
            return nothing;
        }

        apps::ChildAnswer runProgram(std::vector<std::string> words)
        {
            for (std::string& argument : machineArguments(_program.arguments()))
                words.push_back(std::move(argument));
            return apps::runChildren({ { apps::thisProgram(), std::move(words), {} } }, 1).front();
        }

        FollowedSource followedSource()
        {
            FollowedSource source;
            OBMediaManager& manager = _tree->manager();
            source.watchedPaths = _host.pathWatcher().pathsWatchedBy(&manager);
            if (OBSourceInspection* inspection = manager.inspection()) {
                source.projectFolders = inspection->projectSearchPaths();
                source.eventFolders = inspection->eventSearchPaths();
            }
            if (const std::optional<bool> newestFirst = _tree->scannedNewestFirst()) {
                const std::string wanted
                    = *newestFirst ? "\"mostRecentEventFirst\":true" : "\"mostRecentEventFirst\":false";
                const apps::ChildAnswer info = runProgram({ "info", "--json" });
                source.hasOrderChanged = info.status == done && info.output.find(wanted) == std::string::npos;
            }
            return source;
        }

        void finish()
        {
            const bool isEqual = _last->problem.empty() && _last->differences.empty();
            _status = isEqual ? done : failed;
            if (!_last->problem.empty())
                _status = _program.fail(_tree->manager().displayName(), _last->problem);
            else if (_program.wantsJson())
                printJson(isEqual);
            else
                printText(isEqual);
            _platform.mainRunLoop.quit();
        }

        void printJson(bool isEqual)
        {
            Value::List differences;
            for (const std::string& difference : _last->differences)
                differences.emplace_back(std::string_view(difference));
            apps::printValue(_program.output(),
                Value::Dictionary { { "equal", isEqual }, { "differences", std::move(differences) } });
        }

        void printText(bool isEqual)
        {
            const std::string trees = apps::quantityText(_last->groups, "group") + ", "
                + apps::quantityText(_last->movies, "movie") + ", "
                + apps::quantityText(_tree->publications(), "publication");
            print("", isEqual ? "equal to a fresh load: " + trees : "not equal to a fresh load: " + trees,
                TextLine::Look::plain);
            for (const std::string& difference : _last->differences)
                print("FAIL", difference, TextLine::Look::failure);
            for (const std::string& note : _last->notes)
                print("note", note, TextLine::Look::dim);
        }

        void print(std::string_view label, const std::string& text, TextLine::Look look)
        {
            constexpr int textStart = 6;
            TextLine line(_program.style(), _program.columns());
            line.add(0, label, look);
            _program.printWrapped(line, label.empty() ? 0 : textStart, _program.style().name(text));
        }

        Program& _program;
        OBMediaHost& _host;
        const platform::Platform& _platform;
        const std::shared_ptr<FollowedTree> _tree;
        const std::optional<std::chrono::nanoseconds> _limit;
        std::optional<apps::EndingSignalsHeld> _held {};
        bool _isLoaded = false;
        bool _isToCompare = false;
        bool _isSettling = false;
        std::optional<Verification> _last {};
        std::uint64_t _publicationsCompared = 0;
        int _comparisons = 0;
        int _status = failed;
    };

} // namespace

int runVerify(Program& program)
{
    std::optional<std::chrono::nanoseconds> limit;
    if (const std::string* typed = program.arguments().valueOf("--for")) {
        limit = durationOfSeconds(*typed);
        if (!limit)
            return program.failUsage("verify: option --for is a number of seconds, not \"" + *typed + "\"");
    }
    const std::shared_ptr<OBMediaManager> manager = program.loadableManager();
    return manager ? std::make_shared<Verifier>(program, manager, limit)->run() : failed;
}

} // namespace ombrix
