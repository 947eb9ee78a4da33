#pragma once

#include "platform/FileSystem.h"

#include <string_view>

namespace platform {

/// What `problem` means to a person, to stand behind the path that it is about and a colon, or "cannot be read: ".
constexpr std::string_view textOfFileProblem(FileProblem problem) noexcept
{
    switch (problem) {
    case FileProblem::none:
        return "no reason is known";
    case FileProblem::missing:
        return "it does not exist";
    case FileProblem::notAFolder:
        return "something on the way is no folder";
    case FileProblem::notAPlainFile:
        return "it is no plain file";
    case FileProblem::notPermitted:
        return "permission denied";
    case FileProblem::pathTooLong:
        return "the path is too long";
    case FileProblem::linksInCircles:
        return "its symbolic links lead in circles";
    case FileProblem::linkOnTheWay:
        return "a symbolic link is on the way";
    case FileProblem::readError:
        return "the disk cannot be read";
    }
    return "no reason is known";
}

} // namespace platform
