#include "host/OBMediaManager.h"

#include "host/ManagerState.h"
#include "host/OrderedWork.h"
#include "host/WorkCause.h"
#include "platform/Clock.h"
#include "platform/FileSystem.h"
#include "platform/MainRunLoop.h"
#include "platform/Preferences.h"

#include <exception>
#include <utility>

using platform::Text;
using platform::Value;

OBMediaManager::OBMediaManager(const OBManagerContext& context)
    : _state(std::make_unique<ManagerState>(*this, context))
{
}

/// A call that was in flight when the manager ended may have registered since.
OBMediaManager::~OBMediaManager()
{
    _state->core->pathWatcher().removeObserver(this);
}

bool OBMediaManager::init()
{
    return true;
}

void OBMediaManager::dealloc() { }

void OBMediaManager::loadData()
{
    _state->loadDataCalled();
}

OBMediaGroupRef OBMediaManager::performLoadData()
{
    return nullptr;
}

void OBMediaManager::rootMediaGroupInstalled(const OBMediaGroupRef&) { }

bool OBMediaManager::canLoadData()
{
    return true;
}

OBMediaGroupList OBMediaManager::mediaGroups()
{
    return {};
}

OBMediaGroupList OBMediaManager::movieGroups()
{
    return {};
}

Text OBMediaManager::displayName()
{
    return {};
}

OBImageRef OBMediaManager::displayImage()
{
    return nullptr;
}

Text OBMediaManager::uniqueID()
{
    return pluginIdentifier();
}

Text OBMediaManager::rootMediaGroupTitle()
{
    return {};
}

OBImageRef OBMediaManager::rootMediaGroupIcon()
{
    return nullptr;
}

int OBMediaManager::mediaTypesSupported()
{
    return 0;
}

Text OBMediaManager::applicationVersion()
{
    return {};
}

bool OBMediaManager::appInstalled()
{
    return !getAppPath().isAbsent();
}

Text OBMediaManager::getAppPath()
{
    return {};
}

Text OBMediaManager::defaultNoDataMessage(const OBMediaGroupRef&)
{
    return {};
}

OBMenuRef OBMediaManager::contextMenuForMediaObject_inMediaGroup(const OBMediaObjectRef&, const OBMediaGroupRef&)
{
    return nullptr;
}

OBMenuRef OBMediaManager::contextMenuForMediaGroup(const OBMediaGroupRef&)
{
    return nullptr;
}

OBSourceInspection* OBMediaManager::inspection()
{
    return nullptr;
}

OBMediaGroupRef OBMediaManager::rootMediaGroup() const
{
    return _state->root.load();
}

bool OBMediaManager::setRootMediaGroup(const OBMediaGroupRef& group)
{
    return _state->publishRoot(group);
}

bool OBMediaManager::isCancelLoadRequestPending() const noexcept
{
    return _state->gate.isCancelPending();
}

bool OBMediaManager::firstTimeCallingLoadData() const
{
    return _state->firstLoadData();
}

void OBMediaManager::setNeedsReload(bool needsReload)
{
    _state->setNeedsReload(needsReload);
}

void OBMediaManager::setAutoReloadEnabled(bool enabled)
{
    _state->setAutoReload(enabled);
}

void OBMediaManager::setLoadThreadPriority(double priority)
{
    _state->loadThreadPriority = priority;
}

double OBMediaManager::loadThreadPriority() const
{
    return _state->loadThreadPriority;
}

const OBBundle& OBMediaManager::pluginBundle() const
{
    return *_state->bundle;
}

Text OBMediaManager::pluginIdentifier() const
{
    return _state->bundle->identifier();
}

Text OBMediaManager::localizedString(std::string_view key) const
{
    return _state->bundle->localizedString(key);
}

const platform::Platform& OBMediaManager::platform() const
{
    return _state->core->platform();
}

Value OBMediaManager::preferencesOfDomain(std::string_view domain)
{
    platform::PreferencesAnswer answer = platform().preferences.valuesOfDomain(domain);
    if (!answer.problem.empty())
        _state->core->logOnce(answer.problem, this);
    return std::move(answer.values);
}

platform::FolderListing OBMediaManager::listFolder(const Text& path, const platform::ListingRequest& request)
{
    platform::FolderListing listing = readFolder(path, request);
    noteFolderRead(path, listing.problem());
    return listing;
}

platform::FolderListing OBMediaManager::readFolder(const Text& path, const platform::ListingRequest& request)
{
    _state->beginPath(path);
    platform::FolderListing listing = platform().fileSystem.itemsInFolder(path, request);
    noteFoldersDone(1);
    return listing;
}

void OBMediaManager::noteFolderRead(const Text& path, platform::FileProblem problem)
{
    using platform::FileProblem;
    switch (problem) {
    case FileProblem::none:
    case FileProblem::missing:
    case FileProblem::notAFolder:
        break;
    case FileProblem::pathTooLong:
        _state->core->logOnce(path.string() + ": listed as empty: the path is too long for the system", this);
        [[fallthrough]];
    default:
        _state->noteProblem(path, problem);
    }
}

