#pragma once

#include "platform/FileSystem.h"

#include <string_view>

namespace ombrix {

/// Why a folder could not be read, in the words of a message.
constexpr std::string_view problemText(platform::FileProblem problem)
{
    switch (problem) {
    case platform::FileProblem::none:
        return "read";
    case platform::FileProblem::missing:
        return "nothing is there";
    case platform::FileProblem::notAFolder:
        return "not a folder";
    case platform::FileProblem::notAPlainFile:
        return "not a plain file";
    case platform::FileProblem::notPermitted:
        return "reading it is not permitted";
    case platform::FileProblem::pathTooLong:
        return "its path is longer than the system takes";
    case platform::FileProblem::linksInCircles:
        return "its links lead in circles";
    case platform::FileProblem::linkOnTheWay:
        return "a link is on the way";
    case platform::FileProblem::readError:
        break;
    }
    return "the disk could not be read";
}

} // namespace ombrix
