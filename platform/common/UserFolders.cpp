#include "platform/common/UserFolders.h"

#include "platform/FileSystem.h"
#include "platform/PathText.h"
#include "platform/common/WholeFile.h"

#include <cstddef>

namespace platform {

namespace {

    constexpr std::size_t largestFile = 64 * 1024;

    std::string_view trimmed(std::string_view text)
    {
        while (!text.empty() && (text.front() == ' ' || text.front() == '\t'))
            text.remove_prefix(1);
        return text;
    }

    /// What follows `variable=` in the last line that sets it, for a shell would take that.
    std::optional<std::string_view> valueOf(std::string_view text, std::string_view variable)
    {
        std::optional<std::string_view> value;
        while (!text.empty()) {
            const std::string_view line = trimmed(text.substr(0, text.find('\n')));
            text.remove_prefix(std::min(text.size(), text.find('\n') == text.npos ? text.size() : text.find('\n') + 1));
            if (line.starts_with(variable) && line.substr(variable.size()).starts_with('='))
                value = line.substr(variable.size() + 1);
        }
        return value;
    }

    /// The text in double quotes at the start of `value`, a backslash taken from what it stands before.
    std::optional<std::string> unquoted(std::string_view value)
    {
        if (!value.starts_with('"'))
            return std::nullopt;
        std::string text;
        for (std::size_t index = 1; index < value.size(); ++index) {
            if (value[index] == '"')
                return text;
            if (value[index] == '\\' && index + 1 < value.size())
                ++index;
            text += value[index];
        }
        return std::nullopt;
    }

} // namespace

std::optional<std::string> userFolder(
    const FileSystem& files, std::string_view settingsFolder, std::string_view variable)
{
    const OpenResult opened = files.openPlainFile(pathJoined(settingsFolder, "user-dirs.dirs"));
    const std::optional<std::string> home = files.homeFolder();
    if (!opened.file || !home)
        return std::nullopt;
    const std::string text = readBytes(*opened.file, largestFile);
    const std::optional<std::string_view> value = valueOf(text, variable);
    std::optional<std::string> folder = value ? unquoted(*value) : std::nullopt;
    if (!folder)
        return std::nullopt;
    constexpr std::string_view homeVariable = "$HOME/";
    if (folder->starts_with(homeVariable))
        folder = pathJoined(*home, std::string_view(*folder).substr(homeVariable.size()));
    folder = std::string(pathWithoutTrailingSlashes(*folder));
    const bool isAbsolute = folder->starts_with('/');
    return isAbsolute && *folder != pathWithoutTrailingSlashes(*home) ? folder : std::nullopt;
}

} // namespace platform
