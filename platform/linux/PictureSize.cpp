#include "platform/linux/PictureSize.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <optional>

namespace platform {

namespace {

    constexpr std::string_view whiteSpace = " \t\r\n";

    void skip(std::string_view& text, std::string_view characters)
    {
        text.remove_prefix(std::min(text.find_first_not_of(characters), text.size()));
    }

    std::optional<double> takeNumber(std::string_view& text)
    {
        constexpr double largest = 1'000'000;
        skip(text, whiteSpace);
        double number = 0;
        const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
        if (error != std::errc() || !std::isfinite(number) || std::abs(number) > largest)
            return std::nullopt;
        text.remove_prefix(static_cast<std::size_t>(end - text.data()));
        return number;
    }

    // Absent for lengths that depend on something else, such as percentages.
    std::optional<double> lengthOf(std::string_view text)
    {
        const auto number = takeNumber(text);
        skip(text, whiteSpace);
        const bool isPlain = text.empty() || text == "px";
        return number && isPlain && *number > 0 ? number : std::nullopt;
    }

    Size sizeOfViewBox(std::string_view text)
    {
        std::array<double, 4> numbers {};
        for (double& number : numbers) {
            skip(text, " \t\r\n,");
            const auto value = takeNumber(text);
            if (!value)
                return {};
            number = *value;
        }
        return numbers[2] > 0 && numbers[3] > 0 ? Size { numbers[2], numbers[3] } : Size {};
    }

    // What stands before the outermost element: declarations, comments, a document type.
    void skipProlog(std::string_view& text)
    {
        for (;;) {
            text.remove_prefix(std::min(text.find('<'), text.size()));
            const bool isComment = text.substr(0, 4) == "<!--";
            if (!isComment && text.substr(0, 2) != "<?" && text.substr(0, 2) != "<!")
                return;
            const std::string_view end = isComment ? "-->" : ">";
            const std::size_t position = text.find(end);
            text.remove_prefix(position == std::string_view::npos ? text.size() : position + end.size());
        }
    }

} // namespace

Size sizeOfVectorPicture(std::string_view text)
{
    constexpr std::string_view start = "<svg";
    skipProlog(text);
    if (text.substr(0, start.size()) != start)
        return {};
    text.remove_prefix(start.size());
    std::optional<double> width;
    std::optional<double> height;
    Size viewBox;
    for (skip(text, whiteSpace); !text.empty() && text.front() != '>' && text.front() != '/'; skip(text, whiteSpace)) {
        const std::string_view name = text.substr(0, text.find_first_of("= \t\r\n>"));
        text.remove_prefix(name.size());
        skip(text, " \t\r\n=");
        const char quote = text.empty() ? '\0' : text.front();
        const std::size_t end = quote == '"' || quote == '\'' ? text.find(quote, 1) : std::string_view::npos;
        if (end == std::string_view::npos)
            break;
        const std::string_view value = text.substr(1, end - 1);
        text.remove_prefix(end + 1);
        if (name == "width")
            width = lengthOf(value);
        else if (name == "height")
            height = lengthOf(value);
        else if (name == "viewBox")
            viewBox = sizeOfViewBox(value);
    }
    return width && height ? Size { *width, *height } : viewBox;
}

} // namespace platform
