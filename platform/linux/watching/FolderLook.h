#pragma once

#include "platform/linux/Descriptor.h"
#include "platform/linux/watching/FolderFollowing.h"

#include <string>
#include <vector>

#include <sys/types.h>

namespace platform {

/// One look through a folder and all below it, without recursion. The watcher's thread.
class FolderLook {
public:
    FolderLook(WatchingContext& context, FolderFollowing& following, Date since)
        : _context(context)
        , _following(following)
        , _since(since)
    {
    }

    FolderFollowing::Look lookThrough(WatchedFolders::Number folder);

private:
    using Number = WatchedFolders::Number;

    /// A folder whose subfolders are being gone through.
    struct Level {
        Number folder = WatchedFolders::none;
        Descriptor descriptor {}; ///< closed again in folders deep down
        std::size_t pathLength = 0;
        Number nextChild = WatchedFolders::none;
    };
    enum class Entered { yes, no, gone };

    Entered enter(Number folder);
    Entered enterOpened(Number folder, Descriptor descriptor);
    Entered enterFailed(Number folder, int error);
    Entered handOver(Number folder);
    void list(Number folder, int descriptor);
    void dropUnseen(Number folder);
    bool goDeeper();

    WatchingContext& _context;
    FolderFollowing& _following;
    const Date _since;
    FolderFollowing::Look _look {};
    std::string _path {}; ///< of the folder that is being entered
    std::vector<Level> _levels {};
};

} // namespace platform
