#include "platform/linux/SharedLibraryCheck.h"

#include "platform/FileSystem.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <span>
#include <vector>

#include <elf.h>
#include <link.h>

namespace platform {

namespace {

    using Header = ElfW(Ehdr);
    using Segment = ElfW(Phdr);

    // This program's own header, as the loader mapped it, tells what this machine's libraries are like.
    // NOLINTNEXTLINE(bugprone-reserved-identifier, readability-identifier-naming): the linker gives it this name
    extern "C" const Header __ehdr_start __attribute__((weak, visibility("hidden")));

    bool isForThisMachine(const Header& header)
    {
        constexpr unsigned char wordSize = sizeof(void*) == 8 ? ELFCLASS64 : ELFCLASS32;
        constexpr unsigned char byteOrder = __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__ ? ELFDATA2LSB : ELFDATA2MSB;
        if (header.e_ident[EI_CLASS] != wordSize || header.e_ident[EI_DATA] != byteOrder)
            return false;
        return !&__ehdr_start || header.e_machine == __ehdr_start.e_machine;
    }

    bool holds(std::uint64_t size, std::uint64_t offset, std::uint64_t length)
    {
        return offset <= size && length <= size - offset;
    }

    std::string problemOfSegments(const OpenFile& file, const Header& header)
    {
        const std::uint64_t size = file.status().size;
        if (header.e_phentsize != sizeof(Segment) || header.e_phnum == 0)
            return "it is damaged";
        std::vector<Segment> segments(header.e_phnum);
        const auto bytes = std::as_writable_bytes(std::span(segments));
        if (file.read(header.e_phoff, bytes) != bytes.size())
            return "it is cut short";
        bool hasContent = false;
        bool hasDynamicPart = false;
        for (const Segment& segment : segments) {
            const bool isMapped = segment.p_type == PT_LOAD || segment.p_type == PT_DYNAMIC;
            if (isMapped && !holds(size, segment.p_offset, segment.p_filesz))
                return "it is cut short";
            hasContent = hasContent || segment.p_type == PT_LOAD;
            hasDynamicPart = hasDynamicPart || segment.p_type == PT_DYNAMIC;
        }
        return hasContent && hasDynamicPart ? std::string() : "it is damaged";
    }

} // namespace

std::string problemOfSharedLibrary(const OpenFile& file)
{
    Header header {};
    const std::size_t length = file.read(0, std::as_writable_bytes(std::span(&header, 1)));
    if (length < SELFMAG || std::memcmp(header.e_ident, ELFMAG, SELFMAG) != 0)
        return "it is no shared library";
    if (length < sizeof(header))
        return "it is cut short";
    if (!isForThisMachine(header))
        return "it was made for another kind of machine";
    return header.e_type == ET_DYN ? problemOfSegments(file, header) : "it is no shared library";
}

} // namespace platform
