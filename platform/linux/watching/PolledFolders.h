#pragma once

#include "platform/Value.h"
#include "platform/linux/watching/PollingReport.h"

#include <cstdint>
#include <functional>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace platform {

class FileSystem;

/// A folder that is to be polled with all below it.
struct PolledArea {
    std::string path; ///< real
    Date since {}; ///< a folder that changed then or later is reported
    bool isNew = false; ///< it has appeared, so what is in it is told
};

/// The folders of one device as they were when they were last looked at, and where paths over it led. One thread at a
/// time.
class PolledFolders {
public:
    /// `files` outlives this object. `isEnded` is asked between two folders, and ends what is under way.
    PolledFolders(const FileSystem& files, std::function<bool()> isEnded)
        : _files(files)
        , _isEnded(std::move(isEnded))
    {
    }

    void add(const PolledArea& area);
    void removeBelow(const std::string& path);
    void addPath(std::uint64_t watch, const std::string& path);
    void removePath(std::uint64_t watch) { _paths.erase(watch); }
    void lookAtAll();

    bool isEmpty() const { return _folders.empty() && _paths.empty(); }
    std::size_t folderCount() const { return _folders.size(); }
    std::vector<PollingReport> takeReports() { return std::exchange(_reports, {}); }

private:
    /// What a folder looked like.
    struct Seen {
        Date changed {};
        std::uint64_t device = 0;
        std::uint64_t inode = 0;
        std::uint64_t names = 0; ///< of all entries, taken together
        bool mayHaveChangedSince = false; ///< at the same time as far as the disk counts it
    };
    struct Contents {
        std::vector<std::string> subfolders {};
        std::uint64_t names = 0;
    };
    struct WatchedPath {
        std::string path;
        WatchedPlace place {};
    };

    bool look(const std::string& path, Seen& seen) const;
    static Contents contentsOf(const std::string& path);
    Date enterAll(const std::string& path, bool isNew);
    void compare(const std::string& path, Seen& seen);
    void compareSubfolders(const std::string& path, std::vector<std::string> subfolders);
    std::vector<std::string> knownSubfolders(const std::string& path) const;
    void follow(std::uint64_t watch, WatchedPath& path, bool isFirst);
    void tell(PathChange::Kind kind, const std::string& path, bool heldMore = false);

    const FileSystem& _files;
    const std::function<bool()> _isEnded;
    std::map<std::string, Seen> _folders {};
    std::map<std::uint64_t, WatchedPath> _paths {};
    std::vector<PollingReport> _reports {};
};

} // namespace platform
