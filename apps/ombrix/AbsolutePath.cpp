#include "apps/ombrix/AbsolutePath.h"

#include "platform/PathText.h"

#include <filesystem>
#include <system_error>

namespace ombrix {

std::optional<std::string> absolutePath(const std::string& path)
{
    std::error_code error;
    const std::filesystem::path current = std::filesystem::current_path(error);
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
