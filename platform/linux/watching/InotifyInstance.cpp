#include "platform/linux/watching/InotifyInstance.h"

#include <cstring>

#include <sys/inotify.h>
#include <unistd.h>

namespace platform {

namespace {

    constexpr std::size_t bufferSize = 64 * 1024;

} // namespace

InotifyInstance::InotifyInstance(bool mayBeUsed)
    : _descriptor(mayBeUsed ? inotify_init1(IN_CLOEXEC | IN_NONBLOCK) : -1)
    , _buffer(_descriptor.isOpen() ? bufferSize : 0)
{
}

int InotifyInstance::watchFolder(const char* path, std::uint32_t mask)
{
    constexpr std::uint32_t always = IN_ONLYDIR | IN_DONT_FOLLOW | IN_EXCL_UNLINK;
    return uninterrupted([&] { return inotify_add_watch(_descriptor.number(), path, mask | always); });
}

void InotifyInstance::stopWatching(int watch)
{
    inotify_rm_watch(_descriptor.number(), watch);
}

std::size_t InotifyInstance::readEvents()
{
    const ssize_t length = uninterrupted([&] { return read(_descriptor.number(), _buffer.data(), _buffer.size()); });
    return length > 0 ? static_cast<std::size_t>(length) : 0;
}

void InotifyInstance::discardEvents()
{
    while (readEvents() > 0) { }
}

FolderEvent InotifyInstance::eventAt(std::size_t& offset) const
{
    inotify_event header;
    std::memcpy(&header, &_buffer[offset], sizeof(header));
    const char* const name = &_buffer[offset] + sizeof(header);
    offset += sizeof(header) + header.len;
    // The kernel fills up with zero bytes.
    return { header.wd, header.mask, header.cookie, std::string_view(name, strnlen(name, header.len)) };
}

} // namespace platform
