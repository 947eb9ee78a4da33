#include "platform/common/LexicalPath.h"

#include "platform/PathText.h"

#include <cstddef>

namespace platform {

namespace {

    /// Takes the first component off `rest`, with the slashes around it.
    std::string_view takeComponent(std::string_view& rest) noexcept
    {
        while (!rest.empty() && rest.front() == '/')
            rest.remove_prefix(1);
        const std::string_view component = rest.substr(0, rest.find('/'));
        rest.remove_prefix(component.size());
        return component;
    }

    enum class ParentComponents { kept, applied };

    std::string normalised(std::string_view path, ParentComponents parents)
    {
        std::string result;
        result.reserve(path.size() + 1);
        const bool isAbsolute = !path.empty() && path.front() == '/';
        while (!path.empty()) {
            const std::string_view component = takeComponent(path);
            if (component == ".." && parents == ParentComponents::applied) {
                const std::size_t slash = result.rfind('/');
                result.resize(slash == std::string::npos ? 0 : slash);
            } else if (!component.empty() && component != ".") {
                if (isAbsolute || !result.empty())
                    result.push_back('/');
                result.append(component);
            }
        }
        if (result.empty() && isAbsolute)
            result.push_back('/');
        return result;
    }

} // namespace

bool hasDotComponent(std::string_view path) noexcept
{
    while (!path.empty()) {
        const std::string_view component = takeComponent(path);
        if (component == "." || component == "..")
            return true;
    }
    return false;
}

bool isLexicallyNormalised(std::string_view path) noexcept
{
    if (path == "/")
        return true;
    if (path.empty() || path.back() == '/')
        return false;
    for (std::size_t slash = path.find('/'); slash != std::string_view::npos; slash = path.find('/', slash + 1)) {
        const std::string_view after = path.substr(slash + 1);
        if (after.front() == '/' || after == "." || after.substr(0, 2) == "./")
            return false;
    }
    return path.substr(0, 2) != "./" && path != ".";
}

std::string lexicallyNormalised(std::string_view path)
{
    return isLexicallyNormalised(path) ? std::string(path) : normalised(path, ParentComponents::kept);
}

std::string lexicallyAbsolute(std::string_view path, std::string_view folder)
{
    const bool isAbsolute = !path.empty() && path.front() == '/';
    return normalised(isAbsolute ? std::string(path) : pathJoined(folder, path), ParentComponents::applied);
}

} // namespace platform
