#pragma once

#include "platform/FileSystem.h"

#include <cstring>
#include <string_view>

#include <linux/limits.h>

namespace platform {

/// A path in the shape in which the kernel takes it, or why it takes none.
class SystemPath {
public:
    explicit SystemPath(std::string_view path)
    {
        if (path.empty() || path.front() != '/' || path.find('\0') != std::string_view::npos)
            _problem = FileProblem::missing;
        else if (path.size() >= sizeof(_bytes))
            _problem = FileProblem::pathTooLong;
        const std::size_t length = _problem == FileProblem::none ? path.size() : 0;
        if (length > 0)
            std::memcpy(_bytes, path.data(), length);
        _bytes[length] = '\0';
    }

    bool isUsable() const noexcept { return _problem == FileProblem::none; }
    /// `missing` for what names nothing absolute, `pathTooLong` for what is longer than a path can be.
    FileProblem problem() const noexcept { return _problem; }
    /// Empty when the path is not usable, which the kernel refuses.
    const char* bytes() const noexcept { return _bytes; }

private:
    FileProblem _problem = FileProblem::none;
    char _bytes[PATH_MAX];
};

} // namespace platform
