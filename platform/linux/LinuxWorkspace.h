#pragma once

#include "platform/ThreadSafety.h"
#include "platform/Workspace.h"

#include <vector>

namespace platform {

class FileSystem;

/// Applications as their desktop entries tell them. Any thread.
///
/// The program is the one that `Exec` names, else the one that `TryExec` names. A bare name is looked up in PATH; a
/// relative path is taken from the entry's working folder, and names nothing without one.
class LinuxWorkspace : public Workspace {
public:
    /// `files`, which also knows the home folder, outlives this object.
    explicit LinuxWorkspace(const FileSystem& files);

    std::optional<std::string> applicationPath(std::string_view identifier) const override EXCLUDES(_lock);
    /// Knows the applications that `applicationPath` has been asked for.
    std::optional<std::string> applicationIconFile(std::string_view applicationPath) const override EXCLUDES(_lock);

private:
    void remember(std::string_view identifier) const EXCLUDES(_lock);

    const FileSystem& _files;
    mutable Mutex _lock;
    mutable std::vector<std::string> _identifiers GUARDED_BY(_lock);
};

} // namespace platform
