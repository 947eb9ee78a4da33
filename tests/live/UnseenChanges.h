#pragma once

#include "host/OBMediaGroup.h"

#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace tests {

// Where a tree that was left open and one that is loaded now differ though nothing was lost. This is the one place that
// names them; everything else has to be equal.
//
// Differences that the comparison takes out of both trees, or asks for in neither:
// - The lists of folders to search are built once. The projects of a volume that was mounted later are not searched
// for,
//   and its events are searched for after all others; of a volume that went between the two lists, only one knows.
//   The fresh load is told of the volumes in the order of the events, and projects in folders that only one of the two
//   searches are taken out of both trees.
// - An events library without clips leaves the tree with a reload and stays in it with a load: it is taken out of both.
//
// Differences that last until the tree is loaded again:
// - While the editor is missing nothing is loaded, and what cannot be loaded does not empty the tree.
//
// Differences that last until the half is reloaded for another reason: `UnseenChanges::Reason`.

/// The halves of the tree in which something changed that nothing tells of.
class UnseenChanges {
public:
    enum class Reason {
        rewrittenInPlace, ///< a clip or movie was rewritten, or given other dates or permissions: its name stays
        behindLink, ///< something changed behind a link below a library, where nothing is watched
        polledContents, ///< a file was written where folders are polled: only its folder's change time is looked at
        failedListing, ///< a folder could not be read for a while: nothing tells when it can be again
        /// Which half a change belongs to is read off its path: below a folder called Montaro Projects in the events,
        /// it belongs to the projects.
        ambiguousPath,
        preference, ///< the order of events: the preference is read anew, and used by the next reload
    };

    void note(Reason reason, std::string_view path);
    bool projects() const { return _projects; }
    bool events() const { return _events; }
    void forget() { *this = {}; }

private:
    bool _projects = false;
    bool _events = false;
};

/// The tree as a text that is equal for a tree that was left open and for one that was loaded now: JSON with the root's
/// children in the order of a reload, ties by ID, and its media objects in the order of its children.
///
/// `foldersOfOneTree` are the folders with projects that are searched for only one of the two.
std::string comparableTree(const OBMediaGroupRef& root, const std::vector<std::string>& foldersOfOneTree);

} // namespace tests
