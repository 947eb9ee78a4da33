#include "platform/linux/HiddenNames.h"

#include "platform/linux/PlainFile.h"

#include <cstdint>

namespace platform {

HiddenNames HiddenNames::readIn(int folder)
{
    constexpr std::uint64_t sizeAtMost = 16 << 20;
    const OpenedFile file = openPlainFileAt(folder, fileName);
    if (file.problem != FileProblem::none)
        return HiddenNames({});
    std::vector<char> text(static_cast<std::size_t>(std::min(file.status.size, sizeAtMost)));
    text.resize(readFully(file.descriptor.number(), 0, std::as_writable_bytes(std::span(text))));
    // The line that the limit cuts through names nothing.
    if (file.status.size > sizeAtMost) {
        while (!text.empty() && text.back() != '\n')
            text.pop_back();
    }
    return HiddenNames(std::move(text));
}

} // namespace platform
