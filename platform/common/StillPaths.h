#pragma once

#include "platform/PathWatching.h"

namespace platform {

/// The watching of a machine on which nothing ever changes.
class StillPaths final : public PathWatching {
public:
    Date timeOfChangesNow() const override { return {}; }
    std::shared_ptr<void> watch(std::string_view, Date, PathWatchHandlers) override { return nullptr; }
    WatchingState state() const override { return {}; }
    std::unique_ptr<PathWatching> withPathsOf(const FileSystem&, const Volumes&) const override
    {
        return std::make_unique<StillPaths>();
    }
};

} // namespace platform
