#pragma once

#include "plugin/ScanRules.h"

#include "host/OBMediaManager.h"
#include "platform/FileSystem.h"

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
        std::string path = platform::pathJoined(folder, item.name);
        const ScanFailure told = passed ? ScanFailure { rule.passed, {} } : failureOf(rule, item, path);
        _observer->scanDecided(
            { rule.name, std::move(path), passed, std::string(told.text), std::string(told.remedy) });
    }

    ScanFailure failureOf(const ScanRule& rule, const platform::FolderItem& item, const std::string& path) const
    {
        if (!rule.failureOf)
            return { rule.failed, rule.remedy };
        return isInClosedFolder(path) ? ScanRules::folderIsClosed : rule.failureOf(item);
    }

    bool isInClosedFolder(const std::string& path) const
    {
        const platform::FileSystem& fileSystem = _manager.platform().fileSystem;
        return !fileSystem.linkStatus(path)
            && fileSystem.openPlainFile(path).problem == platform::FileProblem::notPermitted;
    }

    OBMediaManager& _manager;
    const std::shared_ptr<OBScanObserver> _observer;
};
