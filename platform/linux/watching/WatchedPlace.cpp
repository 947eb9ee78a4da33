#include "platform/linux/watching/WatchedPlace.h"

// A path is followed prefix by prefix, and so is the target of every link that a prefix is. The file system alone knows
// which of the links that a machine adds win over one another, so it is asked where each prefix leads, and every name
// that it may have met is a step: one too many costs a look, one too few loses a change.

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/linux/SystemPath.h"
#include "platform/linux/watching/FileDates.h"

#include <algorithm>
#include <cstddef>
#include <optional>
#include <set>

#include <sys/stat.h>

namespace platform {

namespace {

    std::optional<struct stat> factsAt(std::string_view path)
    {
        const SystemPath systemPath(path);
        struct stat facts;
        if (!systemPath.isUsable() || lstat(systemPath.bytes(), &facts) != 0)
            return std::nullopt;
        return facts;
    }

    class Way {
    public:
        Way(const FileSystem& files, const MayLook& mayLook)
            : _files(files)
            , _mayLook(mayLook)
        {
        }

        WatchedPlace placeOf(std::string_view path)
        {
            follow(std::string(path));
            if (!_place.endsEarly) {
                _place.path = _files.resolvedPath(path);
                follow(_place.path);
            }
            if (!_place.endsEarly)
                takeFacts();
            return std::move(_place);
        }

    private:
        void follow(const std::string& path);
        void step(const std::string& folder, std::string_view name);
        void followLink(const std::string& path, const std::string& folder);
        void takeFacts();

        const FileSystem& _files;
        const MayLook& _mayLook;
        WatchedPlace _place {};
        std::set<std::string> _pathsFollowed {};
    };

    void Way::follow(const std::string& path)
    {
        if (path.empty() || path.front() != '/' || !_pathsFollowed.insert(path).second)
            return;
        for (std::size_t start = 0; start < path.size() && !_place.endsEarly;) {
            const std::size_t end = std::min(path.find('/', start + 1), path.size());
            const std::string_view name = std::string_view(path).substr(start + 1, end - start - 1);
            if (!name.empty() && name != "." && name != "..") {
                const std::string folder = _files.resolvedPath(start == 0 ? "/" : path.substr(0, start));
                step(folder, name);
                followLink(path.substr(0, end), folder);
            }
            start = end;
        }
    }

    void Way::step(const std::string& folder, std::string_view name)
    {
        _place.endsEarly = _mayLook && !_mayLook(pathJoined(folder, name));
        const auto isKnown
            = [&](const PlaceStep& candidate) { return candidate.folder == folder && candidate.name == name; };
        if (std::none_of(_place.steps.begin(), _place.steps.end(), isKnown))
            _place.steps.push_back({ folder, std::string(name) });
    }

    void Way::followLink(const std::string& path, const std::string& folder)
    {
        const std::optional<std::string> target = _place.endsEarly ? std::nullopt : _files.linkTarget(path);
        if (!target || target->empty())
            return;
        if (const auto facts = factsAt(pathJoined(folder, lastPathComponent(path))); facts && S_ISLNK(facts->st_mode))
            _place.changed = std::max(_place.changed, changeDate(*facts));
        follow(target->front() == '/' ? *target : pathJoined(folder, *target));
    }

    void Way::takeFacts()
    {
        std::string_view path = _place.path;
        std::optional<struct stat> facts = factsAt(path);
        if (facts) {
            _place.kind = S_ISDIR(facts->st_mode) ? WatchedPlace::Kind::folder : WatchedPlace::Kind::other;
            _place.device = facts->st_dev;
            _place.inode = facts->st_ino;
        }
        while (!facts && path.size() > 1) {
            path = pathByRemovingLastComponent(path);
            facts = factsAt(path);
        }
        _place.reached = path;
        if (facts && _place.kind != WatchedPlace::Kind::folder)
            _place.changed = std::max(_place.changed, changeDate(*facts));
    }

} // namespace

WatchedPlace placeOfPath(const FileSystem& files, std::string_view path, const MayLook& mayLook)
{
    return Way(files, mayLook).placeOf(path);
}

} // namespace platform
