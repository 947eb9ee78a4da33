#pragma once

#include <algorithm>
#include <string_view>
#include <utility>
#include <vector>

namespace platform {

/// The names that the `.hidden` of one folder lists, one a line: a convention of the desktop's file managers.
///
/// Lines end with a line feed, which the last may lack, and are compared byte by byte.
class HiddenNames {
public:
    static constexpr const char* fileName = ".hidden";

    /// Reads the `.hidden` of the open folder `folder`, where there is one: a plain file, or a link to one. Of a file
    /// of more than 16 MiB what lies beyond is not read.
    static HiddenNames readIn(int folder);

    explicit HiddenNames(std::vector<char> text)
        : _text(std::move(text))
    {
    }

    bool empty() const noexcept { return _text.empty(); }
    /// Calls `take(std::string_view)` for each line.
    template <class Take> void forEach(const Take& take) const
    {
        std::string_view rest(_text.data(), _text.size());
        while (!rest.empty()) {
            const std::string_view line = rest.substr(0, rest.find('\n'));
            take(line);
            rest.remove_prefix(std::min(rest.size(), line.size() + 1));
        }
    }
    bool contains(std::string_view name) const
    {
        bool found = false;
        forEach([&](std::string_view line) { found = found || line == name; });
        return found;
    }

private:
    std::vector<char> _text;
};

} // namespace platform
