#pragma once

#include "host/OBScanObserver.h"
#include "platform/FileSystem.h"

#include <cstddef>
#include <string_view>

/// What a scan finds at a path beyond the rules for single items, in the words of an explanation.
namespace findings {

/// A library is searched; it is one of `count` for `what` ("projects" or "events"), and the home folder's when
/// `isInHome`.
OBScanDecision searchedLibrary(
    std::string_view path, std::string_view what, std::size_t index, std::size_t count, bool isInHome);

/// A folder was listed, or could not be, which keeps out what lies in it.
OBScanDecision listedFolder(const platform::FileSystem& fileSystem, std::string_view path,
    const platform::FolderListing& listing,
    std::string_view remedyOfMissing = "create the folder, or mount its volume");

/// An item is no project, for a reason of its marker, and is looked at further: it may be an ordinary folder.
OBScanDecision noProject(std::string_view path, std::string_view reason);

/// The folder in a project or event in which its movies lie held `entries` entries.
OBScanDecision moviesFolder(std::string_view path, std::size_t entries);
OBScanDecision clipsFolder(std::string_view path, std::size_t entries);

/// An event is left out, since its folder of clips, which would be at `clips`, or what lies in it, gives none.
OBScanDecision eventWithoutClipsFolder(const platform::FileSystem& fileSystem, std::string_view path,
    std::string_view clips, platform::FileProblem problem);
OBScanDecision eventWithoutClips(std::string_view path);

/// A link leads to what becomes the clip, whether or not anything is there.
OBScanDecision linkedClip(std::string_view path, std::string_view target, bool exists);

/// A clip counts to a year, by `date` as people write it: that of its recording, or of its file. Without one the year
/// is -1.
OBScanDecision yearOfClip(std::string_view path, int year, std::string_view date, bool isRecorded);

} // namespace findings
