#pragma once

#include "apps/common/Style.h"
#include "apps/ombrix/TextLine.h"
#include "apps/ombrix/WatchedVolumes.h"
#include "host/OBPublication.h"
#include "host/OBTreeChanges.h"
#include "platform/PathWatching.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace ombrix {

// What "watch" tells people. Texts are laid out.

/// What came, what changed and what went: "+ Coast (12 clips)    ~ Meyer: 1 → 2 movies    - Draft". What is many is
/// only counted.
std::string changesText(const OBTreeChanges& changes, const apps::Style& style);

/// Why there was a scan and how long it took: "heard 14:02:26, waited 5.0 s, scanned in 18 ms"; where volumes have come
/// or gone with media, that: "Stick was mounted".
std::string circumstancesText(const OBPublication& publication, const OBTreeChanges& changes,
    const VolumeChanges& volumes, const apps::Style& style);

/// "8 search folders, 1,204 folders (inotify)". The search folders are absent where the source does not tell.
std::string followedText(std::optional<std::size_t> searchFolders, const platform::WatchingState& state);

/// "/media: looked at every 10 s only: the limit is used up; to mend it: …"
std::string pollingText(const platform::WatchingProblem& problem);

/// "14:02:07  watching  …"; the last text stands further to the right.
TextLine watchLine(const apps::Style& style, std::optional<int> columns, platform::Date time, std::string_view word,
    std::string_view text, std::string_view circumstances = {});

} // namespace ombrix
