#include "apps/ombrix/AbsolutePath.h"

#include "apps/common/Terminal.h"
#include "platform/PathText.h"

#include <filesystem>
#include <system_error>

namespace ombrix {
namespace {

    /// The working folder as it was gone to, links and all, where the shell tells; else as the system names it.
    std::filesystem::path currentFolder(std::error_code& error)
    {
        const std::filesystem::path asGoneTo = apps::environmentVariable("PWD");
        std::error_code notToldRight;
        if (asGoneTo.is_absolute() && asGoneTo == asGoneTo.lexically_normal()
            && std::filesystem::equivalent(asGoneTo, ".", notToldRight))
            return asGoneTo;
        return std::filesystem::current_path(error);
    }

} // namespace

std::optional<std::string> absolutePath(const std::string& path)
{
    std::error_code error;
    const std::filesystem::path current = currentFolder(error);
    if (path.empty())
        return path;
    if (error && path.front() != '/')
        return std::nullopt;
    const std::string normal = (current / path).lexically_normal().string();
    return std::string(platform::pathWithoutTrailingSlashes(normal));
}

void leaveWorkingFolder()
{
    std::error_code ignored;
    std::filesystem::current_path("/", ignored);
}

} // namespace ombrix
