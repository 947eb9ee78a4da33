#include "platform/linux/HiddenNamesReading.h"

#include "platform/linux/PlainFile.h"

#include <algorithm>
#include <cstdint>
#include <span>
#include <string>
#include <utility>

namespace platform {

HiddenNames readHiddenNames(int folder)
{
    const OpenedFile file = openPlainFileAt(folder, HiddenNames::fileName.data());
    if (file.problem != FileProblem::none)
        return {};
    std::string text(
        static_cast<std::size_t>(std::min<std::uint64_t>(file.status.size, HiddenNames::sizeAtMost + 1)), '\0');
    text.resize(readFully(file.descriptor.number(), 0, std::as_writable_bytes(std::span(text))));
    return HiddenNames(std::move(text));
}

} // namespace platform
