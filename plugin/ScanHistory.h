#pragma once

#include "host/OBMediaGroup.h"
#include "platform/Snapshot.h"

#include <atomic>
#include <cstdint>
#include <utility>

/// The scans of one half of the tree, numbered in the order in which they began, and what the latest of those that ran
/// to their end found. However scans overlap, that is what stays in the tree. Any thread.
class ScanHistory {
public:
    using Number = std::uint64_t;

    /// Is superseded by nothing.
    static constexpr Number latestScan = ~Number();

    struct Result {
        Number number = 0; ///< 0 while no scan has run to its end
        OBMediaGroupRef library {}; ///< its children are the half
    };

    /// Of the scan that begins now, whose list `shown` shows from now on: in one step, so that the list which is shown
    /// is that of the scan that began last.
    template <class List> Number begin(platform::Snapshot<List>& shown, const List& list)
    {
        Number number = 0;
        List before; // released after the snapshot's lock
        shown.update([&](List old) {
            before = std::move(old);
            number = ++_begun;
            return list;
        });
        return number;
    }

    /// A load puts the result of this scan into the tree by itself.
    void beganForLoad(Number number) { _loaded = number; }
    Number loaded() const { return _loaded; }

    /// Keeps what a scan that ran to its end found, unless one that began later has kept its own.
    void keep(Number number, OBMediaGroupRef library)
    {
        Result dropped { number, std::move(library) }; // released after the snapshot's lock
        _latest.update([&](Result latest) {
            if (latest.number < dropped.number)
                std::swap(latest, dropped);
            return latest;
        });
    }
    Result latest() const { return _latest.load(); }

    /// Whether a scan that began later has kept its result.
    bool isSuperseded(Number number) const { return latest().number > number; }

private:
    std::atomic<Number> _begun { 0 };
    std::atomic<Number> _loaded { 0 };
    platform::Snapshot<Result> _latest;
};
