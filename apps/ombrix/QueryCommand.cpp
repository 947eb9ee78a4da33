// "query": the files that an expression matches, printed as they are found. Loads nothing, so the editor need not be
// there.

#include "apps/common/LoadWatch.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/AbsolutePath.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/WatchText.h"
#include "host/OBMetadataQuery.h"
#include "platform/Clock.h"
#include "platform/FileProblemText.h"
#include "platform/MainRunLoop.h"
#include "platform/PathText.h"
#include "platform/ThreadSafety.h"

#include <optional>
#include <utility>

namespace ombrix {
namespace {

    using namespace std::chrono_literals;

    /// How long a reader waits at most for what has been found, while folders are walked.
    constexpr auto untilHandedOut = 100ms;

    struct Scope {
        std::string typed;
        std::string path; ///< absolute, else spelled as it was typed
    };

    /// What was asked for, or what is wrong with it.
    struct Wishes {
        std::shared_ptr<const OBMetadataQuery> query;
        std::vector<Scope> scopes;
        std::string problem;
    };

    Wishes readWishes(const std::vector<std::string>& operands)
    {
        Wishes wishes;
        if (operands.empty())
            wishes.problem = "EXPRESSION is missing (\"ombrix help query\")";
        else if (operands.size() == 1)
            wishes.problem = "SCOPE is missing (\"ombrix help query\")";
        if (!wishes.problem.empty())
            return wishes;
        OBMetadataQuery::ParseResult parsed = OBMetadataQuery::parse(operands[0]);
        wishes.query = std::move(parsed.query);
        wishes.problem = std::move(parsed.problem);
        for (std::size_t index = 1; index < operands.size(); ++index) {
            wishes.scopes.push_back({ operands[index], operands[index] });
            if (operands[index].empty() && wishes.problem.empty())
                wishes.problem = "\"\" is no path";
        }
        return wishes;
    }

    /// How far a gathering has come; told on one thread and read on another.
    class GatherProgress {
    public:
        explicit GatherProgress(const platform::Clock& clock)
            : _clock(clock)
        {
        }
        void enter(std::string_view folder)
        {
            const platform::Text path = folder;
            platform::Locked guard(_lock);
            _progress.foldersDone += _progress.isLoading ? 1 : 0;
            _progress.isLoading = true;
            _progress.pathAtWork = path;
            _progress.pathAtWorkSince = _clock.monotonic();
        }
        void find()
        {
            platform::Locked guard(_lock);
            ++_progress.itemsFound;
        }
        OBLoadProgress progress() const
        {
            platform::Locked guard(_lock);
            return _progress;
        }

    private:
        const platform::Clock& _clock;
        mutable platform::Mutex _lock;
        OBLoadProgress _progress GUARDED_BY(_lock);
    };

    /// Gathers a query's answers over one scope after the other and prints them.
    class Answers {
    public:
        Answers(Program& program, const OBMetadataQuery& query)
            : _program(program)
            , _query(query)
            , _platform(program.session()->platform())
            , _progress(std::make_shared<GatherProgress>(_platform.clock))
            , _handedOut(_platform.clock.monotonic())
        {
            _watch.emplace(
                apps::WatchedWork { _platform, [progress = _progress] { return progress->progress(); }, "hit" });
        }

        /// The exit status.
        int gather(const Scope& scope)
        {
            std::optional<platform::FileProblem> problem;
            const OBGatherObserver observer { [this](std::string_view folder) { enter(folder); },
                [this, &scope, &problem](std::string_view path, platform::FileProblem why) {
                    if (path == platform::pathWithoutTrailingSlashes(scope.path))
                        problem = why;
                    else
                        _unread.push_back({ std::string(path), why });
                } };
            _progress->enter(scope.path);
            _query.gather(
                _platform, scope.path, [this](std::string_view path) { take(path); },
                [this] { return !_program.output().problem().empty(); }, observer);
            return problem ? _program.fail(scope.typed, platform::textOfFileProblem(*problem)) : done;
        }

        void finish()
        {
            _watch.reset();
            if (_program.wantsJson())
                apps::printValue(_program.output(), std::move(_found));
            _program.output().flush();
            _program.warnOfUnreadFolders(_unread);
        }

    private:
        void enter(std::string_view folder)
        {
            _progress->enter(folder);
            const std::chrono::nanoseconds now = _platform.clock.monotonic();
            if (now - _handedOut < untilHandedOut)
                return;
            _handedOut = now;
            _program.output().flush();
        }

