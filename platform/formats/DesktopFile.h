#pragma once

#include <functional>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace platform {

/// A file of groups and keys, as the Desktop Entry Specification lays down for desktop entries and icon themes.
///
/// Lenient: a line that is none of a comment, a group or a key is skipped and the rest kept; lines may end with CR LF;
/// a group that is opened twice is one group, and the last of two equal keys counts. Values are bytes.
class DesktopFile {
public:
    /// The largest file that is read, in bytes; a larger one has no groups.
    static constexpr std::size_t largestSize = 4 * 1024 * 1024;

    explicit DesktopFile(std::string_view bytes);

    bool hasGroup(std::string_view group) const;
    /// The value as it stands in the file, without the white space before it; null where there is none. A translation
    /// has a key of its own, such as "Name[de]". Valid while this file lives.
    const std::string* value(std::string_view group, std::string_view key) const;
    /// The value with its escapes resolved (\s \n \t \r \\); absent where there is none.
    std::optional<std::string> text(std::string_view group, std::string_view key) const;
    /// Whether the value is "true" (or, as older files have it, "1").
    bool isTrue(std::string_view group, std::string_view key) const;
    /// The parts of the value, white space around them removed and empty ones left out; empty where there is no value.
    /// A separator after a backslash separates nothing.
    std::vector<std::string> list(std::string_view group, std::string_view key, char separator) const;

    /// The number of the first line that was skipped, counted from 1; 0 when none was.
    int firstSkippedLine() const noexcept { return _firstSkippedLine; }

private:
    using Group = std::map<std::string, std::string, std::less<>>;

    bool takeLine(std::string_view line, Group*& group);

    std::map<std::string, Group, std::less<>> _groups;
    int _firstSkippedLine = 0;
};

} // namespace platform
