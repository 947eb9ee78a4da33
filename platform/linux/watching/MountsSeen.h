#pragma once

#include "platform/ThreadSafety.h"
#include "platform/Value.h"
#include "platform/Volumes.h"

#include <cstdint>
#include <utility>
#include <vector>

namespace platform {

/// Since when nothing was mounted or unmounted, as far as that was looked at. A mount changes no folder's time, so that
/// a look at the folders does not tell that they were others a moment before. Any thread.
class MountsSeen {
public:
    /// `volumes` outlive this object.
    explicit MountsSeen(std::vector<const Volumes*> volumes)
        : _volumes(std::move(volumes))
    {
    }

    /// Takes what is mounted for what was mounted at `now`.
    void look(Date now)
    {
        Locked guard(_lock);
        const std::uint64_t generation = currentGeneration();
        if (_generation != 0 && _generation != generation)
            _since = now;
        _generation = generation;
    }

    /// Whether something may have been mounted or unmounted since a look at `date`; false while nobody has looked.
    bool haveChangedSince(Date date) const
    {
        Locked guard(_lock);
        return _generation != 0 && (currentGeneration() != _generation || _since >= date);
    }

private:
    std::uint64_t currentGeneration() const
    {
        std::uint64_t sum = 0;
        for (const Volumes* const volumes : _volumes)
            sum += volumes->generation();
        return sum;
    }

    const std::vector<const Volumes*> _volumes;
    mutable Mutex _lock;
    std::uint64_t _generation GUARDED_BY(_lock) = 0; ///< 0 while it is unknown
    Date _since GUARDED_BY(_lock) {};
};

} // namespace platform
