#pragma once

#include "plugin/ScanRules.h"

#include "host/OBMediaManager.h"

#include <memory>
#include <string_view>

/// Applies rules for one scan: counts what they keep out, and tells the observer, if there is one, what they decided.
class ScanReport {
public:
    explicit ScanReport(OBMediaManager& manager)
        : _manager(manager)
        , _observer(manager.scanObserver())
    {
    }

    /// Whether anybody is told what was decided where; nobody else looks at a folder's path.
    bool tells() const { return _observer != nullptr; }

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

private:
    void tell(const ScanRule& rule, bool passed, const platform::FolderItem& item, std::string_view folder) const
    {
        _observer->scanDecided({ rule.name, platform::pathJoined(folder, item.name), passed,
            std::string(passed ? rule.passed : rule.failed), std::string(passed ? std::string_view() : rule.remedy) });
    }

    OBMediaManager& _manager;
    const std::shared_ptr<OBScanObserver> _observer;
};