        void take(std::string_view path)
        {
            _progress->find();
            if (_program.wantsJson()) {
                _found.emplace_back(path);
                return;
            }
            // On a terminal the answers show how far it has come, and the two would stand in each other's way.
            if (_program.style().isTerminal())
                _watch.reset();
            if (_program.arguments().has("-0"))
                return _program.printPath(path);
            const apps::Style& style = _program.style();
            _program.printLine(style.plain(style.name(path), path));
        }

        Program& _program;
        const OBMetadataQuery& _query;
        const platform::Platform& _platform;
        const std::shared_ptr<GatherProgress> _progress;
        std::optional<apps::LoadWatch> _watch;
        std::chrono::nanoseconds _handedOut;
        platform::Value::List _found {}; // for JSON
        std::vector<OBLoadProblem> _unread {};
    };

    /// Makes relative scopes absolute; absolute ones keep their spelling. The exit status.
    int makeAbsolute(Program& program, std::vector<Scope>& scopes)
    {
        for (Scope& scope : scopes) {
            if (scope.path.front() == '/')
                continue;
            const std::optional<std::string> absolute = absolutePath(scope.path);
            if (!absolute)
                return program.fail(scope.typed, noCurrentFolder);
            scope.path = *absolute;
        }
        return done;
    }

    int answerOnce(Program& program, const Wishes& wishes)
    {
        Answers answers(program, *wishes.query);
        int status = done;
        for (const Scope& scope : wishes.scopes)
            status = std::max(status, answers.gather(scope));
        answers.finish();
        return status;
    }

    /// Prints what a live query answers: what is there first, then what comes and goes. The calls come one at a time.
    class LiveAnswers {
    public:
        explicit LiveAnswers(Program& program)
            : _program(program)
            , _platform(program.session()->platform())
            , _handedOut(_platform.clock.monotonic())
        {
        }

        void found(std::string_view path)
        {
            print({}, path);
            const std::chrono::nanoseconds now = _platform.clock.monotonic();
            if (now - _handedOut < untilHandedOut)
                return;
            _handedOut = now;
            handOut();
        }
        void gathered()
        {
            _isGathered = true;
            for (const auto& [sign, path] : std::exchange(_waiting, {}))
                print(sign, path);
            handOut();
        }
        /// A scope that has been gathered already may change while another is being gathered.
        void changed(std::string_view sign, std::string_view path)
        {
            if (!_isGathered) {
                _waiting.emplace_back(sign, path);
                return;
            }
            print(sign, path);
            handOut();
        }

    private:
        void print(std::string_view sign, std::string_view path)
        {
            _program.output().write(sign);
            if (_program.arguments().has("-0"))
                return _program.printPath(path);
            const apps::Style& style = _program.style();
            _program.printLine(style.plain(style.name(path), path));
        }
        void handOut()
        {
            _program.output().flush();
            if (!_program.output().problem().empty())
                _platform.mainRunLoop.quit();
        }

        Program& _program;
        const platform::Platform& _platform;
        std::chrono::nanoseconds _handedOut;
        bool _isGathered = false;
        std::vector<std::pair<std::string_view, std::string>> _waiting {};
    };

    /// Until it is interrupted, or nobody takes the answers.
    int answerLive(Program& program, const Wishes& wishes)
    {
        leaveWorkingFolder();
        std::vector<std::string> scope;
        for (const Scope& one : wishes.scopes)
            scope.emplace_back(platform::pathWithoutTrailingSlashes(one.path));
        const auto answers = std::make_shared<LiveAnswers>(program);
        const OBLiveQueryHandlers handlers {
            .found = [answers](std::string_view path) { answers->found(path); },
            .gathered = [answers] { answers->gathered(); },
            .came = [answers](std::string_view path) { answers->changed("+", path); },
            .went = [answers](std::string_view path) { answers->changed("-", path); },
            .failed = [&program](const platform::WatchingProblem& problem) { program.warn(pollingText(problem)); },
        };
        OBMediaHost& host = program.session()->host();
        program.keep(std::make_shared<OBObservation>(host.followQuery(wishes.query, scope, handlers)));
        program.session()->platform().mainRunLoop.run();
        return done;
    }

} // namespace

int runQuery(Program& program)
{
    Wishes wishes = readWishes(program.arguments().operands);
    if (!wishes.problem.empty())
        return program.failUsage("query: " + wishes.problem);
    if (const int status = makeAbsolute(program, wishes.scopes); status != done)
        return status;
    if (!program.session())
        return failed;
    return program.arguments().has("--live") ? answerLive(program, wishes) : answerOnce(program, wishes);
}

} // namespace ombrix
