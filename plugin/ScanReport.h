#pragma once

#include "plugin/OBMontaroPlugin.h"
#include "plugin/ScanFindings.h"
#include "plugin/ScanReason.h"
#include "plugin/ScanRules.h"

#include "host/OBMediaManager.h"
#include "platform/FileSystem.h"

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <utility>

/// Applies rules for one scan: counts what they keep out, and tells the observer, if there is one, what they decided.
class ScanReport {
public:
    explicit ScanReport(OBMediaManager& manager)
        : _manager(manager)
        , _observer(manager.scanObserver())
    {
    }

    /// Whether somebody is told of each decision.
    bool isObserved() const { return _observer != nullptr; }

    /// Whether `item` of `folder` passes `rule`.
    bool passes(const ScanRule& rule, const platform::FolderItem& item, std::string_view folder) const
    {
        const bool passed = rule.passes(item);
        if (!passed)
            _manager.noteItemsSkipped(1);
        if (_observer)
            tell(rule, passed, item, folder);
        return passed;
    }

    /// What was found at one path beyond the rules for single items. `finding` answers an OBScanDecision, and is called
    /// only where somebody listens.
    template <class Finding> void found(const Finding& finding) const
    {
        if (_observer)
            _observer->scanDecided(finding());
    }
    /// Likewise, of an entry that became a record; `path` answers its path.
    template <class Path, class Finding> void foundRecord(const Path& path, const Finding& finding) const
    {
        if (_observer && _observer->wantsRecordExplained(path()))
            _observer->scanDecided(finding());
    }
    /// Likewise, of something that keeps the path out.
    template <class Finding> void keptOut(const Finding& finding) const
    {
        _manager.noteItemsSkipped(1);
        found(finding);
    }

    /// Calls `scan` with each of `paths`, the libraries that are searched for `what`, until a cancel is pending.
    /// `isInHome` answers whether a path is the home folder's, and is called only where somebody listens.
    template <class IsInHome, class Scan>
    void walkLibraries(
        const MontaroSearchPaths& paths, std::string_view what, const IsInHome& isInHome, const Scan& scan) const
    {
        const std::size_t count = paths ? paths->size() : 0;
        for (std::size_t index = 0; index < count && !_manager.isCancelLoadRequestPending(); ++index) {
            const platform::Text& path = (*paths)[index];
            if (_observer)
                _observer->libraryBegan(path.string());
            found([&] { return findings::searchedLibrary(path, what, index, count, isInHome(path)); });
            scan(path);
        }
    }
    /// `entry` answers the path of the link, or below one, that leads to `target`; called only where somebody listens.
    template <class Entry> void linkFollowed(const Entry& entry, std::string_view target) const
    {
        if (_observer)
            _observer->linkFollowed(entry(), std::string(target));
    }
    void objectMade(const std::string& path, const OBMediaObjectRef& object) const
    {
        if (_observer)
            _observer->objectMade(path, object);
    }

private:
    /// A copy, made only here: whoever walks a listing without an observer need not have its items in memory.
    void tell(const ScanRule& rule, bool passed, platform::FolderItem item, std::string_view folder) const
    {
        std::string path = platform::pathJoined(folder, item.name);
        const ScanReason reason
            = passed ? ScanReason(rule.passed, {}) : scanReason(_manager.platform().fileSystem, rule, item, path);
        _observer->scanDecided({ .rule = rule.name,
            .path = std::move(path),
            .passed = passed,
            .text = reason.text,
            .remedy = reason.remedy,
            .itself = {},
            .inside = std::string(rule.inside.text),
            .insideRemedy = std::string(rule.inside.remedy) });
    }

    OBMediaManager& _manager;
    const std::shared_ptr<OBScanObserver> _observer;
};
