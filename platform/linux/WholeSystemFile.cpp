#include "platform/linux/WholeSystemFile.h"

#include "platform/linux/Descriptor.h"

#include <algorithm>

#include <fcntl.h>

namespace platform {

std::string readToEnd(int file, std::size_t sizeAtMost)
{
    constexpr std::size_t blockSize = 16 * 1024;
    std::string content;
    while (content.size() < sizeAtMost) {
        const std::size_t length = content.size();
        content.resize(length + blockSize);
        const ssize_t count = uninterrupted([&] { return ::read(file, content.data() + length, blockSize); });
        content.resize(length + static_cast<std::size_t>(count > 0 ? count : 0));
        if (count <= 0)
            break;
    }
    content.resize(std::min(content.size(), sizeAtMost));
    return content;
}

std::string readWholeSystemFile(const std::string& path, std::size_t sizeAtMost)
{
    const auto open = [&] { return ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY); };
    const Descriptor file(uninterrupted(open));
    return file.isOpen() ? readToEnd(file.number(), sizeAtMost) : std::string();
}

} // namespace platform
