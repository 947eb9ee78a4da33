#pragma once

#include "platform/ThreadSafety.h"
#include "platform/Workspace.h"

#include <memory>
#include <vector>

namespace platform {

class FileSystem;
class Threads;

/// Applications as their desktop entries tell them. Any thread.
///
/// The program is the one that `Exec` names, else the one that `TryExec` names. A bare name is looked up in PATH; a
/// relative path is taken from the entry's working folder, and names nothing without one.
class LinuxWorkspace : public Workspace {
public:
    /// `files`, which also knows the home folder, outlives this object, and so does `threads`.
    LinuxWorkspace(const FileSystem& files, Threads& threads);

    std::optional<std::string> applicationPath(std::string_view identifier) const override EXCLUDES(_lock);
    /// Knows the applications that `applicationPath` has been asked for.
    std::optional<std::string> applicationIconFile(std::string_view applicationPath) const override EXCLUDES(_lock);
    std::optional<std::string> videosFolder() const override;

    void launchApplication(std::string_view identifier) override;
    void launchProgram(std::string_view path) override;
    void revealFile(std::string_view path) override;
    void observeHandOvers(std::function<void(const HandOver&)> observer) override EXCLUDES(_lock);

private:
    /// Who hears of hand-overs; outlives the workspace while one is under way.
    struct Observed {
        Mutex lock;
        std::function<void(const HandOver&)> observer GUARDED_BY(lock);
    };

    void handOver(std::function<std::string()> perform);
    void remember(std::string_view identifier) const EXCLUDES(_lock);

    const FileSystem& _files;
    Threads& _threads;
    const std::shared_ptr<Observed> _observed = std::make_shared<Observed>();
    mutable Mutex _lock;
    mutable std::vector<std::string> _identifiers GUARDED_BY(_lock);
};

} // namespace platform
