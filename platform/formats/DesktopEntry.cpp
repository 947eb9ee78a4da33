#include "platform/formats/DesktopEntry.h"

#include "platform/formats/DesktopFile.h"

#include <optional>

namespace platform {
namespace {

    constexpr std::string_view entryGroup = "Desktop Entry";

    /// Takes a quoted stretch, of which `exec` begins with the opening quote, and appends what it holds; false when
    /// the closing quote is missing.
    bool takeQuoted(std::string_view& exec, std::string& argument)
    {
        constexpr std::string_view escapable = "\"`$\\";
        const char quote = exec.front();
        exec.remove_prefix(1);
        while (!exec.empty() && exec.front() != quote) {
            const bool mayEscape = quote == '"' && exec.front() == '\\' && exec.size() > 1;
            if (mayEscape && escapable.find(exec[1]) != std::string_view::npos)
                exec.remove_prefix(1);
            argument += exec.front();
            exec.remove_prefix(1);
        }
        if (exec.empty())
            return false;
        exec.remove_prefix(1);
        return true;
    }

    /// Takes one argument; absent when it is broken, with the reason in `problem`.
    std::optional<std::string> takeArgument(std::string_view& exec, std::string& problem)
    {
        constexpr std::string_view separators = " \t\r\n";
        std::string argument;
        while (!exec.empty() && separators.find(exec.front()) == std::string_view::npos) {
            if (exec.front() == '"' || exec.front() == '\'') {
                if (!takeQuoted(exec, argument)) {
                    problem = "a quote in Exec is not closed";
                    return {};
                }
                continue;
            }
            if (exec.front() == '\\')
                exec.remove_prefix(1);
            if (exec.empty()) {
                problem = "Exec ends with a backslash";
                return {};
            }
            argument += exec.front();
            exec.remove_prefix(1);
        }
        return argument;
    }

} // namespace

DesktopEntryResult readDesktopEntry(std::string_view bytes)
{
    DesktopEntryResult result;
    if (bytes.size() > DesktopFile::largestSize) {
        result.problem = "the desktop entry is larger than 4 MiB";
        return result;
    }
    const DesktopFile file(bytes);
    if (!file.hasGroup(entryGroup)) {
        result.problem = "group [Desktop Entry] is missing";
        return result;
    }
    const auto text = [&](std::string_view key) { return file.text(entryGroup, key).value_or(std::string()); };
    const auto isTrue = [&](std::string_view key) { return file.isTrue(entryGroup, key); };
    result.entry = { .type = text("Type"),
        .name = text("Name"),
        .icon = text("Icon"),
        .exec = text("Exec"),
        .tryExec = text("TryExec"),
        .path = text("Path"),
        .startupWindowClass = text("StartupWMClass"),
        .dBusActivatable = isTrue("DBusActivatable"),
        .hidden = isTrue("Hidden"),
        .noDisplay = isTrue("NoDisplay"),
        .startupNotify = isTrue("StartupNotify"),
        .terminal = isTrue("Terminal") };
    return result;
}

ExecArguments splitExec(std::string_view exec)
{
    constexpr std::string_view separators = " \t\r\n";
    ExecArguments result;
    while (true) {
        const std::size_t start = exec.find_first_not_of(separators);
        if (start == std::string_view::npos)
            break;
        exec.remove_prefix(start);
        std::optional<std::string> argument = takeArgument(exec, result.problem);
        if (!argument) {
            result.arguments.clear();
            return result;
        }
        result.arguments.push_back(std::move(*argument));
    }
    if (result.arguments.empty())
        result.problem = "Exec names no program";
    return result;
}

} // namespace platform
