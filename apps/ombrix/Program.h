#pragma once

#include "apps/common/Output.h"
#include "apps/common/Session.h"
#include "apps/common/Style.h"
#include "apps/common/Terminal.h"
#include "apps/common/TreeLoad.h"
#include "apps/ombrix/Arguments.h"
#include "apps/ombrix/TextLine.h"

#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ombrix {

/// What the program answers to whoever started it.
enum ExitStatus : int { done = 0, failed = 1, wrongUsage = 2 };

/// One run of the program: what was typed, where results go, and the machine and tree once a command asks for them.
class Program {
public:
    explicit Program(Arguments arguments);

    const Arguments& arguments() const { return _arguments; }
    /// Whether results are to be JSON.
    bool wantsJson() const { return _arguments.has("--json"); }
    apps::Output& output() { return _output; }
    /// The look of standard output.
    const apps::Style& style() const { return _style; }
    /// Columns of the terminal that standard output is; absent for a pipe or file, whose lines are as long as needed.
    std::optional<int> columns() const;

    /// Prints one line of standard output.
    void printLine(std::string_view line);
    /// Prints a laid-out text that begins at `column` after `before`, in as many lines as the terminal needs for it.
    void printWrapped(
        const TextLine& before, int column, std::string_view laidOut, TextLine::Look look = TextLine::Look::plain);
    /// Prints a path from disk: escaped on a terminal, and ended with a zero byte where that is asked for.
    void printPath(std::string_view path);
    /// Says on standard error what could not be done; answers the exit status.
    int fail(std::string_view place, std::string_view what) const;
    /// The same of a group that nothing typed finds; `what` says what was taken for its name.
    int failGroup(std::string_view typed, std::string_view what, std::string_view suggestion) const;
    int failUsage(std::string_view what) const;
    /// A remark on standard error that leaves the result as it is.
    void warn(std::string_view what) const;

    /// The machine with the framework on it; null after having said why there is none.
    apps::Session* session();
    /// The source's manager; null after having said why.
    std::shared_ptr<OBMediaManager> manager();
    /// The source's class, without a manager; null after having said why.
    const OBMediaManagerClass* managerClass();
    /// The source's manager, which can load now; null after having said why.
    std::shared_ptr<OBMediaManager> loadableManager();
    /// Loads the tree once, with `observer` told what the scan decides; null after having said why there is none.
    OBMediaGroupRef load(const std::shared_ptr<OBScanObserver>& observer = nullptr);
    /// Says why a load by `manager` gave no tree; answers the exit status.
    int failLoad(OBMediaManager& manager, const OBLoadResult& result) const;
    /// Where `load` has been: how long it took.
    std::chrono::nanoseconds loadDuration() const { return _loadDuration; }
    /// A group, or the exit status after having said why there is none.
    struct GroupAnswer {
        OBMediaGroupRef group;
        int status = done;
    };
    /// Loads, and answers the first group with the ID in option --group.
    GroupAnswer loadGroupOfOption();
    /// One line about the folders that the load could not read; empty when there are none.
    std::string unreadFoldersText();
    /// Warns in one line of the folders that the load could not read.
    void warnOfUnreadFolders();
    /// Warns likewise of these folders.
    void warnOfUnreadFolders(const std::vector<OBLoadProblem>& folders) const;

    /// Keeps what threads may still use when the program ends: nothing is torn down then.
    void keep(std::shared_ptr<void> used) { _kept.push_back(std::move(used)); }

    /// Hands out what was printed; answers `status`, or that of a failed write, having said so.
    int finish(int status);

private:
    const Arguments _arguments;
    apps::Output _output;
    const apps::Style _style;
    std::unique_ptr<apps::Session> _session;
    std::chrono::nanoseconds _loadDuration {};
    std::vector<std::shared_ptr<void>> _kept;
};

} // namespace ombrix
