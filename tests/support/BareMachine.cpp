#include "tests/support/BareMachine.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"

#include <thread>

namespace tests {

namespace {

    std::vector<std::string> pathsOf(const std::vector<ListedVolumes::Volume>& volumes)
    {
        std::vector<std::string> paths;
        paths.reserve(volumes.size());
        for (const ListedVolumes::Volume& volume : volumes)
            paths.push_back(volume.path);
        return paths;
    }

} // namespace

std::shared_ptr<void> ListedVolumes::watchMounts(const std::function<void()>& changed) const
{
    const auto watch = std::make_shared<const std::function<void()>>(changed);
    _mountsChanged = watch;
    return std::const_pointer_cast<std::function<void()>>(watch);
}

void ListedVolumes::tellMountsChanged() const
{
    if (const auto watch = _mountsChanged.lock())
        (*watch)();
}

std::vector<std::string> ListedVolumes::localVolumes() const
{
    ++timesListed;
    return pathsOf(local);
}

std::vector<std::string> ListedVolumes::removableMedia() const
{
    return pathsOf(removable);
}

std::string ListedVolumes::displayName(std::string_view path) const
{
    for (const std::vector<Volume>* volumes : { &local, &removable }) {
        for (const Volume& volume : *volumes) {
            if (volume.path == path)
                return volume.displayName;
        }
    }
    return std::string(platform::lastPathComponent(path));
}

std::optional<std::string> ListedVolumes::fileSystemType(std::string_view path) const
{
    for (const Volume& volume : local) {
        if (platform::isSameOrBelow(path, volume.path))
            return volume.type;
    }
    return "base type";
}

std::optional<std::string> ListedWorkspace::applicationPath(std::string_view identifier) const
{
    for (const auto& [listed, path] : applications) {
        if (listed == identifier)
            return path;
    }
    return std::nullopt;
}

BareMachine::BareMachine(platform::FileSystem& files)
    : _files(files)
    , _preferences(files)
    , _movies(files)
    , _metadataIndex(files, _movies)
{
}

platform::Platform BareMachine::platform()
{
    return {
        .fileSystem = _files,
        .pathWatching = pathWatching,
        .volumes = volumes,
        .workspace = workspace,
        .preferences = _preferences,
        .metadataIndex = _metadataIndex,
        .movies = _movies,
        .notifications = notifications,
        .workspaceNotifications = workspaceNotifications,
        .clock = clock,
        .calendar = _calendar,
        .threads = _threads,
        .mainRunLoop = _mainRunLoop,
        .console = console,
        .bundles = _bundles,
        .languages = _languages,
    };
}

bool BareMachine::ThreadsOfProcess::startDetached(const std::string&, std::function<void()> body)
{
    std::thread(std::move(body)).detach();
    return true;
}

bool BareMachine::LoopInPlace::performAndWait(const std::function<void()>& call)
{
    call();
    return true;
}

} // namespace tests
