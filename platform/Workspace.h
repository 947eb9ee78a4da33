#pragma once

#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace platform {

/// What became of something that was handed to the desktop.
struct HandOver {
    bool isDone = false;
    std::string problem {}; ///< one line; empty when it was done
};

/// Applications as the desktop knows them. Any thread. None throws.
class Workspace {
public:
    virtual ~Workspace() = default;

    /// The program of the application registered under `identifier`, absolute, whether or not that file exists.
    /// Absent when no application is registered. A fresh look-up at every call (XDG Desktop Entry, `IDENTIFIER.desktop`
    /// in the XDG data directories).
    virtual std::optional<std::string> applicationPath(std::string_view identifier) const = 0;

    /// The picture file that the desktop shows for the application whose program is at `applicationPath`: its entry's
    /// `Icon`, looked up as the Icon Theme specification says. Absent when it has none.
    virtual std::optional<std::string> applicationIconFile(std::string_view applicationPath) const = 0;

    /// The folder in which the desktop keeps its user's videos, absolute, whether or not it exists. Absent where the
    /// desktop has none of its own (xdg-user-dirs).
    virtual std::optional<std::string> videosFolder() const { return std::nullopt; }

    // Handing something to the desktop. Each answers at once; what became of it goes to the observer.

    /// Starts the application registered under `identifier` as its desktop entry says, so that it outlives this
    /// process.
    virtual void launchApplication(std::string_view identifier) = 0;
    /// Starts the program at `path` likewise, without arguments.
    virtual void launchProgram(std::string_view path) = 0;
    /// Shows the file or folder at `path`, selected, in the desktop's file manager.
    virtual void revealFile(std::string_view path) = 0;

    /// Calls `observer` with what became of each, on any thread; null takes that back. One at a time.
    virtual void observeHandOvers(std::function<void(const HandOver&)> observer) = 0;
};

} // namespace platform
