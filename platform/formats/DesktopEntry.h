#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// An application as its desktop entry tells it (Desktop Entry Specification 1.5). Texts are bytes; one that is not
/// there is empty. `name` is not translated.
struct DesktopEntry {
    std::string type; ///< "Application", "Link" or "Directory"
    std::string name;
    std::string icon; ///< a name, or an absolute path
    std::string exec; ///< the command line, as `splitExec` takes it
    std::string tryExec; ///< a program without which the application counts as absent
    std::string path; ///< working folder
    std::string startupWindowClass;
    bool dBusActivatable = false;
    bool hidden = false; ///< counts as deleted
    bool noDisplay = false; ///< not for menus
    bool startupNotify = false;
    bool terminal = false;
};

/// A desktop entry, or why there is none.
struct DesktopEntryResult {
    DesktopEntry entry;
    std::string problem; ///< one line; empty when read
};

/// Reads a desktop entry. Bad lines are skipped and the rest kept, as `DesktopFile` has it; only a file without the
/// group [Desktop Entry], or one that is too large, is refused.
DesktopEntryResult readDesktopEntry(std::string_view bytes);

/// The arguments of a command line, or why there are none.
struct ExecArguments {
    std::vector<std::string> arguments; ///< program first, field codes such as %f left as they are
    std::string problem; ///< one line; empty when the arguments are right
};

/// Splits a command line at white space by the quoting rules of desktop entries: double quotes hold an argument
/// together, and in them a backslash takes the meaning from `"`, `` ` ``, `$` and `\`. Single quotes, and a backslash
/// outside of quotes, are taken as a shell takes them, since many entries rely on it.
ExecArguments splitExec(std::string_view exec);

} // namespace platform
