#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace platform {

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
};

} // namespace platform