void OBMediaManager::noteFoldersDone(std::uint64_t count)
{
    _state->progress.foldersDone.fetch_add(count, std::memory_order_relaxed);
}

void OBMediaManager::noteItemsFound(std::uint64_t count)
{
    _state->progress.itemsFound.fetch_add(count, std::memory_order_relaxed);
}

void OBMediaManager::noteItemsSkipped(std::uint64_t count)
{
    _state->progress.itemsSkipped.fetch_add(count, std::memory_order_relaxed);
}

void OBMediaManager::notePathAtWork(const Text& path)
{
    _state->beginPath(path);
}

std::shared_ptr<OBScanObserver> OBMediaManager::scanObserver() const
{
    return _state->scanObserver.load();
}

bool OBMediaManager::performOnMainThreadAndWait(const std::function<void()>& call)
{
    std::exception_ptr thrown; // here, where the caller can answer for it
    const bool isDone = platform().mainRunLoop.performAndWait([&] {
        try {
            call();
        } catch (...) {
            thrown = std::current_exception();
        }
    });
    if (thrown)
        std::rethrow_exception(thrown);
    return isDone;
}

void OBMediaManager::performInOrder(
    std::size_t count, const std::function<void(std::size_t)>& job, const std::function<void(std::size_t)>& take)
{
    const auto start = [this](std::function<void()> body) { return startThread("ob-scan", std::move(body)); };
    std::make_shared<OrderedWork>(platform(), start, count, job)->perform(take);
}

bool OBMediaManager::startThread(const std::string& name, std::function<void()> body)
{
    return _state->core->startThread(
        name, [manager = shared_from_this(), name, work = std::move(body), counted = _state->countUnderWay()] {
            manager->_state->callSource("thread " + name, work);
        });
}

void OBMediaManager::observeNotification(
    platform::NotificationCenter& center, std::string_view name, platform::NotificationCenter::Handler handler)
{
    const auto call = [manager = weak_from_this(), work = std::move(handler)](const platform::Notification& posted) {
        const auto alive = manager.lock();
        if (alive && !alive->_state->ended.isRaised())
            alive->_state->callSource(posted.name, [&] { work(posted); });
    };
    _state->addNotification(center, center.addObserver(name, nullptr, call));
}

bool OBMediaManager::sleep(std::chrono::nanoseconds duration)
{
    return platform().clock.sleep(duration, _state->ended);
}

void OBMediaManager::performAfterDelay(
    std::chrono::nanoseconds delay, platform::RunLoopModes modes, std::function<void()> call)
{
    const auto later = [manager = weak_from_this(), cause = WorkCause::current(), work = std::move(call),
                           counted = _state->countUnderWay()] {
        const auto alive = manager.lock();
        if (!alive || alive->_state->ended.isRaised())
            return;
        const WorkCause kept(cause);
        alive->_state->callSource("a call after a delay", work);
    };
    platform().mainRunLoop.performAfterDelay(delay, modes, later);
}

void OBMediaManager::performReload(std::string_view part, const std::function<void()>& reload)
{
    _state->performReload(part, reload);
}

std::shared_ptr<void> OBMediaManager::lifeDuringCalls()
{
    return weak_from_this().lock();
}

bool OBMediaManager::holdsReports() const
{
    return _state->holdsReports();
}

bool OBMediaManager::performAlone(const std::function<void()>& call)
{
    return _state->performAlone(call);
}

std::optional<platform::Date> OBMediaManager::changesMatterSince() const
{
    return _state->gate.beganAt();
}

void OBMediaManager::requestRootMediaGroup(const OBExecutor& executor, std::function<void(OBLoadResult)> completion)
{
    _state->requestTree(executor, std::move(completion));
}

void OBMediaManager::cancelLoad()
{
    _state->gate.requestCancel();
}

OBObservation OBMediaManager::observe(OBExecutor executor, OBManagerCallbacks callbacks)
{
    auto observer = _state->addObserver(std::move(executor), std::move(callbacks));
    const auto takeBack = [observer, manager = weak_from_this()](void*) {
        observer->takenBack = true;
        if (const auto alive = manager.lock())
            alive->_state->removeObserver(observer);
    };
    return OBObservation(std::shared_ptr<void>(nullptr, takeBack));
}

bool OBMediaManager::isAtRest() const
{
    return _state->isAtRest();
}

OBLoadProgress OBMediaManager::loadProgress() const
{
    return _state->progress.now();
}

std::vector<OBLoadProblem> OBMediaManager::loadProblems() const
{
    return _state->problems();
}

void OBMediaManager::setScanObserver(std::shared_ptr<OBScanObserver> observer)
{
    _state->scanObserver.store(std::move(observer));
}

void OBMediaManager::wasHandedOut()
{
    _state->wasHandedOut();
}

void OBMediaManager::end()
{
    _state->end();
}
