#include "apps/ombrix/WatchOutput.h"

#include "apps/common/HostileNames.h"
#include "apps/common/RecordJson.h"
#include "apps/ombrix/Program.h"
#include "apps/ombrix/WatchText.h"
#include "host/OBConstants.h"
#include "host/OBSourceInspection.h"
#include "platform/Clock.h"
#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/PathWatching.h"
#include "platform/Threads.h"

#include <utility>

using platform::Locked;

namespace ombrix {
namespace {

    /// Each keeps a tree.
    constexpr std::size_t mostPending = 16;

    std::optional<bool> newestFirst(OBMediaManager& manager)
    {
        const OBSourceInspection* const inspection = manager.inspection();
        return inspection ? inspection->mostRecentEventFirst() : std::nullopt;
    }

} // namespace

WatchOutput::WatchOutput(
    Program& program, std::shared_ptr<OBMediaManager> manager, WatchForm form, WatchOutputHandlers handlers)
    : _program(program)
    , _manager(std::move(manager))
    , _platform(_manager->platform())
    , _form(form)
    , _handlers(std::move(handlers))
    , _newestFirst(newestFirst(*_manager))
    , _volumesOfTree(_platform)
    , _volumes(_platform)
{
    _loadWatch.emplace(_manager);
}

bool WatchOutput::start()
{
    {
        Locked guard(_lock);
        _runs = true;
    }
    if (_platform.threads.startDetached("watch output", [output = shared_from_this()] { output->run(); }))
        return true;
    Locked guard(_lock);
    _runs = false;
    return false;
}

void WatchOutput::finish()
{
    Locked guard(_lock);
    _isToEnd = true;
    _changed.notifyAll();
    while (_runs)
        _changed.wait(_lock);
}

/// The tree is taken as it is now, by one thread after the other: the last one to come sees what all have done.
void WatchOutput::published(const OBPublication& publication)
{
    Locked guard(_lock);
    const OBMediaGroupRef root = _manager->rootMediaGroup();
    if (_work.shown.size() == mostPending)
        _work.shown.pop_back();
    _work.shown.push_back({ publication, root->copy() });
    _changed.notifyAll();
}

void WatchOutput::warn(std::string text)
{
    Locked guard(_lock);
    if (_work.warnings.size() == mostPending)
        return;
    _work.warnings.push_back(std::move(text));
    _changed.notifyAll();
}

void WatchOutput::look()
{
    Locked guard(_lock);
    _work.looks = true;
    _changed.notifyAll();
}

void WatchOutput::waitNoLonger()
{
    Locked guard(_lock);
    _work.looks = true;
    _work.waitsNoLonger = true;
    _changed.notifyAll();
}

void WatchOutput::watchedPathChanged_fileChangedEventFlags(std::string_view, std::uint64_t)
{
    Locked guard(_lock);
    _work.asksForOrder = true;
    _changed.notifyAll();
}

void WatchOutput::run()
{
    Work work;
    while (takeWork(work)) {
        perform(work);
        if (_program.output().problem().empty())
            continue;
        _handlers.failed();
        break;
    }
    _loadWatch.reset();
    Locked guard(_lock);
    _runs = false;
    _changed.notifyAll();
}

bool WatchOutput::takeWork(Work& work)
{
    Locked guard(_lock);
    const auto isEmpty = [](const Work& next) {
        return next.shown.empty() && next.warnings.empty() && !next.looks && !next.asksForOrder;
    };
    while (isEmpty(_work) && !_isToEnd)
        _changed.wait(_lock);
    work = std::exchange(_work, {});
    return !isEmpty(work);
}

void WatchOutput::perform(const Work& work)
{
    for (const Shown& shown : work.shown) {
        if (_hasBegun)
            goOn(shown);
        else
            begin(shown);
    }
    for (const std::string& text : work.warnings)
        tellWarning(text);
    if (!_hasBegun)
        return;
    tellUnsearchedFolders();
    if (work.asksForOrder)
        tellOrder();
    if (work.waitsNoLonger || _program.session()->host().pathWatcher().pathsStand())
        tellWhatIsFollowed();
}

void WatchOutput::begin(const Shown& first)
{
    _loadWatch.reset();
    _hasBegun = true;
    if (_form != WatchForm::lines)
        apps::printGroup(_program.output(), first.root);
    _program.output().flush();
    if (_form != WatchForm::documents)
        _last = OBTreeSnapshot(first.root);
    _program.warnOfUnreadFolders();
    watchPreferences();
    _handlers.began();
}

/// The source need not watch what its order is read from, and the file need not exist yet: their folder is watched.
void WatchOutput::watchPreferences()
{
    const auto home = _platform.fileSystem.homeFolder();
    if (!home || _form != WatchForm::lines)
        return;
    const std::string preferences = *home + std::string(OBZunoPrefsPath.substr(1));
    _program.session()->host().pathWatcher().watchPath_observer(
        platform::pathByRemovingLastComponent(preferences), this);
}

void WatchOutput::goOn(const Shown& next)
{
    tellOverflows();
    if (_form == WatchForm::documents)
        apps::printGroup(_program.output(), next.root);
    else
        tellChanges(next);
    _program.output().flush();
}

void WatchOutput::tellChanges(const Shown& next)
{
    const OBTreeSnapshot before = std::exchange(_last, OBTreeSnapshot(next.root));
    const OBTreeChanges changes = OBTreeChanges::between(before, _last);
    const OBPublication& publication = next.publication;
    if (_form == WatchForm::changes)
        return apps::printChanges(_program.output(), changes, publication.part, publication.cause.text);
    tellWhatIsFollowed();
    const VolumeChanges volumes = _volumesOfTree.look();
    const apps::Style& style = _program.style();
    _program.printLine(watchLine(style, _program.columns(), _platform.clock.now(),
        publication.part.empty() ? "load" : style.name(publication.part), changesText(changes, style),
        circumstancesText(publication, changes, volumes, style))
                           .text());
}

void WatchOutput::tellOverflows()
{
    const std::uint64_t overflows = _platform.pathWatching.state().overflows;
    if (std::exchange(_overflows, overflows) != overflows)
        tellWarning("change queue overflowed; both halves are scanned again, nothing is missing");
}

/// Once, and only to people.
void WatchOutput::tellWhatIsFollowed()
{
    if (_form != WatchForm::lines || std::exchange(_isFollowingTold, true))
        return;
    constexpr std::string_view hint = "Ctrl-C ends";
    const std::optional<int> columns = _program.columns();
    _program.printLine(watchLine(_program.style(), columns, _platform.clock.now(), "watching",
        followedText(countOfSearchFolders(), _platform.pathWatching.state()), columns ? hint : std::string_view())
                           .text());
    _program.output().flush();
}

std::optional<std::size_t> WatchOutput::countOfSearchFolders() const
{
    OBSourceInspection* const inspection = _manager->inspection();
    if (!inspection)
        return std::nullopt;
    return inspection->projectSearchPaths().size() + inspection->eventSearchPaths().size();
}

/// Where projects are sought is settled when the source first loads.
void WatchOutput::tellUnsearchedFolders()
{
    OBSourceInspection* const inspection = _manager->inspection();
    for (const WatchedVolume& volume : _volumes.look().came) {
        if (!inspection)
            return;
        for (const std::string& folder :
            unsearchedFoldersOn(volume, inspection->projectSearchPaths(), _platform.fileSystem))
            tellWarning(folder + " was absent at the start: a restart shows its projects");
    }
}

/// What a restart would show is what a manager tells that is made now.
void WatchOutput::tellOrder()
{
    const OBManagerResult fresh = _program.session()->host().createManager(_program.session()->source());
    if (!fresh.manager)
        return;
    const std::optional<bool> order = newestFirst(*fresh.manager);
    if (std::exchange(_newestFirst, order) != order)
        tellWarning("the editor's order of events changed: a restart shows it");
}

void WatchOutput::tellWarning(const std::string& text)
{
    if (_form != WatchForm::lines)
        return _program.warn(text);
    const apps::Style& style = _program.style();
    _program.printLine(watchLine(style, _program.columns(), _platform.clock.now(), "warning", style.name(text)).text());
    _program.output().flush();
}

} // namespace ombrix
