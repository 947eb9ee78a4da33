#include "tests/plugin/support/ScriptedRoles.h"

#include "platform/PathText.h"

#include <algorithm>

namespace tests {

using platform::Locked;
using platform::Value;

namespace {

    std::vector<std::string> pathsOf(const std::vector<ScriptedVolumes::Volume>& volumes)
    {
        std::vector<std::string> paths;
        paths.reserve(volumes.size());
        for (const ScriptedVolumes::Volume& volume : volumes)
            paths.push_back(volume.path);
        return paths;
    }

} // namespace

platform::FolderListing ScriptedFileSystem::itemsInFolder(
    std::string_view folder, const platform::ListingRequest& request) const
{
    const platform::FolderListing listing = FaultyFileSystem::itemsInFolder(folder, request);
    std::vector<platform::FolderItem> items;
    for (const platform::FolderItem item : listing)
        items.push_back(item);
    const auto further = furtherFiles.equal_range(folder);
    for (auto file = further.first; file != further.second; ++file) {
        platform::FolderItem item;
        item.name = file->second;
        item.kind = platform::ItemKind::file;
        items.push_back(item);
    }
    std::sort(items.begin(), items.end(),
        [this](const auto& left, const auto& right) { return order(left.name, right.name); });
    platform::FolderListing ordered(listing.problem());
    for (const platform::FolderItem& item : items)
        ordered.append(item);
    if (listing.folderStatus())
        ordered.setFolderStatus(*listing.folderStatus());
    if (listing.holder())
        ordered.setHolder(*listing.holder());
    ordered.setPathIsReal(listing.pathIsReal());
    ordered.setOtherRealPath(listing.otherRealPath());
    return ordered;
}

std::vector<std::string> ScriptedVolumes::localVolumes() const
{
    if (whenListed)
        whenListed();
    return pathsOf(local.load());
}

std::vector<std::string> ScriptedVolumes::removableMedia() const
{
    return pathsOf(removable.load());
}

std::string ScriptedVolumes::displayName(std::string_view path) const
{
    for (const std::vector<Volume>& volumes : { local.load(), removable.load() }) {
        for (const Volume& volume : volumes) {
            if (volume.path == path)
                return volume.displayName;
        }
    }
    return std::string(platform::lastPathComponent(path));
}

std::optional<std::string> ScriptedWorkspace::applicationPath(std::string_view identifier) const
{
    _trace.add("application " + std::string(identifier));
    if (whenAsked)
        whenAsked();
    return editor.load();
}

std::optional<std::string> ScriptedWorkspace::applicationIconFile(std::string_view) const
{
    return iconFile.load();
}

void ScriptedPreferences::set(const std::string& domain, std::string_view key, Value value)
{
    Locked guard(_lock);
    _values[domain] = Value::Dictionary { { platform::Text(key), std::move(value) } };
}

platform::PreferencesAnswer ScriptedPreferences::valuesOfDomain(std::string_view domain) const
{
    _trace.add("preferences " + std::string(domain));
    if (whenRead)
        whenRead();
    {
        Locked guard(_lock);
        if (const auto known = _values.find(domain); known != _values.end())
            return { known->second, {} };
    }
    return _real.valuesOfDomain(domain);
}

std::optional<platform::MovieHeader> ScriptedMovies::headerOfMovie(
    std::string_view path, platform::PathKnowledge knowledge) const
{
    pathsRead.add(std::string(path));
    if (whenRead)
        whenRead(path);
    const auto known = headers.find(platform::lastPathComponent(path));
    return known == headers.end() ? _real.headerOfMovie(path, knowledge) : known->second;
}

std::optional<platform::ImageResource> ScriptedBundles::imageResource(
    std::string_view folder, std::string_view name) const
{
    _trace.add("picture " + std::string(name));
    return hasPictures.load() ? _real.imageResource(folder, name) : std::nullopt;
}

platform::LibraryAnswer ScriptedBundles::loadLibrary(const std::string& path, const char* symbol)
{
    if (linkedEntryPoint)
        return { linkedEntryPoint, {} };
    return _real.loadLibrary(path, symbol);
}

std::vector<std::string> HeldMainRunLoop::delayedCalls() const
{
    platform::Locked guard(_delayedLock);
    std::vector<std::string> lines;
    for (const Delayed& delayed : _delayed) {
        const auto time = std::chrono::duration_cast<std::chrono::milliseconds>(delayed.delay);
        lines.push_back(
            std::to_string(time.count()) + " ms in modes " + std::to_string(static_cast<int>(delayed.modes)));
    }
    return lines;
}

void HeldMainRunLoop::letDelayedCallsFallDue()
{
    std::vector<Delayed> due;
    {
        platform::Locked guard(_delayedLock);
        due = std::exchange(_delayed, {});
    }
    for (const Delayed& delayed : due)
        performAndWait(delayed.call);
}

} // namespace tests
