// "watch": the tree, and what becomes of it. Nothing is joined at the end, for a thread may wait for a disk that does
// not answer.
//
// The one surprise: the first thread only runs the main loop. Signals come to a thread of their own, so that the
// program ends when it is asked to, whatever the main loop waits for.

#include "apps/common/HostileNames.h"
#include "apps/common/StandardError.h"
#include "apps/common/Terminal.h"
#include "apps/ombrix/AbsolutePath.h"
#include "apps/ombrix/Commands.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/Seconds.h"
#include "apps/ombrix/WatchOutput.h"
#include "apps/ombrix/WatchText.h"
#include "host/OBConstants.h"
#include "host/OBMediaHost.h"
#include "platform/Clock.h"
#include "platform/FileSystem.h"
#include "platform/MainRunLoop.h"
#include "platform/Threads.h"
#include "platform/Volumes.h"

#include <algorithm>
#include <atomic>
#include <utility>

namespace ombrix {
namespace {

    using namespace std::chrono_literals;

    constexpr auto untilEndedByForce = 1s;
    constexpr auto patienceForWatches = 3s;

    struct Wishes {
        WatchForm form = WatchForm::lines;
        std::optional<std::chrono::nanoseconds> limit {};
        std::string problem {};
    };

    Wishes readWishes(const Arguments& arguments)
    {
        Wishes wishes;
        if (arguments.has("--changes"))
            wishes.form = WatchForm::changes;
        else if (arguments.has("--json"))
            wishes.form = WatchForm::documents;
        if (const std::string* const typed = arguments.valueOf("--for")) {
            wishes.limit = durationOfSeconds(*typed);
            if (!wishes.limit)
                wishes.problem = "option --for is a number of seconds, not \"" + *typed + "\"";
        }
        return wishes;
    }

    /// One watch, which its threads outlive by nothing: it is kept until the process ends.
    class Watch : public std::enable_shared_from_this<Watch> {
    public:
        Watch(Program& program, std::shared_ptr<OBMediaManager> manager, const Wishes& wishes)
            : _program(program)
            , _manager(std::move(manager))
            , _platform(_manager->platform())
            , _limit(wishes.limit)
            , _form(wishes.form)
        {
        }

        /// The exit status.
        int run()
        {
            _output = std::make_shared<WatchOutput>(_program, _manager, _form,
                WatchOutputHandlers { [this] { began(); }, [this] { _platform.mainRunLoop.quit(); } });
            if (!_output->start() || !endAfterSignal())
                return _program.fail(_program.arguments().command->name, "the system gives no thread");
            follow();
            load();
            _platform.mainRunLoop.run();
            _output->finish();
            return _status;
        }

    private:
        /// Before the load: what changes while it runs is not lost.
        void follow()
        {
            OBMediaHost& host = _program.session()->host();
            _mounts = _platform.volumes.watchMounts([output = _output] { output->look(); });
            _following = host.followChanges({ .stands = [output = _output] { output->look(); },
                .failed = [output = _output](
                              const platform::WatchingProblem& problem) { output->warn(pollingText(problem)); } });
            if (const auto home = _platform.fileSystem.homeFolder())
                host.pathWatcher().watchPath_observer(*home + std::string(OBZunoPrefsPath.substr(1)), _manager.get());
        }

        void load()
        {
            const OBExecutor atOnce = [](const std::function<void()>& call) { call(); };
            _publications
                = _manager->observe(atOnce, { .published = [output = _output](const OBPublication& publication) {
                      output->published(publication);
                  } });
            _manager->requestRootMediaGroup(atOnce, [watch = shared_from_this()](const OBLoadResult& result) {
                if (!result.rootMediaGroup)
                    watch->failLoad(result);
            });
        }

        void failLoad(const OBLoadResult& result)
        {
            _status = _program.failLoad(*_manager, result);
            _platform.mainRunLoop.quit();
        }

        void began()
        {
            _platform.mainRunLoop.performAfterDelay(patienceForWatches, platform::RunLoopModes::commonAndModalPanel,
                [output = _output] { output->waitNoLonger(); });
            if (_limit)
                endAfter([watch = shared_from_this()] {
                    return watch->_platform.clock.sleep(*watch->_limit, watch->_never);
                });
        }

        bool endAfterSignal()
        {
            return endAfter([] { return apps::waitForEndingSignal(); });
        }

        /// Ends the program once `wait` has answered true: with grace, or without when something hangs.
        bool endAfter(std::function<bool()> wait)
        {
            return _platform.threads.startDetached("watch end", [watch = shared_from_this(), wait = std::move(wait)] {
                if (!wait())
                    return;
                watch->_platform.mainRunLoop.quit();
                watch->_platform.clock.sleep(untilEndedByForce, watch->_never);
                apps::endProcess(done);
            });
        }

        Program& _program;
        const std::shared_ptr<OBMediaManager> _manager;
        const platform::Platform& _platform;
        const std::optional<std::chrono::nanoseconds> _limit;
        const WatchForm _form;
        std::shared_ptr<WatchOutput> _output;
        platform::WakeSignal _never;
        std::atomic<int> _status { done };
        std::shared_ptr<void> _mounts;
        OBObservation _following;
        OBObservation _publications;
    };

} // namespace

int runWatch(Program& program)
{
    const Wishes wishes = readWishes(program.arguments());
    if (!wishes.problem.empty())
        return program.failUsage("watch: " + wishes.problem);
    // From now on signals end it as they are to.
    program.keep(std::make_shared<apps::EndingSignalsHeld>());
    const std::shared_ptr<OBMediaManager> manager = program.loadableManager();
    if (!manager)
        return failed;
    leaveWorkingFolder();
    const auto watch = std::make_shared<Watch>(program, manager, wishes);
    program.keep(watch);
    return watch->run();
}

} // namespace ombrix
