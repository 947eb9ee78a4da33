#pragma once

#include "platform/common/LinkedFileSystem.h"
#include "platform/linux/LinuxFileSystem.h"
#include "tests/support/BareMachine.h"
#include "tests/support/FaultyFileSystem.h"
#include "tests/support/TemporaryFolder.h"

#include <optional>
#include <string>
#include <vector>

namespace tests {

/// A real folder, and a file system with links added to it. Build first, then ask.
class LinkedFiles {
public:
    LinkedFiles& link(const std::string& path, const std::string& target)
    {
        _links.push_back({ path, target });
        return *this;
    }

    const platform::LinkedFileSystem& files()
    {
        if (!_files) {
            _table.emplace(_links, volumes, calls);
            _files.emplace(calls, *_table);
        }
        return *_files;
    }

    TemporaryFolder disk {};
    ListedVolumes volumes {};
    platform::LinuxFileSystem kernel {};
    FaultyFileSystem calls { kernel }; ///< what is asked of the disk

private:
    std::vector<platform::AddedLink> _links {};
    std::optional<platform::LinkTable> _table {};
    std::optional<platform::LinkedFileSystem> _files {};
};

} // namespace tests
